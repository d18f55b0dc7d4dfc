#include "core/platform/Json.h"

#include <gtest/gtest.h>

#include <cmath>
#include <limits>

namespace velmar {
namespace {

TEST(Json, EveryKindOnOneLine) {
    auto dictionary = PlistDictionary::create();
    dictionary->set("b", "text");
    dictionary->set("a", PlistValue::integer(-42));
    dictionary->set("real", PlistValue::real(2.5));
    dictionary->set("yes", PlistValue::boolean(true));
    dictionary->set("no", PlistValue::boolean(false));
    dictionary->set("bytes", PlistValue::data({0x01, 0x02, 0xFF}));
    dictionary->set("when", PlistValue::date({1700000000.0}));
    dictionary->set(
        "list", PlistArray::create({PlistValue("x"), PlistValue::newDictionary(), PlistValue::newArray()}));
    dictionary->set("none", PlistValue());
    EXPECT_EQ(plistToJson(dictionary),
              R"({"b": "text", "a": -42, "real": 2.5, "yes": true, "no": false, "bytes": {"$data": "AQL/"}, )"
              R"("when": {"$date": "2023-11-14T22:13:20Z"}, "list": ["x", {}, []], "none": null})");
}

TEST(Json, PrettyPrintingIndentsNestedContainers) {
    auto inner = PlistDictionary::create();
    inner->set("RSRP", "-95.25 dBm");
    auto outer = PlistDictionary::create();
    outer->set("Cell", inner);
    outer->set("Rows", PlistArray::create({PlistValue("1")}));
    EXPECT_EQ(plistToJson(outer, 2),
              "{\n  \"Cell\": {\n    \"RSRP\": \"-95.25 dBm\"\n  },\n  \"Rows\": [\n    \"1\"\n  ]\n}");
}

TEST(Json, StringsAreEscaped) {
    EXPECT_EQ(plistToJson(PlistValue("a\"b\\c\nd\te\x01")), R"("a\"b\\c\nd\te\u0001")");
    EXPECT_EQ(plistToJson(PlistValue("3 \xC3\x97 64chips")), "\"3 \xC3\x97 64chips\"");
}

TEST(Json, NonFiniteRealsBecomeNull) {
    EXPECT_EQ(plistToJson(PlistValue::real(std::numeric_limits<double>::quiet_NaN())), "null");
    EXPECT_EQ(plistToJson(PlistValue::real(INFINITY)), "null");
}

}  // namespace
}  // namespace velmar
