#include "ktisl/BitfileLumShared.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "kterr/Exception.h"
#include "platform/KtFpgaDouble.h"

namespace {

using ktisl::BitfileLumShared;
using testing::ElementsAre;
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
  const std::string elaboration = raised(-52, [] { BitfileLumShared(0x2000); });
  EXPECT_THAT(
      elaboration,
      testing::MatchesRegex(R"(\{"error_constant":"-52",.*"component":"ktorbau","reason:":"Invalid LUM handle!"\})"));
  EXPECT_THAT(ktFpgaDouble().record.take(), ElementsAre());
  BitfileLumShared(0x1FFF);
  EXPECT_THAT(ktFpgaDouble().record.take(), ElementsAre("GetBitfileSignature 8191 4"));
}

TEST(BitfileLumShared, FindsFifosAndRegistersByKind) {
  BitfileLumShared bitfile(7);
  ktFpgaDouble().record.take();
  for (const std::int32_t kind : {35, 36, 71, 72, -1}) {
    const bool isFifo = kind == 36 || kind == 71;
    EXPECT_EQ(bitfile.findResource("a b", kind), 1u);
    EXPECT_THAT(ktFpgaDouble().record.take(),
                ElementsAre(isFifo ? "FindFifo 7 a b 4294967295" : "FindRegister 7 a b 4294967295"));
  }
}

TEST(BitfileLumShared, RaisesErrorsWithItsPlaceAndNoWarnings) {
  ktFpgaDouble().results = {61000, 5, -61017, -61003};
  BitfileLumShared bitfile(7);
  EXPECT_EQ(bitfile.findFifo("a"), 1u);
  EXPECT_THAT(raised(-61017, [&] { bitfile.findFifo("a"); }),
              HasSubstr(R"({"file":"ktisl\\BitfileLumShared","line":)"));
  raised(-61003, [] { BitfileLumShared(7); });
  ktFpgaDouble().record.take();
}

}  // namespace
