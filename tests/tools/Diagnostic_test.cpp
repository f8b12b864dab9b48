#include "tools/diagnostics/Diagnostic.h"

#include <gmock/gmock.h>

#include "kterr/Failure.h"
#include "testing/caught.h"
#include "tools/diagnostics/elaboration.h"

namespace tools {
namespace {

using testing::HasSubstr;
using testing::Not;

TEST(Diagnostic, AnyElaborationIsTold) {
  const auto told = [](const auto& raise) {
    const kterr::Exception failure = caught(raise);
    return diagnoseFailure(failure.code(), failure.getJson()).message;
  };
  EXPECT_THAT(
      told([] { kterr::Failure(ktorba_errors::kErrorInternalSWError).at("f").message("F", "17 > 15").raise(); }),
      HasSubstr(": 17 > 15"));
  EXPECT_THAT(told([] {
                kterr::Failure(ktorba_errors::kErrorInvalidNumberOfMarkersOnAWaveform).usage("Markers", 16u).raise();
              }),
              HasSubstr(": Markers 16"));
  for (const char* text :
       {static_cast<const char*>(nullptr), "", "[1]", "{\"translator_info\":{\"ordered_data\":[1,{}]}}",
        "{\"translator_info\":7,\"error_constant\":8}", "{\"x\":\"\xFF\"}"}) {
    EXPECT_EQ(diagnoseFailure(-52005, text).constant, "nKTAPALS100_tStatus_kInvalidParameter");
  }
  EXPECT_EQ(diagnoseFailure(-70009, nullptr).message, "The call failed with code -70009");
}

// Only programs have one; half of the library's texts for users send there.
TEST(Diagnostic, SpeaksOfNoElaboration) {
  for (const kterr::ErrorConstant& constant : kterr::allErrorConstants()) {
    const Diagnostic told = diagnoseFailure(constant.code, nullptr);
    for (const std::string& text : {told.message, told.help, helpOf(constant)}) {
      EXPECT_THAT(text, Not(HasSubstr("elaboration"))) << constant.cName;
    }
  }
  EXPECT_EQ(helpOf(ktorba_errors::kErrorPrimingDepthTooLarge),
            "Use at most the number of samples given in the error's text.");
}

}  // namespace
}  // namespace tools
