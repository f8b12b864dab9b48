#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "kterr/Exception.h"
#include "platform/KtFpgaLibrary.h"
#include "platform/KtifwuDouble.h"
#include "platform/KtifwuLibrary.h"

namespace {

using testing::HasSubstr;

template <typename Call>
std::string elaborationOf(const Call& call) {
  try {
    call();
  } catch (const kterr::Exception& exception) {
    EXPECT_EQ(exception.code(), -52003);
    return exception.getJson();
  }
  return "nothing raised";
}

TEST(BoundFunction, RaisesTheLoadersWordsWhenTheLibraryIsMissing) {
  for (int attempt = 0; attempt < 2; ++attempt) {
    const std::string elaboration = elaborationOf([] { platform::KtFpga().StartFifo(1, 2); });
    EXPECT_THAT(elaboration, HasSubstr(R"("error_constant":"nKTAPALS100_tStatus_kSoftwareFault")"));
    EXPECT_THAT(elaboration, HasSubstr(R"("KtFpgaDll_StartFifo":"libKtFpga.so: cannot open)"));
  }
}

TEST(BoundFunction, RaisesTheLoadersWordsWhenOneFunctionIsMissing) {
  tStatus status = kterr::makeStatus();
  ktIFW_Target_Reset(1, &status);  // called by its name, so that the library is loaded as by a host
  const auto getChild = [&status] { platform::Ktifwu().Context_GetChild(1, 2, 3, 4, nullptr, &status); };
  EXPECT_THAT(elaborationOf(getChild), testing::ContainsRegex(R"("ktIFW_Context_GetChild":".*undefined symbol)"));
  platform::Ktifwu().Target_Reset(2, &status);
  EXPECT_THAT(ktifwuDouble().take(), testing::ElementsAre("Reset 1", "Reset 2"));
}

}  // namespace
