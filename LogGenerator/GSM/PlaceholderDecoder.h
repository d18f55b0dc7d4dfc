// PlaceholderDecoder: a decoder whose section exists (so that the display template can place it) but which
// subscribes to no code. Dispatch therefore never calls it; if called, it only writes its class name to the
// system log at warning priority.
#pragma once

#include "LogGenerator/DecoderTable.h"

namespace velmar {

class PlaceholderDecoder : public TableDecoder {
  public:
    void updateWithData(ByteView data, std::int32_t logCode) override;

  protected:
    explicit PlaceholderDecoder(const DecoderRow& row) : TableDecoder(row) {}
};

}  // namespace velmar
