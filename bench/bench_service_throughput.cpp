// Sustained throughput of kxserverd: the service replays a real capture with --fast to one client and to
// four clients at once (each streaming every code of the capture), and the clients count what arrives.
//
// Reported per run: blobs/s received (all clients together), the blobs the service dropped (from its log:
// "channel <n>: dropped <k> blobs (queue full)"), the blobs the clients did not receive (drops, and with
// several clients the first few that went out before the later start commands arrived), and the CPU time per
// 1,000 blobs received of the service (utime + stime from /proc/<pid>/stat) and of the client process. The
// service is found next to this program's build folder (<build>/service/kxserverd), or at $KXSERVERD. The
// time measured runs from the start commands to the last blob.
#include <benchmark/benchmark.h>

#include <fcntl.h>
#include <signal.h>
#include <stdlib.h>
#include <sys/wait.h>
#include <unistd.h>

#include <chrono>
#include <cstdio>
#include <ctime>
#include <filesystem>
#include <fstream>
#include <memory>
#include <set>
#include <sstream>
#include <string>
#include <vector>

#include "core/platform/BasebandPacket.h"
#include "core/platform/KxServerProtocol.h"
#include "core/platform/MessagePort.h"
#include "core/platform/PollMainQueue.h"
#include "core/platform/TelephonyServiceConnection.h"
#include "core/platform/plist/PlistCodec.h"
#include "logfile/LogFormat.h"
#include "tests/support/ProcessCpu.h"

namespace velmar {
namespace {

using Clock = std::chrono::steady_clock;

const std::string kCapture = std::string(VELMAR_SOURCE_DIR) + "/samples/captures/mixed-large-1.qmdl";

std::string servicePath() {
    if (const char* explicitPath = std::getenv("KXSERVERD")) {
        return explicitPath;
    }
    const std::filesystem::path self = std::filesystem::read_symlink("/proc/self/exe");
    return (self.parent_path().parent_path() / "service" / "kxserverd").string();
}

// The capture's blob count and the codes of its ordinary packets, read once.
struct Capture {
    std::size_t blobs = 0;
    std::vector<std::int64_t> codes;
};

const Capture& capture() {
    static const Capture loaded = [] {
        Capture result;
        std::set<std::int64_t> codes;
        for (const LogItem& item : readLogFile(kCapture).items) {
            const BasebandPacket framed = frameBasebandPacket(item.bytes);
            if (item.isBlob() && framed.hasCode() && framed.isPlain()) {
                ++result.blobs;
                codes.insert(framed.code);
            }
        }
        result.codes.assign(codes.begin(), codes.end());
        return result;
    }();
    return loaded;
}

double ownCpuSeconds() {
    timespec now{};
    clock_gettime(CLOCK_PROCESS_CPUTIME_ID, &now);
    return static_cast<double>(now.tv_sec) + static_cast<double>(now.tv_nsec) * 1e-9;
}

class Service {
  public:
    explicit Service(const std::string& runtime) : log_(runtime + "/kxserverd.err") {
        const std::string program = servicePath();
        pid_ = fork();
        if (pid_ == 0) {
            setenv("VELMAR_RUNTIME_DIR", runtime.c_str(), 1);
            const int null = open("/dev/null", O_RDWR);
            const int log = open(log_.c_str(), O_WRONLY | O_CREAT | O_TRUNC, 0600);
            dup2(null, STDIN_FILENO);
            dup2(null, STDOUT_FILENO);
            dup2(log, STDERR_FILENO);
            execl(program.c_str(), program.c_str(), "--source", "replay", "--input", kCapture.c_str(),
                  "--fast", "--log-stderr", static_cast<char*>(nullptr));
            _exit(127);
        }
    }
    ~Service() { stop(); }
    // Stops the service (SIGTERM) and reaps it.
    void stop() {
        if (pid_ > 0) {
            kill(pid_, SIGTERM);
            waitpid(pid_, nullptr, 0);
            pid_ = -1;
        }
    }
    pid_t pid() const { return pid_; }
    // The blobs that the service's log says it dropped.
    std::uint64_t dropped() const {
        std::ifstream in(log_);
        std::uint64_t total = 0;
        for (std::string line; std::getline(in, line);) {
            unsigned channel = 0;
            unsigned long long count = 0;
            if (std::sscanf(line.c_str(), "<3> channel %u: dropped %llu blobs", &channel, &count) == 2) {
                total += count;
            }
        }
        return total;
    }
    bool waitUntilServing() {
        const auto deadline = Clock::now() + std::chrono::seconds(30);
        while (Clock::now() < deadline) {
            if (MessagePort::createRemote(std::string(kKxServerControlPortName))) {
                return true;
            }
            if (waitpid(pid_, nullptr, WNOHANG) == pid_) {
                pid_ = -1;
                return false;
            }
            usleep(10000);
        }
        return false;
    }

  private:
    std::string log_;
    pid_t pid_ = -1;
};

struct Client {
    std::shared_ptr<MessagePort> receive;
    std::shared_ptr<MessagePort> send;
    std::size_t received = 0;
};

bool connectClient(Client& client, int index, PollMainQueue& queue) {
    const std::string name = "com.velmar.bench." + std::to_string(index) + ".BasebandStateReport.LogChannel";
    bool exists = false;
    client.receive = MessagePort::createLocal(
        name,
        [&client](std::int32_t id, ByteView) -> std::optional<PlistData> {
            client.received += id == 0 ? 1 : 0;
            return std::nullopt;
        },
        &exists);
    if (!client.receive || exists) {
        return false;
    }
    client.receive->setDispatchQueue(queue);
    const auto connection = TelephonyServiceConnection::create(nullptr, queue);
    std::optional<std::string> channel;
    if (!connection || connection->createLogChannel(name, &channel).error != 0 || !channel) {
        return false;
    }
    client.send = MessagePort::createRemote(*channel);
    return client.send != nullptr;
}

bool startStreaming(Client& client) {
    auto command = PlistDictionary::create();
    command->set(kKxSetStateKey, kKxStreamingState);
    auto codes = PlistArray::create();
    for (const std::int64_t code : capture().codes) {
        codes->append(PlistValue::integer(code));
    }
    command->set(kKxSetLogCodesKey, codes);
    command->set(kKxSetExtraCodesKey, PlistArray::create());
    const std::optional<PlistData> encoded = serializeXml(command);
    return encoded && client.send->sendRequest(0, *encoded, 5, 0, false, nullptr) == kMessagePortSuccess;
}

void BM_ServiceFastReplay(benchmark::State& state) {
    const int clientCount = static_cast<int>(state.range(0));
    const std::size_t perClient = capture().blobs;
    double received = 0;
    double missed = 0;
    double dropped = 0;
    double serviceCpu = 0;
    double clientCpu = 0;
    double seconds = 0;
    for (auto _ : state) {
        char pattern[] = "/tmp/velmar-bench-XXXXXX";
        const std::string runtime = mkdtemp(pattern);
        setenv("VELMAR_RUNTIME_DIR", runtime.c_str(), 1);
        {
            PollMainQueue queue;
            Service service(runtime);
            if (!service.waitUntilServing()) {
                state.SkipWithError(("kxserverd did not start: " + servicePath()).c_str());
                break;
            }
            std::vector<std::unique_ptr<Client>> clients;
            for (int i = 0; i < clientCount; ++i) {
                clients.push_back(std::make_unique<Client>());
                if (!connectClient(*clients.back(), i, queue)) {
                    state.SkipWithError("cannot create a log channel");
                    break;
                }
            }
            if (state.error_occurred()) {
                break;
            }
            const double serviceBefore = testing::processCpuSeconds(service.pid());
            const double clientBefore = ownCpuSeconds();
            const auto started = Clock::now();
            for (const auto& client : clients) {
                startStreaming(*client);
            }
            // Until every client has the whole capture, or nothing more has come for two seconds (drops).
            std::size_t total = 0;
            auto lastProgress = Clock::now();
            auto lastArrival = started;
            const auto sum = [&clients] {
                std::size_t count = 0;
                for (const auto& client : clients) {
                    count += client->received;
                }
                return count;
            };
            while (total < perClient * clients.size() &&
                   Clock::now() - lastProgress < std::chrono::seconds(2)) {
                queue.runUntil([&] { return sum() != total; }, 0.1);
                if (sum() != total) {
                    total = sum();
                    lastProgress = lastArrival = Clock::now();
                }
            }
            const double elapsed = std::chrono::duration<double>(lastArrival - started).count();
            serviceCpu += testing::processCpuSeconds(service.pid()) - serviceBefore;
            clientCpu += ownCpuSeconds() - clientBefore;
            received += static_cast<double>(total);
            missed += static_cast<double>(perClient * clients.size() - total);
            seconds += elapsed;
            state.SetIterationTime(elapsed);
            service.stop();
            dropped += static_cast<double>(service.dropped());
        }
        std::filesystem::remove_all(runtime);
    }
    if (received > 0) {
        state.counters["blobs_per_s"] = benchmark::Counter(received / seconds);
        const double runs = static_cast<double>(state.iterations());
        state.counters["dropped_per_run"] = benchmark::Counter(dropped / runs);
        state.counters["missed_per_run"] = benchmark::Counter(missed / runs);
        state.counters["service_cpu_ms_per_1k"] = benchmark::Counter(serviceCpu * 1e6 / received);
        state.counters["client_cpu_ms_per_1k"] = benchmark::Counter(clientCpu * 1e6 / received);
    }
}

BENCHMARK(BM_ServiceFastReplay)
    ->ArgName("clients")
    ->Arg(1)
    ->Arg(4)
    ->UseManualTime()
    ->Iterations(3)
    ->Unit(benchmark::kMillisecond);

}  // namespace
}  // namespace velmar

BENCHMARK_MAIN();
