// A host application in small: a session of the library on a simulated generator, which it makes play. The simulated
// generator's platform libraries have to be loaded before the first call; the tool is linked with them.
#pragma once

#include <cstdint>
#include <exception>
#include <string>
#include <vector>

#include "ktorba/simulator.h"
#include "tools/diagnostics/Diagnostic.h"
#include "tools/program/GeneratorOptions.h"
#include "tools/recording/Recording.h"

namespace tools {

// A call of the library or of the simulator that failed.
class CallFailure : public std::exception {
 public:
  explicit CallFailure(Diagnostic what) : diagnostic(std::move(what)) {}
  const char* what() const noexcept override { return diagnostic.message.c_str(); }

  Diagnostic diagnostic;
};

// Every function throws CallFailure when a call fails.
class Host {
 public:
  explicit Host(const GeneratorOptions& options);  // makes the generator and opens a session
  ~Host();
  Host(const Host&) = delete;
  Host& operator=(const Host&) = delete;

  void writeWaveform(const std::string& name, const SampleBuffer& samples);
  void writeScript(const std::string& text);
  void selectScript(const std::string& name);
  void start();
  void abort();

  // Raises a hardware trigger at that sample, which has not been played yet.
  void raiseTrigger(unsigned trigger, std::uint64_t sample);

  // Plays up to `count` samples, fewer when generation ends, and returns how many. `samples` are in the generator's
  // width, `markers` one byte each; either may be null, and what is behind the last one played may be overwritten.
  std::uint64_t play(std::uint64_t count, void* samples, std::uint8_t* markers);

  // From the next start on, notes up to `capacity` instructions that nobody has taken; 0 ends it.
  void recordSegments(std::uint64_t capacity);
  // Those that began to play since the last call.
  void takeSegments(std::vector<SegmentStart>& segments);

  // Whether generation has ended, as the library reports it. Throws for a fault of the device, too.
  bool isDone();

  ktSim_State state() const;

 private:
  void checkForDeviceFault() const;
  template <typename Call>
  void call(Call call) const;

  ktSim_Fpga fpga_{};
  std::uint32_t generator_ = 0;
  std::uint32_t session_ = 0;
  std::vector<ktSim_TraceEntry> trace_;
};

}  // namespace tools
