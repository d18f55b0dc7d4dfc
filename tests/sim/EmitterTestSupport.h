// EmitterTestSupport: hand-made radio snapshots and a blob recorder for the emitter tests.
//
// Contract: the recorder keeps every blob an emitter hands out, in order; packets are looked up by log type
// and 16-bit code as the packet header carries them ([type][length u16][code u16][timestamp 8][payload]).
// run() steps an emitter through a snapshot every 20 ms of simulated time, as the radio world does, stamping
// each snapshot's time and baseband timestamp.
#pragma once

#include <cmath>
#include <cstdint>
#include <functional>
#include <vector>

#include "core/platform/plist/PlistValue.h"
#include "service/sim/RadioSnapshot.h"
#include "service/sim/TechnologyEmitter.h"

namespace velmar::sim::testing {

inline constexpr std::uint64_t kTestStartTimestamp = 0x0123456700000000ULL;

struct BlobRecorder {
    std::vector<PlistData> blobs;

    BlobOutput output() {
        return [this](ByteView blob) { blobs.emplace_back(blob.begin(), blob.end()); };
    }
    static std::uint16_t codeOf(const PlistData& packet) {
        return packet.size() < 5 ? 0 : static_cast<std::uint16_t>(packet[3] | packet[4] << 8);
    }
    static std::uint64_t timestampOf(const PlistData& packet) {
        std::uint64_t value = 0;
        for (std::size_t i = 0; i < 8 && 5 + i < packet.size(); ++i) {
            value |= static_cast<std::uint64_t>(packet[5 + i]) << (8 * i);
        }
        return value;
    }
    std::vector<PlistData> packets(std::uint16_t code, std::uint8_t type = 1) const {
        std::vector<PlistData> found;
        for (const PlistData& blob : blobs) {
            if (!blob.empty() && blob[0] == type && codeOf(blob) == code) {
                found.push_back(blob);
            }
        }
        return found;
    }
    std::size_t count(std::uint16_t code, std::uint8_t type = 1) const { return packets(code, type).size(); }
};

inline std::uint32_t readLE(const PlistData& packet, std::size_t offset, std::size_t width) {
    std::uint32_t value = 0;
    for (std::size_t i = 0; i < width; ++i) {
        value |= static_cast<std::uint32_t>(offset + i < packet.size() ? packet[offset + i] : 0) << (8 * i);
    }
    return value;
}

inline SimCell makeCell(int index, CellRat rat, std::uint32_t cellId, std::uint32_t lac, std::uint32_t rac,
                        std::uint32_t channel, std::uint32_t physicalId) {
    SimCell cell;
    cell.index = index;
    cell.rat = rat;
    cell.cellId = cellId;
    cell.areaCode = lac;
    cell.routingArea = rac;
    cell.channel = channel;
    cell.physicalId = physicalId;
    cell.band = rat == CellRat::Umts ? 1 : 0;
    cell.bandwidthMHz = rat == CellRat::Umts ? 5 : 0;
    return cell;
}

// Steps the emitter from `from` to `to` seconds (both included) in 20 ms steps; `shape` may change the
// snapshot before each step.
inline void run(TechnologyEmitter& emitter, RadioSnapshot& snapshot, double from, double to,
                BlobRecorder& recorder, const std::function<void(RadioSnapshot&)>& shape = {}) {
    const BlobOutput output = recorder.output();
    for (long step = std::lround(from / 0.02); step <= std::lround(to / 0.02); ++step) {
        snapshot.time = static_cast<double>(step) * 0.02;
        snapshot.basebandTimestamp = kTestStartTimestamp + (static_cast<std::uint64_t>(step * 16) << 16);
        if (shape) {
            shape(snapshot);
        }
        emitter.step(snapshot, output);
    }
}

}  // namespace velmar::sim::testing
