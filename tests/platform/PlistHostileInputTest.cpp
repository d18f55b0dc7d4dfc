// Hostile and broken documents: every one must fail cleanly (nullopt and a one-line reason naming the line
// or byte offset) without reading outside the buffer, recursing without bound or allocating without bound.
#include <gtest/gtest.h>

#include <bit>
#include <cstdint>
#include <initializer_list>
#include <string>
#include <string_view>
#include <vector>

#include "core/platform/plist/PlistCodec.h"

namespace velmar {
namespace {

using Bytes = std::vector<std::uint8_t>;

std::span<const std::uint8_t> bytesOf(std::string_view text) {
    return {reinterpret_cast<const std::uint8_t*>(text.data()), text.size()};
}

// Parses text, expecting a failure whose message starts with prefix and mentions fragment.
void expectFailure(std::span<const std::uint8_t> document, std::string_view prefix,
                   std::string_view fragment) {
    std::string error;
    const auto value = parsePropertyList(document, &error);
    EXPECT_FALSE(value) << "accepted: " << std::string(document.begin(), document.end()).substr(0, 200);
    EXPECT_EQ(error.rfind(prefix, 0), 0u) << error;
    EXPECT_NE(error.find(fragment), std::string::npos) << "message: " << error;
    EXPECT_EQ(error.find('\n'), std::string::npos) << error;
}

void expectXmlFailure(std::string_view document, std::string_view fragment) {
    expectFailure(bytesOf(document), "line ", fragment);
}

std::string wrapped(std::string_view value) {
    return "<plist version=\"1.0\">" + std::string(value) + "</plist>";
}

void appendBigEndian(Bytes& out, std::uint64_t value, int width) {
    for (int i = width - 1; i >= 0; --i) {
        out.push_back(static_cast<std::uint8_t>(value >> (8 * i)));
    }
}

struct Trailer {
    std::uint8_t offsetWidth = 0;  // 0: the smallest that holds the offsets
    std::uint8_t refWidth = 1;
    std::optional<std::uint64_t> objectCount = std::nullopt;
    std::uint64_t topObject = 0;
    std::optional<std::uint64_t> tableOffset = std::nullopt;
};

// A binary document of the given objects (each a marker and its contents, references already refWidth
// bytes wide); the trailer's fields may be overridden to make it lie.
Bytes assemble(const std::vector<Bytes>& objects, Trailer trailer = {}) {
    Bytes out = {'b', 'p', 'l', 'i', 's', 't', '0', '0'};
    std::vector<std::uint64_t> offsets;
    for (const Bytes& object : objects) {
        offsets.push_back(out.size());
        out.insert(out.end(), object.begin(), object.end());
    }
    const std::uint64_t table = out.size();
    const int width = trailer.offsetWidth != 0 ? trailer.offsetWidth
                      : table > 0xFFFF         ? 4
                      : table > 0xFF           ? 2
                                               : 1;
    for (const auto offset : offsets) {
        appendBigEndian(out, offset, width > 8 ? 8 : width);
    }
    out.insert(out.end(), 6, 0);
    out.push_back(static_cast<std::uint8_t>(width));
    out.push_back(trailer.refWidth);
    appendBigEndian(out, trailer.objectCount.value_or(objects.size()), 8);
    appendBigEndian(out, trailer.topObject, 8);
    appendBigEndian(out, trailer.tableOffset.value_or(table), 8);
    return out;
}

void expectBinaryFailure(const Bytes& document, std::string_view fragment) {
    expectFailure(document, "offset ", fragment);
}

// Arrays nested levels deep, each holding the next, the innermost empty; two-byte references.
Bytes nestedBinaryArrays(int levels) {
    std::vector<Bytes> objects;
    for (int i = 0; i + 1 < levels; ++i) {
        objects.push_back({0xA1, static_cast<std::uint8_t>((i + 1) >> 8), static_cast<std::uint8_t>(i + 1)});
    }
    objects.push_back({0xA0});
    return assemble(objects, Trailer{.refWidth = 2});
}

std::string nestedXmlArrays(int levels) {
    std::string text;
    for (int i = 0; i < levels; ++i) {
        text += "<array>";
    }
    for (int i = 0; i < levels; ++i) {
        text += "</array>";
    }
    return wrapped(text);
}

TEST(PlistHostileXml, RejectsNestingBeyondTheLimit) {
    expectXmlFailure(nestedXmlArrays(600), "nested deeper than 512");
    expectXmlFailure(nestedXmlArrays(kMaxPlistDepth + 1), "nested deeper than 512");
    const auto deepest = parsePropertyList(bytesOf(nestedXmlArrays(kMaxPlistDepth)));
    ASSERT_TRUE(deepest);
    int depth = 0;
    for (PlistValue at = *deepest; at.isArray();
         at = at.array()->empty() ? PlistValue() : at.array()->at(0)) {
        ++depth;
    }
    EXPECT_EQ(depth, kMaxPlistDepth);
    std::string dictionaries;
    for (int i = 0; i < 600; ++i) {
        dictionaries += "<dict><key>k</key>";
    }
    expectXmlFailure(wrapped(dictionaries), "nested deeper than 512");
}

TEST(PlistHostileXml, RejectsEntityDeclarations) {
    const std::string laughs =
        "<?xml version=\"1.0\"?>\n"
        "<!DOCTYPE plist [\n"
        " <!ENTITY lol \"lol\">\n"
        " <!ENTITY lol1 \"&lol;&lol;&lol;&lol;&lol;&lol;&lol;&lol;&lol;&lol;\">\n"
        " <!ENTITY lol2 \"&lol1;&lol1;&lol1;&lol1;&lol1;&lol1;&lol1;&lol1;&lol1;&lol1;\">\n"
        " <!ENTITY lol3 \"&lol2;&lol2;&lol2;&lol2;&lol2;&lol2;&lol2;&lol2;&lol2;&lol2;\">\n"
        " <!ENTITY lol9 \"&lol3;&lol3;&lol3;&lol3;&lol3;&lol3;&lol3;&lol3;&lol3;&lol3;\">\n"
        "]>\n"
        "<plist><string>&lol9;</string></plist>\n";
    std::string error;
    EXPECT_FALSE(parsePropertyList(bytesOf(laughs), &error));
    EXPECT_EQ(error, "line 2: document type declarations with an internal subset are not accepted");
}

TEST(PlistHostileXml, NeverLoadsExternalEntities) {
    expectXmlFailure(
        "<?xml version=\"1.0\"?>\n<!DOCTYPE plist [<!ENTITY xxe SYSTEM \"file:///etc/passwd\">]>\n"
        "<plist><string>&xxe;</string></plist>",
        "internal subset");
    expectXmlFailure(
        "<?xml version=\"1.0\"?>\n<!DOCTYPE plist [<!ENTITY % dtd SYSTEM \"file:///etc/passwd\"> %dtd;]>\n"
        "<plist><string>x</string></plist>",
        "internal subset");
    // An external DTD is named but never read, so an entity it might declare is undeclared here.
    std::string error;
    EXPECT_FALSE(
        parsePropertyList(bytesOf("<?xml version=\"1.0\"?>\n<!DOCTYPE plist SYSTEM \"file:///etc/passwd\">\n"
                                  "<plist><string>&passwd;</string></plist>"),
                          &error));
    EXPECT_EQ(error, "line 3: reference to undeclared entity 'passwd'");
    expectXmlFailure("<plist><string>&undeclared;</string></plist>", "undefined entity");
}

TEST(PlistHostileXml, AcceptsTheStandardDocumentType) {
    const auto value = parsePropertyList(
        bytesOf("<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n<!DOCTYPE plist PUBLIC \"-//Brindle//DTD PLIST "
                "1.0//EN\" \"PropertyList-1.0.dtd\">\n<plist version=\"1.0\"><string>ok &amp; "
                "fine</string></plist>"));
    ASSERT_TRUE(value && value->isString());
    EXPECT_EQ(*value->string(), "ok & fine");
}

TEST(PlistHostileXml, SurvivesTruncationAtEveryLength) {
    const std::string full =
        "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n"
        "<!DOCTYPE plist PUBLIC \"-//Brindle//DTD PLIST 1.0//EN\" \"PropertyList-1.0.dtd\">\n"
        "<plist version=\"1.0\">\n<dict>\n\t<key>Name</key>\n\t<string>a &amp; b \xC3\xBC</string>\n"
        "\t<key>n</key>\n\t<integer>-12</integer>\n\t<key>d</key>\n\t<data>AAH+/w==</data>\n"
        "\t<key>when</key>\n\t<date>2026-03-04T05:06:07Z</date>\n\t<key>list</key>\n"
        "\t<array><real>1.5</real><true/><false/><array/></array>\n</dict>\n</plist>\n";
    const auto whole = parsePropertyList(bytesOf(full));
    ASSERT_TRUE(whole);
    int accepted = 0;
    for (std::size_t length = 0; length < full.size(); ++length) {
        // A copy of exactly this length, so that reading one byte past it is caught by the sanitizers.
        const Bytes cut(full.begin(), full.begin() + static_cast<std::ptrdiff_t>(length));
        std::string error;
        const auto value = parsePropertyList(cut, &error);
        if (value) {
            EXPECT_EQ(*value, *whole) << "length " << length;
            ++accepted;
        } else {
            EXPECT_EQ(error.rfind("line ", 0), 0u) << "length " << length << ": " << error;
        }
    }
    // Only the cut that drops the final line end still holds the whole document.
    EXPECT_EQ(accepted, 1);
}

TEST(PlistHostileXml, RejectsBadBase64) {
    for (const char* text :
         {"AAH", "A===", "AA=A", "AA==AA==", "@@@@", "AAH+/w=", "QQ==QQ==", "QQ=\n=Q", "Q"}) {
        expectXmlFailure(wrapped("<data>" + std::string(text) + "</data>"), "invalid base64");
    }
}

TEST(PlistHostileXml, RejectsBadDates) {
    for (const char* text :
         {"2026-13-01T00:00:00Z", "2026-00-10T00:00:00Z", "2026-01-00T00:00:00Z", "2026-02-29T00:00:00Z",
          "1900-02-29T00:00:00Z", "2026-04-31T00:00:00Z", "2026-01-01T24:00:00Z", "2026-01-01T23:60:00Z",
          "2026-01-01T23:59:60Z", "2026-01-01 00:00:00Z", "2026-01-01T00:00:00", "2026-01-01T00:00:00+01:00",
          "26-01-01T00:00:00Z", "2026-01-01T00:00:00.Z", "2026-1-01T00:00:00Z", "2026-01-01T00:00:00ZZ", "",
          "yesterday"}) {
        expectXmlFailure(wrapped("<date>" + std::string(text) + "</date>"), "invalid date");
    }
    std::string error;
    EXPECT_FALSE(parsePropertyList(bytesOf("<plist>\n<date>2026-13-01T00:00:00Z</date></plist>"), &error));
    EXPECT_EQ(error, "line 2: invalid date '2026-13-01T00:00:00Z'");
}

TEST(PlistHostileXml, RejectsIntegerOverflowAndGarbage) {
    for (const char* text :
         {"9223372036854775808", "-9223372036854775809", "0x8000000000000000", "18446744073709551615",
          "99999999999999999999999", "", "12x", "1.5", "--1", "+-1", "0x", "0xG", "1 2", "- 1"}) {
        expectXmlFailure(wrapped("<integer>" + std::string(text) + "</integer>"), "integer");
    }
    std::string error;
    EXPECT_FALSE(parsePropertyList(bytesOf(wrapped("<integer>9223372036854775808</integer>")), &error));
    EXPECT_EQ(error, "line 1: invalid or out-of-range integer '9223372036854775808'");
}

TEST(PlistHostileXml, RejectsBadReals) {
    for (const char* text : {"", "abc", "1.5.2", "1,5", "1e400", "0x1p3", "++1", "+-1", "1.5 x"}) {
        expectXmlFailure(wrapped("<real>" + std::string(text) + "</real>"), "real");
    }
}

TEST(PlistHostileXml, RejectsInvalidUtf8) {
    expectXmlFailure(wrapped("<string>bad \xFF byte</string>"), "");
    expectXmlFailure(wrapped("<string>overlong \xC0\xAF</string>"), "");
    expectXmlFailure(wrapped("<string>surrogate \xED\xA0\x80</string>"), "");
    expectXmlFailure(wrapped("<string>cut \xE2\x9C</string>"), "");
    expectXmlFailure(wrapped("<dict><key>k\xFE</key><true/></dict>"), "");
    expectXmlFailure(wrapped("<string>&#xD800;</string>"), "");
    expectXmlFailure(wrapped("<string>&#0;</string>"), "");
    expectXmlFailure(wrapped("<string>&#x1;</string>"), "");
    expectXmlFailure(wrapped("<string>\x01</string>"), "");
    expectXmlFailure(wrapped("<string>\xEF\xBF\xBF</string>"), "");
}

TEST(PlistHostileXml, RejectsMalformedDictionaries) {
    expectXmlFailure(wrapped("<dict><integer>1</integer><string>x</string></dict>"),
                     "expected <key> in <dict>, found <integer>");
    expectXmlFailure(wrapped("<dict><key>a</key></dict>"), "key 'a' has no value");
    expectXmlFailure(wrapped("<dict><key>a</key><key>b</key><true/></dict>"), "key 'a' has no value");
    expectXmlFailure(wrapped("<dict><key>a</key><true/><true/></dict>"),
                     "expected <key> in <dict>, found <true>");
    expectXmlFailure(wrapped("<array><key>a</key></array>"), "<key> outside a dictionary");
    expectXmlFailure(wrapped("<key>a</key>"), "<key> outside a dictionary");
    expectXmlFailure("<key>a</key>", "<key> outside a dictionary");
    expectXmlFailure(wrapped("<dict><key>a<b/></key><true/></dict>"), "unknown element <b>");
    expectXmlFailure(wrapped("<dict><key>a<true/></key><true/></dict>"), "element <true> inside <key>");
}

TEST(PlistHostileXml, RejectsUnknownElementsStrayTextAndBadStructure) {
    expectXmlFailure(wrapped("<foo/>"), "unknown element <foo>");
    expectXmlFailure("<foo/>", "unknown element <foo>");
    expectXmlFailure(wrapped("<\xC3\xA9l\xC3\xA9ment/>"), "unknown element <??l??ment>");
    expectXmlFailure(wrapped("<dict><key>a</key><bar/></dict>"), "unknown element <bar>");
    expectXmlFailure(wrapped("hello<true/>"), "unexpected text 'hello' in <plist>");
    expectXmlFailure(wrapped("<dict>x<key>a</key><true/></dict>"), "unexpected text 'x' in <dict>");
    expectXmlFailure(wrapped("<array>x</array>"), "unexpected text");
    expectXmlFailure(wrapped("<true>yes</true>"), "unexpected text 'yes' in <true>");
    expectXmlFailure(wrapped(""), "<plist> holds no value");
    expectXmlFailure(wrapped("<true/><false/>"), "more than one value in <plist>");
    expectXmlFailure(wrapped("<plist><true/></plist>"), "<plist> inside <plist>");
    expectXmlFailure(wrapped("<array><plist/></array>"), "<plist> inside a value");
    expectXmlFailure(wrapped("<string><string/></string>"), "element <string> inside <string>");
    expectXmlFailure("", "no element found");
    expectXmlFailure("  \n ", "no element found");
    expectXmlFailure(wrapped("<true/>") + "<true/>", "junk after document element");
    expectXmlFailure("<plist><string>open</plist>", "mismatched tag");
    expectXmlFailure("bplist01", "syntax error");
}

// ---- binary ----

TEST(PlistHostileBinary, RejectsNestingBeyondTheLimit) {
    expectBinaryFailure(nestedBinaryArrays(600), "nested deeper than 512");
    expectBinaryFailure(nestedBinaryArrays(kMaxPlistDepth + 1), "nested deeper than 512");
    EXPECT_TRUE(parsePropertyList(nestedBinaryArrays(kMaxPlistDepth)));
}

TEST(PlistHostileBinary, RejectsReferenceCycles) {
    expectBinaryFailure(assemble({{0xA1, 0x00}}), "object 0 contains itself");
    expectBinaryFailure(assemble({{0xA1, 0x01}, {0xA1, 0x00}}), "object 0 contains itself");
    expectBinaryFailure(assemble({{0xA2, 0x01, 0x02}, {0x10, 0x05}, {0xD1, 0x03, 0x00}, {0x51, 'k'}}),
                        "object 0 contains itself");
    // Sharing without a cycle is fine: the same string twice and the same array twice.
    const auto shared = parsePropertyList(assemble({{0xA3, 0x01, 0x01, 0x02}, {0x51, 's'}, {0xA1, 0x01}}));
    ASSERT_TRUE(shared);
    const PlistValue inner(PlistArray::create({PlistValue("s")}));
    EXPECT_EQ(*shared, PlistValue(PlistArray::create({PlistValue("s"), PlistValue("s"), inner})));
}

TEST(PlistHostileBinary, BoundsTheExpansionOfSharedObjects) {
    // Each array holds the next one twice: 64 levels would decode to 2^64 values.
    std::vector<Bytes> objects;
    for (int i = 0; i < 64; ++i) {
        objects.push_back({0xA2, static_cast<std::uint8_t>(i + 1), static_cast<std::uint8_t>(i + 1)});
    }
    objects.push_back({0x5F, 0x10, 0x20});
    objects.back().insert(objects.back().end(), 32, 'x');
    expectBinaryFailure(assemble(objects), "far larger than the file");
}

TEST(PlistHostileBinary, RejectsOutOfRangeOffsetsAndReferences) {
    const Bytes good = assemble({{0xA1, 0x01}, {0x09}});
    ASSERT_TRUE(parsePropertyList(good));
    // Offset table entry of object 1 pointing past the objects.
    Bytes bad = good;
    bad[8 + 3 + 1] = 0x40;
    expectBinaryFailure(bad, "outside the object area");
    // ... and into the magic.
    bad[8 + 3 + 1] = 0x02;
    expectBinaryFailure(bad, "outside the object area");
    expectBinaryFailure(assemble({{0xA1, 0x07}, {0x09}}), "object reference 7 out of range");
    expectBinaryFailure(assemble({{0x09}}, Trailer{.topObject = 1}), "top object 1 out of range");
    expectBinaryFailure(assemble({{0x09}}, Trailer{.tableOffset = 4}),
                        "offset table position 4 out of range");
    expectBinaryFailure(assemble({{0x09}}, Trailer{.tableOffset = 1000}),
                        "offset table position 1000 out of range");
    expectBinaryFailure(assemble({{0x09}}, Trailer{.objectCount = 0}), "no objects");
    expectBinaryFailure(assemble({{0x09}}, Trailer{.objectCount = 1ULL << 60}),
                        "does not fit the offset table");
    expectBinaryFailure(assemble({{0x09}}, Trailer{.objectCount = ~0ULL}), "does not fit the offset table");
    expectBinaryFailure(assemble({{0x09}}, Trailer{.topObject = ~0ULL}), "out of range");
    expectBinaryFailure(assemble({{0x09}}, Trailer{.offsetWidth = 9}), "invalid offset size 9");
    expectBinaryFailure(assemble({{0x09}}, Trailer{.refWidth = 0}), "invalid object reference size 0");
    expectBinaryFailure(assemble({{0x09}}, Trailer{.refWidth = 9}), "invalid object reference size 9");
}

TEST(PlistHostileBinary, RejectsHugeCounts) {
    Bytes hugeArray = {0xAF, 0x13};
    appendBigEndian(hugeArray, 1ULL << 62, 8);
    expectBinaryFailure(assemble({hugeArray}), "runs past the object area");
    Bytes hugeDictionary = {0xDF, 0x13};
    appendBigEndian(hugeDictionary, (1ULL << 63) - 1, 8);
    expectBinaryFailure(assemble({hugeDictionary}), "runs past the object area");
    expectBinaryFailure(assemble({{0x4F, 0x12, 0xFF, 0xFF, 0xFF, 0xFF}}), "data length 4294967295 runs past");
    expectBinaryFailure(assemble({{0x5F, 0x11, 0xFF, 0xFF, 'a'}}), "string length 65535 runs past");
    expectBinaryFailure(assemble({{0x6F, 0x10, 0x02, 0x00, 'a'}}), "string length 2 runs past");
    expectBinaryFailure(assemble({{0x43, 0x01, 0x02}}), "data length 3 runs past");
    Bytes negative = {0x4F, 0x13};
    appendBigEndian(negative, ~0ULL, 8);
    expectBinaryFailure(assemble({negative}), "negative object count");
    expectBinaryFailure(assemble({{0x4F, 0x23, 0, 0, 0, 0, 0, 0, 0, 0}}), "object count is not an integer");
    expectBinaryFailure(assemble({{0x4F}}), "truncated object count");
    expectBinaryFailure(assemble({{0x4F, 0x13, 0x00}}), "truncated object count");
}

TEST(PlistHostileBinary, RejectsBadObjects) {
    expectBinaryFailure(assemble({{0x00}}), "null object");
    expectBinaryFailure(assemble({{0x0F}}), "unknown object marker 0x0f");
    expectBinaryFailure(assemble({{0x80, 0x01}}), "unsupported object marker 0x80");
    expectBinaryFailure(assemble({{0x71, 'a'}}), "unsupported object marker 0x71");
    expectBinaryFailure(assemble({{0x15, 0x00}}), "invalid integer size");
    expectBinaryFailure(assemble({{0x13, 0x00, 0x01}}), "truncated integer");
    expectBinaryFailure(assemble({{0x21, 0x00, 0x00}}), "unsupported real size");
    expectBinaryFailure(assemble({{0x23, 0x00}}), "truncated real");
    expectBinaryFailure(assemble({{0x34, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0}}),
                        "unsupported date");
    expectBinaryFailure(assemble({{0x33, 0x7F, 0xF8, 0, 0, 0, 0, 0, 0}}), "date is not a finite number");
    expectBinaryFailure(assemble({{0x51, 0xE9}}), "ASCII string holds a byte above 0x7F");
    expectBinaryFailure(assemble({{0x61, 0xD8, 0x00}}), "unpaired UTF-16 surrogate");
    expectBinaryFailure(assemble({{0x61, 0xDC, 0x00}}), "unpaired UTF-16 surrogate");
    expectBinaryFailure(assemble({{0x62, 0xD8, 0x00, 0x00, 0x41}}), "unpaired UTF-16 surrogate");
    expectBinaryFailure(assemble({{0xD1, 0x01, 0x02}, {0x10, 0x01}, {0x51, 'x'}}),
                        "dictionary key is not a string");
    expectBinaryFailure(assemble({{0xD1, 0x01, 0x02}, {0xA0}, {0x51, 'x'}}),
                        "dictionary key is not a string");
    std::string error;
    EXPECT_FALSE(parsePropertyList(assemble({{0xA2, 0x01, 0x02}, {0x09}, {0x00}}), &error));
    EXPECT_EQ(error, "offset 12: null object");
}

TEST(PlistHostileBinary, RejectsDocumentsTooShortForTheTrailer) {
    expectBinaryFailure(Bytes{'b', 'p', 'l', 'i', 's', 't', '0', '0'}, "too short");
    Bytes almost = assemble({{0x09}});
    almost.erase(almost.begin() + 8);  // drop the only object: the trailer now claims more than there is
    expectBinaryFailure(almost, "");
}

PlistValue sample() {
    auto rows = PlistArray::create();
    for (int i = 0; i < 20; ++i) {
        auto row = PlistDictionary::create();
        row->set("Name", "Cell " + std::to_string(i));
        row->set("Value", PlistValue::integer(-90 - i));
        rows->append(PlistValue(row));
    }
    auto root = PlistDictionary::create();
    root->set("Rows", PlistValue(rows));
    root->set("Grüße", PlistValue::real(2.5));
    root->set("When", PlistValue::date(PlistDate{1772600767}));
    root->set("Blob", PlistValue::data(PlistData(40, 7)));
    return PlistValue(root);
}

TEST(PlistHostileBinary, SurvivesTruncationAtEveryLength) {
    const auto full = serializeBinary(sample());
    ASSERT_TRUE(full);
    for (std::size_t length = 0; length < full->size(); ++length) {
        const Bytes cut(full->begin(), full->begin() + static_cast<std::ptrdiff_t>(length));
        std::string error;
        const auto value = parsePropertyList(cut, &error);
        if (value) {
            EXPECT_EQ(*value, sample()) << "length " << length;
        } else {
            EXPECT_FALSE(error.empty()) << "length " << length;
        }
    }
}

TEST(PlistHostileBinary, SurvivesEverySingleByteCorruption) {
    const auto full = serializeBinary(sample());
    ASSERT_TRUE(full);
    int rejected = 0;
    for (std::size_t at = 8; at < full->size(); ++at) {
        for (const std::uint8_t replacement :
             {std::uint8_t{0x00}, std::uint8_t{0xFF}, static_cast<std::uint8_t>((*full)[at] ^ 0x80),
              static_cast<std::uint8_t>((*full)[at] + 1)}) {
            Bytes corrupt = *full;
            corrupt[at] = replacement;
            std::string error;
            const auto value = parsePropertyList(corrupt, &error);
            if (value) {
                // Whatever was accepted is a complete property list.
                EXPECT_TRUE(serializeBinary(*value)) << "byte " << at;
            } else {
                EXPECT_EQ(error.rfind("offset ", 0), 0u) << error;
                ++rejected;
            }
        }
    }
    EXPECT_GT(rejected, 0);
}

}  // namespace
}  // namespace velmar
