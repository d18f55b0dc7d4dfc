#include "service/modem-manager/LteBandOfEarfcn.h"

#include <gtest/gtest.h>

namespace velmar::modem {
namespace {

TEST(LteBandOfEarfcn, EachRangeHoldsItsFirstAndLastNumber) {
    EXPECT_EQ(lteBandOfEarfcn(0), 1);
    EXPECT_EQ(lteBandOfEarfcn(599), 1);
    EXPECT_EQ(lteBandOfEarfcn(600), 2);
    EXPECT_EQ(lteBandOfEarfcn(1300), 3);
    EXPECT_EQ(lteBandOfEarfcn(2075), 4);
    EXPECT_EQ(lteBandOfEarfcn(6300), 20);
    EXPECT_EQ(lteBandOfEarfcn(10359), 32);
    EXPECT_EQ(lteBandOfEarfcn(36000), 33);
    EXPECT_EQ(lteBandOfEarfcn(39650), 41);
    EXPECT_EQ(lteBandOfEarfcn(66436), 66);
    EXPECT_EQ(lteBandOfEarfcn(68600), 71);
    EXPECT_EQ(lteBandOfEarfcn(70645), 88);
}

TEST(LteBandOfEarfcn, NumbersOutsideEveryDownlinkRangeHaveNoBand) {
    EXPECT_EQ(lteBandOfEarfcn(-1), std::nullopt);
    EXPECT_EQ(lteBandOfEarfcn(4950), std::nullopt);   // between bands 11 and 12
    EXPECT_EQ(lteBandOfEarfcn(10360), std::nullopt);  // past band 32, before the TDD bands
    EXPECT_EQ(lteBandOfEarfcn(18000), std::nullopt);  // an uplink number of band 1
    EXPECT_EQ(lteBandOfEarfcn(60255), std::nullopt);
    EXPECT_EQ(lteBandOfEarfcn(70646), std::nullopt);
    EXPECT_EQ(lteBandOfEarfcn(262143), std::nullopt);
}

}  // namespace
}  // namespace velmar::modem
