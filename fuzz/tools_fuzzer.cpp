// The C interface of the tools, with whatever callers give it. An input is four parts, parted by lines of "----": a
// text, a generator, a list of waveforms and what a host does with them; missing ones are empty.
#include <array>
#include <nlohmann/json.hpp>
#include <string>
#include <string_view>

#include "ktorba/script_tools.h"
#include "testing/require.h"

namespace {

using nlohmann::json;
using std::string_view;

constexpr string_view kSeparator = "\n----\n";

struct Request {
  string_view text, generator, waveforms, host;
};

// Cuts the first part off.
string_view takePart(string_view& rest) {
  const std::size_t end = std::min(rest.find(kSeparator), rest.size());
  const string_view part = rest.substr(0, end);
  rest.remove_prefix(std::min(rest.size(), end + kSeparator.size()));
  return part;
}

Request readRequest(string_view input) {
  Request request;
  for (string_view* part : {&request.text, &request.generator, &request.waveforms, &request.host})
    *part = takePart(input);
  return request;
}

void requireKnown(std::int32_t code) {
  require(code == KTTOOLS_SUCCESS || *ktTools_DescribeCode(code) != '\0', "code");
  require(code != KTTOOLS_E_INTERNAL, "a defect");
}

void requireWithin(const json& range, std::size_t size) {
  if (range.is_null()) return;
  require(range["start"]["offset"] <= range["end"]["offset"] && range["end"]["offset"] <= size, "range");
}

// What the script itself says may be quoted.
void requireGood(const json& diagnostics, string_view text) {
  const std::size_t size = text.size();
  const bool mayQuote = text.find("elaboration") != string_view::npos;
  for (const json& diagnostic : diagnostics) {
    const std::string message = diagnostic["message"];
    require(!message.empty() && (mayQuote || message.find("elaboration") == std::string::npos), "message");
    requireWithin(diagnostic["range"], size);
    for (const json& related : diagnostic["related"]) requireWithin(related["range"], size);
    for (const json& fix : diagnostic["fixes"]) requireWithin(fix["range"], size);
  }
}

bool hasErrors(const json& document) {
  for (const json& diagnostic : document["diagnostics"]) {
    if (diagnostic["severity"] == "error") return true;
  }
  return false;
}

// Makes a call, and returns its document where it gave one.
template <typename Call>
json ask(const Request& request, std::int32_t& code, Call call) {
  ktTools_Document document = {nullptr, 7};
  code = call(&document);
  requireKnown(code);
  json parsed;
  if (document.text != nullptr) parsed = json::parse(document.text, document.text + document.length);
  ktTools_FreeDocument(&document);
  require(document.text == nullptr && document.length == 0, "freed document");
  if (parsed.is_null()) return parsed;
  require(parsed["schema"] == 1, "schema");
  if (parsed.contains("diagnostics")) requireGood(parsed["diagnostics"], request.text);
  return parsed;
}

// Whether the text has no errors; nothing can be said where the generator is no good.
bool check(const Request& request) {
  std::int32_t code = 0;
  const json document = ask(request, code, [&](ktTools_Document* out) {
    return ktTools_Check(request.text.data(), request.text.size(), request.generator.data(), request.generator.size(),
                         out);
  });
  require(code == KTTOOLS_SUCCESS || code == KTTOOLS_E_JSON, "check");
  return code == KTTOOLS_SUCCESS && !hasErrors(document);
}

void checkTokens(const Request& request) {
  ktTools_Token* tokens = nullptr;
  std::uint64_t count = 0;
  requireKnown(ktTools_Tokenize(request.text.data(), request.text.size(), &tokens, &count));
  std::uint64_t end = 0;
  for (std::uint64_t i = 0; i < count; ++i) {
    require(tokens[i].offset >= end && tokens[i].length > 0, "order of tokens");
    end = tokens[i].offset + tokens[i].length;
  }
  require(end <= request.text.size(), "end of tokens");
  ktTools_FreeTokens(tokens);
}

void checkScript(const Request& request, const ktTools_Program* program, std::uint64_t script) {
  const std::uint32_t* words = nullptr;
  std::uint64_t instructions = 0;
  require(ktTools_Words(program, script, &words, &instructions) == KTTOOLS_SUCCESS, "words");
  std::int32_t code = 0;
  const json list = ask(request, code, [&](ktTools_Document* out) { return ktTools_List(program, script, out); });
  require(code == KTTOOLS_SUCCESS && list["instructions"].size() == instructions, "listing");
}

// Walks along what plays, and asks for windows of it; what has no samples is refused.
void checkTimeline(const Request& request, const ktTools_Program* program, std::uint64_t script) {
  std::uint64_t odd = 1;
  for (const char byte : request.text) odd = odd * 31 + static_cast<unsigned char>(byte);
  const ktTools_Trigger triggers[] = {{odd % 10'000, static_cast<std::int32_t>(odd % 7 + 1)}, {odd, 2}};
  ktTools_Timeline* timeline = nullptr;
  require(ktTools_MakeTimeline(program, script, triggers, 2, &timeline) == KTTOOLS_SUCCESS, "timeline");
  ktTools_Length length;
  require(ktTools_PlayLength(timeline, &length) == KTTOOLS_SUCCESS, "length");
  const std::uint64_t end = length.kind == KTTOOLS_LENGTH_EXACT ? length.samples : KTTOOLS_NO_SAMPLE;
  std::array<ktTools_Run, 50> runs;
  for (const std::uint64_t begin : {std::uint64_t{0}, odd, end - 1, end}) {
    std::uint64_t count = 0;
    require(ktTools_Runs(timeline, begin, runs.size(), runs.data(), &count) == KTTOOLS_SUCCESS, "runs");
    require((count == 0) == (begin >= end), "runs up to the end");
    for (std::uint64_t run = 1; run < count; ++run) {
      require(runs[run].firstSample == runs[run - 1].firstSample + runs[run - 1].sampleCount, "order of runs");
    }
  }
  std::uint64_t count = 0;
  std::int16_t levels[8];
  const bool isPlaying = ktTools_WaveformCount(timeline) != 0;
  requireKnown(ktTools_Samples(timeline, odd, 4, levels, nullptr, &count));
  require((ktTools_Samples(timeline, 0, 4, levels, nullptr, &count) == KTTOOLS_E_SAMPLES) == isPlaying, "samples");
  for (std::uint32_t marker = 0; marker < 8; ++marker) {
    require(ktTools_MarkerCount(timeline, marker, 0, end, &count) == KTTOOLS_SUCCESS, "markers");
    std::uint64_t last = 0;
    if (count == 0 || count == KTTOOLS_NO_SAMPLE) continue;
    require(ktTools_MarkerPulse(timeline, marker, count - 1, &last) == KTTOOLS_SUCCESS && last < end, "last pulse");
  }
  ktTools_FreeTimeline(timeline);
}

bool compile(const Request& request) {
  ktTools_Program* program = nullptr;
  std::int32_t code = 0;
  ask(request, code, [&](ktTools_Document* out) {
    return ktTools_Compile(request.text.data(), request.text.size(), request.generator.data(), request.generator.size(),
                           request.waveforms.data(), request.waveforms.size(), &program, out);
  });
  require((code == KTTOOLS_SUCCESS) == (program != nullptr), "program");
  const std::uint64_t scripts = ktTools_ScriptCount(program);
  for (std::uint64_t script = 0; script < scripts; ++script) {
    checkScript(request, program, script);
    checkTimeline(request, program, script);
  }
  ktTools_Document none = {nullptr, 0};
  require(ktTools_List(program, scripts, &none) == KTTOOLS_E_ARGUMENT, "a script too far");
  ktTools_FreeDocument(&none);
  ktTools_FreeProgram(program);
  return code == KTTOOLS_SUCCESS;
}

bool fits(const Request& request) {
  std::int32_t code = 0;
  const json document = ask(request, code, [&](ktTools_Document* out) {
    return ktTools_Fit(request.text.data(), request.text.size(), request.generator.data(), request.generator.size(),
                       request.waveforms.data(), request.waveforms.size(), request.host.data(), request.host.size(),
                       out);
  });
  return code == KTTOOLS_SUCCESS && document["fits"] == true;
}

// Lengths that nothing has, and texts that are not there, are refused unread.
void checkAbsurd(const Request& request) {
  std::uint64_t odd = 0xFFFFFFFF;
  for (const char byte : request.text.substr(0, 8)) odd = odd << 4 | static_cast<unsigned char>(byte) | 0xFFFFFFFF;
  ktTools_Document document;
  for (const auto& [data, length] : std::array<std::pair<const char*, std::uint64_t>, 3>{
           {{request.text.data(), odd}, {nullptr, odd}, {nullptr, 1 + request.text.size()}}}) {
    require(ktTools_Check(data, length, nullptr, 0, &document) == KTTOOLS_E_ARGUMENT, "length of a text");
    ktTools_FreeDocument(&document);
    require(ktTools_Check("", 0, data, length, &document) == KTTOOLS_E_ARGUMENT, "length of a generator");
    ktTools_FreeDocument(&document);
    require(ktTools_Fit("", 0, nullptr, 0, data, length, nullptr, 0, &document) == KTTOOLS_E_ARGUMENT,
            "length of waveforms");
    ktTools_FreeDocument(&document);
    require(ktTools_Fit("", 0, nullptr, 0, nullptr, 0, data, length, &document) == KTTOOLS_E_ARGUMENT,
            "length of a request");
    ktTools_FreeDocument(&document);
  }
  require(ktTools_Fit(request.text.data(), request.text.size(), nullptr, 0, nullptr, 0, nullptr, 0, nullptr) ==
              KTTOOLS_E_ARGUMENT,
          "no document");
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  const Request request = readRequest({reinterpret_cast<const char*>(data), size});
  checkTokens(request);
  const bool isGood = check(request);
  const bool isCompiled = compile(request);
  require(isGood || !isCompiled, "a program of a text with errors");
  require(isCompiled || !fits(request), "what fits and does not compile");
  checkAbsurd(request);
  return 0;
}
