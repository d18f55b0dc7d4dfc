#include "LogGenerator/GSM/GSMRRInfo.h"

#include "LogGenerator/GSM/ORV_GSMClassIndex.h"
#include "LogGenerator/RecordRule.h"
#include "core/platform/logcodes/GsmLogCodes.h"

namespace velmar {

namespace {

constexpr const DecoderRow& kRow = rowOf(kGsmDecoders, "GSMRRInfo");

// Three of the names carry a blank inside, as the baseband spells them.
constexpr ValueName kRrStateRows[] = {
    {0, 0, "RR_INACTIVE"},
    {1, 1, "RR_GOING_ACTIVE"},
    {2, 2, "RR_GOING_INACTIVE"},
    {3, 3, "RR_CELL_SELECTION"},
    {4, 4, "RR_PLMN_LIST_CONSTRUCTION"},
    {5, 5, "RR_IDLE"},
    {6, 6, "RR_CELL_RESELECTION"},
    {7, 7, "RR_CONNECTION_PENDING"},
    {8, 8, "RR_CHOOSE_CELL"},
    {9, 9, "RR_DATA_TRANSFER"},
    {10, 10, "RR_NO_CHANNELS"},
    {11, 11, "RR_CONNECTION_RELEASE"},
    {12, 12, "RR_EARLY_CAMPED_WAIT_FOR_SI"},
    {13, 13, "RR_W2G_INTERRAT_HANDOVER_ PROGRESS"},
    {14, 14, "RR_W2G_INTERRAT_RESELECTION_PROGRESS"},
    {15, 15, "RR_WAIT_FOR_EARLY_PSCAN"},
    {16, 16, "GRR51"},
    {17, 17, "GRR52"},
    {18, 18, "RR_G2W_INTERRAT_RESELECTION_PROGRESS"},
    {19, 19, "RR_G2W_INTERRAT_HANDOVER_ PROGRESS"},
    {20, 20, "RR_CELL_REEST"},
    {21, 21, "RR_W2G_INTERRAT_CC_ORDER_ PROGRESS"},
};
constexpr ValueNames kRrStateNames{kRrStateRows, "Unknown"};

constexpr ValueName kVoiceRows[] = {{0, 0, "Voice"}};
constexpr ValueNames kRrModeNames{kVoiceRows, "Data"};

constexpr ValueName kOffRows[] = {{0, 0, "OFF"}};
constexpr ValueNames kDtxNames{kOffRows, "ON"};

// 0x512C: RR state.
constexpr RecordField kRrStateFields[] = {
    u8Field(13, "RR State", asName(kRrStateNames)),
    u8Field(14, "RR Sub State"),
    u8Field(15, "RR Status"),
    u8Field(16, "RR Mode", asName(kRrModeNames)),
};

// 0x5137: the serving cell's measurements. The two 32-bit values are shown whole here (the serving-cell
// section shows their low 16 bits as C1 and C2).
constexpr RecordField kServingMeasurementFields[] = {
    u8Field(15, "Serving Rx Level"),
    s32Field(16, "Rx Quality Full"),
    s32Field(20, "Rx Quality Sub"),
};

// 0x5072: channel parameters.
constexpr RecordField kChannelFields[] = {
    u8Field(19, "DTX Used", asName(kDtxNames)),
};

// 0x51F6: the DRX timer.
constexpr RecordField kDrxFields[] = {
    u8Field(16, "DRX Used", asInt("%d sec")),
};

constexpr RecordRule kRules[] = {
    {kLogCodeGsmRrState, 17, kRrStateFields},
    {kLogCodeGsmMeasurements, 29, kServingMeasurementFields},
    {kLogCodeGsmChannelParameters, 20, kChannelFields},
    {kLogCodeGprsTbfParameters, 24, kDrxFields},
};
constexpr DecoderRules kDecoderRules{"GSMRRInfo", kRules};

}  // namespace

GSMRRInfo::GSMRRInfo() : KeySectionDecoder(kRow, kDecoderRules) {}
static_assert(rulesMatch(kRules, kRow));

}  // namespace velmar
