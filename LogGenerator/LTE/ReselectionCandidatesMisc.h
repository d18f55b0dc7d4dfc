// ReselectionCandidatesMisc: the "Reselection Candidates" key section, the serving-cell scalars of the idle-
// mode reselection-candidates record 0xB186.
//
// Contract: a record under 21 bytes changes nothing; another code is reported as unknown.
#pragma once

#include "LogGenerator/Base.h"

namespace velmar {

class ReselectionCandidatesMisc : public Base {
  public:
    void updateWithData(ByteView data, std::int32_t logCode) override;
    std::string_view getSectionName() const override;
    LogCodeArray getLogCodeArray() const override;
};

}  // namespace velmar
