#include "testing/TextSession.h"

#include <algorithm>
#include <iomanip>
#include <map>
#include <memory>
#include <numeric>
#include <regex>
#include <sstream>
#include <tuple>

#include "testing/Record.h"
#include "testing/files.h"
#include "testing/golden.h"
#include "testing/require.h"

namespace {

using ktorba::Register;

// clang-format off
#define KTORBA_TRAITS(X) \
  X(sampleWidthBits) X(memoryWordBytes) X(memorySizeBytes) X(sequenceWords) X(downloadElementBits) X(versionMajor) \
  X(versionMinor) X(reportedType)
#define KTORBA_STATE(X) \
  X(running) X(done) X(underflow) X(writeReady) X(streaming) X(triggerLatches) X(waitingForTrigger) X(address) \
  X(loopDepth) X(lastSample) X(samplesPlayed) X(writeBytesMissing) X(fifoDepth) X(fifoLevel) X(streamingFreeWords)
#define KTORBA_COUNTERS(X) \
  X(instructionsExecuted) X(markersFired) X(initiates) X(memoryWrites) X(bytesReceived) X(registerReads) \
  X(registerWrites) X(samplesLost) X(traceEntriesLost)
// Functions, with what tells their first argument.
#define KTORBA_CALLS(X) \
  X(session, ktORBA_, CloseOrbaSession) X(session, ktORBA_, GetWaveformMemorySize) \
  X(session, ktORBA_, AllocateWaveform) X(session, ktORBA_, WriteWaveformU32) X(session, ktORBA_, WriteWaveformI16) \
  X(session, ktORBA_, SetWaveformNextWritePosition) X(session, ktORBA_, ClearWaveform) \
  X(session, ktORBA_, ClearAllWaveforms) X(session, ktORBA_, WriteScript) X(session, ktORBA_, SelectActiveScript) \
  X(session, ktORBA_, DeleteScript) X(session, ktORBA_, StartGeneration) X(session, ktORBA_, AbortGeneration) \
  X(session, ktORBA_, CheckGenerationStatus) X(session, ktORBA_, Reset) X(session, ktORBA_, SetDownloadFifoDepth) \
  X(session, ktORBA_, SetMemoryReadGrantTime) X(session, ktORBA_, SetMemoryWriteGrantTime) \
  X(session, ktORBA_, SetPrimingDepth) X(session, ktORBA_, SetWaveformWriteChunkSize) \
  X(session, ktORBA_, ConfigureStreamingWaveform) X(session, ktORBA_, CheckStreamingWaveformSpace) \
  X(generator, ktSim_, Advance) X(generator, ktSim_, SetAutoAdvance) X(generator, ktSim_, RaiseTrigger) \
  X(generator, ktSim_, RaiseTriggerAt) X(generator, ktSim_, RecordTrace) X(generator, ktSim_, OverrideRegister) \
  X(generator, ktSim_, RestoreRegister) X(generator, ktSim_, HoldMemoryWrites) X(generator, ktSim_, SetDrainRate) \
  X(generator, ktSim_, PeekRegister) X(fpga, ktSim_, FailCall) X(fpga, ktSim_, ClearFailures) \
  X(fpga, ktSim_, RecordCalls) X(fpga, KtFpgaDll_, ConfigureFifo2) X(fpga, KtFpgaDll_, StartFifo) \
  X(fpga, KtFpgaDll_, StopFifo) X(fpga, KtFpgaDll_, WriteFifoU8)
// clang-format on

// A line being performed: what is left to read of it, and what is told of it.
struct Line {
  std::string word() {
    std::string text;
    require(static_cast<bool>(words >> std::quoted(text)), "a word is missing: " + words.str());
    return text;
  }
  std::uint64_t number() {
    const std::string text = word();
    if (text == "fifo") return on.device->fifo;
    return text[0] == '-' ? static_cast<std::uint64_t>(std::stoll(text)) : std::stoull(text, nullptr, 0);
  }
  bool skipNull() {
    const auto before = words.tellg();
    std::string text;
    if (words >> text && text == "null") return true;
    words.clear();
    words.seekg(before);
    return false;
  }

  TextSession& on;
  std::istringstream words;
  std::ostringstream out{};
};

// ---- What functions take and give: read from the line, and printed behind the call. ----

// Nothing comes back in it.
struct Given {
  void print(Line&) const {}
};

template <typename T>
struct Argument : Given {
  explicit Argument(Line& line) : value(static_cast<T>(line.number())) {}
  T get() { return value; }
  T value;
};

template <typename T>
struct Argument<T*> {
  explicit Argument(Line& line) : isNull(line.skipNull()) {}
  T* get() { return isNull ? nullptr : &value; }
  void print(Line& line) const {
    if (value != kUntouched) line.out << "= " << +value << '\n';
  }
  static constexpr T kUntouched = static_cast<T>(0xEEEEEEEEEEEEEEEE);
  T value = kUntouched;
  bool isNull;
};

template <typename T>
struct Argument<const T*> : Given {
  explicit Argument(Line& line) {
    if (line.skipNull()) return;
    values.resize(10000);
    std::iota(values.begin(), values.end(), static_cast<T>(line.number()));
  }
  const T* get() { return values.empty() ? nullptr : values.data(); }
  std::vector<T> values;
};

template <>
struct Argument<const char*> : Given {
  explicit Argument(Line& line) : isNull(line.skipNull()), text(isNull ? "" : line.word()) {}
  const char* get() { return isNull ? nullptr : text.c_str(); }
  bool isNull;
  std::string text;
};

template <>
struct Argument<tStatus*> {
  explicit Argument(Line&) {}
  tStatus* get() { return record.get(); }
  void print(Line& line) const {
    if (record->json != nullptr) line.out << describe(record->json) << '\n';
  }
  std::unique_ptr<Record> record = std::make_unique<Record>();
};

// ---- Verbs ----

using Verb = std::function<void(Line& line)>;

void tellCode(Line& line, std::int32_t code) {
  line.on.code = code;
  if (code == 0) return;
  line.out << code;
  if (std::string_view(ktSim_DescribeCode(code)) != "unknown code") line.out << ' ' << ktSim_DescribeCode(code);
  line.out << '\n';
}

std::uint32_t session(const TextSession& on) { return on.session; }
std::uint32_t generator(const TextSession& on) { return on.device->number; }
std::uint32_t fpga(const TextSession& on) { return on.device->fpga.fpgaSession; }

// A function whose first argument is the session's number, the generator's or the FPGA's.
template <typename... Arguments>
Verb call(std::uint32_t (*first)(const TextSession&), std::int32_t (*function)(std::uint32_t, Arguments...)) {
  return [=](Line& line) {
    std::tuple<Argument<Arguments>...> arguments{Argument<Arguments>(line)...};
    const std::uint32_t number = first(line.on);
    std::int32_t code = 0;
    const auto perform = [&] {
      code = std::apply([&](auto&... each) { return function(number, each.get()...); }, arguments);
    };
    first == session ? line.on.caller(std::ref(perform)) : perform();
    tellCode(line, code);
    std::apply([&](auto&... each) { (each.print(line), ...); }, arguments);
  };
}

void open(Line& line) {
  std::uint32_t instance = 0;
  line.words >> instance;
  Argument<tStatus*> status(line);
  std::int32_t code = 0;
  const auto perform = [&] {
    code = line.on.device->open(line.on.session, static_cast<std::uint8_t>(instance), status.get());
  };
  line.on.caller(std::ref(perform));
  tellCode(line, code);
  status.print(line);
}

// Reads "name=value" as long as there are any.
template <typename Set>
void readSettings(Line& line, const Set& set) {
  for (std::string text; line.words >> text;) {
    const std::size_t equals = text.find('=');
    require(equals != std::string::npos, text);
    set(text.substr(0, equals), static_cast<std::uint32_t>(std::stoull(text.substr(equals + 1), nullptr, 0)));
  }
}

void makeDevice(Line& line) {
  ktSim_Traits traits = smallTraits();
  readSettings(line, [&traits](const std::string& name, std::uint32_t value) {
#define KTORBA_SET(trait) \
  if (name == #trait) return void(traits.trait = static_cast<decltype(traits.trait)>(value));
    KTORBA_TRAITS(KTORBA_SET)
    require(false, "no trait: " + name);
  });
  line.on.device.emplace(traits);
}

void writeInstruction(Line& line, const ktorba::SequenceInstructionWords& words) {
  const std::uint32_t address = line.on.programLength++;
  tellCode(line, ktSim_WriteSequenceMemory(line.on.device->number, address, words.words.data(), 1));
}

Verb instructionVerb(const ktorba::InstructionFormat& format) {
  return [&format](Line& line) {
    ktorba::SequenceInstructionWords words = instruction(format.opcode);
    readSettings(line, [&](const std::string& name, std::uint32_t value) {
      const auto field = std::ranges::find(format.fields, name, &ktorba::InstructionField::name);
      require(field != format.fields.end(), "no field: " + name);
      ktorba::writeField(words, *field, value);
    });
    writeInstruction(line, words);
  };
}

// Runs in short: 1..9 counts up, 7*3 repeats.
template <typename Value>
std::string inRuns(const std::vector<Value>& values) {
  std::string text;
  for (auto first = values.begin(); first != values.end();) {
    const int step = first + 1 != values.end() ? first[1] - first[0] : 2;
    auto last = first;
    while (last + 1 != values.end() && (step == 0 || step == 1) && last[1] - last[0] == step) ++last;
    text += ' ' + std::to_string(*first);
    if (last != first) text += step == 0 ? '*' + std::to_string(last - first + 1) : ".." + std::to_string(*last);
    first = last + 1;
  }
  return text;
}

void play(Line& line) {
  const std::uint64_t count = line.number();
  std::vector<std::int16_t> samples(count);
  std::vector<std::uint8_t> markers(count);
  const std::uint64_t played = line.on.device->playInto(count, samples.data(), markers.data());
  samples.resize(played);
  markers.resize(played);
  line.out << '=' << inRuns(samples) << '\n';
  if (std::ranges::count(markers, 0) != static_cast<std::ptrdiff_t>(played)) line.out << "m" << inRuns(markers) << '\n';
}

#define KTORBA_TELL(name) line.out << (from.name != 0 ? " " #name "=" + std::to_string(from.name) : "");

void tellState(Line& line) {
  const ktSim_State from = line.on.device->state();
  KTORBA_STATE(KTORBA_TELL)
  line.out << '\n';
}

void tellCounters(Line& line) {
  const ktSim_Counters from = line.on.device->counters();
  KTORBA_COUNTERS(KTORBA_TELL)
  line.out << '\n';
}
#undef KTORBA_TELL

// An entry's address, its first sample and its pass of the loop.
void tellTrace(Line& line) {
  std::vector<ktSim_TraceEntry> entries(100);
  std::uint64_t count = 0;
  tellCode(line, ktSim_ReadTrace(line.on.device->number, entries.size(), entries.data(), &count));
  for (const ktSim_TraceEntry& entry : std::span(entries).first(count)) {
    line.out << entry.address << ": @" << entry.firstSample << " pass " << entry.loopPass << std::hex;
    for (const std::uint32_t word : entry.words) line.out << ' ' << word;
    line.out << std::dec << '\n';
  }
}

// A register by its name without the k.
Register registerOf(const std::string& name) {
  const auto* const info = std::ranges::find(ktorba::kRegisters, 'k' + name, &ktorba::RegisterInfo::name);
  require(info != std::end(ktorba::kRegisters), "no register: " + name);
  return info->number;
}

std::map<std::string, Verb> makeVerbs() {
  std::map<std::string, Verb> verbs{
#define KTORBA_VERB(first, prefix, name) {#name, call(first, prefix##name)},
      KTORBA_CALLS(KTORBA_VERB)  //
      {"Open", open},
      {"device", makeDevice},
      {"ramp", [](Line& line) { line.on.device->fillWithRamp(); }},
      {"play", play},
      {"state", tellState},
      {"counters", tellCounters},
      {"trace", tellTrace},
  };
  verbs["words"] = [](Line& line) {
    ktorba::SequenceInstructionWords words;
    for (std::uint32_t& word : words.words) word = static_cast<std::uint32_t>(line.number());
    writeInstruction(line, words);
  };
  verbs["read"] = [](Line& line) { line.out << "= " << line.on.device->read(registerOf(line.word())) << '\n'; };
  verbs["write"] = [](Line& line) {
    const Register which = registerOf(line.word());
    tellCode(line, line.on.device->write(which, line.number()));
  };
  verbs["announce"] = [](Line& line) { line.on.device->announce({line.number(), line.number(), line.number()}); };
  verbs["memory"] = [](Line& line) {
    const std::uint64_t address = line.number();
    line.out << '=' << inRuns(line.on.device->sampleMemory(address, line.number())) << '\n';
  };
  for (const ktorba::InstructionFormat& format : ktorba::kInstructionFormats) {
    verbs[format.name] = instructionVerb(format);
  }
  return verbs;
}

// "{ab*3}" is "ababab".
std::string expand(std::string text) {
  static const std::regex kRepetition(R"(\{([^{}]*)\*(\d+)\})");
  for (std::smatch found; std::regex_search(text, found, kRepetition);) {
    std::string all;
    for (int left = std::stoi(found[2]); left > 0; --left) all += found[1];
    text = found.prefix().str() + all + found.suffix().str();
  }
  return text;
}

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

}  // namespace

TextSession::TextSession() { device.emplace(smallTraits()); }
TextSession::~TextSession() {
  ktORBA_CloseOrbaSession(session, nullptr);  // not open in every session
}

std::string TextSession::perform(const std::string& text) {
  static const std::map<std::string, Verb> kVerbs = makeVerbs();
  Line line{*this, std::istringstream(expand(text))};
  const auto verb = kVerbs.find(line.word());
  require(verb != kVerbs.end(), text);
  verb->second(line);
  return line.out.str() + tellNews();
}

std::string TextSession::tellNews() {
  std::string news = foldLookUps(device->takeCalls());
  const std::vector<ktSim_DeviceFault> faults = device->deviceFaults();
  for (faultsTold_ = std::min(faultsTold_, faults.size()); faultsTold_ < faults.size(); ++faultsTold_) {
    const ktSim_DeviceFault& fault = faults[faultsTold_];
    news += "fault " + std::to_string(fault.code) + " at sample " + std::to_string(fault.sample) + ": " + fault.text +
            (fault.address == KTSIM_NO_ADDRESS ? ", no address\n" : "\n");
  }
  return news;
}

bool isCall(const std::string& line) {
  return !line.empty() && !line.starts_with("  ") && !line.starts_with('#') && !line.starts_with("==== ");
}

void expectSessions(const std::filesystem::path& file) {
  std::istringstream lines(readFile(file));
  std::string text;
  std::optional<TextSession> on(std::in_place);
  for (std::string line; std::getline(lines, line);) {
    if (line.starts_with("  ")) continue;
    if (line.starts_with("==== ")) on.emplace();
    text += line + '\n';
    if (!isCall(line)) continue;
    std::istringstream outcome(on->perform(line));
    for (std::string each; std::getline(outcome, each);) text += "  " + each + '\n';
  }
  expectGolden(file, text);
}
