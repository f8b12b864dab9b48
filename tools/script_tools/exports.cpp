#include <cstdlib>
#include <memory>
#include <span>

#include "ktWfmScriptCompiler/ScriptTraits.h"
#include "kterr/Exception.h"
#include "ktorba/script_tools.h"
#include "tools/check/checkText.h"
#include "tools/program/ProgramBuilder.h"
#include "tools/script_tools/CompiledText.h"
#include "tools/script_tools/boundary.h"
#include "tools/script_tools/documents.h"
#include "tools/script_tools/requests.h"
#include "tools/syntax/SyntaxTree.h"

namespace tools {
namespace {

std::vector<std::string> namesOf(const std::vector<WaveformLength>& waveforms) {
  std::vector<std::string> names;
  names.reserve(waveforms.size());
  for (const WaveformLength& waveform : waveforms) names.push_back(waveform.name);
  return names;
}

// Compiles, and looks whether the waveforms are there. False with errors in `diagnostics`.
bool compile(CompiledText& program, const GeneratorOptions& generator, const std::vector<WaveformLength>& waveforms,
             std::vector<Diagnostic>& diagnostics) {
  if (program.builder.compile(program.file, diagnostics) == 0) return false;
  const std::vector<std::string> names = namesOf(waveforms);
  program.builder.checkWaveformsAreThere(names, names, diagnostics);
  if (!diagnostics.empty()) return false;
  diagnostics = checkText(program.file, toScriptTraits(generator), generator.sampleRateHz).diagnostics;
  return true;
}

std::int32_t kindOf(const SyntaxToken& token) {
  if (token.fault() != TokenFault::kNone) return KTTOOLS_TOKEN_FAULT;
  switch (token.type()) {
    case TokenType::kIdentifier:
      return KTTOOLS_TOKEN_NAME;
    case TokenType::kInteger:
      return KTTOOLS_TOKEN_NUMBER;
    case TokenType::kMarkerName:
      return KTTOOLS_TOKEN_MARKER;
    case TokenType::kTriggerName:
      return KTTOOLS_TOKEN_TRIGGER;
    case TokenType::kOpenParenthesis:
    case TokenType::kCloseParenthesis:
    case TokenType::kComma:
      return KTTOOLS_TOKEN_MARK;
    default:
      return KTTOOLS_TOKEN_KEYWORD;
  }
}

// Adds the comments between two tokens. Looks no further: each gap would else be searched to the end of the text.
void addComments(std::string_view text, std::size_t from, std::size_t to, std::vector<ktTools_Token>& tokens) {
  const std::string_view gap = text.substr(0, to);
  for (std::size_t start = gap.find("//", from); start != gap.npos; start = gap.find("//", from)) {
    from = std::min(gap.find_first_of("\r\n", start), to);
    tokens.push_back({start, from - start, KTTOOLS_TOKEN_COMMENT});
  }
}

std::vector<ktTools_Token> tokenize(std::string_view text) {
  const ktwfmscriptcompiler::ScriptTraits traits = ktwfmscriptcompiler::standardScriptTraits();
  const SyntaxTree tree(text, traits);
  std::vector<ktTools_Token> tokens;
  std::size_t end = 0;
  for (std::uint32_t i = 0; i + 1 < tree.tokens().size(); ++i) {
    const SyntaxToken& token = tree.tokens()[i];
    addComments(text, end, token.offset(), tokens);
    const std::size_t length = tree.textOf(i).size();
    tokens.push_back({token.offset(), length, kindOf(token)});
    end = token.offset() + length;
  }
  addComments(text, end, tree.unreadFrom(), tokens);
  const std::size_t unread = text.size() - tree.unreadFrom();
  if (unread > 0) tokens.push_back({tree.unreadFrom(), unread, KTTOOLS_TOKEN_UNREAD});
  return tokens;
}

}  // namespace
}  // namespace tools

using tools::atBoundary;
using tools::require;
using tools::view;

const char* ktTools_Version() { return KTORBA_VERSION; }

const char* ktTools_DescribeCode(std::int32_t code) {
  switch (code) {
#define KTTOOLS_DESCRIBE(name, number, text) \
  case number:                               \
    return text;
    KTTOOLS_CODES(KTTOOLS_DESCRIBE)
#undef KTTOOLS_DESCRIBE
    default:
      return "";
  }
}

void ktTools_FreeDocument(ktTools_Document* document) {
  if (document == nullptr) return;
  std::free(document->text);
  *document = {nullptr, 0};
}

void ktTools_FreeTokens(ktTools_Token* tokens) { std::free(tokens); }

void ktTools_FreeProgram(ktTools_Program* program) { delete program; }

std::int32_t ktTools_Check(const char* text, std::uint64_t length, const char* generator, std::uint64_t generatorLength,
                           ktTools_Document* document) {
  return atBoundary(document, [&] {
    require(document != nullptr);
    const tools::GeneratorOptions options = tools::readGenerator(view(generator, generatorLength));
    const tools::ScriptFile file("script", std::string(view(text, length)));
    const auto checked = tools::checkText(file, toScriptTraits(options), options.sampleRateHz);
    tools::give(tools::makeCheckDocument(file, checked.diagnostics), document);
    return KTTOOLS_SUCCESS;
  });
}

std::int32_t ktTools_Tokenize(const char* text, std::uint64_t length, ktTools_Token** tokens, std::uint64_t* count) {
  return atBoundary(nullptr, [&] {
    require(tokens != nullptr && count != nullptr);
    const std::vector<ktTools_Token> found = tools::tokenize(view(text, length));
    const std::size_t bytes = std::max<std::size_t>(1, found.size()) * sizeof(ktTools_Token);
    auto* const copy = static_cast<ktTools_Token*>(std::malloc(bytes));
    if (copy == nullptr) throw std::bad_alloc();
    std::copy(found.begin(), found.end(), copy);
    *tokens = copy;
    *count = found.size();
    return KTTOOLS_SUCCESS;
  });
}

std::int32_t ktTools_Compile(const char* text, std::uint64_t length, const char* generator,
                             std::uint64_t generatorLength, const char* waveforms, std::uint64_t waveformsLength,
                             ktTools_Program** program, ktTools_Document* document) {
  return atBoundary(document, [&]() -> std::int32_t {
    require(program != nullptr);
    const tools::GeneratorOptions options = tools::readGenerator(view(generator, generatorLength));
    const auto lengths = tools::readWaveforms(view(waveforms, waveformsLength));
    const auto made = std::make_shared<tools::CompiledText>(std::string(view(text, length)), options);
    std::vector<tools::Diagnostic> diagnostics;
    bool isGood = tools::compile(*made, options, lengths, diagnostics);
    if (isGood) {
      for (const tools::WaveformLength& waveform : lengths) {
        const tools::WaveformFit fit = tools::placeWaveform(waveform, made->builder);
        if (fit.refusal) diagnostics.push_back({.message = *fit.refusal});
        isGood = isGood && !fit.refusal;
      }
    }
    const std::size_t before = diagnostics.size();
    if (isGood) made->programs = made->builder.build(diagnostics);
    isGood = isGood && diagnostics.size() == before;
    tools::give(tools::makeCheckDocument(made->file, diagnostics), document);
    if (!isGood) return KTTOOLS_E_SCRIPT;
    *program = std::make_unique<ktTools_Program>(ktTools_Program{made}).release();
    return KTTOOLS_SUCCESS;
  });
}

std::uint64_t ktTools_ScriptCount(const ktTools_Program* program) {
  return program == nullptr ? 0 : program->compiled->programs.size();
}

std::int32_t ktTools_Words(const ktTools_Program* program, std::uint64_t script, const std::uint32_t** words,
                           std::uint64_t* instructions) {
  return atBoundary(nullptr, [&] {
    require(script < ktTools_ScriptCount(program) && words != nullptr && instructions != nullptr);
    const auto& all = program->compiled->programs[script].entry.instructionWords;
    static_assert(sizeof(all[0]) == 4 * sizeof(std::uint32_t));
    *words = all.empty() ? nullptr : &all.front().words[0];
    *instructions = all.size();
    return KTTOOLS_SUCCESS;
  });
}

std::int32_t ktTools_List(const ktTools_Program* program, std::uint64_t script, ktTools_Document* document) {
  return atBoundary(document, [&] {
    require(script < ktTools_ScriptCount(program) && document != nullptr);
    tools::give(tools::makeListDocument(program->compiled->programs[script], program->compiled->builder), document);
    return KTTOOLS_SUCCESS;
  });
}

std::int32_t ktTools_Fit(const char* text, std::uint64_t length, const char* generator, std::uint64_t generatorLength,
                         const char* waveforms, std::uint64_t waveformsLength, const char* request,
                         std::uint64_t requestLength, ktTools_Document* document) {
  return atBoundary(document, [&]() -> std::int32_t {
    require(document != nullptr);
    const tools::GeneratorOptions options = tools::readGenerator(view(generator, generatorLength));
    const auto lengths = tools::readWaveforms(view(waveforms, waveformsLength));
    const auto host = tools::readFitRequest(view(request, requestLength), options.sampleRateHz);
    tools::CompiledText program(std::string(view(text, length)), options);
    std::vector<tools::Diagnostic> diagnostics;
    if (!tools::compile(program, options, lengths, diagnostics)) {
      tools::give(tools::makeCheckDocument(program.file, diagnostics), document);
      return KTTOOLS_E_SCRIPT;
    }
    const tools::Fit fit = tools::measureRequestedFit(program.builder, lengths, options, host);
    tools::give(tools::makeFitDocument(program.file, fit), document);
    return KTTOOLS_SUCCESS;
  });
}

std::int32_t ktTools_ErrorTable(ktTools_Document* document) {
  return atBoundary(document, [&] {
    require(document != nullptr);
    tools::give(tools::makeErrorTable(), document);
    return KTTOOLS_SUCCESS;
  });
}
