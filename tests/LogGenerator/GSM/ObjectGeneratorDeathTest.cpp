// Nothing catches the object-based generator's assertion failure: once it leaves the generator the program
// ends (std::terminate), with the failure's text on standard error.
#include <gtest/gtest.h>

#include <thread>

#include "LogGenerator/GSM/GSMLogGenerator.h"
#include "logfile/records/ObjectBlobRecords.h"

namespace velmar {
namespace {

// Runs the blob through a fresh generator on a thread of its own, outside any handler of the test framework.
void decodeUncaught(const PlistData& blob) {
    std::thread([blob]() {
        GSMLogGenerator generator;
        generator.updateState(PlistDictionary::create(), blob);
    }).join();
}

TEST(ObjectGeneratorDeathTest, UncaughtUndecodableBlobTerminatesTheProgram) {
    GTEST_FLAG_SET(death_test_style, "threadsafe");
    EXPECT_DEATH(decodeUncaught(PlistData{'n', 'o', 't', ' ', 'a', ' ', 'p', 'l', 'i', 's', 't'}),
                 "GSMLogGenerator:90\\): Could not deserialize the object");
}

TEST(ObjectGeneratorDeathTest, UncaughtUnknownObjectTerminatesTheProgram) {
    GTEST_FLAG_SET(death_test_style, "threadsafe");
    const PlistData blob = buildObjectBlob(PlistValue::boolean(false), ObjectBlobEncoding::Binary);
    EXPECT_DEATH(decodeUncaught(blob), "GSMLogGenerator:78\\): Unknown object of type boolean encountered");
}

}  // namespace
}  // namespace velmar
