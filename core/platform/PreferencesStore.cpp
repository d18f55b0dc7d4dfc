#include "core/platform/PreferencesStore.h"

#include <sys/stat.h>
#include <unistd.h>

#include <cstdio>
#include <cstdlib>
#include <filesystem>

#include "core/platform/MessagePort.h"
#include "core/platform/SystemLog.h"
#include "core/platform/plist/PlistCodec.h"

namespace velmar {

PreferencesStore::PreferencesStore(std::string domain) : domain_(std::move(domain)) {
    auto existing = readDictionaryFile(filePath());
    values_ = existing ? existing->dictionary() : PlistDictionary::create();
    if (!values_) {
        values_ = PlistDictionary::create();
    }
}

std::string PreferencesStore::directory() {
    std::string base;
    if (const char* config = std::getenv("XDG_CONFIG_HOME"); config && *config) {
        base = config;
    } else if (const char* home = std::getenv("HOME"); home && *home) {
        base = std::string(home) + "/.config";
    } else {
        base = "/tmp";
    }
    return base + "/velmar/preferences";
}

std::string PreferencesStore::filePath() const {
    return directory() + "/" + domain_ + ".plist";
}

PlistValue PreferencesStore::value(const std::string& key) const {
    return values_->get(key);
}

void PreferencesStore::setValue(const std::string& key, PlistValue value) {
    values_->set(key, std::move(value));
}

bool PreferencesStore::synchronize() {
    std::error_code error;
    std::filesystem::create_directories(directory(), error);
    const std::string target = filePath();
    const std::string temporary = target + ".tmp-" + std::to_string(getpid());
    if (!writeXmlFile(PlistValue(values_), temporary)) {
        SystemLog::log(kLogError, "Cannot write preferences %s", temporary.c_str());
        return false;
    }
    if (std::rename(temporary.c_str(), target.c_str()) != 0) {
        std::remove(temporary.c_str());
        SystemLog::log(kLogError, "Cannot replace preferences %s", target.c_str());
        return false;
    }
    return true;
}

void PreferencesStore::postChanged(const std::string& key) const {
    auto listener = MessagePort::createRemote(domain_ + ".preferences-changed");
    if (!listener) {
        return;
    }
    auto note = PlistDictionary::create();
    note->set("Domain", domain_);
    note->set("Key", key);
    if (const auto encoded = serializeXml(note)) {
        listener->sendRequest(0, *encoded, 1.0, 0.0, false, nullptr);
    }
}

}  // namespace velmar
