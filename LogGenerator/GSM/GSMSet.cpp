#include "LogGenerator/GSM/GSMSet.h"

#include "LogGenerator/GSM/GsmDecoderSupport.h"
#include "LogGenerator/GSM/GsmLogCodes.h"
#include "LogGenerator/GSM/RecordRows.h"

namespace velmar {

namespace {

constexpr gsm::RecordRule kRules[] = {
    {kLogCodeUmtsIdleMeasurements, 15},
};

constexpr RecordField kGsmCellFields[] = {
    u16Field(0, "ARFCN"),
    u16Field(2, "BSIC"),
    s8Field(4, "RSSI", asInt("%d dBm")),
    s16Field(5, "Ranking Value"),
};

constexpr RecordRowList kGsmCells{14, 15, 7, kGsmCellFields};

}  // namespace

void GSMSet::updateWithData(ByteView data, std::int32_t logCode) {
    if (gsm::admitRecord("GSMSet", kRules, data, logCode) == nullptr) {
        return;
    }
    showRecordRows(kGsmCells, RecordReader(data), sectionArray());
}

std::string_view GSMSet::getSectionName() const {
    return "GSM Set";
}

LogCodeArray GSMSet::getLogCodeArray() const {
    return gsm::codesOf(kRules);
}

}  // namespace velmar
