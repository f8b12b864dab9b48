#include "source/ktorba_lib/Frame.h"

namespace ktorba_lib {

tStatus* elaborationTarget(tStatus*) noexcept { return nullptr; }

}  // namespace ktorba_lib
