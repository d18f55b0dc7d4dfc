#include "service/live/DiagSession.h"

#include <algorithm>
#include <cinttypes>
#include <cstdio>

#include "core/platform/SystemLog.h"
#include "logfile/DiagFraming.h"
#include "service/live/LogMasks.h"

namespace velmar::live {

namespace {

constexpr std::uint8_t kDebugConfigSuccess = 1;

std::string hexByte(std::uint8_t value) {
    char text[8];
    std::snprintf(text, sizeof text, "0x%02X", value);
    return text;
}

std::string hexItems(std::uint32_t value) {
    char text[16];
    std::snprintf(text, sizeof text, "0x%X", value);
    return text;
}

// A device's text for a message: printable ASCII, anything else as '?', "(none)" when empty.
std::string text(const std::string& field) {
    if (field.empty()) {
        return "(none)";
    }
    std::string shown = field;
    std::replace_if(
        shown.begin(), shown.end(), [](char c) { return c < 0x20 || c > 0x7E; }, '?');
    return shown;
}

}  // namespace

DiagSession::DiagSession(MainQueue& queue, std::string name, DiagTiming timing, DiagRequests::Writer writer,
                         Listener& listener)
    : queue_(queue),
      name_(std::move(name)),
      timing_(timing),
      listener_(listener),
      writer_(writer),
      requests_(queue, std::move(writer), timing.responseSeconds),
      alive_(std::make_shared<bool>(true)) {}

DiagSession::~DiagSession() {
    *alive_ = false;
    if (keepAliveTimer_ != 0) {
        queue_.cancelTimer(keepAliveTimer_);
    }
}

std::string DiagSession::failure(DiagRequests::Outcome outcome, ByteView response) const {
    switch (outcome) {
        case DiagRequests::Outcome::Answered:
            return {};
        case DiagRequests::Outcome::ErrorResponse:
            return "refused: " + std::string(errorResponseName(response[0])) + " (" + hexByte(response[0]) +
                   ")";
        case DiagRequests::Outcome::TimedOut:
            break;
    }
    return "no answer";
}

void DiagSession::begin(const LogCodeFilter& demand) {
    demand_ = demand;
    state_ = State::Probing;
    // A lone flag ends whatever partial frame the device's receiver holds.
    const std::uint8_t flag = 0x7E;
    writer_(ByteView(&flag, 1));
    requests_.submit(
        versionRequest(), timing_.probeAttempts,
        [this](DiagRequests::Outcome outcome, ByteView response) { onVersion(outcome, response); });
}

void DiagSession::onVersion(DiagRequests::Outcome outcome, ByteView response) {
    if (outcome == DiagRequests::Outcome::TimedOut) {
        state_ = State::Idle;
        listener_.probeFailed();
        return;
    }
    if (outcome == DiagRequests::Outcome::Answered) {
        identity_.version = parseVersionResponse(response);
    }
    if (identity_.version) {
        const VersionInfo& version = *identity_.version;
        SystemLog::log(kLogNotice,
                       "live: %s: diagnostic port answers: version %s, compiled %s %s, released %s %s",
                       name_.c_str(), text(version.directory).c_str(), text(version.compileDate).c_str(),
                       text(version.compileTime).c_str(), text(version.releaseDate).c_str(),
                       text(version.releaseTime).c_str());
    } else {
        // An error response or a short answer is still an answer: this is a diagnostic port.
        SystemLog::log(kLogNotice, "live: %s: diagnostic port answers (version request: %s)", name_.c_str(),
                       outcome == DiagRequests::Outcome::Answered ? "short response"
                                                                  : failure(outcome, response).c_str());
    }
    state_ = State::SettingUp;
    setUpStep(buildIdRequest(),
              [this](DiagRequests::Outcome result, ByteView answer) { onBuildId(result, answer); });
    setUpStep(eventReportsRequest(false), [this](DiagRequests::Outcome result, ByteView answer) {
        checkPlain("event reports off", result, answer);
    });
    setUpStep(debugMessagesOffRequest(), [this](DiagRequests::Outcome result, ByteView answer) {
        checkPlain("debug messages off", result, answer);
    });
    setUpStep(logConfigRequest(LogConfigOperation::DisableAll),
              [this](DiagRequests::Outcome result, ByteView answer) {
                  checkLogConfig("log disable", result, answer);
              });
    setUpStep(logConfigRequest(LogConfigOperation::RetrieveRanges),
              [this](DiagRequests::Outcome result, ByteView answer) { onRanges(result, answer); });
}

void DiagSession::setUpStep(PlistData request, Step check) {
    requests_.submit(std::move(request), timing_.attempts,
                     [this, check = std::move(check)](DiagRequests::Outcome outcome, ByteView response) {
                         if (state_ == State::SettingUp) {
                             check(outcome, response);
                         }
                     });
}

void DiagSession::onBuildId(DiagRequests::Outcome outcome, ByteView response) {
    if (outcome == DiagRequests::Outcome::Answered) {
        identity_.build = parseBuildIdResponse(response);
    }
    if (!identity_.build) {
        SystemLog::log(kLogWarning, "live: %s: build id request: %s", name_.c_str(),
                       outcome == DiagRequests::Outcome::Answered ? "short response"
                                                                  : failure(outcome, response).c_str());
        return;
    }
    const BuildIdInfo& build = *identity_.build;
    SystemLog::log(kLogNotice,
                   "live: %s: build id %s, model %s, hardware version 0x%08" PRIX32 ", model id %" PRIu32,
                   name_.c_str(), text(build.buildId).c_str(), text(build.model).c_str(),
                   build.hardwareVersion, build.modelId);
}

void DiagSession::checkPlain(const std::string& what, DiagRequests::Outcome outcome, ByteView response) {
    const std::string problem = failure(outcome, response);
    if (!problem.empty()) {
        SystemLog::log(kLogWarning, "live: %s: %s: %s", name_.c_str(), what.c_str(), problem.c_str());
        return;
    }
    if (response[0] == kDiagDebugConfigCommand &&
        (response.size() < 3 || response[2] != kDebugConfigSuccess)) {
        SystemLog::log(kLogWarning, "live: %s: %s: status %u", name_.c_str(), what.c_str(),
                       response.size() < 3 ? 0U : static_cast<unsigned>(response[2]));
    }
}

void DiagSession::checkLogConfig(const std::string& what, DiagRequests::Outcome outcome, ByteView response) {
    const std::string problem = failure(outcome, response);
    if (!problem.empty()) {
        SystemLog::log(kLogError, "live: %s: %s: %s", name_.c_str(), what.c_str(), problem.c_str());
        return;
    }
    const std::optional<LogConfigResponse> parsed = parseLogConfigResponse(response);
    if (!parsed) {
        SystemLog::log(kLogError, "live: %s: %s: response of %zu bytes is too short", name_.c_str(),
                       what.c_str(), response.size());
    } else if (parsed->status != kLogConfigSuccess) {
        SystemLog::log(kLogError, "live: %s: %s failed: %s", name_.c_str(), what.c_str(),
                       logConfigStatusName(parsed->status).c_str());
    }
}

void DiagSession::onRanges(DiagRequests::Outcome outcome, ByteView response) {
    ranges_ = {};
    std::string problem = failure(outcome, response);
    if (problem.empty()) {
        const std::optional<LogConfigResponse> parsed = parseLogConfigResponse(response);
        const std::optional<EquipmentRanges> ranges = parsed ? parseLogRanges(*parsed) : std::nullopt;
        if (!parsed || !ranges) {
            problem = "response of " + std::to_string(response.size()) + " bytes is too short";
        } else if (parsed->status != kLogConfigSuccess) {
            problem = "failed: " + logConfigStatusName(parsed->status);
        } else {
            ranges_ = *ranges;
        }
    }
    if (!problem.empty()) {
        SystemLog::log(kLogWarning, "live: %s: log ranges request: %s; masks sized by the wanted codes alone",
                       name_.c_str(), problem.c_str());
    } else {
        std::string list;
        for (std::size_t id = 0; id < ranges_.size(); ++id) {
            if (ranges_[id] != 0) {
                list += (list.empty() ? "" : ", ") + std::to_string(id) + ": " + hexItems(ranges_[id]);
            }
        }
        SystemLog::log(kLogInfo, "live: %s: log ranges by equipment id: %s", name_.c_str(),
                       list.empty() ? "none" : list.c_str());
    }
    setUpDone();
}

void DiagSession::setUpDone() {
    state_ = State::Ready;
    inForce_.clear();  // the set-up disabled every mask
    mayBeLogging_ = false;
    armKeepAlive();
    sendMasks();
}

void DiagSession::setDemand(const LogCodeFilter& demand) {
    if (demand == demand_) {
        return;
    }
    demand_ = demand;
    if (state_ != State::Ready) {
        return;  // the set-up sends the masks of the demand as it stands when it is done
    }
    if (masksInFlight_) {
        demandChanged_ = true;
        return;
    }
    sendMasks();
}

void DiagSession::sendMasks() {
    demandChanged_ = false;
    const std::vector<EquipmentLogMask> wanted = logMasksFor(demand_, ranges_);
    if (wanted.empty()) {
        if (!mayBeLogging_) {
            masksSent();
            return;
        }
        masksInFlight_ = true;
        maskAnswersDue_ = 1;
        requests_.submit(logConfigRequest(LogConfigOperation::DisableAll), timing_.attempts,
                         [this](DiagRequests::Outcome outcome, ByteView response) {
                             if (state_ != State::Ready) {
                                 return;
                             }
                             if (outcome == DiagRequests::Outcome::TimedOut) {
                                 lostDevice("log disable");
                                 return;
                             }
                             checkLogConfig("log disable", outcome, response);
                             inForce_.clear();
                             mayBeLogging_ = false;
                             SystemLog::log(kLogNotice, "live: %s: logging off (no channel streams)",
                                            name_.c_str());
                             maskAnswersDue_ = 0;
                             masksSent();
                         });
        return;
    }
    const std::vector<EquipmentLogMask> updates = maskUpdates(inForce_, wanted);
    if (updates.empty()) {
        masksSent();
        return;
    }
    masksInFlight_ = true;
    // Even a set-mask that fails may have changed the device's mask: only a disable makes it sure again.
    mayBeLogging_ = true;
    maskAnswersDue_ = updates.size();
    for (const EquipmentLogMask& mask : updates) {
        requests_.submit(setLogMaskRequest(mask), timing_.attempts,
                         [this, mask](DiagRequests::Outcome outcome, ByteView response) {
                             onMaskAnswer(mask, outcome, response);
                         });
    }
}

void DiagSession::onMaskAnswer(const EquipmentLogMask& sent, DiagRequests::Outcome outcome,
                               ByteView response) {
    if (state_ != State::Ready) {
        return;
    }
    if (outcome == DiagRequests::Outcome::TimedOut) {
        lostDevice("set log mask");
        return;
    }
    const auto forget = [this, &sent] {
        std::erase_if(inForce_,
                      [&](const EquipmentLogMask& mask) { return mask.equipment == sent.equipment; });
    };
    const std::string problem = failure(outcome, response);
    const std::optional<LogConfigResponse> parsed =
        problem.empty() ? parseLogConfigResponse(response) : std::nullopt;
    const std::optional<SetMaskEcho> echo = parsed ? parseSetMaskEcho(*parsed) : std::nullopt;
    if (!problem.empty()) {
        SystemLog::log(kLogError, "live: %s: equipment id %" PRIu32 ": set log mask %s", name_.c_str(),
                       sent.equipment, problem.c_str());
        forget();
    } else if (!parsed) {
        SystemLog::log(kLogError,
                       "live: %s: equipment id %" PRIu32 ": set log mask: response of %zu bytes is too short",
                       name_.c_str(), sent.equipment, response.size());
        forget();
    } else if (parsed->status != kLogConfigSuccess) {
        SystemLog::log(kLogError, "live: %s: equipment id %" PRIu32 ": set log mask failed: %s",
                       name_.c_str(), sent.equipment, logConfigStatusName(parsed->status).c_str());
        forget();
    } else {
        forget();
        const std::size_t codes = codesInMask(sent);
        if (codes != 0) {
            inForce_.push_back(sent);
        }
        if (echo && echo->itemCount < sent.itemCount) {
            EquipmentLogMask kept = sent;
            kept.itemCount = echo->itemCount;
            kept.bits.resize((echo->itemCount + 7) / 8);
            if (echo->itemCount % 8 != 0 && !kept.bits.empty()) {
                kept.bits.back() =
                    static_cast<std::uint8_t>(kept.bits.back() & ((1U << (echo->itemCount % 8)) - 1));
            }
            SystemLog::log(kLogWarning,
                           "live: %s: equipment id %" PRIu32 ": the device kept %" PRIu32 " of %" PRIu32
                           " mask items; %zu wanted codes are not logged",
                           name_.c_str(), sent.equipment, echo->itemCount, sent.itemCount,
                           codes - codesInMask(kept));
        }
        if (codes != 0) {
            SystemLog::log(kLogNotice,
                           "live: %s: equipment id %" PRIu32 ": logging %zu codes (mask of %s items)",
                           name_.c_str(), sent.equipment, codes, hexItems(sent.itemCount).c_str());
        } else {
            SystemLog::log(kLogNotice, "live: %s: equipment id %" PRIu32 ": logging nothing", name_.c_str(),
                           sent.equipment);
        }
    }
    if (maskAnswersDue_ > 0 && --maskAnswersDue_ == 0) {
        masksSent();
    }
}

void DiagSession::masksSent() {
    masksInFlight_ = false;
    if (!readyTold_) {
        readyTold_ = true;
        const std::weak_ptr<bool> alive = alive_;
        listener_.ready();
        if (const std::shared_ptr<bool> live = alive.lock(); !live || !*live) {
            return;
        }
    }
    if (demandChanged_ && state_ == State::Ready) {
        sendMasks();
    }
}

void DiagSession::lostDevice(const std::string& what) {
    if (state_ != State::Ready) {
        return;
    }
    state_ = State::Idle;
    requests_.cancelAll();
    listener_.stoppedAnswering("no answer to " + what);
}

void DiagSession::heardFromDevice() {
    heard_ = true;
}

void DiagSession::armKeepAlive() {
    if (keepAliveTimer_ != 0) {
        queue_.cancelTimer(keepAliveTimer_);
    }
    heard_ = false;
    keepAliveTimer_ = queue_.after(timing_.keepAliveSeconds, [this, alive = std::weak_ptr<bool>(alive_)] {
        const std::shared_ptr<bool> live = alive.lock();
        if (live && *live) {
            keepAliveTimer_ = 0;
            keepAlive();
        }
    });
}

void DiagSession::keepAlive() {
    if (state_ != State::Ready) {
        return;
    }
    if (heard_ || !requests_.idle()) {
        armKeepAlive();
        return;
    }
    requests_.submit(versionRequest(), timing_.probeAttempts,
                     [this](DiagRequests::Outcome outcome, ByteView) {
                         if (state_ != State::Ready) {
                             return;
                         }
                         if (outcome == DiagRequests::Outcome::TimedOut) {
                             lostDevice("a version request");
                             return;
                         }
                         armKeepAlive();
                     });
}

void DiagSession::onFrame(ByteView packet) {
    // Before the probe is answered, a stray answer is likely the device's reply to whoever used the port
    // last (what arrived after the port was flushed); after the end nothing is asked any more.
    if (requests_.offer(packet) != DiagRequests::Offer::Unmatched || state_ == State::Probing ||
        state_ == State::Stopping || state_ == State::Stopped) {
        return;
    }
    ++unmatched_;
    if (unmatched_ == 1) {
        SystemLog::log(
            kLogWarning,
            "live: %s: a response (command %s) matches no request: another program is talking to the "
            "port; the udev rule 60-velmar-diag-port.rules keeps ModemManager away from it",
            name_.c_str(), hexByte(packet[0]).c_str());
    }
}

std::vector<PlistData> DiagSession::stopRequests() {
    return {logConfigRequest(LogConfigOperation::DisableAll), eventReportsRequest(false),
            debugMessagesOffRequest()};
}

void DiagSession::abandon() {
    state_ = State::Stopped;
    requests_.cancelAll();
    if (keepAliveTimer_ != 0) {
        queue_.cancelTimer(keepAliveTimer_);
        keepAliveTimer_ = 0;
    }
}

void DiagSession::stopNow() {
    const bool talking = state_ == State::SettingUp || state_ == State::Ready || state_ == State::Stopping;
    abandon();
    if (!talking) {
        return;
    }
    PlistData frames;
    for (const PlistData& request : stopRequests()) {
        appendDiagFrame(frames, request);
    }
    writer_(frames);
    SystemLog::log(kLogNotice, "live: %s: logging off", name_.c_str());
}

void DiagSession::stop(std::function<void()> done) {
    const bool talking = state_ == State::SettingUp || state_ == State::Ready;
    requests_.cancelAll();
    if (keepAliveTimer_ != 0) {
        queue_.cancelTimer(keepAliveTimer_);
        keepAliveTimer_ = 0;
    }
    if (!talking) {
        state_ = State::Stopped;
        done();
        return;
    }
    state_ = State::Stopping;
    const auto check = [this](const std::string& what) {
        return [this, what](DiagRequests::Outcome outcome, ByteView response) {
            if (what == "log disable") {
                checkLogConfig(what, outcome, response);
            } else {
                checkPlain(what, outcome, response);
            }
        };
    };
    std::vector<PlistData> requests = stopRequests();
    requests_.submit(std::move(requests[0]), 1, check("log disable"));
    requests_.submit(std::move(requests[1]), 1, check("event reports off"));
    requests_.submit(std::move(requests[2]), 1,
                     [this, check, done = std::move(done)](DiagRequests::Outcome outcome, ByteView response) {
                         check("debug messages off")(outcome, response);
                         state_ = State::Stopped;
                         inForce_.clear();
                         mayBeLogging_ = false;
                         SystemLog::log(kLogNotice, "live: %s: logging off", name_.c_str());
                         done();
                     });
}

}  // namespace velmar::live
