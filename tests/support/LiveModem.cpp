#include "tests/support/LiveModem.h"

#include <cstdio>
#include <filesystem>

#include "core/platform/WholeFile.h"
#include "logfile/DiagFraming.h"
#include "logfile/DiagStreamDeframer.h"
#include "tests/support/TestPaths.h"

namespace velmar::testing {

namespace {

namespace fs = std::filesystem;

class BlobCollector : public DiagFrameSink {
  public:
    explicit BlobCollector(std::optional<std::uint32_t> subscription) : subscription_(subscription) {}
    bool onDiagFrame(const DiagFrameView& frame) override {
        const DiagFrameContents contents = readDiagFrame(frame.payload);
        if (contents.kind == DiagFrameContents::Kind::LogPacket &&
            (!subscription_ || !contents.subscription || *contents.subscription == *subscription_)) {
            blobs.emplace_back(contents.blob().begin(), contents.blob().end());
        }
        return true;
    }
    std::vector<PlistData> blobs;

  private:
    std::optional<std::uint32_t> subscription_;
};

std::string hex(int value, int width) {
    char text[16];
    std::snprintf(text, sizeof text, "%0*x", width, value);
    return text;
}

}  // namespace

std::vector<PlistData> captureBlobs(const std::string& path, std::optional<std::uint32_t> subscription) {
    PlistData bytes;
    if (!velmar::readWholeFile(path, bytes).ok()) {
        return {};
    }
    BlobCollector collector(subscription);
    DiagStreamDeframer deframer(path, collector);
    deframer.feed(bytes);
    deframer.finish();
    return collector.blobs;
}

void FakeSysfs::addUsbSerialPort(const UsbPort& port) {
    const int bus = nextBus_++;
    const fs::path usbDevice = fs::path(root_) / "sys/devices/pci0000:00/usb1" / ("1-" + std::to_string(bus));
    const fs::path interface =
        usbDevice / ("1-" + std::to_string(bus) + ":1." + std::to_string(port.interfaceNumber));
    const fs::path serialPort = interface / port.tty;
    fs::create_directories(serialPort);
    writeWholeFile((usbDevice / "idVendor").string(), port.vendor + "\n");
    writeWholeFile((usbDevice / "idProduct").string(), port.product + "\n");
    writeWholeFile((interface / "bInterfaceNumber").string(), hex(port.interfaceNumber, 2) + "\n");
    writeWholeFile((interface / "bInterfaceClass").string(), hex(port.interfaceClass, 2) + "\n");
    writeWholeFile((interface / "bInterfaceSubClass").string(), hex(port.interfaceSubClass, 2) + "\n");
    writeWholeFile((interface / "bInterfaceProtocol").string(), hex(port.interfaceProtocol, 2) + "\n");
    const fs::path tty = fs::path(root_) / "sys/class/tty" / port.tty;
    fs::create_directories(tty);
    fs::create_symlink(fs::relative(serialPort, tty), tty / "device");
    fs::create_directories(fs::path(root_) / "dev/serial/by-id");
    if (!port.byId.empty()) {
        fs::create_symlink(fs::path("../..") / port.tty, fs::path(root_) / "dev/serial/by-id" / port.byId);
    }
}

void FakeSysfs::addPlainTty(const std::string& tty) {
    const fs::path device = fs::path(root_) / "sys/devices/platform/serial8250" / tty;
    fs::create_directories(device);
    const fs::path entry = fs::path(root_) / "sys/class/tty" / tty;
    fs::create_directories(entry);
    fs::create_symlink(fs::relative(device, entry), entry / "device");
}

}  // namespace velmar::testing
