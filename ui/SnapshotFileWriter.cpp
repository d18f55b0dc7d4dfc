#include "ui/SnapshotFileWriter.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>

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
    const int fd = open(path.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC | O_NOFOLLOW, 0600);
    if (fd < 0) {
        return false;
    }
    bool written = fchmod(fd, 0600) == 0;
    std::size_t done = 0;
    while (written && done < document->size()) {
        const ssize_t count = write(fd, document->data() + done, document->size() - done);
        if (count < 0 && errno == EINTR) {
            continue;
        }
        if (count <= 0) {
            written = false;
            break;
        }
        done += static_cast<std::size_t>(count);
    }
    if (close(fd) != 0) {
        written = false;
    }
    return written;
}

}  // namespace velmar
