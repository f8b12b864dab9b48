#include "source/ktorba_lib/failures.h"

#include "kterr/Failure.h"

namespace ktorba_lib {

void raise(const kterr::ErrorConstant& constant, const char* function, const char* message, std::uint32_t line) {
  kterr::Failure(constant).at(R"(source\ktorba_lib\ktorba_lib)", line).message(function, message).raise();
}

void requireArgument(const void* argument, const char* function, const char* message, std::uint32_t line) {
  if (argument == nullptr) raise(nKTAPALS100_tStatus_kInvalidParameter, function, message, line);
}

}  // namespace ktorba_lib
