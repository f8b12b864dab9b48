#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "platform/fpga/KtFpgaLibrary.h"
#include "platform/fpga/KtifwuLibrary.h"
#include "testing/KtifwuDouble.h"
#include "testing/caught.h"

namespace {

using testing::HasSubstr;

TEST(BoundFunction, RaisesTheLoadersWordsWhenTheLibraryIsMissing) {
  for (int attempt = 0; attempt < 2; ++attempt) {
    const kterr::Exception failure = caught([] { platform::KtFpga().StartFifo(1, 2); });
    EXPECT_EQ(failure.code(), -52003);
    EXPECT_THAT(failure.what(), HasSubstr(R"("error_constant":"nKTAPALS100_tStatus_kSoftwareFault")"));
    EXPECT_THAT(failure.what(), HasSubstr(R"("KtFpgaDll_StartFifo":"libKtFpga.so: cannot open)"));
  }
}

TEST(BoundFunction, RaisesTheLoadersWordsWhenOneFunctionIsMissing) {
  tStatus status = kterr::makeStatus();
  ktIFW_Target_Reset(1, &status);  // called by its name, so that the library is loaded as by a host
  const kterr::Exception failure =
      caught([&status] { platform::Ktifwu().Context_GetChild(1, 2, 3, 4, nullptr, &status); });
  EXPECT_EQ(failure.code(), -52003);
  EXPECT_THAT(failure.what(), testing::ContainsRegex(R"("ktIFW_Context_GetChild":".*undefined symbol)"));
  platform::Ktifwu().Target_Reset(2, &status);
  EXPECT_THAT(ktifwuDouble().take(), testing::ElementsAre("Reset 1", "Reset 2"));
}

}  // namespace
