#include "LogGenerator/GSM/GPRSInformation.h"

#include "LogGenerator/GSM/ORV_GSMClassIndex.h"
#include "LogGenerator/RecordRule.h"
#include "core/platform/logcodes/GsmLogCodes.h"

namespace velmar {

namespace {

constexpr const DecoderRow& kRow = rowOf(kGsmDecoders, "GPRSInformation");

constexpr ValueName kNetworkOperatingModeRows[] = {{0, 0, "Class 1"}, {1, 1, "Class 2"}, {2, 2, "Class 3"}};
constexpr ValueNames kNetworkOperatingModeNames{kNetworkOperatingModeRows, "Unknown"};

constexpr ValueName kSi13PositionRows[] = {
    {0, 0, "Located on BCCH"},
    {1, 1, "Located on Extended BCCH"},
    {255, 255, "Not Available"},
};
constexpr ValueNames kSi13PositionNames{kSi13PositionRows, "Unknown"};

constexpr ValueName kNetworkControlOrderRows[] = {
    {0, 0, "NC0"}, {1, 1, "NC1"}, {2, 2, "NC2"}, {255, 255, "Not Available"}};
constexpr ValueNames kNetworkControlOrderNames{kNetworkControlOrderRows, "Unknown"};

// 255 reads "Available" here, unlike the "Not Available" of the neighbouring tables; the display keeps it.
constexpr ValueName kPfcSupportedRows[] = {
    {0, 0, "Not Supported"}, {1, 1, "Supported"}, {255, 255, "Available"}};
constexpr ValueNames kPfcSupportedNames{kPfcSupportedRows, "Unknown"};

// The priority access threshold of the GPRS cell options.
constexpr ValueName kPriorityAccessThresholdRows[] = {
    {0, 0, "Barred (PKT access not allowed in the Cell)"},
    {1, 1, "Barred"},
    {2, 2, "Barred"},
    {3, 3, "1 Only"},
    {4, 4, "1 to 2"},
    {5, 5, "1 to 3"},
    {6, 6, "1 to 4"},
    {7, 7, "Allowed"},
    {255, 255, "Not Available"},
};
constexpr ValueNames kPriorityAccessThresholdNames{kPriorityAccessThresholdRows, "Unknown"};

// T3192 as coded by 3GPP TS 44.060 (3 = 0 ms follows 2 = 1500 ms).
constexpr ValueName kT3192Rows[] = {
    {0, 0, "500 ms"}, {1, 1, "1000 ms"}, {2, 2, "1500 ms"}, {3, 3, "0 ms"},
    {4, 4, "80 ms"},  {5, 5, "120 ms"},  {6, 6, "160 ms"},  {7, 7, "200 ms"},
};
constexpr ValueNames kT3192Names{kT3192Rows, "?? ms"};

constexpr ValueName kAccessBurstTypeRows[] = {{0, 0, "8-bit format"}};
constexpr ValueNames kAccessBurstTypeNames{kAccessBurstTypeRows, "11-bit format"};

constexpr ValueName kPacketSiStatusRows[] = {{0, 0, "Not Supported"}};
constexpr ValueNames kPacketSiStatusNames{kPacketSiStatusRows, "Supported"};

constexpr ValueName kCellReselectHysteresisRows[] = {{0, 0, "Not Applied"}};
constexpr ValueNames kCellReselectHysteresisNames{kCellReselectHysteresisRows, "Applied"};

constexpr RecordField kRegistrationFields[] = {
    u8Field(13, "Network Operating Mode", asName(kNetworkOperatingModeNames)),
};
constexpr RecordField kSi13Fields[] = {
    u8Field(14, "SI13 Position", asName(kSi13PositionNames)),
};
constexpr RecordField kCellOptionFields[] = {
    u8Field(15, "Network Control Order", asName(kNetworkControlOrderNames)),
    u8Field(13, "PFC Supported", asName(kPfcSupportedNames)),
    u8Field(14, "Priority Access Threshold", asName(kPriorityAccessThresholdNames)),
};
constexpr RecordField kTbfFields[] = {
    u8Field(15, "T3192", asName(kT3192Names)),
    u8Field(17, "Access Burst Type", asName(kAccessBurstTypeNames)),
    u8Field(16, "DRX Timer Max"),
};
constexpr RecordField kPbcchFields[] = {
    u8Field(13, "PBCCH Present"),
};
constexpr RecordField kPacketSystemInfoFields[] = {
    u8Field(16, "Ext Measurement Order"),
    u8Field(13, "Packet PSI Status"),
    u8Field(33, "Packet SI Status", asName(kPacketSiStatusNames)),
    u8Field(14, "Count LR"),
    u8Field(15, "Count HR"),
};
constexpr RecordField kHysteresisFields[] = {
    u8Field(26, "Cell Reselect Hysteresis", asName(kCellReselectHysteresisNames)),
};

constexpr RecordRule kRules[] = {
    {kLogCodeGprsCellOptions, 18, kCellOptionFields},
    {kLogCodeRegistrationInfo, 32, kRegistrationFields},
    {kLogCodeGprsTbfParameters, 24, kTbfFields},
    {kLogCodeGprsPbcchDescription, 34, kPbcchFields},
    {kLogCodeGprsPacketSystemInfo, 35, kPacketSystemInfoFields},
    {kLogCodeGprsSi13Position, 15, kSi13Fields},
    {kLogCodeGsmMeasurements, 29, kHysteresisFields},
};
constexpr DecoderRules kDecoderRules{"GPRSInformation", kRules};

}  // namespace

GPRSInformation::GPRSInformation() : KeySectionDecoder(kRow, kDecoderRules) {}
static_assert(rulesMatch(kRules, kRow));

}  // namespace velmar
