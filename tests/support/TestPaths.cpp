#include "tests/support/TestPaths.h"

#include <cstdlib>
#include <filesystem>
#include <vector>

#include "core/platform/WholeFile.h"

namespace velmar::testing {

std::string testDataPath(const std::string& name) {
    return std::string(VELMAR_TEST_DATA_DIR) + "/" + name;
}

TemporaryDirectory::TemporaryDirectory() {
    std::string pattern = (std::filesystem::temp_directory_path() / "velmar-test-XXXXXX").string();
    if (mkdtemp(pattern.data()) != nullptr) {
        path_ = pattern;
    }
}

TemporaryDirectory::~TemporaryDirectory() {
    std::error_code ignored;
    if (!path_.empty()) {
        std::filesystem::remove_all(path_, ignored);
    }
}

std::string readWholeFile(const std::string& path) {
    std::vector<std::uint8_t> bytes;
    velmar::readWholeFile(path, bytes);
    return std::string(bytes.begin(), bytes.end());
}

void writeWholeFile(const std::string& path, const std::string& contents) {
    velmar::writeWholeFile(path,
                           ByteView(reinterpret_cast<const std::uint8_t*>(contents.data()), contents.size()));
}

}  // namespace velmar::testing
