#include "tools/check/foreignWords.h"

#include "ktcheckname/compareNames.h"

namespace tools {
namespace {

constexpr std::string_view kCountedLoop = "Write repeat 10 ... end repeat to do something ten times.";
constexpr std::string_view kLoopUntil = "Write repeat until trigger1 ... end repeat to go on until a trigger arrives.";
constexpr std::string_view kEndless = "Write repeat forever ... end repeat for a loop without end.";
constexpr std::string_view kNoConditions =
    "Scripts decide nothing but when a wait or a loop ends: wait until trigger1.";
constexpr std::string_view kWait = "Write wait 1000 to hold the last sample for 1000 samples.";
constexpr std::string_view kPlay = "Write generate and a waveform's name to play it.";
constexpr std::string_view kEndLoop = "A loop ends with end repeat.";
constexpr std::string_view kEndScript = "A script ends with end script.";
constexpr std::string_view kWaitTrigger = "Write wait until trigger1 to wait for a trigger.";
constexpr std::string_view kMarker = "Write marker0(0) behind a generate to fire a marker at its first sample.";

constexpr ForeignWord kForeignWords[] = {
    {"begin", "A script begins with the keyword script and its name."},
    {"break", kNoConditions},
    {"delay", kWait},
    {"do", kCountedLoop},
    {"done", kEndLoop},
    {"else", kNoConditions},
    {"endfor", kEndLoop},
    {"endif", kNoConditions},
    {"endloop", kEndLoop},
    {"endrepeat", kEndLoop},
    {"endscript", kEndScript},
    {"endwhile", kEndLoop},
    {"finish", kEndScript},
    {"fire", kMarker},
    {"for", kCountedLoop},
    {"foreach", kCountedLoop},
    {"function", "Begin a script with the keyword script and its name."},
    {"goto", kEndless},
    {"hold", kWait},
    {"if", kNoConditions},
    {"jump", kEndless},
    {"loop", kCountedLoop},
    {"next", kEndLoop},
    {"on", kNoConditions},
    {"output", kPlay},
    {"pause", kWait},
    {"play", kPlay},
    {"return", kEndScript},
    {"run", kPlay},
    {"send", kPlay},
    {"sleep", kWait},
    {"start", kPlay},
    {"stop", kEndScript},
    {"stream", kPlay},
    {"trigger", kWaitTrigger},
    {"wend", kEndLoop},
    {"while", kLoopUntil},
};

}  // namespace

std::span<const ForeignWord> allForeignWords() { return kForeignWords; }

std::string_view explainForeignWord(std::string_view word) {
  for (const ForeignWord& foreign : kForeignWords) {
    if (ktcheckname::compareNames(word, foreign.word) == 0) return foreign.help;
  }
  return {};
}

}  // namespace tools
