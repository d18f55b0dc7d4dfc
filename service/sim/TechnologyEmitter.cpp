#include "service/sim/TechnologyEmitter.h"

#include <array>

#include "service/sim/CdmaEmitter.h"
#include "service/sim/GsmEmitter.h"
#include "service/sim/LteEmitter.h"
#include "service/sim/ObjectBlobEmitter.h"
#include "service/sim/UtranEmitter.h"

namespace velmar::sim {

namespace {

using EmitterCreator = std::unique_ptr<TechnologyEmitter> (*)(SimRandom& random);

struct EmitterRow {
    std::string_view technology;
    EmitterCreator create;
};

std::unique_ptr<TechnologyEmitter> lteEmitter(SimRandom& random) {
    return std::make_unique<LteEmitter>(random);
}

std::unique_ptr<TechnologyEmitter> cdmaEmitter(SimRandom& random) {
    return std::make_unique<CdmaEmitter>(random);
}

// One row per technology name.
const std::array<EmitterRow, 5> kEmitters = {{
    {"gsm", &makeGsmEmitter},
    {"lte", &lteEmitter},
    {"utran", &makeUtranEmitter},
    {"cdma", &cdmaEmitter},
    {"ifx", &makeObjectBlobEmitter},
}};

}  // namespace

std::unique_ptr<TechnologyEmitter> makeTechnologyEmitter(std::string_view technology, SimRandom& random) {
    for (const EmitterRow& row : kEmitters) {
        if (row.technology == technology) {
            return row.create(random);
        }
    }
    return nullptr;
}

}  // namespace velmar::sim
