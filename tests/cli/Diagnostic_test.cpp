#include "cli/diagnostics/Diagnostic.h"

#include <gmock/gmock.h>

#include "cli/diagnostics/elaboration.h"
#include "kterr/Failure.h"

namespace cli {
namespace {

using testing::HasSubstr;

TEST(Diagnostic, AnyElaborationIsTold) {
  try {
    kterr::Failure(ktorba_errors::kErrorInternalSWError)
        .at("f")
        .message("SomeFunction", "headSkip 17 is above 15")
        .raise();
  } catch (const kterr::Exception& error) {
    EXPECT_THAT(diagnoseFailure(error.code(), error.getJson()).message, HasSubstr(": headSkip 17 is above 15"));
  }
  try {
    kterr::Failure(ktorba_errors::kErrorInvalidNumberOfMarkersOnAWaveform).usage("Number of markers", 16u).raise();
  } catch (const kterr::Exception& error) {
    EXPECT_THAT(diagnoseFailure(error.code(), error.getJson()).message, HasSubstr(": Number of markers 16"));
  }
  for (const char* text :
       {static_cast<const char*>(nullptr), "", "[1]", "{\"translator_info\":{\"ordered_data\":[1,{}]}}",
        "{\"translator_info\":7,\"error_constant\":8}", "{\"x\":\"\xFF\"}"}) {
    EXPECT_EQ(diagnoseFailure(-52005, text).constant, "nKTAPALS100_tStatus_kInvalidParameter");
  }
  EXPECT_EQ(diagnoseFailure(-70009, nullptr).message, "The call failed with code -70009");
}

}  // namespace
}  // namespace cli
