#include "LogGenerator/LTE/LTEClassIndex.h"

#include <cstdio>

namespace velmar {

LTEClassIndex::~LTEClassIndex() {
    std::fputs("Deallocing LTEClassIndex\n", stdout);
    releaseDecoders();
}

}  // namespace velmar
