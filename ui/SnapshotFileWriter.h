// SnapshotFileWriter: writes a snapshot dictionary as an XML property-list file that only its owner can read.
//
// Contract: the file is written in place, not atomically (a second save to the same path replaces the first
// one's contents); it is created with mode 0600, and an existing file is narrowed to 0600 before it is
// overwritten. Answers false with the reason in why when the value cannot be serialised (the file is not
// touched), the file cannot be opened (a symbolic link at the path is not followed), or it cannot be fully
// written (the partial file is removed).
#pragma once

#include <string>

#include "core/platform/plist/PlistValue.h"

namespace velmar {

bool writeSnapshotFile(const PlistValue& dictionary, const std::string& path, std::string* why = nullptr);

}  // namespace velmar
