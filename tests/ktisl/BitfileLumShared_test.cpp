#include "ktisl/BitfileLumShared.h"

#include <gmock/gmock.h>

#include "SimulatedFifo.h"
#include "testing/caught.h"

namespace {

using ktisl::BitfileLumShared;

TEST(BitfileLumShared, RefusesFlaggedHandlesBeforeAnyCall) {
  const kterr::Exception flagged = caught([] { BitfileLumShared(0x2000); });
  EXPECT_EQ(flagged.code(), -52);
  EXPECT_THAT(
      flagged.what(),
      testing::MatchesRegex(R"(\{"error_constant":"-52",.*"component":"ktorbau","reason:":"Invalid LUM handle!"\})"));
  EXPECT_EQ(caught([] { BitfileLumShared(0x1FFF); }).code(), KTSIM_E_SESSION);
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
  fpga.failCall("KtFpgaDll_GetBitfileSignature", 61000);
  BitfileLumShared bitfile(fpga.session);
  for (const std::int32_t kind : {35, 36}) {
    const kterr::Exception missing = caught([&] { bitfile.findResource("a", kind); });
    EXPECT_EQ(missing.code(), KTSIM_E_NAME);
    EXPECT_THAT(missing.what(), testing::HasSubstr(R"({"file":"ktisl\\BitfileLumShared","line":)"));
  }
}

}  // namespace
