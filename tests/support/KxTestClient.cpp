#include "tests/support/KxTestClient.h"

#include <set>

#include "core/platform/KxServerProtocol.h"
#include "core/platform/TelephonyServiceConnection.h"
#include "core/platform/plist/PlistCodec.h"
#include "logfile/LogFormat.h"
#include "logfile/PacketVersionAdapter.h"

namespace velmar::testing {

namespace {
constexpr double kTimeoutSeconds = 10.0;
}

KxTestClient::KxTestClient(PollMainQueue& queue, std::string name)
    : queue_(queue), receivePortName_("com.velmar.test." + name + ".BasebandStateReport.LogChannel") {}

bool KxTestClient::connect(bool readBlobs) {
    bool exists = false;
    receivePort_ = MessagePort::createLocal(
        receivePortName_,
        [this](std::int32_t messageId, ByteView data) -> std::optional<PlistData> {
            if (messageId == 0) {
                blobs_.emplace_back(data.begin(), data.end());
                arrivals_.push_back(std::chrono::steady_clock::now());
            }
            return std::nullopt;
        },
        &exists);
    if (!receivePort_ || exists) {
        error_ = "cannot create the receive port";
        return false;
    }
    if (readBlobs) {
        receivePort_->setDispatchQueue(queue_);
    }
    const auto connection = TelephonyServiceConnection::create(nullptr, queue_);
    if (!connection) {
        error_ = "no service listens on the control port";
        return false;
    }
    std::optional<std::string> channelPort;
    const TelephonyServiceConnection::Status status =
        connection->createLogChannel(receivePortName_, &channelPort);
    if (status.error != 0 || !channelPort || channelPort->empty()) {
        error_ = "CreateLogChannel failed: domain " + std::to_string(status.domain) + ", error " +
                 std::to_string(status.error) + ", reason: " + status.reason;
        return false;
    }
    channelPortName_ = *channelPort;
    sendPort_ = MessagePort::createRemote(channelPortName_);
    if (!sendPort_) {
        error_ = "cannot connect to the channel port " + channelPortName_;
        return false;
    }
    return true;
}

std::optional<PlistValue> KxTestClient::request(const PlistValue& command) {
    const std::optional<PlistData> encoded = serializeXml(command);
    if (!sendPort_ || !encoded) {
        return std::nullopt;
    }
    std::optional<PlistData> reply;
    const std::int32_t status =
        sendPort_->sendRequest(0, *encoded, kTimeoutSeconds, kTimeoutSeconds, true, &reply);
    if (status != kMessagePortSuccess || !reply) {
        error_ = "request failed with status " + std::to_string(status);
        return std::nullopt;
    }
    return parsePropertyList(*reply);
}

std::optional<std::string> KxTestClient::technology() {
    auto command = PlistDictionary::create();
    command->set(kKxGetTechnologyKey, kKxGetTechnologyKey);
    const std::optional<PlistValue> reply = request(command);
    const PlistDictionaryRef fields = reply ? reply->dictionary() : nullptr;
    const std::string* answer = fields ? fields->get(kKxGetTechnologyKey).string() : nullptr;
    if (answer == nullptr) {
        return std::nullopt;
    }
    return *answer;
}

bool KxTestClient::send(const PlistValue& command) {
    const std::optional<PlistData> encoded = serializeXml(command);
    return sendPort_ && encoded &&
           sendPort_->sendRequest(0, *encoded, kTimeoutSeconds, 0, false, nullptr) == kMessagePortSuccess;
}

bool KxTestClient::start(const std::vector<std::int64_t>& codes,
                         const std::vector<std::int64_t>& extraCodes) {
    auto command = PlistDictionary::create();
    command->set(kKxSetStateKey, kKxStreamingState);
    auto plain = PlistArray::create();
    for (const std::int64_t code : codes) {
        plain->append(PlistValue::integer(code));
    }
    auto extra = PlistArray::create();
    for (const std::int64_t code : extraCodes) {
        extra->append(PlistValue::integer(code));
    }
    command->set(kKxSetLogCodesKey, plain);
    command->set(kKxSetExtraCodesKey, extra);
    return send(command);
}

bool KxTestClient::stopStreaming() {
    auto command = PlistDictionary::create();
    command->set(kKxSetStateKey, "Stopped");
    return send(command);
}

void KxTestClient::disconnect() {
    if (receivePort_) {
        receivePort_->invalidate();
        receivePort_.reset();
    }
    if (sendPort_) {
        sendPort_->invalidate();
        sendPort_.reset();
    }
}

std::vector<PlistData> blobsOfFile(const std::string& path) {
    std::vector<PlistData> blobs;
    for (const LogItem& item : readLogFile(path).items) {
        if (item.isBlob()) {
            blobs.push_back(item.bytes);
        }
    }
    return blobs;
}

std::vector<PlistData> adaptedBlobsOfFile(const std::string& path) {
    return adaptedBlobs(blobsOfFile(path));
}

std::vector<PlistData> adaptedBlobs(std::vector<PlistData> blobs) {
    PacketVersionAdapter adapter;
    for (PlistData& blob : blobs) {
        const ByteView adapted = adapter.adapt(blob).blob;
        if (adapted.data() != blob.data()) {
            blob.assign(adapted.begin(), adapted.end());
        }
    }
    return blobs;
}

std::vector<std::int64_t> codesOf(const std::vector<PlistData>& blobs) {
    std::set<std::int64_t> codes;
    for (const PlistData& blob : blobs) {
        if (blob.size() >= 5 && blob[0] == 0x01) {
            codes.insert(blob[3] | blob[4] << 8);
        }
    }
    return std::vector<std::int64_t>(codes.begin(), codes.end());
}

std::string hexOf(const PlistData& blob) {
    static const char kDigits[] = "0123456789abcdef";
    std::string text;
    for (const std::uint8_t value : blob) {
        if (!text.empty()) {
            text += ' ';
        }
        text += kDigits[value >> 4];
        text += kDigits[value & 0x0F];
    }
    return text;
}

}  // namespace velmar::testing
