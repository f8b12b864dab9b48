#include "source/ktorba_lib/Frame.h"

namespace ktorba_lib {

tStatus* elaborationTarget(tStatus* caller) noexcept { return caller; }

}  // namespace ktorba_lib
