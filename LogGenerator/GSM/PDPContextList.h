// PDPContextList: the "PDP Context Info" list section, filled from the PDP-context extra record (0xFF0002)
// that the telephony service supplies as a property-list array of context dictionaries. Every class index of
// the log-code family creates one.
//
// Contract: a record whose property list is an array replaces the section's rows with its elements, as they
// are; anything else (another root, unparsable data) leaves the rows unchanged, silently.
#pragma once

#include "LogGenerator/DecoderTable.h"
#include "core/platform/logcodes/ExtraLogCodes.h"

namespace velmar {

class PDPContextList : public TableDecoder {
  public:
    PDPContextList();
    void updateWithData(ByteView data, std::int32_t logCode) override;
};

// The row of every technology's decoder table.
inline constexpr DecoderRow kPDPContextListRow =
    VELMAR_DECODER_ROW(PDPContextList, "PDP Context Info", kLogCodePdpContexts);

}  // namespace velmar
