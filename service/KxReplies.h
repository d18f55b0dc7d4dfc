// KxReplies: the property-list answers that the service sends on its control port and channel ports.
//
// Contract: every answer is an XML property list. An error answer is {"Domain": 1, "Error": code,
// "Reason": text}; a reason that cannot be written (not valid UTF-8, from a client's own bytes) is left out
// rather than losing the answer.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>

#include "core/platform/plist/PlistValue.h"

namespace velmar {

PlistData kxErrorReply(std::int32_t error, const std::string& reason);
PlistData kxChannelCreatedReply(const std::string& channelPort);
PlistData kxTechnologyReply(std::string_view technology);

// A client's text quoted for a message: at most 64 characters, control characters shown as '?'.
std::string quotedForLog(std::string_view text);

}  // namespace velmar
