#include "ktisl/BitfileLumShared.h"

#include <gmock/gmock.h>

#include "kterr/Exception.h"
#include "ktisl/SimulatedFifo.h"

namespace {

using ktisl::BitfileLumShared;
using testing::HasSubstr;

std::string raised(std::int32_t code, const auto& call) {
  try {
    call();
  } catch (const kterr::Exception& exception) {
    EXPECT_EQ(exception.code(), code);
    return exception.getJson();
  }
  return "nothing raised";
}

TEST(BitfileLumShared, RefusesFlaggedHandlesBeforeAnyCall) {
  EXPECT_THAT(
      raised(-52, [] { BitfileLumShared(0x2000); }),
      testing::MatchesRegex(R"(\{"error_constant":"-52",.*"component":"ktorbau","reason:":"Invalid LUM handle!"\})"));
  raised(KTSIM_E_SESSION, [] { BitfileLumShared(0x1FFF); });
}

TEST(BitfileLumShared, FindsFifosAndRegistersByKind) {
  SimulatedFifo fpga;
  BitfileLumShared bitfile(fpga.session);
  for (const std::int32_t kind : {35, 36, 71, 72, -1}) {
    EXPECT_EQ(bitfile.findResource("a b", kind), kind == 36 || kind == 71 ? fpga.fifo : 35) << kind;
  }
}

TEST(BitfileLumShared, RaisesErrorsWithItsPlaceAndNoWarnings) {
  SimulatedFifo fpga;
  fpga.failNext("KtFpgaDll_GetBitfileSignature", 61000);
  BitfileLumShared bitfile(fpga.session);
  for (const std::int32_t kind : {35, 36}) {
    EXPECT_THAT(raised(KTSIM_E_NAME, [&] { bitfile.findResource("a", kind); }),
                HasSubstr(R"({"file":"ktisl\\BitfileLumShared","line":)"));
  }
}

}  // namespace
