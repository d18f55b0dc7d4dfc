// KxTestClient: a monitor-side client of kxserverd for the tests, built the way the monitor builds its log
// channel: a local receive port, a telephony service connection that creates the channel, and a remote port
// to the channel port that carries "GetTechnology" and the start command.
//
// Every blob that arrives with message id 0 is kept, with the time it arrived. A client that does not read
// (readBlobs false) never binds its receive port to a queue, so the service's messages pile up unread.
#pragma once

#include <chrono>
#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "core/platform/MessagePort.h"
#include "core/platform/PollMainQueue.h"
#include "core/platform/plist/PlistValue.h"

namespace velmar::testing {

class KxTestClient {
  public:
    // name must be unique among the clients of one test.
    KxTestClient(PollMainQueue& queue, std::string name);

    // Creates the receive port and asks the service for a channel. false with a reason in error().
    bool connect(bool readBlobs = true);
    // The "GetTechnology" round trip: the answer's value, or nullopt.
    std::optional<std::string> technology();
    // Sends the log-code start command {"SetState": "Streaming", "SetOrvaneLogCodes", "SetKxExtraCodes"}.
    bool start(const std::vector<std::int64_t>& codes, const std::vector<std::int64_t>& extraCodes);
    // Sends {"SetState": "Stopped"}: the channel stays, streaming ends.
    bool stopStreaming();
    // Sends any command without waiting for an answer.
    bool send(const PlistValue& command);
    // Sends a command and answers the parsed reply.
    std::optional<PlistValue> request(const PlistValue& command);
    // Gives up both ports, as a monitor that goes away does.
    void disconnect();

    const std::vector<PlistData>& blobs() const { return blobs_; }
    const std::vector<std::chrono::steady_clock::time_point>& arrivals() const { return arrivals_; }
    const std::string& channelPortName() const { return channelPortName_; }
    const std::string& receivePortName() const { return receivePortName_; }
    const std::string& error() const { return error_; }
    bool receivePortValid() const { return receivePort_ && receivePort_->isValid(); }

  private:
    PollMainQueue& queue_;
    std::string receivePortName_;
    std::string channelPortName_;
    std::string error_;
    std::shared_ptr<MessagePort> receivePort_;
    std::shared_ptr<MessagePort> sendPort_;
    std::vector<PlistData> blobs_;
    std::vector<std::chrono::steady_clock::time_point> arrivals_;
};

// The blobs of a recorded log file, ticks left out.
std::vector<PlistData> blobsOfFile(const std::string& path);
// Blobs as the service hands them on: through the packet-version adapter.
std::vector<PlistData> adaptedBlobs(std::vector<PlistData> blobs);
std::vector<PlistData> adaptedBlobsOfFile(const std::string& path);
// The distinct codes of ordinary log packets among blobs (no channel prefix), ascending.
std::vector<std::int64_t> codesOf(const std::vector<PlistData>& blobs);
// A blob as spaced lowercase hex, for readable failures.
std::string hexOf(const PlistData& blob);

}  // namespace velmar::testing
