// Files as sources: whatever their bytes and parameters are, they are taken or refused, and what is taken fits. The
// first byte is the kind of file, a line of parameters follows, and the rest is the file.
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cstdio>
#include <fstream>
#include <string>

#include "testing/require.h"
#include "tools/sources/Source.h"
#include "tools/text/Refusal.h"

namespace {

constexpr std::uint64_t kMaxSamples = 1 << 16;
constexpr std::array<const char*, 5> kEndings = {".csv", ".npy", ".npz", ".raw", ".wav"};

std::string pathFor(unsigned char kind) {
  return "/tmp/ktorba_fuzz_" + std::to_string(getpid()) + kEndings[kind % kEndings.size()];
}

void load(const std::string& source, unsigned widthBits) {
  try {
    const tools::LoadedWaveform waveform = tools::loadSource(source, {widthBits, 1e6, kMaxSamples});
    const std::size_t count = waveform.samples.size();
    require(count > 0 && count <= kMaxSamples, "number of samples");
    require(waveform.clippedSamples <= count, "number of clipped samples");
  } catch (const tools::Refusal& refusal) {
    require(*refusal.what() != '\0', "reason of a refusal");
  }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  if (size == 0) return 0;
  const std::string bytes(data + 1, data + size);
  const std::size_t end = std::min(bytes.find('\n'), bytes.size());
  const std::string path = pathFor(data[0]);
  std::ofstream(path, std::ios::binary) << bytes.substr(std::min(end + 1, bytes.size()));
  load(path + ":" + bytes.substr(0, end), data[0] < 128 ? 16 : 32);
  std::remove(path.c_str());
  return 0;
}
