#include "service/KxReplies.h"

#include <algorithm>

#include "core/platform/KxServerProtocol.h"
#include "core/platform/plist/PlistCodec.h"

namespace velmar {

namespace {

constexpr std::size_t kMaxQuoted = 64;

PlistData encode(const PlistDictionaryRef& reply) {
    return serializeXml(reply).value_or(PlistData());
}

}  // namespace

PlistData kxErrorReply(std::int32_t error, const std::string& reason) {
    auto reply = PlistDictionary::create();
    reply->set(kKxDomainKey, PlistValue::integer(kKxErrorDomainServer));
    reply->set(kKxErrorKey, PlistValue::integer(error));
    reply->set(kKxReasonKey, reason);
    if (std::optional<PlistData> encoded = serializeXml(reply)) {
        return std::move(*encoded);
    }
    reply->remove(kKxReasonKey);
    return encode(reply);
}

PlistData kxChannelCreatedReply(const std::string& channelPort) {
    auto reply = PlistDictionary::create();
    reply->set(kKxDomainKey, PlistValue::integer(kKxErrorDomainServer));
    reply->set(kKxErrorKey, PlistValue::integer(0));
    reply->set(kKxChannelPortKey, channelPort);
    return encode(reply);
}

PlistData kxTechnologyReply(std::string_view technology) {
    auto reply = PlistDictionary::create();
    reply->set(kKxGetTechnologyKey, technology);
    return encode(reply);
}

std::string quotedForLog(std::string_view text) {
    // Cut at a character boundary, so that a quoted UTF-8 text stays valid UTF-8.
    std::size_t cut = std::min(text.size(), kMaxQuoted);
    while (cut > 0 && cut < text.size() && (static_cast<unsigned char>(text[cut]) & 0xC0U) == 0x80U) {
        --cut;
    }
    std::string quoted = "\"";
    for (std::size_t i = 0; i < cut; ++i) {
        const auto c = static_cast<unsigned char>(text[i]);
        quoted += (c < 0x20 || c == 0x7F) ? '?' : static_cast<char>(c);
    }
    if (cut < text.size()) {
        quoted += "...";
    }
    quoted += '"';
    return quoted;
}

}  // namespace velmar
