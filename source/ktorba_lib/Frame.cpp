#include "source/ktorba_lib/Frame.h"

#include "kterr/ErrorConstant.h"

namespace ktorba_lib {
namespace {

void merge(tStatus& status, std::int32_t code, const char* text) {
  if (kterr::setCode(status, code) && text != nullptr) kterr::setJson(status, text);
}

}  // namespace

void CallRecord::take(const kterr::ExceptionBase& error) noexcept { merge(status_, error.code(), error.getJson()); }

void CallRecord::takeForeign() noexcept { merge(status_, nKTAPALS100_tStatus_kSoftwareFault.code, nullptr); }

std::int32_t CallRecord::finish(tStatus* target) noexcept {
  if (target == nullptr) return status_.code;
  try {
    merge(*target, status_.code, status_.json);
  } catch (...) {  // out of the host's own callback: the text is left out, as where it refuses
  }
  return status_.code;
}

}  // namespace ktorba_lib
