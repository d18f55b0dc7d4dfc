// HSDPAInformation: the "HSDPA Info" key section: version, sub-frame count and carrier configuration of
// record 0x4221, and its primary and secondary HARQ process lists as array values of the section.
//
// Contract: every call logs "HSDPA Info" at warning priority; any other code, and a record under 18 bytes,
// is ignored without a message. A list whose count is zero keeps the rows shown before. Counts are not
// checked against the record's length: entries past the end read as zeros.
#pragma once

#include "LogGenerator/KeySectionDecoder.h"

namespace velmar {

class HSDPAInformation : public KeySectionDecoder {
  public:
    HSDPAInformation();
};

}  // namespace velmar
