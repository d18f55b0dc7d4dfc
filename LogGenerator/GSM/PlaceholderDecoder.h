// PlaceholderDecoder: a decoder whose section exists (so that the display template can place it) but which
// subscribes to no code. Dispatch therefore never calls it; if called, it only writes its title to the
// system log at warning priority.
#pragma once

#include <string_view>

#include "LogGenerator/Base.h"

namespace velmar {

class PlaceholderDecoder : public Base {
  public:
    void updateWithData(ByteView data, std::int32_t logCode) override;
    std::string_view getSectionName() const override { return sectionName_; }
    LogCodeArray getLogCodeArray() const override { return std::nullopt; }

  protected:
    PlaceholderDecoder(const char* title, std::string_view sectionName)
        : title_(title), sectionName_(sectionName) {}

  private:
    const char* title_;
    std::string_view sectionName_;
};

}  // namespace velmar
