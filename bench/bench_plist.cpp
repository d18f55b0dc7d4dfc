// Throughput of the property-list codec on a display-like document of about 1 MB: a dictionary of display
// pages, each holding header fields and a table of row dictionaries with string values, as the monitor's
// state snapshots and templates look. Reports bytes per second of XML text parsed or written.
#include <benchmark/benchmark.h>

#include <cstdlib>
#include <string>

#include "core/platform/plist/PlistCodec.h"

namespace {

using velmar::PlistArray;
using velmar::PlistData;
using velmar::PlistDictionary;
using velmar::PlistValue;

PlistValue makeDisplay(std::size_t targetBytes) {
    static const char* const kTechnologies[] = {"LTE", "UMTS", "GSM", "CDMA", "NR"};
    static const char* const kFields[] = {"RSRP",     "RSRQ",      "SINR", "RSSI",    "EARFCN", "PCI",
                                          "Band",     "Bandwidth", "TAC",  "Cell ID", "MCC",    "MNC",
                                          "TX Power", "CQI",       "RI",   "BLER"};
    auto root = PlistDictionary::create();
    auto pages = PlistDictionary::create();
    root->set("Display", PlistValue(pages));
    root->set("Version", PlistValue::integer(3));
    for (std::size_t page = 0;; ++page) {
        // Measuring the document every few pages keeps building it cheap.
        if (page % 8 == 0) {
            const auto bytes = velmar::serializeXml(PlistValue(root));
            if (!bytes || bytes->size() >= targetBytes) {
                break;
            }
        }
        auto header = PlistDictionary::create();
        header->set("Title", std::string(kTechnologies[page % 5]) + " Serving Cell " + std::to_string(page));
        header->set("Technology", kTechnologies[page % 5]);
        header->set("Refresh", PlistValue::integer(500));
        header->set("Visible", PlistValue::boolean(page % 3 != 0));
        auto rows = PlistArray::create();
        for (std::size_t row = 0; row < 40; ++row) {
            auto cells = PlistDictionary::create();
            cells->set("Name", kFields[row % 16]);
            cells->set("Value", std::to_string(-(static_cast<long>(row * 7 + page) % 140)) + ".5");
            cells->set("Unit", row % 2 == 0 ? "dBm" : "dB");
            cells->set("Color", row % 5 == 0 ? "#FF4040" : "#E0E0E0");
            cells->set("Tooltip", "Measured on carrier " + std::to_string(row) + " & neighbour <" +
                                      std::to_string(page) + ">");
            rows->append(PlistValue(cells));
        }
        auto entry = PlistDictionary::create();
        entry->set("Header", PlistValue(header));
        entry->set("Rows", PlistValue(rows));
        pages->set("Page " + std::to_string(page), PlistValue(entry));
    }
    return PlistValue(root);
}

const PlistValue& display() {
    static const PlistValue value = makeDisplay(1 << 20);
    return value;
}

const PlistData& displayXml() {
    static const PlistData bytes = *velmar::serializeXml(display());
    return bytes;
}

void BM_ParseXml(benchmark::State& state) {
    const PlistData& bytes = displayXml();
    for (auto _ : state) {
        auto value = velmar::parsePropertyList(bytes);
        if (!value) {
            state.SkipWithError("parse failed");
            break;
        }
        benchmark::DoNotOptimize(value);
    }
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations() * bytes.size()));
    state.counters["document_bytes"] = static_cast<double>(bytes.size());
}
BENCHMARK(BM_ParseXml)->Unit(benchmark::kMillisecond);

void BM_WriteXml(benchmark::State& state) {
    const PlistValue& value = display();
    std::size_t size = 0;
    for (auto _ : state) {
        auto bytes = velmar::serializeXml(value);
        if (!bytes) {
            state.SkipWithError("write failed");
            break;
        }
        size = bytes->size();
        benchmark::DoNotOptimize(bytes);
    }
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations() * size));
}
BENCHMARK(BM_WriteXml)->Unit(benchmark::kMillisecond);

void BM_ParseBinary(benchmark::State& state) {
    const PlistData bytes = *velmar::serializeBinary(display());
    for (auto _ : state) {
        auto value = velmar::parsePropertyList(bytes);
        if (!value) {
            state.SkipWithError("parse failed");
            break;
        }
        benchmark::DoNotOptimize(value);
    }
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations() * bytes.size()));
}
BENCHMARK(BM_ParseBinary)->Unit(benchmark::kMillisecond);

void BM_WriteBinary(benchmark::State& state) {
    const PlistValue& value = display();
    std::size_t size = 0;
    for (auto _ : state) {
        auto bytes = velmar::serializeBinary(value);
        if (!bytes) {
            state.SkipWithError("write failed");
            break;
        }
        size = bytes->size();
        benchmark::DoNotOptimize(bytes);
    }
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations() * size));
}
BENCHMARK(BM_WriteBinary)->Unit(benchmark::kMillisecond);

}  // namespace

BENCHMARK_MAIN();
