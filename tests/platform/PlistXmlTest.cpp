// The XML encoding: exact output of serializeXml and writeXmlFile, and what parsePropertyList and
// readDictionaryFile make of well-formed documents.
#include <gtest/gtest.h>

#include <cmath>
#include <cstdint>
#include <initializer_list>
#include <limits>
#include <string>
#include <string_view>

#include "core/platform/plist/PlistCodec.h"
#include "tests/support/TestPaths.h"

namespace velmar {
namespace {

const std::string kPrologue =
    "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n"
    "<!DOCTYPE plist PUBLIC \"-//Brindle//DTD PLIST 1.0//EN\" \"PropertyList-1.0.dtd\">\n"
    "<plist version=\"1.0\">\n";

// A whole document: the prologue, the given lines each ended by "\n", and the closing tag.
std::string document(std::initializer_list<std::string_view> lines) {
    std::string text = kPrologue;
    for (const auto line : lines) {
        text.append(line);
        text.push_back('\n');
    }
    text.append("</plist>\n");
    return text;
}

std::string text(const PlistData& bytes) {
    return std::string(bytes.begin(), bytes.end());
}

std::span<const std::uint8_t> bytesOf(std::string_view text) {
    return {reinterpret_cast<const std::uint8_t*>(text.data()), text.size()};
}

std::optional<PlistValue> parseText(std::string_view document, std::string* error = nullptr) {
    return parsePropertyList(bytesOf(document), error);
}

// The serialised text, or a marker that cannot be mistaken for a document when serialisation fails.
std::string xmlOf(const PlistValue& value) {
    const auto bytes = serializeXml(value);
    return bytes ? text(*bytes) : std::string("<serializeXml failed>");
}

PlistValue dictionaryOf(std::initializer_list<std::pair<std::string_view, PlistValue>> entries) {
    auto dictionary = PlistDictionary::create();
    for (const auto& [key, value] : entries) {
        dictionary->set(key, value);
    }
    return PlistValue(dictionary);
}

PlistValue arrayOf(std::initializer_list<PlistValue> items) {
    return PlistValue(PlistArray::create(items));
}

TEST(PlistXmlWriter, WritesSmallDictionaryByteForByte) {
    const std::string expected =
        "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n"
        "<!DOCTYPE plist PUBLIC \"-//Brindle//DTD PLIST 1.0//EN\" \"PropertyList-1.0.dtd\">\n"
        "<plist version=\"1.0\">\n"
        "<dict>\n"
        "\t<key>GetTechnology</key>\n"
        "\t<string>GetTechnology</string>\n"
        "</dict>\n"
        "</plist>\n";
    EXPECT_EQ(xmlOf(dictionaryOf({{"GetTechnology", "GetTechnology"}})), expected);
}

TEST(PlistXmlWriter, IndentsNestedContainersOneTabPerLevel) {
    const PlistValue value = dictionaryOf({
        {"Display", dictionaryOf({
                        {"Rows", arrayOf({dictionaryOf({{"Name", "RSRP"}}), PlistValue::newArray()})},
                        {"Empty", PlistValue::newDictionary()},
                    })},
    });
    EXPECT_EQ(xmlOf(value), document({
                                "<dict>",
                                "\t<key>Display</key>",
                                "\t<dict>",
                                "\t\t<key>Rows</key>",
                                "\t\t<array>",
                                "\t\t\t<dict>",
                                "\t\t\t\t<key>Name</key>",
                                "\t\t\t\t<string>RSRP</string>",
                                "\t\t\t</dict>",
                                "\t\t\t<array/>",
                                "\t\t</array>",
                                "\t\t<key>Empty</key>",
                                "\t\t<dict/>",
                                "\t</dict>",
                                "</dict>",
                            }));
}

TEST(PlistXmlWriter, WritesEveryKind) {
    const PlistValue value = dictionaryOf({
        {"text", "a & b < c > d \"q\" 'r'"},
        {"empty", ""},
        {"negative", PlistValue::integer(-42)},
        {"largest", PlistValue::integer(std::numeric_limits<std::int64_t>::max())},
        {"smallest", PlistValue::integer(std::numeric_limits<std::int64_t>::min())},
        {"real", PlistValue::real(3.25)},
        {"tenth", PlistValue::real(0.1)},
        {"whole", PlistValue::real(-2.0)},
        {"huge", PlistValue::real(1e300)},
        {"yes", PlistValue::boolean(true)},
        {"no", PlistValue::boolean(false)},
        {"data", PlistValue::data({0x00, 0x01, 0xFE, 0xFF})},
        {"date", PlistValue::date(PlistDate{1772600767})},
        {"käse", "Grüße ✓"},
    });
    EXPECT_EQ(xmlOf(value), document({
                                "<dict>",
                                "\t<key>text</key>",
                                "\t<string>a &amp; b &lt; c &gt; d \"q\" 'r'</string>",
                                "\t<key>empty</key>",
                                "\t<string></string>",
                                "\t<key>negative</key>",
                                "\t<integer>-42</integer>",
                                "\t<key>largest</key>",
                                "\t<integer>9223372036854775807</integer>",
                                "\t<key>smallest</key>",
                                "\t<integer>-9223372036854775808</integer>",
                                "\t<key>real</key>",
                                "\t<real>3.25</real>",
                                "\t<key>tenth</key>",
                                "\t<real>0.1</real>",
                                "\t<key>whole</key>",
                                "\t<real>-2</real>",
                                "\t<key>huge</key>",
                                "\t<real>1e+300</real>",
                                "\t<key>yes</key>",
                                "\t<true/>",
                                "\t<key>no</key>",
                                "\t<false/>",
                                "\t<key>data</key>",
                                "\t<data>",
                                "\t\tAAH+/w==",
                                "\t</data>",
                                "\t<key>date</key>",
                                "\t<date>2026-03-04T05:06:07Z</date>",
                                "\t<key>käse</key>",
                                "\t<string>Grüße ✓</string>",
                                "</dict>",
                            }));
}

TEST(PlistXmlWriter, WrapsDataAtSeventySixCharacters) {
    PlistData bytes;
    for (int i = 0; i < 60; ++i) {
        bytes.push_back(static_cast<std::uint8_t>(i));
    }
    EXPECT_EQ(xmlOf(arrayOf({PlistValue::data(bytes), PlistValue::data({})})),
              document({
                  "<array>",
                  "\t<data>",
                  "\t\tAAECAwQFBgcICQoLDA0ODxAREhMUFRYXGBkaGxwdHh8gISIjJCUmJygpKissLS4vMDEyMzQ1Njc4",
                  "\t\tOTo7",
                  "\t</data>",
                  "\t<data>",
                  "\t</data>",
                  "</array>",
              }));
}

TEST(PlistXmlWriter, WritesScalarRootAtColumnZero) {
    EXPECT_EQ(xmlOf(PlistValue("alone")), document({"<string>alone</string>"}));
    EXPECT_EQ(xmlOf(PlistValue::newArray()), document({"<array/>"}));
    EXPECT_EQ(xmlOf(PlistValue::newDictionary()), document({"<dict/>"}));
}

TEST(PlistXmlWriter, WritesDatesBeforeNineteenSeventyAndDropsFractions) {
    EXPECT_EQ(xmlOf(PlistValue::date(PlistDate{-1})), document({"<date>1969-12-31T23:59:59Z</date>"}));
    EXPECT_EQ(xmlOf(PlistValue::date(PlistDate{-0.5})), document({"<date>1969-12-31T23:59:59Z</date>"}));
    EXPECT_EQ(xmlOf(PlistValue::date(PlistDate{951825600.75})),
              document({"<date>2000-02-29T12:00:00Z</date>"}));
    EXPECT_EQ(xmlOf(PlistValue::date(PlistDate{-62135596800})),
              document({"<date>0001-01-01T00:00:00Z</date>"}));
}

TEST(PlistXmlWriter, EscapesCarriageReturnSoThatItSurvives) {
    const PlistValue value("one\r\ntwo\tthree");
    EXPECT_EQ(xmlOf(value), document({"<string>one&#13;", "two\tthree</string>"}));
    const auto back = parsePropertyList(*serializeXml(value));
    ASSERT_TRUE(back);
    EXPECT_EQ(*back, value);
}

TEST(PlistXmlWriter, FailsOnNoneValueAnywhere) {
    EXPECT_FALSE(serializeXml(PlistValue()));
    EXPECT_FALSE(serializeXml(dictionaryOf({{"ok", "fine"}, {"missing", PlistValue()}})));
    EXPECT_FALSE(serializeXml(dictionaryOf({{"deep", arrayOf({PlistValue::integer(1), PlistValue()})}})));
}

TEST(PlistXmlWriter, FailsOnTextThatIsNotValidUtf8) {
    EXPECT_FALSE(serializeXml(dictionaryOf({{std::string_view("bad\xFFkey"), "value"}})));
    EXPECT_FALSE(serializeXml(dictionaryOf({{"key", std::string_view("over\xC0\xAFlong")}})));
    EXPECT_FALSE(serializeXml(arrayOf({std::string_view("surrogate \xED\xA0\x80")})));
    EXPECT_FALSE(serializeXml(arrayOf({std::string_view("cut \xE2\x9C")})));
}

TEST(PlistXmlWriter, FailsOnCharactersXmlCannotCarry) {
    EXPECT_FALSE(serializeXml(PlistValue(std::string("nul\0here", 8))));
    EXPECT_FALSE(serializeXml(PlistValue("bell\x07")));
    EXPECT_FALSE(serializeXml(PlistValue("not a character \xEF\xBF\xBE")));
}

TEST(PlistXmlWriter, FailsOnDatesOutsideFourDigitYears) {
    EXPECT_FALSE(serializeXml(PlistValue::date(PlistDate{-62167219201})));  // 0000-01-01 minus a second
    EXPECT_FALSE(serializeXml(PlistValue::date(PlistDate{253402300800})));  // 10000-01-01
    EXPECT_FALSE(serializeXml(PlistValue::date(PlistDate{std::numeric_limits<double>::infinity()})));
    EXPECT_EQ(xmlOf(PlistValue::date(PlistDate{253402300799})),
              document({"<date>9999-12-31T23:59:59Z</date>"}));
}

TEST(PlistXmlWriter, FailsOnTreeThatContainsItself) {
    auto array = PlistArray::create();
    array->append(PlistValue(array));
    EXPECT_FALSE(serializeXml(PlistValue(array)));
    array->clear();  // break the cycle so the array is freed
}

TEST(PlistXmlWriter, WriteXmlFileWritesTheSerialisedText) {
    testing::TemporaryDirectory directory;
    const std::string path = directory.file("state.plist");
    const PlistValue value =
        dictionaryOf({{"GetTechnology", "GetTechnology"}, {"n", PlistValue::integer(3)}});
    ASSERT_TRUE(writeXmlFile(value, path));
    EXPECT_EQ(testing::readWholeFile(path), xmlOf(value));
    // Writing again replaces the contents.
    const PlistValue smaller = dictionaryOf({{"a", "b"}});
    ASSERT_TRUE(writeXmlFile(smaller, path));
    EXPECT_EQ(testing::readWholeFile(path), xmlOf(smaller));
}

TEST(PlistXmlWriter, WriteXmlFileFailsOnUnwritablePathOrNonDictionary) {
    testing::TemporaryDirectory directory;
    EXPECT_FALSE(writeXmlFile(dictionaryOf({{"a", "b"}}), directory.file("missing/folder/state.plist")));
    EXPECT_FALSE(writeXmlFile(dictionaryOf({{"a", "b"}}), directory.path()));
    const std::string path = directory.file("array.plist");
    EXPECT_FALSE(writeXmlFile(arrayOf({PlistValue("a")}), path));
    EXPECT_FALSE(writeXmlFile(dictionaryOf({{"a", PlistValue()}}), path));
    EXPECT_EQ(testing::readWholeFile(path), "");
}

TEST(PlistXmlReader, ReadsTheSmallDictionary) {
    std::string error;
    const auto value = parseText(
        document({"<dict>", "\t<key>GetTechnology</key>", "\t<string>GetTechnology</string>", "</dict>"}),
        &error);
    ASSERT_TRUE(value) << error;
    EXPECT_EQ(*value, dictionaryOf({{"GetTechnology", "GetTechnology"}}));
}

TEST(PlistXmlReader, EmptyContainersComeBackEmpty) {
    for (const PlistValue& value : {PlistValue::newArray(), PlistValue::newDictionary()}) {
        const auto back = parsePropertyList(*serializeXml(value));
        ASSERT_TRUE(back);
        EXPECT_EQ(back->kind(), value.kind());
        EXPECT_EQ(*back, value);
    }
    const auto expanded = parseText("<plist><array></array></plist>");
    ASSERT_TRUE(expanded && expanded->isArray());
    EXPECT_TRUE(expanded->array()->empty());
    const auto emptyString = parseText("<plist><string></string></plist>");
    ASSERT_TRUE(emptyString && emptyString->isString());
    EXPECT_EQ(*emptyString->string(), "");
    const auto selfClosed = parseText("<plist><string/></plist>");
    ASSERT_TRUE(selfClosed && selfClosed->isString());
    EXPECT_EQ(*selfClosed->string(), "");
}

TEST(PlistXmlReader, RoundTripsEveryKind) {
    PlistData bytes;
    for (int i = 0; i < 300; ++i) {
        bytes.push_back(static_cast<std::uint8_t>(i * 7));
    }
    const PlistValue value = dictionaryOf({
        {"text", "a & b < c > d ]]> \"q\""},
        {"spaces", "  leading and trailing  \n"},
        {"unicode", "Grüße ✓ 𝄞"},
        {"empty", ""},
        {"negative", PlistValue::integer(-42)},
        {"zero", PlistValue::integer(0)},
        {"largest", PlistValue::integer(std::numeric_limits<std::int64_t>::max())},
        {"smallest", PlistValue::integer(std::numeric_limits<std::int64_t>::min())},
        {"real", PlistValue::real(3.25)},
        {"tenth", PlistValue::real(0.1)},
        {"third", PlistValue::real(1.0 / 3.0)},
        {"tiny", PlistValue::real(std::numeric_limits<double>::denorm_min())},
        {"max", PlistValue::real(std::numeric_limits<double>::max())},
        {"negativeZero", PlistValue::real(-0.0)},
        {"infinity", PlistValue::real(std::numeric_limits<double>::infinity())},
        {"minusInfinity", PlistValue::real(-std::numeric_limits<double>::infinity())},
        {"yes", PlistValue::boolean(true)},
        {"no", PlistValue::boolean(false)},
        {"data", PlistValue::data(bytes)},
        {"emptyData", PlistValue::data({})},
        {"date", PlistValue::date(PlistDate{1772600767})},
        {"early", PlistValue::date(PlistDate{-62135596800})},
        {"list", arrayOf({PlistValue::integer(1), "two", arrayOf({}), dictionaryOf({})})},
    });
    const auto xml = serializeXml(value);
    ASSERT_TRUE(xml);
    std::string error;
    const auto back = parsePropertyList(*xml, &error);
    ASSERT_TRUE(back) << error;
    EXPECT_EQ(*back, value);
    EXPECT_TRUE(std::signbit(*back->dictionary()->get("negativeZero").realValue()));
}

TEST(PlistXmlReader, KeepsDictionaryOrder) {
    const auto value = parseText(
        "<plist><dict><key>zeta</key><integer>1</integer><key>alpha</key><integer>2</integer>"
        "<key>mid</key><integer>3</integer></dict></plist>");
    ASSERT_TRUE(value && value->isDictionary());
    const auto& entries = value->dictionary()->entries();
    ASSERT_EQ(entries.size(), 3u);
    EXPECT_EQ(entries[0].first, "zeta");
    EXPECT_EQ(entries[1].first, "alpha");
    EXPECT_EQ(entries[2].first, "mid");
    EXPECT_EQ(xmlOf(*value),
              document({"<dict>", "\t<key>zeta</key>", "\t<integer>1</integer>", "\t<key>alpha</key>",
                        "\t<integer>2</integer>", "\t<key>mid</key>", "\t<integer>3</integer>", "</dict>"}));
}

TEST(PlistXmlReader, AcceptsByteOrderMarkLeadingSpaceAndBareRoot) {
    const auto withMark =
        parseText("\xEF\xBB\xBF\n  <?xml version=\"1.0\" encoding=\"UTF-8\"?>\n<plist><true/></plist>");
    ASSERT_TRUE(withMark);
    EXPECT_EQ(*withMark, PlistValue::boolean(true));
    const auto bare = parseText("<dict><key>a</key><array><false/></array></dict>");
    ASSERT_TRUE(bare);
    EXPECT_EQ(*bare, dictionaryOf({{"a", arrayOf({PlistValue::boolean(false)})}}));
    const auto noVersion = parseText("<plist>\n  <integer>7</integer>\n</plist>");
    ASSERT_TRUE(noVersion);
    EXPECT_EQ(*noVersion, PlistValue::integer(7));
}

TEST(PlistXmlReader, ReadsIntegerForms) {
    const struct {
        const char* text;
        std::int64_t value;
    } cases[] = {
        {"0", 0},
        {"-17", -17},
        {"+17", 17},
        {" 12 ", 12},
        {"0x1F", 31},
        {"0Xff", 255},
        {"-0x10", -16},
        {"9223372036854775807", std::numeric_limits<std::int64_t>::max()},
        {"-9223372036854775808", std::numeric_limits<std::int64_t>::min()},
        {"0x7FFFFFFFFFFFFFFF", std::numeric_limits<std::int64_t>::max()},
        {"-0x8000000000000000", std::numeric_limits<std::int64_t>::min()},
    };
    for (const auto& c : cases) {
        std::string error;
        const auto value = parseText("<plist><integer>" + std::string(c.text) + "</integer></plist>", &error);
        ASSERT_TRUE(value) << c.text << ": " << error;
        EXPECT_EQ(value->integerValue(), c.value) << c.text;
    }
}

TEST(PlistXmlReader, ReadsRealForms) {
    const struct {
        const char* text;
        double value;
    } cases[] = {
        {"1.5", 1.5},
        {"-2", -2.0},
        {"+0.25", 0.25},
        {"1e3", 1000.0},
        {" 6.02E23 ", 6.02e23},
        {".5", 0.5},
        {"inf", std::numeric_limits<double>::infinity()},
        {"-inf", -std::numeric_limits<double>::infinity()},
        {"+infinity", std::numeric_limits<double>::infinity()},
    };
    for (const auto& c : cases) {
        std::string error;
        const auto value = parseText("<plist><real>" + std::string(c.text) + "</real></plist>", &error);
        ASSERT_TRUE(value) << c.text << ": " << error;
        EXPECT_EQ(value->realValue(), c.value) << c.text;
    }
    const auto nan = parseText("<plist><real>nan</real></plist>");
    ASSERT_TRUE(nan && nan->isReal());
    EXPECT_TRUE(std::isnan(*nan->realValue()));
}

TEST(PlistXmlReader, ReadsDatesWithAndWithoutFraction) {
    const auto plain = parseText("<plist><date>2026-03-04T05:06:07Z</date></plist>");
    ASSERT_TRUE(plain);
    EXPECT_EQ(plain->dateValue(), PlistDate{1772600767});
    const auto fraction = parseText("<plist><date>2026-03-04T05:06:07.25Z</date></plist>");
    ASSERT_TRUE(fraction);
    EXPECT_EQ(fraction->dateValue(), PlistDate{1772600767.25});
    const auto leap = parseText("<plist><date>2000-02-29T12:00:00Z</date></plist>");
    ASSERT_TRUE(leap);
    EXPECT_EQ(leap->dateValue(), PlistDate{951825600});
    const auto early = parseText("<plist><date>1969-12-31T23:59:59Z</date></plist>");
    ASSERT_TRUE(early);
    EXPECT_EQ(early->dateValue(), PlistDate{-1});
}

TEST(PlistXmlReader, ReadsBase64AcrossLinesAndSpaces) {
    const auto value = parseText("<plist><data>\n\tAAH+\n\t/w==\n</data></plist>");
    ASSERT_TRUE(value && value->isData());
    EXPECT_EQ(*value->dataValue(), (PlistData{0x00, 0x01, 0xFE, 0xFF}));
    const auto twoPad = parseText("<plist><data>QQ==</data></plist>");
    ASSERT_TRUE(twoPad && twoPad->isData());
    EXPECT_EQ(*twoPad->dataValue(), (PlistData{'A'}));
    const auto onePad = parseText("<plist><data>QUI=</data></plist>");
    ASSERT_TRUE(onePad && onePad->isData());
    EXPECT_EQ(*onePad->dataValue(), (PlistData{'A', 'B'}));
}

TEST(PlistXmlReader, ReadsEscapesReferencesCdataAndComments) {
    const auto value = parseText(
        "<?xml version=\"1.0\"?>\n<!-- state -->\n<plist version=\"1.0\"><array>"
        "<string>&amp;&lt;&gt;&quot;&apos;&#65;&#x263A;</string>"
        "<!-- between --><string><![CDATA[<raw & text>]]></string>"
        "<?ignored instruction?><key-less/></array></plist>");
    EXPECT_FALSE(value);  // <key-less/> is not a property-list element
    const auto fine = parseText(
        "<?xml version=\"1.0\"?>\n<!-- state -->\n<plist version=\"1.0\"><array>"
        "<string>&amp;&lt;&gt;&quot;&apos;&#65;&#x263A;</string>"
        "<!-- between --><string><![CDATA[<raw & text>]]></string>"
        "<?ignored instruction?></array></plist>");
    ASSERT_TRUE(fine);
    EXPECT_EQ(*fine, arrayOf({"&<>\"'A\u263A", "<raw & text>"}));
}

TEST(PlistXmlReader, ReadsOtherDocumentEncodings) {
    // Latin-1 text comes back as UTF-8.
    const auto latin =
        parseText("<?xml version=\"1.0\" encoding=\"ISO-8859-1\"?><plist><string>caf\xE9</string></plist>");
    ASSERT_TRUE(latin);
    EXPECT_EQ(*latin->string(), "caf\xC3\xA9");
    // UTF-16 with a byte-order mark.
    std::string utf16 = "\xFF\xFE";
    for (const char c : std::string_view("<plist><string>hi</string></plist>")) {
        utf16.push_back(c);
        utf16.push_back('\0');
    }
    const auto wide = parseText(utf16);
    ASSERT_TRUE(wide);
    EXPECT_EQ(*wide->string(), "hi");
}

TEST(PlistXmlReader, LaterDuplicateKeyReplacesValueInPlace) {
    const auto value = parseText(
        "<dict><key>a</key><integer>1</integer><key>b</key><integer>2</integer><key>a</key><integer>3</"
        "integer>"
        "</dict>");
    ASSERT_TRUE(value);
    EXPECT_EQ(*value, dictionaryOf({{"a", PlistValue::integer(3)}, {"b", PlistValue::integer(2)}}));
}

TEST(PlistXmlReader, ReportsTheLineOfTheProblem) {
    std::string error;
    EXPECT_FALSE(
        parseText(document({"<dict>", "\t<key>n</key>", "\t<integer>12x</integer>", "</dict>"}), &error));
    EXPECT_EQ(error, "line 6: invalid or out-of-range integer '12x'");
    EXPECT_FALSE(parseText("\n\n<plist>\n<strin>x</strin></plist>", &error));
    EXPECT_EQ(error, "line 4: unknown element <strin>");
    EXPECT_FALSE(parseText("<plist>\n<string>x</plist>", &error));
    EXPECT_EQ(error.rfind("line 2: ", 0), 0u) << error;
}

TEST(PlistReadDictionaryFile, ReadsXmlAndBinaryDictionaries) {
    testing::TemporaryDirectory directory;
    const PlistValue value = dictionaryOf({{"Template", "LTE"}, {"Rows", arrayOf({PlistValue::integer(1)})}});
    const std::string xmlPath = directory.file("template.plist");
    ASSERT_TRUE(writeXmlFile(value, xmlPath));
    std::string error;
    const auto fromXml = readDictionaryFile(xmlPath, &error);
    ASSERT_TRUE(fromXml) << error;
    EXPECT_EQ(*fromXml, value);

    const std::string binaryPath = directory.file("template.bplist");
    const auto binary = serializeBinary(value);
    ASSERT_TRUE(binary);
    testing::writeWholeFile(binaryPath, text(*binary));
    const auto fromBinary = readDictionaryFile(binaryPath, &error);
    ASSERT_TRUE(fromBinary) << error;
    EXPECT_EQ(*fromBinary, value);
}

TEST(PlistReadDictionaryFile, FailsWithThePathInTheMessage) {
    testing::TemporaryDirectory directory;
    std::string error;
    const std::string missing = directory.file("missing.plist");
    EXPECT_FALSE(readDictionaryFile(missing, &error));
    EXPECT_EQ(error, missing + ": No such file or directory");

    const std::string arrayPath = directory.file("array.plist");
    testing::writeWholeFile(arrayPath, xmlOf(arrayOf({PlistValue("a")})));
    EXPECT_FALSE(readDictionaryFile(arrayPath, &error));
    EXPECT_EQ(error, arrayPath + ": the root is array, not a dictionary");

    const std::string brokenPath = directory.file("broken.plist");
    testing::writeWholeFile(brokenPath, "<plist>\n<dict><key>a</key></dict></plist>");
    EXPECT_FALSE(readDictionaryFile(brokenPath, &error));
    EXPECT_EQ(error, brokenPath + ": line 2: key 'a' has no value");
}

}  // namespace
}  // namespace velmar
