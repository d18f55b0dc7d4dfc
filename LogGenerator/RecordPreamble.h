// RecordPreamble: the checks a record decoder makes before it decodes anything.
//
// Contract: every call first logs the decoder's title (warning priority unless the decoder names another).
// A record whose log code is not the decoder's own is either reported as "Received an unknown log message:
// %d" (error priority) or passed over silently, as the decoder's technology does it. A record shorter than
// the decoder's fixed minimum length is passed over silently and changes nothing. Only when every check holds
// does acceptRecord answer true.
#pragma once

#include <cstddef>
#include <cstdint>

#include "core/platform/ByteView.h"
#include "core/platform/SystemLog.h"

namespace velmar {

struct RecordPreamble {
    enum class OtherCodes : std::uint8_t { Reported, Ignored };

    const char* title;
    std::int32_t logCode;
    std::size_t minimumLength;
    OtherCodes otherCodes = OtherCodes::Reported;
    int titlePriority = kLogWarning;
};

void logDecoderTitle(const char* title, int priority = kLogWarning);
// "Received an unknown log message: %d" (error priority).
void reportUnknownLogMessage(std::int32_t logCode);
// Logs the title and answers whether the record is the decoder's own and long enough to decode.
bool acceptRecord(const RecordPreamble& preamble, ByteView data, std::int32_t logCode);

}  // namespace velmar
