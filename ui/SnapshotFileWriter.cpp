#include "ui/SnapshotFileWriter.h"

#include "core/platform/WholeFile.h"
#include "core/platform/plist/PlistCodec.h"

namespace velmar {

bool writeSnapshotFile(const PlistValue& dictionary, const std::string& path) {
    if (!dictionary.isDictionary()) {
        return false;
    }
    // Serialised first, so that a value that cannot be written does not truncate an existing file.
    const auto document = serializeXml(dictionary);
    if (!document) {
        return false;
    }
    return writeWholeFile(path, *document, FileWrite::Private).ok();
}

}  // namespace velmar
