// VersionRewriter: the one walker that applies a VersionTable to a record's payload, as RecordFields' walker
// applies a decoder's field table.
//
// Contract: reads the newer version's payload only through RecordReader (nothing outside it is touched,
// whatever its counts claim) and writes the decoded layout's payload through RecordWriter at `base` of out,
// which it grows, zero-filled, to the decoded layout's length: its fixed part plus the lists it wrote. The
// decoded version number is written first, then the fields, then the lists in table order. Answers false,
// writing nothing, when the decoded layout cannot express the record (a payload shorter than the table's
// minimum, or an empty list where the decoded layout counts "minus one"); the caller then drops it.
#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

#include "core/platform/ByteView.h"
#include "logfile/versions/VersionLayout.h"

namespace velmar::packet_versions {

bool rewritePayload(const CodeVersions& code, const VersionTable& table, ByteView payload,
                    std::vector<std::uint8_t>& out, std::size_t base, RewriteTally& tally);

// Writes the decoded version number alone (the whole payload of a dropped record) at base of out.
void writeDecodedVersionOnly(const CodeVersions& code, std::vector<std::uint8_t>& out, std::size_t base);

}  // namespace velmar::packet_versions
