// The session behind a handle, as the registry and the exported functions need it: implemented by
// WaveformGenerationSession. References are counted and the last one deletes the session; apart from counting and its
// name, a session is used from one thread at a time. Failures are kterr::Exception.
#pragma once

#include <boost/smart_ptr/intrusive_ptr.hpp>
#include <cstdint>

#include "ktisl/Session.h"
#include "ktorba/hwControl/HWControlInterface.h"
#include "ktorba/settings/GenerationSettings.h"

namespace ktorba_lib {

class SessionInterface : public ktisl::Session {
 public:
  using ktisl::Session::Session;

  // The engine facade, owned by the session.
  virtual ktorba::HWControlInterface& getHWControl() = 0;

  // What was asked for last and accepted.
  virtual ktorba::GenerationSettings getRequestedSettings() const = 0;

  // Calculates hardware settings from `requested` and configures the generator with them. When either fails, the
  // requested settings stay as they were.
  virtual void applySettings(const ktorba::GenerationSettings& requested) = 0;

  // Applies the requested settings with another streaming waveform; `name` is UTF-8, empty turns streaming off.
  virtual void configureStreamingWaveform(const std::string& name) = 0;

  // Write samples into a waveform, allocating it when it does not exist. `waveformName` is in the host's encoding;
  // null pointers are refused here. `timeoutMs` is the limit for the whole write.
  virtual void writeWaveform(const char* waveformName, const std::uint32_t* data, std::uint32_t numSamples,
                             std::int32_t timeoutMs) = 0;
  virtual void writeWaveform(const char* waveformName, const std::int16_t* data, std::uint32_t numSamples,
                             std::int32_t timeoutMs) = 0;
};

using SessionPtr = boost::intrusive_ptr<SessionInterface>;

}  // namespace ktorba_lib
