#include "ktifw_lib_client/ContextNumbers.h"

#include <algorithm>
#include <new>

#include "platform/fpga/KtifwuLibrary.h"

namespace ktifw_lib_client {
namespace {

// Arrays tried for a framework that names more contexts each time it is asked; then what fits is taken.
constexpr int kMaxArrays = 4;

}  // namespace

bool ContextNumbers::allocate(std::uint32_t capacity) {
  numbers_.reset(new (std::nothrow) std::uint32_t[capacity]);
  capacity_ = numbers_ != nullptr ? capacity : 0;
  return numbers_ != nullptr;
}

template <typename Query>
void ContextNumbers::ask(Status& status, const Query& query) {
  std::uint32_t count = 0;
  const auto askOnce = [&] {
    callFramework(status, status.code,
                  [&](tStatus* framework) { query(numbers_.get(), capacity_, &count, framework); });
    return !failed(status);
  };
  if (!askOnce()) return;
  for (int array = 0; array < kMaxArrays && count > capacity_; ++array) {
    if (!allocate(count)) return setOutOfMemory(status);
    if (!askOnce()) return;
  }
  count_ = std::min(count, capacity_);
}

ContextNumbers ContextNumbers::allChildren(std::uint32_t session, std::uint32_t context, Status& status) {
  ContextNumbers result;
  result.ask(status, [&](std::uint32_t* numbers, std::uint32_t capacity, std::uint32_t* count, tStatus* framework) {
    platform::Ktifwu().Context_GetAllChildren(session, context, numbers, capacity, count, framework);
  });
  return result;
}

ContextNumbers ContextNumbers::childrenByUid(std::uint32_t session, std::uint32_t context, std::uint16_t uid,
                                             Status& status) {
  ContextNumbers result;
  result.ask(status, [&](std::uint32_t* numbers, std::uint32_t capacity, std::uint32_t* count, tStatus* framework) {
    platform::Ktifwu().Context_GetChildrenByUid(session, context, uid, numbers, capacity, count, framework);
  });
  return result;
}

}  // namespace ktifw_lib_client
