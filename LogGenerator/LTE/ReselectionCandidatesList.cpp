#include "LogGenerator/LTE/ReselectionCandidatesList.h"

#include <span>
#include "LogGenerator/LTE/LTEClassIndex.h"

#include "LogGenerator/LTE/LteRecordLayouts.h"
#include "LogGenerator/ListSection.h"
#include "LogGenerator/RecordFields.h"
#include "LogGenerator/RecordRule.h"
#include "core/platform/logcodes/LteLogCodes.h"

namespace velmar {

namespace {

constexpr const DecoderRow& kRow = rowOf(kLteDecoders, "ReselectionCandidatesList");

using namespace lte_layout::reselection;

constexpr RecordRule kRules[] = {{kLogCodeLteReselectionCandidates, kMinimumLength}};
constexpr DecoderRules kDecoderRules{"Reselection Candidates List", kRules};

constexpr ValueName kRatNameRows[] = {
    {0, 0, "LTE"}, {1, 1, "UTRAN"}, {2, 2, "GERAN"}, {3, 3, "CDMA1XRTT"}, {4, 4, "CDMAHRPD"},
};
constexpr ValueNames kRatNames{kRatNameRows, "??"};

// The candidate's 4-byte header.
constexpr std::size_t kRatTypeOffset = 2;
constexpr RecordField kHeaderFields[] = {
    u16Field(0, "Candidate Priority"),
    u16Field(kRatTypeOffset, "Candidate RAT Type", asName(kRatNames)),
};

// Technology fields, relative to the bytes after the header.
constexpr RecordField kLteFields[] = {
    u16Field(0, "E ARFCN"),
    bitField(2, 2, 7, 15, "Cell ID"),
};
constexpr RecordField kUtranFields[] = {
    u16Field(0, "U ARFCN"),
    u16Field(2, "PSC"),
};
constexpr RecordField kGeranFields[] = {
    u16Field(0, "ARFCN"),
    u8Field(2, "Band"),
    u8Field(3, "BSIC ID"),
};
// CDMA 1xRTT and HRPD candidates share one layout and differ only in the name shown.
constexpr RecordField kCdmaFields[] = {
    u8Field(0, "Band"),
    u16Field(4, "Channel"),
    u16Field(6, "Pilot"),
};
// Indexed by RAT type; types beyond the table have no fields.
constexpr std::span<const RecordField> kTechnologyFields[] = {kLteFields, kUtranFields, kGeranFields,
                                                              kCdmaFields, kCdmaFields};

}  // namespace

ReselectionCandidatesList::ReselectionCandidatesList() : TableDecoder(kRow) {}
static_assert(rulesMatch(kRules, kRow));

void ReselectionCandidatesList::updateWithData(ByteView data, std::int32_t logCode) {
    if (admitRecord(kDecoderRules, data, logCode) == nullptr) {
        return;
    }
    const RecordReader record(data);
    const std::size_t count = record.u16(kCountOffset) & 0xFF;
    rebuildListSection(sectionArray(), count, [&](std::size_t index) {
        const std::size_t base = kEntriesOffset + kEntryStride * index;
        PlistDictionaryRef row = rowFromFields(kHeaderFields, record, base);
        const std::uint32_t ratType = record.u16(base + kRatTypeOffset);
        if (ratType < std::size(kTechnologyFields)) {
            writeFields(kTechnologyFields[ratType], record, base + kTechnologyFieldsOffset, *row);
        }
        return PlistValue(std::move(row));
    });
}

}  // namespace velmar
