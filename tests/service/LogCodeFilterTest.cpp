#include "service/LogCodeFilter.h"

#include <gtest/gtest.h>

#include <vector>

#include "service/BasebandBlob.h"

namespace velmar {
namespace {

using Bytes = std::vector<std::uint8_t>;

TEST(BasebandBlob, ReadsTypeAndCodeBehindAnOptionalPrefix) {
    const Bytes ordinary = {0x01, 0x0D, 0x00, 0x79, 0xB1, 0x00};
    const BasebandBlob plain = frameBasebandBlob(ordinary);
    EXPECT_EQ(plain.kind, BlobKind::Ordinary);
    EXPECT_EQ(plain.code, 0xB179);
    EXPECT_EQ(plain.bytes.data(), ordinary.data());
    EXPECT_EQ(plain.bytes.size(), ordinary.size());

    const Bytes prefixed = {0x81, 0x07, 0xFF, 0x0D, 0x00, 0x02, 0x00};
    const BasebandBlob extended = frameBasebandBlob(prefixed);
    EXPECT_EQ(extended.kind, BlobKind::Extended);
    EXPECT_EQ(extended.code, 0x0002);
    EXPECT_EQ(extended.bytes.size(), prefixed.size());  // the prefix stays in the blob

    const Bytes cases[] = {
        {0x01, 0x0D, 0x00, 0xC1},        // too short for the code
        {0x02, 0x0D, 0x00, 0xC1, 0xB0},  // no known log type
        {0x81},                          // a prefix marker alone
        {0x81, 0x00, 0x01, 0x0D, 0x00, 0xC1},
        {},
    };
    for (const Bytes& bytes : cases) {
        EXPECT_EQ(frameBasebandBlob(bytes).kind, BlobKind::Unframed);
    }
}

PlistValue integers(std::initializer_list<std::int64_t> values) {
    auto array = PlistArray::create();
    for (const std::int64_t value : values) {
        array->append(PlistValue::integer(value));
    }
    return array;
}

BasebandBlob blob(BlobKind kind, std::uint16_t code) {
    BasebandBlob result;
    result.kind = kind;
    result.code = code;
    return result;
}

TEST(LogCodeFilter, TakesThePlainAndExtraCodesOfTheStartCommand) {
    PlistDictionary command;
    command.set("SetState", "Streaming");
    command.set("SetOrvaneLogCodes", integers({0xB0C1, 0xB179}));
    command.set("SetKxExtraCodes", integers({1}));
    std::size_t ignored = 99;
    std::string reason;
    const std::optional<LogCodeFilter> filter = LogCodeFilter::fromStartCommand(command, ignored, reason);
    ASSERT_TRUE(filter);
    EXPECT_EQ(ignored, 0U);
    EXPECT_EQ(filter->codeCount(), 2U);
    EXPECT_EQ(filter->extraCodeCount(), 1U);
    EXPECT_TRUE(filter->accepts(blob(BlobKind::Ordinary, 0xB0C1)));
    EXPECT_TRUE(filter->accepts(blob(BlobKind::Ordinary, 0xB179)));
    EXPECT_FALSE(filter->accepts(blob(BlobKind::Ordinary, 0xB0C2)));
    EXPECT_FALSE(filter->accepts(blob(BlobKind::Ordinary, 0x0001)));
    EXPECT_TRUE(filter->accepts(blob(BlobKind::Extended, 0x0001)));
    EXPECT_FALSE(filter->accepts(blob(BlobKind::Extended, 0xB0C1)));
    EXPECT_FALSE(filter->accepts(blob(BlobKind::Unframed, 0xB0C1)));
}

TEST(LogCodeFilter, MissingListsNameNoCodesAndBadElementsAreCounted) {
    PlistDictionary command;
    command.set("SetState", "Streaming");
    std::size_t ignored = 0;
    std::string reason;
    const std::optional<LogCodeFilter> none = LogCodeFilter::fromStartCommand(command, ignored, reason);
    ASSERT_TRUE(none);
    EXPECT_FALSE(none->accepts(blob(BlobKind::Ordinary, 0)));
    EXPECT_FALSE(none->accepts(blob(BlobKind::Extended, 0)));

    auto mixed = PlistArray::create();
    mixed->append(PlistValue::integer(-1));
    mixed->append(PlistValue::integer(0x10000));
    mixed->append(PlistValue::integer(0xFFFF));
    mixed->append(PlistValue::real(2.0));
    mixed->append("7");
    command.set("SetKxExtraCodes", mixed);
    const std::optional<LogCodeFilter> some = LogCodeFilter::fromStartCommand(command, ignored, reason);
    ASSERT_TRUE(some);
    EXPECT_EQ(ignored, 4U);
    EXPECT_EQ(some->extraCodeCount(), 1U);
    EXPECT_TRUE(some->accepts(blob(BlobKind::Extended, 0xFFFF)));

    command.set("SetOrvaneLogCodes", "everything");
    EXPECT_FALSE(LogCodeFilter::fromStartCommand(command, ignored, reason));
    EXPECT_EQ(reason, "SetOrvaneLogCodes is not an array");
}

TEST(LogCodeFilter, EverythingTakesBlobsOfAnyFraming) {
    const LogCodeFilter all = LogCodeFilter::everything();
    EXPECT_TRUE(all.takesEverything());
    EXPECT_TRUE(all.accepts(blob(BlobKind::Ordinary, 0x1234)));
    EXPECT_TRUE(all.accepts(blob(BlobKind::Extended, 0x0002)));
    EXPECT_TRUE(all.accepts(blob(BlobKind::Unframed, 0)));
    EXPECT_FALSE(LogCodeFilter().accepts(blob(BlobKind::Unframed, 0)));
}

}  // namespace
}  // namespace velmar
