#include "service/sim/ObjectBlobEmitter.h"

#include <vector>

#include "core/platform/StringFormat.h"
#include "logfile/records/ObjectBlobRecords.h"

namespace velmar::sim {

namespace {

constexpr std::size_t kMaxNeighbours = 6;

const SimCell* servingOf(const RadioSnapshot& snapshot) {
    if (snapshot.servingCell < 0 || static_cast<std::size_t>(snapshot.servingCell) >= snapshot.cells.size()) {
        return nullptr;
    }
    return &snapshot.cells[static_cast<std::size_t>(snapshot.servingCell)];
}

std::string number(long value) {
    return std::to_string(value);
}

}  // namespace

std::string objectRrState(const RadioSnapshot& snapshot) {
    switch (snapshot.phase) {
        case ActivityPhase::PowerOn:
            return "Cell Selection";
        case ActivityPhase::Registering:
            return "Dedicated (SDCCH)";
        case ActivityPhase::Idle:
            return snapshot.dataSession ? "Packet Idle" : "Idle";
        case ActivityPhase::Connecting:
            return "Connection Pending";
        case ActivityPhase::Connected:
            return snapshot.dataSession ? "Packet Transfer" : "Dedicated (TCH)";
        case ActivityPhase::Releasing:
            return "Connection Release";
    }
    return "Unknown";
}

std::string objectMmState(const RadioSnapshot& snapshot) {
    switch (snapshot.phase) {
        case ActivityPhase::PowerOn:
            return "Idle, PLMN Search";
        case ActivityPhase::Registering:
            return "Location Update Initiated";
        case ActivityPhase::Idle:
            return "Idle, Normal Service";
        case ActivityPhase::Connecting:
            return snapshot.dataSession ? "Idle, Normal Service" : "Wait For RR Connection";
        case ActivityPhase::Connected:
            return snapshot.dataSession ? "Idle, Normal Service" : "Connection Active";
        case ActivityPhase::Releasing:
            return snapshot.dataSession ? "Idle, Normal Service" : "Wait For Network Command";
    }
    return "Unknown";
}

std::string objectGmmState(const RadioSnapshot& snapshot) {
    switch (snapshot.phase) {
        case ActivityPhase::PowerOn:
            return "Deregistered";
        case ActivityPhase::Registering:
            return "Registered Initiated";
        default:
            return snapshot.dataSession ? "Registered, PDP Active" : "Registered";
    }
}

std::unique_ptr<TechnologyEmitter> makeObjectBlobEmitter(SimRandom& random) {
    return std::make_unique<ObjectBlobEmitter>(random);
}

ObjectBlobEmitter::ObjectBlobEmitter(SimRandom& /*random*/) {}

void ObjectBlobEmitter::step(const RadioSnapshot& snapshot, const BlobOutput& emit) {
    const Tick now = ticksFromSeconds(snapshot.time);
    if (!started_) {
        started_ = true;
        timer_.armAt(now);
    }
    if (timer_.next() > now) {
        return;
    }
    // Every blob describes the whole picture, so blobs missed between two steps would only repeat it.
    while (timer_.next() <= now) {
        timer_.fire();
    }
    levels_.update(snapshot);
    const PlistData blob = buildObjectBlob(pictureOf(snapshot), ObjectBlobEncoding::Binary);
    if (!blob.empty()) {
        emit(blob);
    }
}

PlistValue ObjectBlobEmitter::pictureOf(const RadioSnapshot& snapshot) const {
    std::vector<ObjectEntry> picture;
    const SimCell* serving = servingOf(snapshot);
    if (serving != nullptr) {
        std::vector<ObjectEntry> cell = {
            objectText("ARFCN", number(serving->channel)),   objectText("BSIC", number(serving->physicalId)),
            objectText("Cell ID", number(serving->cellId)),  objectText("LAC", number(serving->areaCode)),
            objectText("RAC", number(serving->routingArea)),
        };
        if (const GsmLevel* level = levels_.gsmLevel(snapshot.servingCell)) {
            cell.push_back(objectText("RxLev", stringWithFormat("%d dBm", level->rssiDbm)));
            cell.push_back(objectText("C1", number(level->c1)));
        }
        picture.push_back(objectGroup("Serving Cell", std::move(cell)));
    } else {
        picture.push_back(objectGroup("Serving Cell", {objectText("Status", "Searching")}));
    }

    std::vector<ObjectEntry> neighbours;
    for (const GsmLevel& level : levels_.gsm()) {
        if (level.cell == snapshot.servingCell) {
            continue;
        }
        if (neighbours.size() == kMaxNeighbours) {
            break;
        }
        const SimCell& cell = snapshot.cells[static_cast<std::size_t>(level.cell)];
        neighbours.push_back(
            objectGroup("", {
                                objectText("ARFCN", number(cell.channel)),
                                objectText("BSIC", number(cell.physicalId)),
                                objectText("RxLev", stringWithFormat("%d dBm", level.rssiDbm)),
                                objectText("C1", number(level.c1)),
                            }));
    }
    picture.push_back(objectList("Neighbour Cells", std::move(neighbours)));

    picture.push_back(objectGroup("States", {
                                                objectText("RR State", objectRrState(snapshot)),
                                                objectText("MM State", objectMmState(snapshot)),
                                                objectText("GMM State", objectGmmState(snapshot)),
                                            }));
    picture.push_back(objectGroup("PLMN", {
                                              objectText("MCC", stringWithFormat("%03u", snapshot.mcc)),
                                              objectText("MNC", stringWithFormat("%02u", snapshot.mnc)),
                                              objectText("Network Name", "Test Network"),
                                              objectText("Selection Mode", "Automatic"),
                                          }));
    return objectTree(picture);
}

}  // namespace velmar::sim
