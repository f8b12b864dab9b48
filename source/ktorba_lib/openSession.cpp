#include "source/ktorba_lib/openSession.h"

#include "source/ktorba_lib/WaveformGenerationSession.h"

namespace ktorba_lib {

SessionPtr openSession(const GeneratorAddress& generator) { return new WaveformGenerationSession(generator); }

}  // namespace ktorba_lib
