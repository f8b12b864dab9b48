// The edge of the C interface: what comes from callers is checked, and nothing that is thrown gets out.
#pragma once

#include <cstdint>
#include <exception>
#include <new>
#include <string>
#include <string_view>

#include "ktorba/script_tools.h"
#include "tools/script_tools/requests.h"

namespace tools {

// What a caller must not give.
class ArgumentError : public std::exception {};

// The samples of a waveform are asked for, and nobody has lent them.
class MissingSamples : public std::exception {};

inline void require(bool condition) {
  if (!condition) throw ArgumentError();
}

std::string_view view(const char* text, std::uint64_t length);

// Gives a document to a caller who wants one.
void give(const std::string& text, ktTools_Document* document);

// Gives the document that tells what went wrong with the call, and returns the code.
std::int32_t failWith(std::int32_t code, const char* message, ktTools_Document* document) noexcept;

// Runs the body of an exported function.
template <typename Body>
std::int32_t atBoundary(ktTools_Document* document, Body body) noexcept {
  if (document != nullptr) *document = {nullptr, 0};
  try {
    return body();
  } catch (const ArgumentError&) {
    return failWith(KTTOOLS_E_ARGUMENT, ktTools_DescribeCode(KTTOOLS_E_ARGUMENT), document);
  } catch (const MissingSamples&) {
    return failWith(KTTOOLS_E_SAMPLES, ktTools_DescribeCode(KTTOOLS_E_SAMPLES), document);
  } catch (const RequestError& error) {
    return failWith(KTTOOLS_E_JSON, error.what(), document);
  } catch (const std::bad_alloc&) {
    return KTTOOLS_E_MEMORY;
  } catch (const std::exception& error) {
    return failWith(KTTOOLS_E_INTERNAL, error.what() == nullptr ? "" : error.what(), document);
  } catch (...) {
    return KTTOOLS_E_INTERNAL;
  }
}

}  // namespace tools
