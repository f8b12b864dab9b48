#include "ktisl/BitfileLumShared.h"

#include "kterr/Failure.h"
#include "platform/fpga/KtFpgaLibrary.h"

namespace ktisl {
namespace {

constexpr char kSource[] = R"(ktisl\BitfileLumShared)";
constexpr std::uint32_t kFlaggedSession = 0x2000;
constexpr std::uint32_t kAnyType = 0xFFFFFFFF;

// Four groups of nine consecutive kinds are FIFOs.
constexpr std::int32_t kFirstFifoKind = 36;
constexpr std::int32_t kLastFifoKind = 71;

void raiseIfError(std::int32_t code, std::uint32_t line = __builtin_LINE()) {
  auto status = kterr::makeLocatedStatus();
  kterr::mergeCode(status, code, kterr::kComponent, kSource, line);
  kterr::raiseLocated(status);
}

}  // namespace

BitfileLumShared::BitfileLumShared(std::uint32_t fpgaSession) : fpgaSession_(fpgaSession) {
  if ((fpgaSession & kFlaggedSession) != 0) {
    kterr::Failure(ktorba_codes::kInvalidLumHandle).at(kSource).message("reason:", "Invalid LUM handle!").raise();
  }
  auto count = static_cast<std::uint32_t>(signature_.size());
  raiseIfError(platform::KtFpga().GetBitfileSignature(fpgaSession_, signature_.data(), &count));
}

std::uint32_t BitfileLumShared::findResource(const char* resourceName, std::int32_t resourceKind) {
  const bool isFifo = resourceKind >= kFirstFifoKind && resourceKind <= kLastFifoKind;
  return isFifo ? findFifo(resourceName) : findRegister(resourceName);
}

std::uint32_t BitfileLumShared::findFifo(const char* name) const {
  std::uint32_t fifo = 0;
  raiseIfError(platform::KtFpga().FindFifoPrivate(fpgaSession_, name, kAnyType, &fifo));
  return fifo;
}

std::uint32_t BitfileLumShared::findRegister(const char* name) const {
  std::uint32_t offset = 0;
  raiseIfError(platform::KtFpga().FindRegisterPrivate(fpgaSession_, name, kAnyType, &offset));
  return offset;
}

}  // namespace ktisl
