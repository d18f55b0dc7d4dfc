#include "service/VersionAdaptingSink.h"

#include <cinttypes>
#include <string>
#include <vector>

#include "core/platform/BasebandPacket.h"
#include "core/platform/SystemLog.h"

namespace velmar {

void VersionAdaptingSink::deliver(const BasebandBlob& blob) {
    const AdaptedPacket adapted = adapter_.adapt(blob.bytes);
    if (census_.add(adapted) && adapted.outcome == VersionOutcome::UnknownVersion) {
        const std::size_t length = withoutChannelPrefix(blob.bytes).size();
        if (adapted.version == kNoVersion) {
            SystemLog::log(
                kLogWarning,
                "unknown record version: log code 0x%04X without its version, %zu bytes; passed on as "
                "recorded",
                static_cast<unsigned>(adapted.logCode), length);
        } else {
            SystemLog::log(
                kLogWarning,
                "unknown record version: log code 0x%04X version %d, %zu bytes; passed on as recorded",
                static_cast<unsigned>(adapted.logCode), adapted.version, length);
        }
    }
    if (adapted.blob.data() == blob.bytes.data()) {
        channels_.deliver(blob);
        return;
    }
    BasebandBlob rewritten = blob;  // the same log type and code
    rewritten.bytes = adapted.blob;
    channels_.deliver(rewritten);
}

void VersionAdaptingSink::logCensus() const {
    SystemLog::log(kLogNotice, "version census: %" PRIu64 " records", census_.records());
    for (const std::string& line : censusReport(census_, nullptr)) {
        SystemLog::log(kLogNotice, "version census: %s", line.c_str());
    }
}

}  // namespace velmar
