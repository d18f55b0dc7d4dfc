// The CDMA2000 generator on a realistic 1x-traffic-and-EV-DO stream built with the CDMA record builders, in
// steps of 20 ms: EV-DO status (0x1183) and 1x status (0x119C) every 1.28 s, finger C/I (0x108A) every 80 ms,
// the EV-DO active set (0x12B6) every 160 ms, 1x traffic frame errors (0x119D) every 100 ms, the forward- and
// reverse-link counters (0x1192, 0x127E) every second and the 1x system identity (0x134F) every 5 s. Every
// blob goes through C2KLogGenerator::updateState at the default log threshold, with a display refresh every
// 2 s of stream time (100 blobs for the per-code figures). Reports records per second for the stream and the
// time per record of each code.
#include <benchmark/benchmark.h>

#include <random>
#include <string>
#include <vector>

#include "LogGenerator/C2K/C2KLogGenerator.h"
#include "LogGenerator/StateKeys.h"
#include "bench/BenchFeeding.h"
#include "core/platform/SystemLog.h"
#include "core/platform/plist/PlistCodec.h"
#include "logfile/records/CdmaRecords.h"

namespace velmar {
namespace {

constexpr std::size_t kRefreshEvery = 100;

class StreamMaker {
  public:
    explicit StreamMaker(unsigned seed) : random_(seed) {}

    int between(int low, int high) { return std::uniform_int_distribution<int>(low, high)(random_); }
    void advance() { clock_ += std::uint64_t{16} << 16; }  // 20 ms: 16 ticks of 1/800 s

    PlistData evdoStatus() {
        EvdoStatusRecord record;
        record.channel = 283;
        record.bandClass = 1;
        record.rxAgc0 = static_cast<std::int8_t>(between(-105, -60));
        record.rxAgc1 = static_cast<std::int8_t>(between(-105, -60));
        record.txAgc = static_cast<std::int8_t>(between(-20, 15));
        record.pnOffset = 168;
        record.deviceState = 5;
        record.sessionState = 4;
        record.uati24 = 0x0A1B2C;
        record.colorCode = 7;
        return buildEvdoStatusRecord(record, clock_);
    }

    PlistData evdoActiveSet() {
        EvdoActiveSetRecord record;
        const int pilots = between(1, 6);
        for (int k = 0; k < pilots; ++k) {
            record.pilots.push_back(
                {static_cast<std::uint16_t>(between(0, 511)), static_cast<std::uint16_t>(between(20, 2000))});
        }
        return buildEvdoActiveSetRecord(record, clock_);
    }

    PlistData fingers() {
        FingerC2IRecord record;
        for (int k = 0; k < 8; ++k) {
            const bool assigned = k < between(2, 8);
            record.fingers.push_back({static_cast<std::uint16_t>(assigned ? between(0, 511) : 65535),
                                      static_cast<std::uint16_t>(between(20, 4000))});
        }
        return buildFingerC2IRecord(record, clock_);
    }

    PlistData status1x() {
        Cdma1xRadio radio;
        radio.rx0BandClass = 1;
        radio.rx1BandClass = 1;
        radio.rx0Channel = 25;
        radio.rx1Channel = 25;
        radio.rxAgc0 = static_cast<std::int8_t>(between(-120, 40));
        radio.rxAgc1 = static_cast<std::int8_t>(between(-120, 40));
        radio.txPower = static_cast<std::int16_t>(between(-300, 230));
        Cdma1xActiveSet activeSet;
        activeSet.l = 8;
        activeSet.m = 2;
        activeSet.q = 3;
        activeSet.f = 2;
        const int pilots = between(1, 6);
        for (int k = 0; k < pilots; ++k) {
            activeSet.pilots.push_back(
                {static_cast<std::uint16_t>(between(0, 511)), static_cast<std::uint16_t>(between(0, 3000))});
        }
        activeSet.referencePn = activeSet.pilots.front().pn;
        CdmaSubpacketRecord record;
        record.subpackets = {cdma1xStateSubpacket(8), cdma1xRadioSubpacket(radio),
                             cdma1xActiveSetSubpacket(activeSet), cdma1xFingerSubpacket()};
        record.trailingBytes = 4;
        return build1xStatusRecord(record, clock_);
    }

    PlistData traffic1x() {
        CdmaSubpacketRecord record;
        record.subpackets = {cdma1xStateSubpacket(8), cdma1xTrafficDemodSubpacket(between(0, 49) == 0)};
        record.trailingBytes = 4;
        return build1xTrafficRecord(record, clock_);
    }

    PlistData systemIdentity() {
        Cdma1xSystemIdentityRecord record;
        record.roamingIndicator = static_cast<std::uint32_t>(between(0, 14));
        record.systemId = 4139;
        record.networkId = 7;
        record.packetZoneId = 17;
        record.protocolRevision = 6;
        record.baseId = static_cast<std::uint16_t>(between(0, 65535));
        return build1xSystemIdentityRecord(record, clock_);
    }

    PlistData forwardLink() {
        EvdoForwardLinkRecord record;
        record.sequence = ++forwardSequence_;
        for (std::size_t i = 0; i < record.counters.size(); ++i) {
            forwardCounters_[i] += static_cast<std::uint32_t>(between(0, 40));
            record.counters[i] = forwardCounters_[i];
        }
        return buildEvdoForwardLinkRecord(record, clock_);
    }

    PlistData reverseLink() {
        EvdoReverseLinkRecord record;
        record.sequence = ++reverseSequence_;
        for (auto& block : reverseCounters_) {
            for (auto& rateClass : block) {
                for (auto& counter : rateClass) {
                    counter += static_cast<std::uint32_t>(between(0, 4));
                }
            }
        }
        record.counters = reverseCounters_;
        return buildEvdoReverseLinkRecord(record, clock_);
    }

  private:
    std::mt19937 random_;
    std::uint64_t clock_ = 0;
    std::uint32_t forwardSequence_ = 0;
    std::uint32_t reverseSequence_ = 0;
    std::array<std::uint32_t, 56> forwardCounters_{};
    std::array<std::array<std::array<std::uint32_t, 12>, 12>, 3> reverseCounters_{};
};

// 60 s of stream; a refresh marker (an empty blob) every 2 s.
const std::vector<PlistData>& cdmaStream() {
    static const std::vector<PlistData> stream = [] {
        StreamMaker maker(20240601);
        std::vector<PlistData> out;
        for (int step = 0; step < 3000; ++step) {
            maker.advance();
            if (step % 64 == 0) {
                out.push_back(maker.evdoStatus());
                out.push_back(maker.status1x());
            }
            if (step % 4 == 0) {
                out.push_back(maker.fingers());
            }
            if (step % 8 == 0) {
                out.push_back(maker.evdoActiveSet());
            }
            if (step % 5 == 0) {
                out.push_back(maker.traffic1x());
            }
            if (step % 50 == 0) {
                out.push_back(maker.forwardLink());
                out.push_back(maker.reverseLink());
            }
            if (step % 250 == 0) {
                out.push_back(maker.systemIdentity());
            }
            if (step % 100 == 99) {
                out.push_back(PlistData());
            }
        }
        return out;
    }();
    return stream;
}

PlistValue shippedTemplate() {
    static const PlistValue loaded = [] {
        const auto value =
            readDictionaryFile(std::string(VELMAR_SOURCE_DIR) + "/resources/templates/C2KTemplate.plist");
        return value ? *value : PlistValue();
    }();
    return loaded;
}

// Empty blobs stand for display refreshes; otherwise a refresh every refreshEvery blobs (0: never).
void feed(benchmark::State& state, const std::vector<PlistData>& blobs, std::size_t refreshEvery) {
    bench::quietLog();
    C2KLogGenerator generator;
    const StateDict stateDict = PlistDictionary::create();
    stateDict->set(state_keys::kTemplate, shippedTemplate());
    std::size_t next = 0;
    std::size_t sinceRefresh = 0;
    std::size_t records = 0;
    for (auto _ : state) {
        const PlistData& blob = blobs[next];
        next = next + 1 == blobs.size() ? 0 : next + 1;
        if (blob.empty()) {
            generator.generateLogUsingState(stateDict);
            continue;
        }
        generator.updateState(stateDict, blob);
        ++records;
        if (refreshEvery != 0 && ++sinceRefresh == refreshEvery) {
            sinceRefresh = 0;
            generator.generateLogUsingState(stateDict);
        }
    }
    state.SetItemsProcessed(static_cast<std::int64_t>(records));
}

void BM_CdmaStream(benchmark::State& state) {
    state.counters["blobs"] = static_cast<double>(cdmaStream().size());
    feed(state, cdmaStream(), 0);
}
BENCHMARK(BM_CdmaStream);

// One code at a time: 64 successive records of the code, cycled.
template <PlistData (StreamMaker::*Make)()>
void BM_CdmaCode(benchmark::State& state) {
    StreamMaker maker(7);
    std::vector<PlistData> blobs;
    for (int k = 0; k < 64; ++k) {
        maker.advance();
        blobs.push_back((maker.*Make)());
    }
    feed(state, blobs, kRefreshEvery);
}
BENCHMARK_TEMPLATE(BM_CdmaCode, &StreamMaker::fingers)->Name("BM_CdmaCode/0x108A");
BENCHMARK_TEMPLATE(BM_CdmaCode, &StreamMaker::evdoStatus)->Name("BM_CdmaCode/0x1183");
BENCHMARK_TEMPLATE(BM_CdmaCode, &StreamMaker::forwardLink)->Name("BM_CdmaCode/0x1192");
BENCHMARK_TEMPLATE(BM_CdmaCode, &StreamMaker::evdoActiveSet)->Name("BM_CdmaCode/0x12B6");
BENCHMARK_TEMPLATE(BM_CdmaCode, &StreamMaker::status1x)->Name("BM_CdmaCode/0x119C");
BENCHMARK_TEMPLATE(BM_CdmaCode, &StreamMaker::traffic1x)->Name("BM_CdmaCode/0x119D");
BENCHMARK_TEMPLATE(BM_CdmaCode, &StreamMaker::reverseLink)->Name("BM_CdmaCode/0x127E");
BENCHMARK_TEMPLATE(BM_CdmaCode, &StreamMaker::systemIdentity)->Name("BM_CdmaCode/0x134F");

}  // namespace
}  // namespace velmar

BENCHMARK_MAIN();
