#include "cli/console.h"

#include <gtest/gtest.h>

#include "tools/text/characters.h"

namespace tools::cli {
namespace {

TEST(ProgressLine, FitsEveryWidth) {
  const std::string label = "writing a/\u4e2d\u6587.csv";
  EXPECT_EQ(progressLine("playing", 50, 24),
            "playing \u2588\u2588\u2588\u2588\u2588\u2591\u2591\u2591\u2591\u2591 50 %");
  EXPECT_EQ(progressLine("playing", 50, 18), "playing 50 %");
  EXPECT_EQ(progressLine("playing", 100, 5), "100 ");
  for (int columns = 1; columns < 200; ++columns) {
    for (const int percent : {0, 7, 100}) {
      const auto shown = static_cast<int>(blanksFor(progressLine(label, percent, columns)).size());
      EXPECT_LT(shown, columns) << percent;
      EXPECT_GT(shown, columns > 5 ? 2 : -1) << percent;
    }
  }
}

}  // namespace
}  // namespace tools::cli
