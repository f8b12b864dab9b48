#include "ktorba/hwControl/requireWorkableTraits.h"

#include <string>

#include "kterr/Failure.h"

namespace ktorba {
namespace {

constexpr char kSource[] = R"(includes\ktorba\hwControl\HWControl)";

// A byte mask has 64 bits, one for each byte of a memory word.
constexpr std::uint32_t kMaxMemoryWordBits = 64 * 8;

void require(bool holds, const char* trait, std::uint32_t value, const char* rule) {
  if (holds) return;
  const std::string text = std::string(trait) + " is " + std::to_string(value) + "; it must be " + rule;
  kterr::Failure(ktorba_errors::kErrorInternalSWError)
      .at(kSource)
      .message("ktorba::requireWorkableTraits", text.c_str())
      .raise();
}

}  // namespace

void requireWorkableTraits(const HWTraits& traits) {
  const std::uint32_t sampleBits = traits.sampleWidthBits;
  const std::uint32_t wordBits = traits.memoryWordBits;
  require(sampleBits >= 8, "sampleWidthBits", sampleBits, "at least 8");
  require(wordBits >= 8, "memoryWordBits", wordBits, "at least 8");
  require(wordBits <= kMaxMemoryWordBits, "memoryWordBits", wordBits, "at most 512");
  require(traits.downloadElementBits >= 8, "downloadElementBits", traits.downloadElementBits, "at least 8");
}

}  // namespace ktorba
