#include "source/ktorba_lib/openSession.h"

#include "kterr/Failure.h"

namespace ktorba_lib {

SessionPtr openSession(const GeneratorAddress&) {
  kterr::Failure(nKTAPALS100_tStatus_kInvalidParameter)
      .at(R"(source\ktorba_lib\WaveformGenerationSession)")
      .message("openSession", "No generator can be reached.")
      .raise();
}

}  // namespace ktorba_lib
