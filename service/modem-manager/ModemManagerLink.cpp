#include "service/modem-manager/ModemManagerLink.h"

#include <systemd/sd-bus.h>

#include <algorithm>
#include <climits>
#include <cstdlib>

#include "core/platform/SystemLog.h"
#include "logfile/records/RecordBuilder.h"
#include "service/BasebandBlob.h"

namespace velmar::modem {

namespace {

constexpr const char* kService = "org.freedesktop.ModemManager1";
constexpr const char* kRootPath = "/org/freedesktop/ModemManager1";
constexpr const char* kModemInterface = "org.freedesktop.ModemManager1.Modem";
constexpr const char* kSimInterface = "org.freedesktop.ModemManager1.Sim";
constexpr const char* kBearerInterface = "org.freedesktop.ModemManager1.Bearer";
constexpr const char* kPropertiesInterface = "org.freedesktop.DBus.Properties";
constexpr const char* kObjectManagerInterface = "org.freedesktop.DBus.ObjectManager";
constexpr const char* kOff = "no SIM files, cell list or data contexts until";

// How long a burst of change signals is let settle before the objects are read again.
constexpr double kRefreshDelaySeconds = 0.05;

bool isDigits(std::string_view text) {
    return !text.empty() &&
           std::all_of(text.begin(), text.end(), [](char c) { return c >= '0' && c <= '9'; });
}

bool endsWithNumber(std::string_view path, std::string_view number) {
    return path.size() > number.size() && path.ends_with(number) &&
           path[path.size() - number.size() - 1] == '/';
}

// The device name of a port path as ModemManager lists it ("ttyUSB0"), through any symbolic links.
std::string portName(const std::string& path) {
    std::string resolved = path;
    if (char* real = realpath(path.c_str(), nullptr)) {
        resolved = real;
        std::free(real);  // NOLINT(cppcoreguidelines-no-malloc): realpath allocates with malloc
    }
    const std::size_t slash = resolved.rfind('/');
    return slash == std::string::npos ? resolved : resolved.substr(slash + 1);
}

std::string errorName(const std::string& error) {
    return error.substr(0, error.find(':'));
}

}  // namespace

ModemManagerLink::ModemManagerLink(Settings settings, MainQueue& queue, BlobSink& sink,
                                   std::function<std::string()> diagnosticPort)
    : settings_(std::move(settings)),
      queue_(queue),
      sink_(sink),
      diagnosticPort_(std::move(diagnosticPort)),
      bus_(queue),
      alive_(std::make_shared<bool>(true)) {
    bus_.setLostHandler([this](const std::string& reason) { onLost(reason); });
}

ModemManagerLink::~ModemManagerLink() {
    stop();
}

void ModemManagerLink::start() {
    if (running_) {
        return;
    }
    running_ = true;
    *alive_ = true;
    const std::weak_ptr<bool> alive = alive_;
    cellTimer_ = queue_.repeating(settings_.cellInfoSeconds, [this, alive] {
        if (const auto live = alive.lock(); live && *live && wants(1)) {
            askCellInfo();
        }
    });
    wantedCells_ = wants(1);
    connect();
}

void ModemManagerLink::stop() {
    if (!running_) {
        return;
    }
    running_ = false;
    *alive_ = false;
    for (MainQueue::Handle* timer : {&retryTimer_, &refreshTimer_, &cellTimer_}) {
        if (*timer != 0) {
            queue_.cancelTimer(*timer);
            *timer = 0;
        }
    }
    bus_.close();
}

bool ModemManagerLink::wants(std::uint16_t code) const {
    BasebandBlob probe;
    probe.kind = BlobKind::Extended;
    probe.code = code;
    return sink_.streamingDemand().accepts(probe);
}

void ModemManagerLink::send(const PlistData& record) {
    sink_.deliver(frameBasebandBlob(ByteView(record.data(), record.size())));
}

void ModemManagerLink::demandChanged() {
    // A channel that starts asking gets the current records at once; the others take them again unharmed.
    if (simRecord_ && wants(0)) {
        send(*simRecord_);
    }
    if (bearerRecord_ && wants(2)) {
        send(*bearerRecord_);
    }
    const bool cells = wants(1);
    if (cells && !wantedCells_) {
        askCellInfo();
    }
    wantedCells_ = cells;
}

void ModemManagerLink::diagnosticPortChanged() {
    if (running_ && bus_.isOpen()) {
        scheduleRefresh();
    }
}

void ModemManagerLink::enter(State state, const std::string& detail) {
    // One notice per state: an absence that goes on for another reason (the bus lost, then not found) is
    // not news; another modem in use is.
    if (state == state_ && (detail == stateDetail_ || state != State::Using)) {
        return;
    }
    state_ = state;
    stateDetail_ = detail;
    switch (state) {
        case State::Starting:
            break;
        case State::NoBus:
            SystemLog::log(kLogNotice, "modem-manager: no bus (%s); %s it is there", detail.c_str(), kOff);
            break;
        case State::NoService:
            SystemLog::log(kLogNotice, "modem-manager: ModemManager is not on the bus (%s); %s it appears",
                           detail.c_str(), kOff);
            break;
        case State::NoModem:
            SystemLog::log(kLogNotice, "modem-manager: %s; %s one appears", detail.c_str(), kOff);
            break;
        case State::Ambiguous:
            SystemLog::log(kLogNotice, "modem-manager: %s; choose one with --modem", detail.c_str());
            break;
        case State::Using:
            SystemLog::log(kLogNotice, "modem-manager: using modem %s", detail.c_str());
            break;
    }
}

void ModemManagerLink::report(std::vector<std::string>& problems) {
    const auto now = std::chrono::steady_clock::now();
    if (now - problemWindowStart_ >= kProblemWindow) {
        if (problemsSuppressed_ > 0) {
            SystemLog::log(kLogWarning, "modem-manager: %llu more values skipped in the last %lld s",
                           static_cast<unsigned long long>(problemsSuppressed_),
                           static_cast<long long>(kProblemWindow.count()));
        }
        problemWindowStart_ = now;
        problemsLogged_.clear();
        problemsSuppressed_ = 0;
    }
    for (std::string& problem : problems) {
        // The same bad value comes back with every poll: it is told once a window, then only counted.
        const bool told =
            std::find(problemsLogged_.begin(), problemsLogged_.end(), problem) != problemsLogged_.end();
        if (!told && problemsLogged_.size() < kProblemsPerWindow) {
            SystemLog::log(kLogWarning, "modem-manager: %s", problem.c_str());
            problemsLogged_.push_back(std::move(problem));
        } else {
            ++problemsSuppressed_;
        }
    }
    problems.clear();
}

void ModemManagerLink::connect() {
    retryTimer_ = 0;
    std::string error;
    if (!bus_.open(settings_.busAddress, error)) {
        enter(State::NoBus, error);
        const std::weak_ptr<bool> alive = alive_;
        retryTimer_ = queue_.after(settings_.retrySeconds, [this, alive] {
            if (const auto live = alive.lock(); live && *live) {
                connect();
            }
        });
        return;
    }
    subscribe();
    refresh();
}

void ModemManagerLink::onLost(const std::string& reason) {
    ++generation_;
    modemPath_.clear();
    cellCallOut_ = false;
    enter(State::NoBus, "the connection was lost: " + reason);
    const std::weak_ptr<bool> alive = alive_;
    retryTimer_ = queue_.after(settings_.retrySeconds, [this, alive] {
        if (const auto live = alive.lock(); live && *live) {
            connect();
        }
    });
}

void ModemManagerLink::subscribe() {
    bus_.match(std::string("type='signal',sender='org.freedesktop.DBus',interface='org.freedesktop.DBus',"
                           "member='NameOwnerChanged',arg0='") +
                   kService + "'",
               [this](sd_bus_message* /*signal*/) { scheduleRefresh(); });
    bus_.match(std::string("type='signal',sender='") + kService + "',path='" + kRootPath + "',interface='" +
                   kObjectManagerInterface + "'",
               [this](sd_bus_message* /*signal*/) { scheduleRefresh(); });
    bus_.match(std::string("type='signal',sender='") + kService + "',interface='" + kPropertiesInterface +
                   "',member='PropertiesChanged'",
               [this](sd_bus_message* signal) {
                   const char* interface = nullptr;
                   if (sd_bus_message_read_basic(signal, 's', &interface) <= 0 || interface == nullptr) {
                       return;
                   }
                   const std::string_view name = interface;
                   if (name == kModemInterface || name == kSimInterface || name == kBearerInterface) {
                       scheduleRefresh();
                   }
               });
}

void ModemManagerLink::scheduleRefresh() {
    if (refreshTimer_ != 0) {
        return;
    }
    const std::weak_ptr<bool> alive = alive_;
    refreshTimer_ = queue_.after(kRefreshDelaySeconds, [this, alive] {
        if (const auto live = alive.lock(); live && *live) {
            refreshTimer_ = 0;
            refresh();
        }
    });
}

void ModemManagerLink::refresh() {
    if (!bus_.isOpen()) {
        return;
    }
    const std::uint64_t generation = ++generation_;
    bus_.call(kService, kRootPath, kObjectManagerInterface, "GetManagedObjects", nullptr,
              [this, generation](sd_bus_message* reply, const std::string& error) {
                  if (generation != generation_) {
                      return;
                  }
                  if (reply == nullptr) {
                      modemPath_.clear();
                      simRecord_.reset();
                      bearerRecord_.reset();
                      enter(State::NoService, errorName(error));
                      return;
                  }
                  BusObjects objects;
                  if (!readObjects(reply, objects)) {
                      std::vector<std::string> problems = {"GetManagedObjects answered in an unknown form"};
                      report(problems);
                      return;
                  }
                  onObjects(objects);
              });
}

void ModemManagerLink::onObjects(const BusObjects& objects) {
    std::vector<std::string> modems;
    for (const auto& [path, interfaces] : objects) {
        if (interfaces.contains(kModemInterface)) {
            modems.push_back(path);
        }
    }
    std::string chosen;
    std::string why;
    if (!settings_.modem.empty()) {
        for (const std::string& path : modems) {
            if (path == settings_.modem ||
                (isDigits(settings_.modem) && endsWithNumber(path, settings_.modem))) {
                chosen = path;
            }
        }
        why = "no modem " + settings_.modem;
    } else {
        const std::string port = diagnosticPort_ ? diagnosticPort_() : std::string();
        if (!port.empty()) {
            const std::string name = portName(port);
            for (const std::string& path : modems) {
                const BusDictionary& properties = objects.find(path)->second.find(kModemInterface)->second;
                const auto ports = properties.find("Ports");
                const auto* names = ports != properties.end() ? ports->second.asTexts() : nullptr;
                if (names != nullptr && std::find(names->begin(), names->end(), name) != names->end()) {
                    chosen = path;
                }
            }
        }
        if (chosen.empty() && modems.size() == 1) {
            chosen = modems.front();
        }
        why = modems.empty() ? std::string("no modem")
                             : std::to_string(modems.size()) + " modems and none owns the diagnostic port";
    }
    if (chosen.empty()) {
        modemPath_.clear();
        simRecord_.reset();
        bearerRecord_.reset();
        enter(modems.empty() || !settings_.modem.empty() ? State::NoModem : State::Ambiguous, why);
        return;
    }
    modemPath_ = chosen;
    enter(State::Using, chosen);
    modem_ = objects.find(chosen)->second.find(kModemInterface)->second;

    std::vector<std::string> problems;
    std::string simPath;
    if (const auto found = modem_.find("Sim"); found != modem_.end()) {
        if (const std::string* path = found->second.asText(); path != nullptr && found->second.type == 'o') {
            simPath = *path == "/" ? std::string() : *path;
        } else {
            problems.push_back("modem: Sim is not an object path; skipped");
        }
    }
    bearerPaths_.clear();
    if (const auto found = modem_.find("Bearers"); found != modem_.end()) {
        if (const auto* paths = found->second.asTexts()) {
            bearerPaths_ = *paths;
        } else {
            problems.push_back("modem: Bearers is not a list of object paths; skipped");
        }
    }
    report(problems);
    haveSim_ = false;
    sim_.clear();
    bearers_.assign(bearerPaths_.size(), BusDictionary());
    const std::uint64_t generation = generation_;
    pendingReplies_ = static_cast<int>(bearerPaths_.size()) + (simPath.empty() ? 0 : 1);
    if (pendingReplies_ == 0) {
        publish();
        return;
    }
    if (!simPath.empty()) {
        readSim(generation, simPath);
    }
    for (std::size_t index = 0; index < bearerPaths_.size(); ++index) {
        readBearer(generation, index, bearerPaths_[index]);
    }
}

void ModemManagerLink::readSim(std::uint64_t generation, const std::string& path) {
    bus_.call(kService, path.c_str(), kPropertiesInterface, "GetAll", kSimInterface,
              [this, generation](sd_bus_message* reply, const std::string& /*error*/) {
                  if (generation != generation_) {
                      return;
                  }
                  if (reply != nullptr) {
                      haveSim_ = readPropertyMap(reply, sim_);
                  }
                  replyArrived(generation);
              });
}

void ModemManagerLink::readBearer(std::uint64_t generation, std::size_t index, const std::string& path) {
    bus_.call(
        kService, path.c_str(), kPropertiesInterface, "GetAll", kBearerInterface,
        [this, generation, index](sd_bus_message* reply, const std::string& /*error*/) {
            if (generation != generation_) {
                return;
            }
            if (reply != nullptr && index < bearers_.size() && !readPropertyMap(reply, bearers_[index])) {
                bearers_[index].clear();
            }
            replyArrived(generation);
        });
}

void ModemManagerLink::replyArrived(std::uint64_t generation) {
    if (generation == generation_ && --pendingReplies_ == 0) {
        publish();
    }
}

void ModemManagerLink::publish() {
    std::vector<std::string> problems;
    const PlistData sim = buildSimFilesRecord(simFilesFrom(haveSim_ ? &sim_ : nullptr, modem_, problems));
    std::vector<BearerContext> contexts;
    for (std::size_t index = 0; index < bearers_.size(); ++index) {
        if (auto context = bearerContextFrom(bearerPaths_[index], bearers_[index], problems)) {
            contexts.push_back(std::move(*context));
        }
    }
    const PlistData bearers = buildBearerContextsRecord(contexts);
    report(problems);
    if (!simRecord_ || *simRecord_ != sim) {
        simRecord_ = sim;
        if (wants(0)) {
            send(sim);
        }
    }
    if (!bearerRecord_ || *bearerRecord_ != bearers) {
        bearerRecord_ = bearers;
        if (wants(2)) {
            send(bearers);
        }
    }
}

void ModemManagerLink::askCellInfo() {
    if (!bus_.isOpen() || modemPath_.empty() || cellCallOut_) {
        return;
    }
    cellCallOut_ = true;
    bus_.call(kService, modemPath_.c_str(), kModemInterface, "GetCellInfo", nullptr,
              [this, path = modemPath_](sd_bus_message* reply, const std::string& error) {
                  cellCallOut_ = false;
                  if (path != modemPath_) {
                      return;
                  }
                  std::vector<std::string> problems;
                  std::vector<BusDictionary> cells;
                  if (reply == nullptr) {
                      problems.push_back("GetCellInfo failed: " + error);
                  } else if (!readPropertyMaps(reply, cells)) {
                      problems.push_back("GetCellInfo answered in an unknown form");
                  } else {
                      const PlistValue array = cellMonitorFrom(cells, problems);
                      if (wants(1)) {
                          send(buildCellMonitorPacket(array));
                      }
                  }
                  report(problems);
              });
}

}  // namespace velmar::modem
