#include <gtest/gtest.h>

#include "simulator/Fpga.h"

namespace {

// A process may open and close as many FPGAs as it likes.
TEST(FpgaTable, StartsItsNumbersOverBehindTheLast) {
  constexpr std::uint32_t kLastGiven = 0xFFDFFF;  // those above have a bit that hosts refuse
  simulator::FpgaTable table(kLastGiven - 1);
  const auto create = [&] { return table.create()->numbers().fpgaSession; };
  EXPECT_EQ(create(), kLastGiven);
  EXPECT_EQ(create(), 1u);
  EXPECT_NE(table.bySession(kLastGiven), nullptr);
}

}  // namespace
