#include "kterr/ErrorConstant.h"

namespace kterr {

std::span<const ErrorConstant> allErrorConstants() {
  static constexpr ErrorConstant kAll[] = {
#define KTORBA_ERROR(scope, name, code, meaning, help) scope::name,
#define KTORBA_PLATFORM(name, code, meaning, help) name,
#define KTORBA_CODE(name, code, text, meaning, help) ktorba_codes::name,
#include "kterr/errors.def"
#undef KTORBA_ERROR
#undef KTORBA_PLATFORM
#undef KTORBA_CODE
  };
  return kAll;
}

}  // namespace kterr
