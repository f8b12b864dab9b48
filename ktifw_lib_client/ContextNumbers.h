// Internal to this folder: the context numbers of one of the framework's lists, handed out one by one. A list is asked
// for in two calls: its length, then the numbers. Of a long one that second call is made in steps, each for a multiple
// of what the one before brought, so that no more is reserved than has been read.
#pragma once

#include <cstdint>
#include <memory>
#include <optional>

#include "ktifw_lib_client/FrameworkStatus.h"

namespace ktifw_lib_client {

class ContextNumbers {
 public:
  // The children of `context`, all or those with this unique id, in the framework's order. Nothing is asked for yet.
  ContextNumbers(std::uint32_t session, std::uint32_t context, std::optional<std::uint16_t> uid = {})
      : session_(session), context_(context), uid_(uid) {}

  // The next number; nothing at the end, and on an error, which `status` tells.
  std::optional<std::uint32_t> next(Status& status);

 private:
  // Makes one call of the framework for up to capacity_ numbers; false on an error.
  bool ask(Status& status);
  // Reads the first numbers behind those used, if any are announced; false at the end and on an error.
  bool readStep(Status& status);
  bool allocate(std::uint32_t capacity, Status& status);
  bool isUnfilled() const;

  std::uint32_t session_;
  std::uint32_t context_;
  std::optional<std::uint16_t> uid_;
  std::unique_ptr<std::uint32_t[]> numbers_;
  std::uint32_t capacity_ = 0;
  std::uint32_t announced_ = 0;  // length of the list, as the framework said last
  std::uint32_t used_ = 0;       // numbers handed out
  int calls_ = 0;
};

}  // namespace ktifw_lib_client
