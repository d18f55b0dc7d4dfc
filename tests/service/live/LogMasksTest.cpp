// Log masks from the channels' demand: the published worked example byte for byte, unions of channels,
// several equipment ids, N from the reported range or the highest wanted item, the 0x1000 cap, and what
// changes are sent.
#include "service/live/LogMasks.h"

#include <gtest/gtest.h>

#include <vector>

#include "logfile/DiagFraming.h"

namespace velmar::live {
namespace {

using Bytes = std::vector<std::uint8_t>;

LogCodeFilter demandOf(std::initializer_list<std::uint16_t> codes) {
    LogCodeFilter filter;
    for (const std::uint16_t code : codes) {
        filter.addCode(code);
    }
    return filter;
}

TEST(LogMasks, TheWorkedExampleByteForByte) {
    const EquipmentRanges noRanges{};
    const std::vector<EquipmentLogMask> masks = logMasksFor(demandOf({0xB0C2, 0xB17F}), noRanges);
    ASSERT_EQ(masks.size(), 1U);
    EXPECT_EQ(masks[0].equipment, 0xBU);
    EXPECT_EQ(masks[0].itemCount, 0x180U);
    ASSERT_EQ(masks[0].bits.size(), 48U);

    Bytes payload = {0x73, 0, 0, 0, 0x03, 0, 0, 0, 0x0b, 0, 0, 0, 0x80, 0x01, 0, 0};
    payload.insert(payload.end(), 24, 0x00);
    payload.push_back(0x04);
    payload.insert(payload.end(), 22, 0x00);
    payload.push_back(0x80);
    EXPECT_EQ(setLogMaskRequest(masks[0]), payload);
    EXPECT_EQ(crc16X25(payload), 0x2934);

    Bytes wire;
    appendDiagFrame(wire, setLogMaskRequest(masks[0]));
    Bytes expectedWire = payload;
    expectedWire.insert(expectedWire.end(), {0x34, 0x29, 0x7E});
    EXPECT_EQ(wire, expectedWire);
}

TEST(LogMasks, TheUnionOfChannelsSpansSeveralEquipmentIdsInOrder) {
    LogCodeFilter first = demandOf({0xB0C1, 0xB0C2});
    const LogCodeFilter second = demandOf({0x4116, 0xB0C2, 0x7130});
    first.unite(second);
    const std::vector<EquipmentLogMask> masks = logMasksFor(first, EquipmentRanges{});
    ASSERT_EQ(masks.size(), 3U);
    EXPECT_EQ(masks[0].equipment, 4U);
    EXPECT_EQ(masks[0].itemCount, 0x117U);
    EXPECT_EQ(masks[0].bits[0x116 / 8], 1U << (0x116 % 8));
    EXPECT_EQ(codesInMask(masks[0]), 1U);
    EXPECT_EQ(masks[1].equipment, 7U);
    EXPECT_EQ(masks[1].itemCount, 0x131U);
    EXPECT_EQ(masks[2].equipment, 11U);
    EXPECT_EQ(masks[2].itemCount, 0xC3U);
    EXPECT_EQ(codesInMask(masks[2]), 2U);
    EXPECT_EQ(masks[2].bits[0xC1 / 8], 0x06U);  // items 0xC1 and 0xC2: bits 1 and 2 of byte 24
}

TEST(LogMasks, NIsTheReportedRangeWhenThatIsLargerAndTheWantedItemsOtherwise) {
    EquipmentRanges ranges{};
    ranges[0xB] = 0x209;  // above the highest wanted item
    ranges[0x4] = 0x010;  // below a wanted item: not trusted alone
    const std::vector<EquipmentLogMask> masks = logMasksFor(demandOf({0xB0C2, 0x4116}), ranges);
    ASSERT_EQ(masks.size(), 2U);
    EXPECT_EQ(masks[0].equipment, 4U);
    EXPECT_EQ(masks[0].itemCount, 0x117U);
    EXPECT_EQ(masks[0].bits.size(), 35U);
    EXPECT_EQ(masks[1].equipment, 11U);
    EXPECT_EQ(masks[1].itemCount, 0x209U);
    EXPECT_EQ(masks[1].bits.size(), 66U);  // ceil(0x209 / 8)
}

TEST(LogMasks, NeverMoreThan0x1000Items) {
    EquipmentRanges ranges{};
    ranges[1] = 0xFFFFFFFF;  // a device's absurd answer
    ranges[2] = 0x1001;
    const std::vector<EquipmentLogMask> masks = logMasksFor(demandOf({0x1001, 0x2FFF, 0x3FFF}), ranges);
    ASSERT_EQ(masks.size(), 3U);
    for (const EquipmentLogMask& mask : masks) {
        EXPECT_EQ(mask.itemCount, 0x1000U) << mask.equipment;
        EXPECT_EQ(mask.bits.size(), 0x200U) << mask.equipment;
    }
    EXPECT_EQ(masks[2].bits.back(), 0x80U);  // item 0xFFF, the last one
}

TEST(LogMasks, NothingWantedAsksForNothing) {
    EquipmentRanges ranges{};
    ranges[0xB] = 0x209;
    EXPECT_TRUE(logMasksFor(LogCodeFilter(), ranges).empty());
    // Extra codes come from elsewhere, never from the modem's log masks.
    LogCodeFilter extras;
    extras.addExtraCode(1);
    EXPECT_TRUE(logMasksFor(extras, ranges).empty());
}

TEST(LogMasks, TakingEverythingAsksForEveryItemOfEveryReportedId) {
    EquipmentRanges ranges{};
    ranges[1] = 0xFFF;
    ranges[6] = 0x1C;
    const std::vector<EquipmentLogMask> masks = logMasksFor(LogCodeFilter::everything(), ranges);
    ASSERT_EQ(masks.size(), 2U);
    EXPECT_EQ(masks[0].equipment, 1U);
    EXPECT_EQ(codesInMask(masks[0]), 0xFFFU);
    EXPECT_EQ(masks[1].equipment, 6U);
    EXPECT_EQ(masks[1].itemCount, 0x1CU);
    EXPECT_EQ(masks[1].bits, (Bytes{0xFF, 0xFF, 0xFF, 0x0F}));
}

TEST(LogMasks, UpdatesSendWhatChangedAndEmptyMasksForIdsNoLongerWanted) {
    EquipmentRanges ranges{};
    ranges[0xB] = 0x209;
    const std::vector<EquipmentLogMask> before = logMasksFor(demandOf({0xB0C2, 0x4116, 0x7130}), ranges);
    const std::vector<EquipmentLogMask> after = logMasksFor(demandOf({0xB0C2, 0xB0C1, 0x7130}), ranges);
    const std::vector<EquipmentLogMask> updates = maskUpdates(before, after);
    ASSERT_EQ(updates.size(), 2U);
    EXPECT_EQ(updates[0].equipment, 4U);  // no longer wanted: emptied, same N
    EXPECT_EQ(updates[0].itemCount, 0x117U);
    EXPECT_EQ(codesInMask(updates[0]), 0U);
    EXPECT_EQ(updates[0].bits.size(), 35U);
    EXPECT_EQ(updates[1].equipment, 11U);  // changed
    EXPECT_EQ(codesInMask(updates[1]), 2U);
    EXPECT_TRUE(maskUpdates(after, after).empty());
    EXPECT_EQ(maskUpdates({}, after), after);
}

}  // namespace
}  // namespace velmar::live
