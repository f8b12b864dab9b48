// Which calls each exported function makes of the two platform libraries, in which order, read from the simulated
// generator's record and compared with platformCalls.txt. KTORBA_UPDATE_GOLDEN=1 rewrites that file; review the
// difference.
#include <gtest/gtest.h>

#include <cstdlib>
#include <fstream>
#include <numeric>
#include <sstream>
#include <string_view>
#include <vector>

#include "source/ktorba_lib/SimulatedGenerator.h"

namespace {

// The record with register look-ups in front of the transfer that they are for: "[17] read 17".
std::string foldLookUps(const std::string& record) {
  constexpr std::string_view kLookUp = "ktIFW_Context_Contextualize context=2 offset=";
  std::istringstream lines(record);
  std::string folded, offsets;
  for (std::string line; std::getline(lines, line);) {
    if (line.starts_with(kLookUp)) {
      offsets += (offsets.empty() ? "" : " ") + line.substr(kLookUp.size());
    } else {
      folded += (offsets.empty() ? "" : "[" + offsets + "] ") + line + "\n";
      offsets.clear();
    }
  }
  return folded;
}

class Transcript {
 public:
  // Adds what `call` made of the platform; `call` returns a code, which is told when it is not 0.
  template <typename Call>
  void add(const std::string& title, Call&& call) {
    generator.takeCalls();
    const std::int32_t code = call();
    text +=
        "==== " + title + (code != 0 ? " = " + std::to_string(code) : "") + "\n" + foldLookUps(generator.takeCalls());
  }

  SimulatedGenerator generator{SimulatedGenerator::smallTraits()};
  std::string text;
};

std::string transcribeEveryOperation() {
  Transcript calls;
  EXPECT_EQ(ktSim_RecordCalls(calls.generator.fpga.fpgaSession, 1000), 0);
  std::vector<std::int16_t> samples(200);
  std::iota(samples.begin(), samples.end(), std::int16_t{1});
  std::uint32_t session = 0;
  std::uint64_t size = 0;
  std::uint8_t isDone = 0;
  const auto write = [&](const char* name, std::uint32_t count) {
    return [=, &session, &samples] {
      return ktORBA_WriteWaveformI16(session, name, samples.data(), count, 1000, nullptr);
    };
  };
  const auto select = [&](const char* name) {
    return [=, &session] { return ktORBA_SelectActiveScript(session, name, nullptr); };
  };

  calls.add("open", [&] { return calls.generator.open(session); });
  calls.add("set the write grant time to its default",
            [&] { return ktORBA_SetMemoryWriteGrantTime(session, 30, nullptr); });
  calls.add("start without a script", [&] { return ktORBA_StartGeneration(session, nullptr); });
  calls.add("allocate 100 samples", [&] { return ktORBA_AllocateWaveform(session, "w", 100, nullptr); });
  calls.add("write 6 samples", write("w", 6));
  calls.add("write 3 samples behind them, inside one memory word and the next", write("w", 3));
  calls.add("write the other 91 in chunks of 64 bytes", [&] {
    ktORBA_SetWaveformWriteChunkSize(session, 64, nullptr);
    return write("w", 91)();
  });
  calls.add("write past the end", write("w", 1));
  calls.add("write an unknown waveform of 198 samples, which end inside a memory word", write("loop", 198));
  calls.add("write a script", [&] {
    return ktORBA_WriteScript(session,
                              "script once generate w end script "
                              "script on repeat forever generate loop end repeat end script",
                              nullptr);
  });
  calls.add("select it", select("once"));
  calls.add("select it again", select("ONCE"));
  calls.add("start", [&] { return ktORBA_StartGeneration(session, nullptr); });
  calls.add("poll", [&] { return ktORBA_CheckGenerationStatus(session, &isDone, nullptr); });
  calls.add("abort", [&] { return ktORBA_AbortGeneration(session, nullptr); });
  calls.add("set the read grant time to 61", [&] { return ktORBA_SetMemoryReadGrantTime(session, 61, nullptr); });
  calls.add("set it to 61 again", [&] { return ktORBA_SetMemoryReadGrantTime(session, 61, nullptr); });
  calls.add("set a priming depth above the limit", [&] { return ktORBA_SetPrimingDepth(session, 2049, nullptr); });
  calls.add("set a priming depth of 37 samples", [&] { return ktORBA_SetPrimingDepth(session, 37, nullptr); });
  calls.add("stream", [&] { return ktORBA_ConfigureStreamingWaveform(session, "loop", nullptr); });
  calls.add("select the endless script", select("on"));
  calls.add("start", [&] { return ktORBA_StartGeneration(session, nullptr); });
  EXPECT_EQ(ktSim_Advance(calls.generator.number, 100, nullptr), 0);
  calls.add("space", [&] { return ktORBA_CheckStreamingWaveformSpace(session, &size, nullptr); });
  EXPECT_EQ(size, 88u) << "92 samples played, and one word that the waveform does not fill";
  calls.add("write 150 samples while streaming", write("loop", 150));
  calls.add("write 150 more, around the end", write("loop", 150));
  calls.add("abort", [&] { return ktORBA_AbortGeneration(session, nullptr); });
  calls.add("write 3 samples, from the start again", write("loop", 3));
  calls.add("clear another waveform", [&] { return ktORBA_ClearWaveform(session, "w", nullptr); });
  calls.add("clear the streaming waveform", [&] { return ktORBA_ClearWaveform(session, "loop", nullptr); });
  calls.add("delete a script", [&] { return ktORBA_DeleteScript(session, "on", nullptr); });
  calls.add("set the FIFO depth", [&] { return ktORBA_SetDownloadFifoDepth(session, 8192, nullptr); });
  calls.add("write another waveform", write("next", 200));
  calls.add("stream it", [&] { return ktORBA_ConfigureStreamingWaveform(session, "next", nullptr); });
  calls.add("clear all waveforms", [&] { return ktORBA_ClearAllWaveforms(session, nullptr); });
  calls.add("reset", [&] { return ktORBA_Reset(session, nullptr); });
  calls.add("memory size", [&] { return ktORBA_GetWaveformMemorySize(session, &size, nullptr); });
  calls.add("close", [&] { return ktORBA_CloseOrbaSession(session, nullptr); });
  return calls.text;
}

TEST(PlatformCalls, OfEveryOperation) {
  const std::string transcript = transcribeEveryOperation();
  if (std::getenv("KTORBA_UPDATE_GOLDEN") != nullptr)
    std::ofstream(PLATFORM_CALLS_FILE, std::ios::binary) << transcript;
  std::ostringstream expected;
  expected << std::ifstream(PLATFORM_CALLS_FILE, std::ios::binary).rdbuf();
  EXPECT_EQ(transcript, expected.str());
}

}  // namespace
