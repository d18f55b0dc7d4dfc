#include "tests/support/FakeTelephonyService.h"

#include <chrono>
#include <future>

#include "core/platform/KxServerProtocol.h"
#include "core/platform/plist/PlistCodec.h"

namespace velmar::testing {

namespace {
PlistData encode(const PlistValue& value) {
    return serializeXml(value).value_or(PlistData());
}
}  // namespace

FakeTelephonyService::FakeTelephonyService() : FakeTelephonyService(Behaviour{}) {}

FakeTelephonyService::FakeTelephonyService(Behaviour behaviour) : behaviour_(std::move(behaviour)) {
    std::promise<void> ready;
    auto started = ready.get_future();
    thread_ = std::thread([this, &ready] {
        control_ = MessagePort::createLocal(
            std::string(kKxServerControlPortName),
            [this](std::int32_t, ByteView data) { return onControl(data); }, nullptr,
            MessagePort::LocalMode::Serving);
        if (control_) {
            control_->setDispatchQueue(queue_);
        }
        // Tasks from the test thread are picked up every few milliseconds.
        queue_.repeating(0.005, [this] {
            std::vector<std::function<void()>> pending;
            {
                std::lock_guard<std::mutex> lock(mutex_);
                pending.swap(tasks_);
            }
            for (auto& task : pending) {
                task();
            }
            if (stopping_) {
                queue_.stop();
            }
        });
        ready.set_value();
        queue_.run();
        client_.reset();
        channel_.reset();
        control_.reset();
    });
    started.wait();
}

FakeTelephonyService::~FakeTelephonyService() {
    stopping_ = true;
    thread_.join();
}

void FakeTelephonyService::runOnServiceThread(std::function<void()> task) {
    std::promise<void> done;
    auto finished = done.get_future();
    {
        std::lock_guard<std::mutex> lock(mutex_);
        tasks_.push_back([&task, &done] {
            task();
            done.set_value();
        });
    }
    finished.wait();
}

void FakeTelephonyService::sendBlob(const PlistData& blob, std::int32_t messageId) {
    runOnServiceThread([this, &blob, messageId] {
        if (client_) {
            client_->sendRequest(messageId, blob, 1.0, 0.0, false, nullptr);
        }
    });
}

void FakeTelephonyService::closeChannel() {
    runOnServiceThread([this] {
        if (channel_) {
            channel_->invalidate();
            channel_.reset();
        }
        if (client_) {
            client_->invalidate();
            client_.reset();
        }
    });
}

std::vector<PlistValue> FakeTelephonyService::commands() {
    std::lock_guard<std::mutex> lock(mutex_);
    return commands_;
}

bool FakeTelephonyService::waitFor(const std::function<bool()>& predicate, double seconds) {
    const auto deadline = std::chrono::steady_clock::now() + std::chrono::duration<double>(seconds);
    while (!predicate()) {
        if (std::chrono::steady_clock::now() >= deadline) {
            return false;
        }
        std::this_thread::sleep_for(std::chrono::milliseconds(5));
    }
    return true;
}

std::optional<PlistData> FakeTelephonyService::onControl(ByteView data) {
    const auto request = parsePropertyList(data);
    const PlistDictionaryRef fields = request ? request->dictionary() : nullptr;
    auto reply = PlistDictionary::create();
    reply->set(kKxDomainKey, PlistValue::integer(kKxErrorDomainServer));
    const std::string* receivePort = fields ? fields->get(kKxReceivePortKey).string() : nullptr;
    if (behaviour_.channelError != 0 || receivePort == nullptr) {
        reply->set(kKxErrorKey,
                   PlistValue::integer(behaviour_.channelError != 0 ? behaviour_.channelError : 1));
        return encode(reply);
    }
    client_ = MessagePort::createRemote(*receivePort);
    const std::string channelName = "com.velmar.test.channel." + std::to_string(++nextChannel_);
    channel_ = MessagePort::createLocal(
        channelName, [this](std::int32_t, ByteView request) { return onChannel(request); }, nullptr);
    if (channel_) {
        channel_->setDispatchQueue(queue_);
    }
    ++channelsCreated_;
    reply->set(kKxErrorKey, PlistValue::integer(0));
    reply->set(kKxChannelPortKey, behaviour_.emptyChannelPort ? std::string() : channelName);
    return encode(reply);
}

std::optional<PlistData> FakeTelephonyService::onChannel(ByteView data) {
    const auto command = parsePropertyList(data);
    {
        std::lock_guard<std::mutex> lock(mutex_);
        commands_.push_back(command.value_or(PlistValue("(not a property list)")));
    }
    const PlistDictionaryRef fields = command ? command->dictionary() : nullptr;
    if (!fields || !fields->contains(kKxGetTechnologyKey)) {
        return std::nullopt;
    }
    auto reply = PlistDictionary::create();
    switch (behaviour_.technologyReply) {
        case TechnologyReply::Answer:
            reply->set(kKxGetTechnologyKey, behaviour_.technology);
            return encode(reply);
        case TechnologyReply::NoAnswerKey:
            reply->set("Something", "else");
            return encode(reply);
        case TechnologyReply::NotAPropertyList: {
            const std::string text = "this is not a property list";
            return PlistData(text.begin(), text.end());
        }
        case TechnologyReply::EmptyReply:
            return std::nullopt;
        case TechnologyReply::Stall:
            std::this_thread::sleep_for(std::chrono::milliseconds(1500));
            return std::nullopt;
    }
    return std::nullopt;
}

}  // namespace velmar::testing
