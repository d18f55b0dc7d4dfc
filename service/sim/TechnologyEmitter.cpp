#include "service/sim/TechnologyEmitter.h"

#include "core/platform/TechnologyNames.h"
#include "service/sim/CdmaEmitter.h"
#include "service/sim/GsmEmitter.h"
#include "service/sim/LteEmitter.h"
#include "service/sim/ObjectBlobEmitter.h"
#include "service/sim/UtranEmitter.h"

namespace velmar::sim {

std::unique_ptr<TechnologyEmitter> makeTechnologyEmitter(std::string_view technology, SimRandom& random) {
    const TechnologyName* named = technologyNamed(technology);
    if (named == nullptr) {
        return nullptr;
    }
    switch (named->technology) {
        case Technology::Gsm:
            return makeGsmEmitter(random);
        case Technology::Lte:
            return std::make_unique<LteEmitter>(random);
        case Technology::Utran:
            return makeUtranEmitter(random);
        case Technology::Cdma:
            return std::make_unique<CdmaEmitter>(random);
        case Technology::ObjectBased:
            return makeObjectBlobEmitter(random);
    }
    return nullptr;
}

}  // namespace velmar::sim
