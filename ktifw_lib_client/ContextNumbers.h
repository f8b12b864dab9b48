// Internal to this folder: lists of context numbers, asked of the framework in two calls.
#pragma once

#include <cstdint>
#include <memory>
#include <span>

#include "ktifw_lib_client/FrameworkStatus.h"

namespace ktifw_lib_client {

class ContextNumbers {
 public:
  // The children of `context` in the framework's order; none on an error.
  static ContextNumbers allChildren(std::uint32_t session, std::uint32_t context, Status& status);
  static ContextNumbers childrenByUid(std::uint32_t session, std::uint32_t context, std::uint16_t uid, Status& status);

  const std::uint32_t* begin() const { return numbers_.get(); }
  const std::uint32_t* end() const { return numbers_.get() + count_; }

 private:
  // `query(numbers, capacity, count, status)` is the framework's operation.
  template <typename Query>
  void ask(Status& status, const Query& query);
  bool allocate(std::uint32_t capacity);

  std::unique_ptr<std::uint32_t[]> numbers_;
  std::uint32_t capacity_ = 0;
  std::uint32_t count_ = 0;  // at most capacity_
};

}  // namespace ktifw_lib_client
