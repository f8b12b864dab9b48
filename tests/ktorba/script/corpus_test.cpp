// The fuzzer's corpus, without the fuzzer: nothing in it fails, and it starts from every error that a text can give.
#include <gmock/gmock.h>

#include <filesystem>
#include <set>

#include "kterr/ErrorConstant.h"
#include "testing/ScriptInput.h"
#include "testing/files.h"

namespace {

TEST(ScriptCorpus, ReachesEveryErrorOfATextAndItsWaveforms) {
  std::set<std::int32_t> reached;
  for (const auto& entry : std::filesystem::directory_iterator(KTORBA_CORPUS_FOLDER)) {
    const std::int32_t code = runScriptInput(readFile(entry.path()));
    EXPECT_EQ(code == 0, entry.path().filename().string().starts_with("ok-")) << entry.path();
    reached.insert(code);
  }
  using namespace ktorba_errors;
  std::set<std::int32_t> expected{0};
  for (const kterr::ErrorConstant& constant :
       {kErrorSpecifiedWaveformNotFound, kErrorStartPositionExceedsWaveformLength,
        kErrorRequestedWaveformLengthIsTooSmall, kErrorRequestedWaveformLengthExceedsAllocatedLength,
        kErrorInvalidStartPositionAndWaveformLengthCombination, kErrorMarkerPositionExceedsLastElementInWaveform,
        kErrorInvalidNumberOfMarkersOnAWaveform, kErrorInvalidDistanceBetweenTwoMarkerPositions,
        kErrorInternalSWError}) {
    expected.insert(constant.code);
  }
  for (const kterr::ErrorConstant& constant : kterr::allErrorConstants()) {
    if (std::string_view(constant.cName).starts_with("ktwfmscriptcompiler_errors")) expected.insert(constant.code);
  }
  EXPECT_EQ(reached, expected);
}

}  // namespace
