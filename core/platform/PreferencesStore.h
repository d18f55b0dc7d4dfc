// PreferencesStore: per-domain preference files, and the notification that tells another application to
// reread its preferences.
//
// Contract: a domain's preferences are one XML property-list dictionary in
// ${XDG_CONFIG_HOME:-~/.config}/velmar/preferences/<domain>.plist. setValue changes the in-memory copy;
// synchronize writes it atomically (temporary file, then rename). postChanged sends one message to the port
// "<domain>.preferences-changed" when something listens there, and does nothing otherwise.
#pragma once

#include <string>

#include "core/platform/plist/PlistValue.h"

namespace velmar {

class PreferencesStore {
  public:
    explicit PreferencesStore(std::string domain);

    static std::string directory();
    std::string filePath() const;
    PlistValue value(const std::string& key) const;
    void setValue(const std::string& key, PlistValue value);
    bool synchronize();
    void postChanged(const std::string& key) const;

    static constexpr const char* kHomeScreenDomain = "com.velmar.homescreen";

  private:
    std::string domain_;
    PlistDictionaryRef values_;
};

}  // namespace velmar
