// SimInfo: the "SIM Info" key section, filled from the SIM-file extra record (0xFF0000) that the telephony
// service supplies as a property-list dictionary. Every class index of the log-code family creates one.
//
// Contract: each known SIM-file record key that is present is copied, value unchanged, under its display key;
// absent keys leave their display key as it was. A record that cannot be parsed logs "SIM File dictionary
// data could not be constructed" and throws LogCode_0xFF0000::UnknownDataException before any key changes.
// Other codes are ignored without a message.
#pragma once

#include "LogGenerator/KeySectionDecoder.h"
#include "core/platform/logcodes/ExtraLogCodes.h"

namespace velmar {

class SimInfo : public KeySectionDecoder {
  public:
    SimInfo();
};

// The row of every technology's decoder table.
inline constexpr DecoderRow kSimInfoRow = VELMAR_DECODER_ROW(SimInfo, "SIM Info", kLogCodeSimFiles);

}  // namespace velmar
