#include "ui/SnapshotFileWriter.h"

#include <unistd.h>

#include "core/platform/WholeFile.h"
#include "core/platform/plist/PlistCodec.h"

namespace velmar {

bool writeSnapshotFile(const PlistValue& dictionary, const std::string& path, std::string* why) {
    const auto fail = [why](const std::string& reason) {
        if (why != nullptr) {
            *why = reason;
        }
        return false;
    };
    if (!dictionary.isDictionary()) {
        return fail("the snapshot is not a dictionary");
    }
    // Serialised first, so that a value that cannot be written does not truncate an existing file.
    const auto document = serializeXml(dictionary);
    if (!document) {
        return fail("the snapshot cannot be written as a property list");
    }
    const FileOutcome written = writeWholeFile(path, *document, FileWrite::Private);
    if (!written.ok()) {
        if (written.failedStep == "cannot write") {
            unlink(path.c_str());  // half a snapshot is no snapshot
        }
        return fail(std::string(written.failedStep) + " " + path + ": " + written.reason());
    }
    return true;
}

}  // namespace velmar
