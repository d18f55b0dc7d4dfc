// FakeTelephonyService: a telephony service for the model's tests, built on the same port library, running on
// its own thread and main queue. It can behave well or badly: answer "GetTechnology" with any technology,
// with a dictionary lacking the answer, with bytes that are not a property list, or not at all; refuse
// channels; answer an empty port name; send blobs with any message id; and close a channel as a dying service
// would.
#pragma once

#include <atomic>
#include <functional>
#include <memory>
#include <mutex>
#include <optional>
#include <string>
#include <thread>
#include <vector>

#include "core/platform/MessagePort.h"
#include "core/platform/PollMainQueue.h"
#include "core/platform/plist/PlistValue.h"

namespace velmar::testing {

class FakeTelephonyService {
  public:
    enum class TechnologyReply { Answer, NoAnswerKey, NotAPropertyList, EmptyReply, Stall };

    struct Behaviour {
        std::string technology = "kKxLogChannelTechnology_Orvane_LTE";
        TechnologyReply technologyReply = TechnologyReply::Answer;
        std::int32_t channelError = 0;  // non-zero: refuse channels with this error code
        bool emptyChannelPort = false;
    };

    FakeTelephonyService();
    explicit FakeTelephonyService(Behaviour behaviour);
    ~FakeTelephonyService();

    // Sends a blob on the newest channel (from the service's thread); waits until it has gone out.
    void sendBlob(const PlistData& blob, std::int32_t messageId = 0);
    // Closes the newest channel's ports, as a service that went away would.
    void closeChannel();
    // The commands that arrived on channel ports (decoded property lists), in order.
    std::vector<PlistValue> commands();
    int channelsCreated() const { return channelsCreated_.load(); }
    // Waits until predicate holds or the time is up (the predicate may call the other members).
    bool waitFor(const std::function<bool()>& predicate, double seconds);

  private:
    void runOnServiceThread(std::function<void()> task);
    std::optional<PlistData> onControl(ByteView data);
    std::optional<PlistData> onChannel(ByteView data);

    Behaviour behaviour_;
    PollMainQueue queue_;
    std::thread thread_;
    std::mutex mutex_;
    std::vector<std::function<void()>> tasks_;
    std::vector<PlistValue> commands_;
    std::atomic<int> channelsCreated_{0};
    std::atomic<bool> stopping_{false};
    // Used on the service thread only.
    std::shared_ptr<MessagePort> control_;
    std::shared_ptr<MessagePort> channel_;
    std::shared_ptr<MessagePort> client_;
    int nextChannel_ = 0;
};

}  // namespace velmar::testing
