// VersionTables: the record layouts of newer baseband firmware that the packet-version adapter knows, one
// table per (log code, version), grouped by technology.
//
// Contract: each CodeVersions names the decoded layout's version number (which adapted records carry, so an
// adapted record is recognised as decoded and left alone) and the tables that rewrite the other known
// versions into it. A code appears in one group only.
#pragma once

#include <span>

#include "logfile/versions/VersionLayout.h"

namespace velmar::packet_versions {

// 0xB0C2, 0xB0C1, 0xB179, 0xB17F, 0xB180, and 0xB186 (no other layout known).
std::span<const CodeVersions> lteCodeVersions();
// 0x4005, 0x7150, and 0x4221, 0x134F (no other layout known).
std::span<const CodeVersions> otherCodeVersions();

}  // namespace velmar::packet_versions
