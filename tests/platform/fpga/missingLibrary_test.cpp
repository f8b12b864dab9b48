#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <system_error>

#include "platform/fpga/KtFpgaLibrary.h"
#include "platform/fpga/KtifwuLibrary.h"
#include "platform/system/DynamicLibrary.h"
#include "testing/FrameworkDouble.h"
#include "testing/caught.h"

namespace {

using testing::HasSubstr;

const std::string kLibrary = platform::DynamicLibrary("KtFpga").name();

TEST(BoundFunction, RaisesTheLoadersWordsWhenTheLibraryIsMissing) {
  for (int attempt = 0; attempt < 2; ++attempt) {
    const kterr::Exception failure = caught([] { platform::KtFpga().StartFifo(1, 2); });
    EXPECT_EQ(failure.code(), -52003);
    EXPECT_THAT(failure.what(), HasSubstr(R"("error_constant":"nKTAPALS100_tStatus_kSoftwareFault")"));
    EXPECT_THAT(failure.what(), HasSubstr(std::string(R"("KtFpgaDll_StartFifo":")") + KTORBA_NO_LIBRARY));
    EXPECT_THAT(failure.what(), HasSubstr(kLibrary + R"(":"looked for among the libraries loaded, in )"));
    EXPECT_THAT(failure.what(), HasSubstr(KTORBA_PLACE));
  }
}

TEST(BoundFunction, RaisesTheLoadersWordsWhenOneFunctionIsMissing) {
  frameworkDouble().isRecording = true;  // called, so that the library is loaded as by a host
  const kterr::Exception failure =
      caught([] { platform::Ktifwu().Context_GetSubsystemAndOffset(1, 2, nullptr, nullptr, nullptr); });
  EXPECT_EQ(failure.code(), -52003);
  EXPECT_THAT(failure.what(),
              testing::AllOf(HasSubstr(R"("ktIFW_Context_GetSubsystemAndOffset":")"), HasSubstr(KTORBA_NO_FUNCTION)));
  platform::Ktifwu().Target_Reset(2, nullptr);
  EXPECT_THAT(frameworkDouble().take(), testing::ElementsAre("Reset 2"));
}

}  // namespace
