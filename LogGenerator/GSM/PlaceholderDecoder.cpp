#include "LogGenerator/GSM/PlaceholderDecoder.h"

#include "LogGenerator/GSM/GsmDecoderSupport.h"

namespace velmar {

void PlaceholderDecoder::updateWithData(ByteView, std::int32_t) {
    gsm::logDecoderEntry(title_);
}

}  // namespace velmar
