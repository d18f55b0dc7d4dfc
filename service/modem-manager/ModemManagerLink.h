// ModemManagerLink: the live source's second supplier, beside the diagnostic port: what ModemManager knows
// about the modem (SIM identities, the cells it sees, the connected bearers), read over D-Bus and handed to
// the channels as the extra records 0xFF0000 (SIM files), 0xFF0001 (cell-monitor array) and 0xFF0002
// (packet-data contexts).
//
// Contract:
// - Everything runs on the service's queue through a BusConnection: no call ever waits on the bus.
// - The modem is the one named by Settings::modem (an object path, or the number that ends it), else the
//   one whose ports include the diagnostic port in use, else the only one. Its objects are read with
//   GetManagedObjects and the SIM's and bearers' properties with GetAll, again whenever ModemManager says a
//   modem, SIM or bearer changed (InterfacesAdded/Removed, PropertiesChanged), its name changes owner or a
//   diagnostic port begins to answer.
// - 0xFF0000 and 0xFF0002 go out when they change and whenever a channel starts asking for their code;
//   0xFF0001 is asked for (GetCellInfo) every cellInfoSeconds while a channel asks for it. Every record goes
//   only to the channels whose start command names its extra code (the sink filters).
// - Absence is normal: no bus, ModemManager not on it, no modem, an ambiguous choice, a modem removed: one
//   notice for each new state, the extras stop, nothing else is affected. The bus is tried again every
//   retrySeconds; ModemManager and modems appearing later are picked up from the bus's signals.
// - Values of the wrong type or out of range are skipped (ModemRecords) and logged as warnings: each line at
//   most once every kProblemWindow, however often the value comes back, and at most kProblemsPerWindow
//   lines a window; repeats and the rest are counted and summed up in one line when the next window opens.
#pragma once

#include <chrono>
#include <cstdint>
#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "core/platform/MainQueue.h"
#include "core/platform/plist/PlistValue.h"
#include "service/BasebandSource.h"
#include "service/modem-manager/BusConnection.h"
#include "service/modem-manager/BusMessages.h"
#include "service/modem-manager/ModemRecords.h"

namespace velmar::modem {

class ModemManagerLink {
  public:
    struct Settings {
        std::string busAddress;  // empty: the system bus
        std::string modem;  // an object path or its number; empty: the diagnostic port's modem, else the only
        double retrySeconds = 5.0;
        double cellInfoSeconds = 2.0;
    };
    // diagnosticPort answers the path of the diagnostic port in use ("" while none).
    ModemManagerLink(Settings settings, MainQueue& queue, BlobSink& sink,
                     std::function<std::string()> diagnosticPort);
    ~ModemManagerLink();

    void start();
    void stop();
    // The channels' demand may have changed: records newly asked for go out now.
    void demandChanged();
    // A diagnostic port has begun to answer (found, or back): the modem is chosen again, since the one
    // that owns the port may be another.
    void diagnosticPortChanged();

    static constexpr std::size_t kProblemsPerWindow = 5;
    static constexpr std::chrono::seconds kProblemWindow{60};

  private:
    enum class State { Starting, NoBus, NoService, NoModem, Ambiguous, Using };

    void connect();
    void onLost(const std::string& reason);
    void subscribe();
    void scheduleRefresh();
    void refresh();
    void onObjects(const BusObjects& objects);
    void readSim(std::uint64_t generation, const std::string& path);
    void readBearer(std::uint64_t generation, std::size_t index, const std::string& path);
    void replyArrived(std::uint64_t generation);
    void publish();
    void askCellInfo();
    void enter(State state, const std::string& detail);
    void report(std::vector<std::string>& problems);
    bool wants(std::uint16_t code) const;
    void send(const PlistData& record);

    Settings settings_;
    MainQueue& queue_;
    BlobSink& sink_;
    std::function<std::string()> diagnosticPort_;
    BusConnection bus_;
    std::shared_ptr<bool> alive_;
    State state_ = State::Starting;
    std::string stateDetail_;
    bool running_ = false;
    MainQueue::Handle retryTimer_ = 0;
    MainQueue::Handle refreshTimer_ = 0;
    MainQueue::Handle cellTimer_ = 0;
    std::uint64_t generation_ = 0;  // of the current read; replies of older reads are dropped
    int pendingReplies_ = 0;
    bool cellCallOut_ = false;

    std::string modemPath_;
    BusDictionary modem_;
    BusDictionary sim_;
    bool haveSim_ = false;
    std::vector<std::string> bearerPaths_;
    std::vector<BusDictionary> bearers_;

    std::optional<PlistData> simRecord_;  // the last records made, sent again to channels that start asking
    std::optional<PlistData> bearerRecord_;
    bool wantedCells_ = false;

    std::chrono::steady_clock::time_point problemWindowStart_{};
    std::vector<std::string> problemsLogged_;  // this window's lines, at most kProblemsPerWindow
    std::uint64_t problemsSuppressed_ = 0;
};

}  // namespace velmar::modem
