#include "ktifw_lib_client/ContextNumbers.h"

#include <algorithm>
#include <new>

#include "kterr/ErrorConstant.h"
#include "platform/fpga/KtifwuLibrary.h"

namespace ktifw_lib_client {
namespace {

constexpr char kSource[] = R"(ktifw_lib_client\ContextNumbers)";
constexpr std::uint32_t kFirstStep = 1u << 16;  // numbers; lists that are not longer take two calls
constexpr std::uint64_t kStepGrowth = 4;
// Enough for the longest list there is, and the end for a framework that names more contexts each time it is asked:
// then what was read is taken.
constexpr int kMaxCalls = 16;

}  // namespace

std::optional<std::uint32_t> ContextNumbers::next(Status& status) {
  if (used_ >= std::min(announced_, capacity_) && !readStep(status)) return std::nullopt;
  return numbers_[used_++];
}

bool ContextNumbers::readStep(Status& status) {
  if (calls_ == 0 && !ask(status)) return false;
  if (announced_ <= capacity_ || calls_ == kMaxCalls) return false;
  const std::uint64_t step = std::max<std::uint64_t>(kFirstStep, capacity_ * kStepGrowth);
  if (!allocate(static_cast<std::uint32_t>(std::min<std::uint64_t>(announced_, step)), status)) return false;
  if (!ask(status)) return false;
  if (announced_ > capacity_ && isUnfilled()) {
    kterr::mergeCode(status, nKTAPALS100_tStatus_kSoftwareFault.code, kterr::kComponent, kSource, __builtin_LINE());
    return false;
  }
  return used_ < std::min(announced_, capacity_);
}

bool ContextNumbers::ask(Status& status) {
  ++calls_;
  callFramework(status, status.code, [&](tStatus* framework) {
    auto& library = platform::Ktifwu();
    if (uid_) {
      library.Context_GetChildrenByUid(session_, context_, *uid_, numbers_.get(), capacity_, &announced_, framework);
    } else {
      library.Context_GetAllChildren(session_, context_, numbers_.get(), capacity_, &announced_, framework);
    }
  });
  return !failed(status);
}

bool ContextNumbers::allocate(std::uint32_t capacity, Status& status) {
  numbers_.reset(new (std::nothrow) std::uint32_t[capacity]());
  capacity_ = numbers_ != nullptr ? capacity : 0;
  if (numbers_ == nullptr) setOutOfMemory(status);
  return numbers_ != nullptr;
}

// Whether the framework announced more numbers than it gives: those still 0 are the root's, which is nobody's child.
bool ContextNumbers::isUnfilled() const {
  return std::all_of(&numbers_[used_], &numbers_[capacity_], [](std::uint32_t number) { return number == 0; });
}

}  // namespace ktifw_lib_client
