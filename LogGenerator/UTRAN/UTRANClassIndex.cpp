#include "LogGenerator/UTRAN/UTRANClassIndex.h"

namespace velmar {

UTRANClassIndex::~UTRANClassIndex() {
    releaseDecoders();
}

}  // namespace velmar
