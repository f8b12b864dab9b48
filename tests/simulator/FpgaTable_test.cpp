#include <gtest/gtest.h>

#include "simulator/Fpga.h"

namespace {

// A process may open and close as many FPGAs as it likes; hosts refuse numbers with bit 13, so none is ever given.
TEST(FpgaTable, GivesNumbersInTurnAndLeavesOutThoseThatHostsRefuse) {
  constexpr std::uint32_t kLastGiven = 0xFFDFFF;
  simulator::FpgaTable table(kLastGiven - 1);
  const auto create = [](simulator::FpgaTable& in) { return in.create()->numbers().fpgaSession; };
  EXPECT_EQ(create(table), kLastGiven);
  EXPECT_EQ(create(table), 1u);
  EXPECT_NE(table.bySession(kLastGiven), nullptr);
  EXPECT_TRUE(table.destroy(1));
  EXPECT_EQ(create(table), 2u) << "not the number of one just closed";
  simulator::FpgaTable middle(0x1FFE);
  EXPECT_EQ(create(middle), 0x1FFFu);
  EXPECT_EQ(create(middle), 0x4000u);
}

}  // namespace
