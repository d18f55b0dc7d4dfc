// The live diagnostic port's path through kxserverd, once per byte from the port.
//
// BM_LivePathFromPipe: the live source as it runs (LiveSource on a FIFO: read(2) 64 KiB at a time, deframe,
// read each frame, choose the subscription, hand each blob to the channels) with two monitors' filters (the
// LTE start command, and every code of the capture) in place of the channels' sockets, on one thread: the
// benchmark writes the capture into the pipe and the same thread's main queue reads it. Reports MB/s of port
// bytes and log packets/s.
// BM_LivePathInMemory: the same without the system calls (deframe, read, choose, filter), for comparison.
// BM_ServiceCpuWithModem: the real kxserverd against the modem emulator streaming 1,000 log packets/s to two
// monitors (test clients that start every code of the capture); reports the service's CPU share (utime +
// stime over wall time, in percent) and what each monitor received per second.
#include <benchmark/benchmark.h>

#include <fcntl.h>
#include <signal.h>
#include <sys/ioctl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <chrono>
#include <filesystem>
#include <memory>
#include <string>
#include <vector>

#include "core/platform/PollMainQueue.h"
#include "core/platform/SystemLog.h"
#include "core/platform/WholeFile.h"
#include "logfile/DiagFraming.h"
#include "logfile/DiagStreamDeframer.h"
#include "service/live/LiveSource.h"
#include "service/live/SubscriptionSelector.h"
#include "tests/support/KxTestClient.h"
#include "tests/support/ProcessCpu.h"
#include "tests/support/ServiceProcess.h"
#include "tests/support/TestPaths.h"
#include "tools/modem-emulator/ModemEmulator.h"

namespace velmar {
namespace {

using Clock = std::chrono::steady_clock;

const std::string kCapture = std::string(VELMAR_SOURCE_DIR) + "/samples/captures/mixed-large-1.qmdl";
const std::vector<std::int64_t> kLteCodes = {0xB0C2, 0xB0C1, 0xB179, 0xB17F, 0xB180, 0xB186};

void quietLog() {
    SystemLog::setSink([](int, const std::string&) {});
    SystemLog::setThreshold(kLogError);
}

const PlistData& captureBytes() {
    static const PlistData bytes = [] {
        PlistData read;
        readWholeFile(kCapture, read);
        return read;
    }();
    return bytes;
}

// Two monitors: one with the LTE start command, one with every code.
class TwoMonitors : public BlobSink {
  public:
    TwoMonitors() {
        for (const std::int64_t code : kLteCodes) {
            lte_.addCode(static_cast<std::uint16_t>(code));
        }
        for (unsigned code = 0; code < LogCodeFilter::kCodeCount; ++code) {
            all_.addCode(static_cast<std::uint16_t>(code));
        }
    }
    void deliver(const BasebandBlob& blob) override {
        ++delivered;
        taken += lte_.accepts(blob) ? 1 : 0;
        taken += all_.accepts(blob) ? 1 : 0;
    }
    bool canTakeMore() const override { return true; }
    void notifyWhenReady(std::function<void()>) override {}
    LogCodeFilter streamingDemand() const override {
        LogCodeFilter demand = lte_;
        demand.unite(all_);
        return demand;
    }
    void observeStreamingDemand(std::function<void()>) override {}

    std::uint64_t delivered = 0;
    std::uint64_t taken = 0;

  private:
    LogCodeFilter lte_;
    LogCodeFilter all_;
};

void BM_LivePathFromPipe(benchmark::State& state) {
    quietLog();
    const PlistData& bytes = captureBytes();
    testing::TemporaryDirectory directory;
    const std::string fifo = directory.file("port");
    if (bytes.empty() || mkfifo(fifo.c_str(), 0600) != 0) {
        state.SkipWithError("cannot prepare the capture or the FIFO");
        return;
    }
    PollMainQueue queue;
    TwoMonitors monitors;
    LiveSource::Settings settings;
    settings.device = fifo;
    LiveSource source(settings);
    std::string error;
    if (!source.prepare(error)) {
        state.SkipWithError(error.c_str());
        return;
    }
    const int writer = open(fifo.c_str(), O_WRONLY | O_NONBLOCK | O_CLOEXEC);
    fcntl(writer, F_SETPIPE_SZ, 1 << 20);
    source.start(queue, monitors);
    const auto emptied = [writer] {
        int waiting = 0;
        return ioctl(writer, FIONREAD, &waiting) == 0 && waiting == 0;
    };
    for (auto _ : state) {
        std::size_t offset = 0;
        while (offset < bytes.size()) {
            const ssize_t wrote =
                write(writer, bytes.data() + offset, std::min<std::size_t>(bytes.size() - offset, 1 << 20));
            if (wrote > 0) {
                offset += static_cast<std::size_t>(wrote);
            }
            queue.runUntil(emptied, 5);
        }
    }
    source.stop();
    close(writer);
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations() * bytes.size()));
    state.counters["packets_per_s"] =
        benchmark::Counter(static_cast<double>(monitors.delivered), benchmark::Counter::kIsRate);
    state.counters["packets_per_pass"] =
        benchmark::Counter(static_cast<double>(monitors.delivered) / static_cast<double>(state.iterations()));
}
BENCHMARK(BM_LivePathFromPipe)->Unit(benchmark::kMillisecond);

// The live source's frame handling without its port: deframe, read the frame, choose the subscription,
// frame the blob and offer it to both monitors.
class InMemoryPath : public DiagFrameSink {
  public:
    bool onDiagFrame(const DiagFrameView& frame) override {
        const DiagFrameContents contents = readDiagFrame(frame.payload);
        if (contents.kind == DiagFrameContents::Kind::LogPacket &&
            subscriptions_.streams(contents.subscription)) {
            monitors.deliver(frameBasebandBlob(contents.blob()));
        }
        return true;
    }
    TwoMonitors monitors;

  private:
    live::SubscriptionSelector subscriptions_;
};

void BM_LivePathInMemory(benchmark::State& state) {
    quietLog();
    const PlistData& bytes = captureBytes();
    InMemoryPath path;
    DiagStreamDeframer deframer("port", path);
    constexpr std::size_t kChunk = 64 * 1024;
    for (auto _ : state) {
        for (std::size_t offset = 0; offset < bytes.size(); offset += kChunk) {
            deframer.feed(ByteView(bytes.data() + offset, std::min(kChunk, bytes.size() - offset)));
        }
    }
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations() * bytes.size()));
    state.counters["packets_per_s"] =
        benchmark::Counter(static_cast<double>(path.monitors.delivered), benchmark::Counter::kIsRate);
}
BENCHMARK(BM_LivePathInMemory)->Unit(benchmark::kMillisecond);

void BM_ServiceCpuWithModem(benchmark::State& state) {
    const double rate = static_cast<double>(state.range(0));
    constexpr double kMeasureSeconds = 5.0;
    double cpuShare = 0;
    double received = 0;
    double measured = 0;
    for (auto _ : state) {
        testing::TemporaryDirectory runtime;
        testing::TemporaryDirectory files;
        setenv("VELMAR_RUNTIME_DIR", runtime.path().c_str(), 1);
        testing::ModemEmulator::Settings settings;
        settings.capturePath = kCapture;
        settings.packetsPerSecond = rate;
        settings.linkPath = files.file("modem");
        testing::ModemEmulator modem(settings);
        std::string error;
        if (!modem.start(error)) {
            state.SkipWithError(error.c_str());
            break;
        }
        testing::ServiceProcess service({"--source", "live", "--device", settings.linkPath}, files.path());
        if (!service.waitUntilServing(30)) {
            state.SkipWithError("kxserverd did not start");
            break;
        }
        PollMainQueue queue;
        const MainQueue::Handle tick = queue.repeating(0.01, [] {});
        std::vector<std::unique_ptr<testing::KxTestClient>> monitors;
        const std::vector<std::int64_t> codes = testing::codesOf(testing::blobsOfFile(kCapture));
        for (int i = 0; i < 2; ++i) {
            monitors.push_back(std::make_unique<testing::KxTestClient>(queue, "monitor" + std::to_string(i)));
            if (!monitors.back()->connect() || !monitors.back()->start(codes, {})) {
                state.SkipWithError("cannot start a monitor");
                break;
            }
        }
        if (state.error_occurred()) {
            break;
        }
        // Settled: masks set and packets flowing to both.
        queue.runUntil([&] { return monitors[0]->blobs().size() > 100 && monitors[1]->blobs().size() > 100; },
                       30);
        const std::size_t before = monitors[0]->blobs().size() + monitors[1]->blobs().size();
        const double cpuBefore = testing::processCpuSeconds(service.pid());
        const auto started = Clock::now();
        queue.runFor(kMeasureSeconds);
        const double elapsed = std::chrono::duration<double>(Clock::now() - started).count();
        const double cpu = testing::processCpuSeconds(service.pid()) - cpuBefore;
        const std::size_t after = monitors[0]->blobs().size() + monitors[1]->blobs().size();
        state.SetIterationTime(elapsed);
        cpuShare += cpu / elapsed;
        received += static_cast<double>(after - before) / 2;
        measured += elapsed;
        queue.cancelTimer(tick);
        service.sendSignal(SIGTERM);
        service.waitForExit(10);
        monitors.clear();
        unsetenv("VELMAR_RUNTIME_DIR");
    }
    const double runs = static_cast<double>(state.iterations());
    if (measured > 0) {
        state.counters["service_cpu_percent"] = benchmark::Counter(100 * cpuShare / runs);
        state.counters["packets_per_s_per_monitor"] = benchmark::Counter(received / measured);
    }
}
BENCHMARK(BM_ServiceCpuWithModem)
    ->ArgName("packets_per_s")
    ->Arg(1000)
    ->UseManualTime()
    ->Iterations(2)
    ->Unit(benchmark::kMillisecond);

}  // namespace
}  // namespace velmar

BENCHMARK_MAIN();
