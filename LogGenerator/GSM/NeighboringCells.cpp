#include "LogGenerator/GSM/NeighboringCells.h"

#include <iterator>
#include "LogGenerator/GSM/ORV_GSMClassIndex.h"

#include "LogGenerator/CellMonitorWalk.h"
#include "LogGenerator/GSM/CountedList.h"
#include "LogGenerator/RecordRule.h"
#include "core/platform/KxServerProtocol.h"
#include "core/platform/logcodes/GsmLogCodes.h"

namespace velmar {

namespace {

constexpr const DecoderRow& kRow = rowOf(kGsmDecoders, "NeighboringCells");

constexpr RecordRule kRules[] = {
    {kLogCodeGsmMeasurements, 29},
    {kLogCodeGsmBsicList, 15},
    {kLogCodeCellMonitor, 0},
};
constexpr DecoderRules kDecoderRules{"NeighboringCells", kRules};

// 0x51FF: count at 14, 4-byte elements from 15: ARFCN (2 bytes), BSIC (1 byte), one unused byte.
constexpr std::size_t kBsicCountOffset = 14;
constexpr std::size_t kBsicListOffset = 15;
constexpr std::size_t kBsicElementSize = 4;

// 0x5137: count at 28, 14-byte neighbour elements from 29; bytes 7..13 of an element are not read.
constexpr std::size_t kNeighbourCountOffset = 28;
constexpr std::size_t kNeighbourListOffset = 29;
constexpr std::size_t kNeighbourElementSize = 14;

constexpr RecordField kNeighbourFields[] = {
    u16Field(0, "ARFCN"),
    u8Field(2, "RSSI"),
    s32Field(3, "C1 Value"),
};
constexpr std::size_t kNeighbourArfcnOffset = 0;

constexpr CellMonitorField kNeighbourCellFields[] = {
    {kKxCellMonitorARFCN, "ARFCN", "NeighboringCells: Failed to retrieve ARFCN\n"},
    {kKxCellMonitorRSSI, "RSSI", "NeighboringCells: Failed to retrieve RSSI\n",
     asInt("%d dBm", 2).withSentinel(kCellMonitorNoReading, "")},
};

}  // namespace

NeighboringCells::NeighboringCells() : TableDecoder(kRow) {}
static_assert(rulesMatch(kRules, kRow));

void NeighboringCells::updateWithData(ByteView data, std::int32_t logCode) {
    const RecordRule* rule = admitRecord(kDecoderRules, data, logCode);
    if (rule == nullptr) {
        return;
    }
    switch (rule->code) {
        case kLogCodeGsmBsicList:
            updateBsicList(data);
            break;
        case kLogCodeGsmMeasurements:
            updateNeighbourMeasurements(data);
            break;
        case kLogCodeCellMonitor:
            showNeighbourCells(data, kKxCellMonitorRadioAccessTechnologyGSM, kNeighbourCellFields,
                               sectionArray());
            break;
        default:
            break;
    }
}

void NeighboringCells::updateBsicList(ByteView data) {
    const RecordReader record(data);
    const CountedList list{kBsicListOffset, kBsicElementSize, record.u8(kBsicCountOffset)};
    std::unordered_map<std::uint32_t, std::string> bsics;
    for (std::size_t i = 0; i < list.count; ++i) {
        const std::size_t at = list.elementOffset(i);
        bsics.insert_or_assign(record.u16(at), std::to_string(record.u8(at + 2)));
    }
    arfcnToBsic = std::move(bsics);
}

void NeighboringCells::updateNeighbourMeasurements(ByteView data) {
    const PlistArrayRef section = sectionArray();
    clearElementsInArray(section);
    const RecordReader record(data);
    const CountedList list{kNeighbourListOffset, kNeighbourElementSize, record.u8(kNeighbourCountOffset)};
    if (list.count == 0) {
        return;
    }
    auto rows = PlistArray::create();
    rows->reserve(list.count);
    for (std::size_t i = 0; i < list.count; ++i) {
        const std::size_t at = list.elementOffset(i);
        auto row = PlistDictionary::create();
        row->reserve(std::size(kNeighbourFields) + 1);
        writeFields(kNeighbourFields, record, at, *row);
        if (const auto bsic = arfcnToBsic.find(record.u16(at + kNeighbourArfcnOffset));
            bsic != arfcnToBsic.end()) {
            row->set("BSIC", bsic->second);
        }
        rows->append(std::move(row));
    }
    replaceArray(section, rows);
}

}  // namespace velmar
