// WholeFile: reading a file whole and writing a file whole, the one way the programs do either.
//
// Contract: readWholeFile reads until the end of the file (a regular file's size is only a hint: pipes and
// character devices have none), or at most maxBytes of its beginning; a directory fails to read. On failure
// bytes is empty. writeWholeFile writes every byte or fails: Replace creates or truncates the file, Private
// does the same with mode 0600 (the file is made 0600 when it already exists) and never through a symbolic
// link, Append adds to the end, creating the file when it is missing. Interrupted system calls are resumed.
// Either answers a FileOutcome that names the step that failed and why.
#pragma once

#include <cstddef>
#include <cstdint>
#include <limits>
#include <string>
#include <string_view>
#include <vector>

#include "core/platform/ByteView.h"

namespace velmar {

struct FileOutcome {
    std::string_view failedStep;  // "cannot open", "cannot read", "cannot create", "cannot open for
                                  // appending", "cannot write"; empty on success
    int errorNumber = 0;          // the errno of the failed step

    bool ok() const { return failedStep.empty(); }
    std::string reason() const;                          // "No such file or directory"
    std::string message(const std::string& path) const;  // "path: cannot open: No such file or directory"
};

FileOutcome readWholeFile(const std::string& path, std::vector<std::uint8_t>& bytes,
                          std::size_t maxBytes = std::numeric_limits<std::size_t>::max());

enum class FileWrite { Replace, Private, Append };

FileOutcome writeWholeFile(const std::string& path, ByteView bytes, FileWrite mode = FileWrite::Replace);

}  // namespace velmar
