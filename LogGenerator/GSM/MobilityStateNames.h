// MobilityStateNames: the value-name tables of the mobility-management state records (0x7130, 0x7131,
// 0x7132) shared by ProcessPS, ProcessCO and ProcessCS, and the field tables that read them.
//
// Contract: every value beyond a table's end, and every hole of the MM state table, is shown as "Unknown".
// Names are kept exactly as the baseband's state names, blanks and misspellings included.
#pragma once

#include "LogGenerator/RecordFields.h"

namespace velmar {

// Minimum length of each of the three records.
inline constexpr std::size_t kMobilityRecordMinimumLength = 16;

extern const ValueNames kRegistrationStateNames;
extern const ValueNames kMmStateNames;
extern const ValueNames kMmSubStateNames;
extern const ValueNames kLocationUpdateStatusNames;
extern const ValueNames kGmmStateNames;
extern const ValueNames kGmmSubStateNames;
extern const ValueNames kGmmUpdateStatusNames;

// 0x7132: "MM Service State" of the registration state.
inline constexpr RecordField kRegistrationStateFields[] = {
    u8Field(13, "MM Service State", asName(kRegistrationStateNames)),
};

}  // namespace velmar
