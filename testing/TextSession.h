// Sessions on a simulated generator as text, for golden files. A line is a call, and what comes of it stands below,
// two blanks in; nothing below a line: success, and nothing to tell.
//
//   ==== a name: what follows has a generator and a session of its own
//   # a remark
//   device sampleWidthBits=32          (instead of smallTraits(), from here on)
//   Open
//   AllocateWaveform w 8               (ktORBA_AllocateWaveform; so with all of the library's functions,
//   CheckGenerationStatus               and with those of ktSim_ and KtFpgaDll_ that the table names)
//     = 0                              (what it wrote; where it failed the code and the elaboration, shortened)
//   WriteWaveformI16 w 100 8 1000      (samples count up from 100)
//   WriteScript "script s {generate w *60} end script"
//   fetch wordCount=1 isWait=1         (the next instruction of sequence memory)
//   play 100                           (samples: 1..40 counts up, 7*3 repeats)
//
// "null" stands for a null pointer. Recorded platform calls and new faults of the device are told below the line that
// they come of. One thread.
#pragma once

#include <filesystem>
#include <functional>
#include <optional>
#include <string>

#include "testing/SimulatedDevice.h"

class TextSession {
 public:
  TextSession();
  ~TextSession();
  TextSession(const TextSession&) = delete;
  TextSession& operator=(const TextSession&) = delete;

  // Performs a line and returns what came of it, each line ended. Throws std::logic_error for a line without sense.
  std::string perform(const std::string& line);

  // Has the library's functions called by a caller of the user's own.
  std::function<void(const std::function<void()>& call)> caller = [](const auto& call) { call(); };

  std::int32_t code = 0;  // of the latest call
  std::optional<SimulatedDevice> device;
  std::uint32_t session = 0;
  std::uint32_t programLength = 0;  // instructions written

 private:
  std::string tellNews();

  std::size_t faultsTold_ = 0;
};

// The lines to perform: those that are neither outcomes nor remarks nor titles.
bool isCall(const std::string& line);

// Expects the sessions of a golden file to go as written.
void expectSessions(const std::filesystem::path& file);
