#include "LogGenerator/GSM/GSMSet.h"

#include "LogGenerator/GSM/ORV_GSMClassIndex.h"
#include "LogGenerator/GSM/RecordRows.h"
#include "LogGenerator/RecordRule.h"
#include "core/platform/logcodes/GsmLogCodes.h"

namespace velmar {

namespace {

constexpr const DecoderRow& kRow = rowOf(kGsmDecoders, "GSMSet");

constexpr RecordRule kRules[] = {
    {kLogCodeUmtsIdleMeasurements, 15},
};
constexpr DecoderRules kDecoderRules{"GSMSet", kRules};

constexpr RecordField kGsmCellFields[] = {
    u16Field(0, "ARFCN"),
    u16Field(2, "BSIC"),
    s8Field(4, "RSSI", asInt("%d dBm")),
    s16Field(5, "Ranking Value"),
};

constexpr RecordRowList kGsmCells{14, 15, 7, kGsmCellFields};

}  // namespace

GSMSet::GSMSet() : TableDecoder(kRow) {}
static_assert(rulesMatch(kRules, kRow));

void GSMSet::updateWithData(ByteView data, std::int32_t logCode) {
    if (admitRecord(kDecoderRules, data, logCode) == nullptr) {
        return;
    }
    showRecordRows(kGsmCells, RecordReader(data), sectionArray());
}

}  // namespace velmar
