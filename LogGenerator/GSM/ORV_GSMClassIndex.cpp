#include "LogGenerator/GSM/ORV_GSMClassIndex.h"

#include <cstdio>

namespace velmar {

ORV_GSMClassIndex::~ORV_GSMClassIndex() {
    std::fputs("Deallocing ORV_GSMClassIndex\n", stdout);
    releaseDecoders();
}

}  // namespace velmar
