// ByteView: a read-only view of bytes owned elsewhere (a received blob, a record, a file's contents).
#pragma once

#include <cstdint>
#include <span>

namespace velmar {

using ByteView = std::span<const std::uint8_t>;

}  // namespace velmar
