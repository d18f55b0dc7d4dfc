#include "tests/support/TestPaths.h"

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <sstream>

namespace velmar::testing {

std::string testDataPath(const std::string& name) { return std::string(VELMAR_TEST_DATA_DIR) + "/" + name; }

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
    std::ifstream in(path, std::ifstream::binary);
    std::ostringstream out;
    out << in.rdbuf();
    return out.str();
}

void writeWholeFile(const std::string& path, const std::string& contents) {
    std::ofstream out(path, std::ofstream::binary | std::ofstream::trunc);
    out << contents;
}

}  // namespace velmar::testing
