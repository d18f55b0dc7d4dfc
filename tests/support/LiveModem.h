// LiveModem: what the tests of the live diagnostic port share: the blobs of a capture as a live source
// streams them (by subscription) and a fake sysfs tree of USB serial ports for device discovery.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "core/platform/plist/PlistValue.h"

namespace velmar::testing {

// The blobs of a raw capture's log packets, in order, of the frames that came unwrapped or wrapped with
// subscription (every frame's when subscription is nullopt).
std::vector<PlistData> captureBlobs(const std::string& path, std::optional<std::uint32_t> subscription);

// A tree under root that looks like sysfs and /dev for USB serial ports: root/sys/class/tty/<tty>/device
// leads to a USB interface directory with its class triple, whose parent holds the vendor and product;
// root/dev/serial/by-id/<byId> links to ../../<tty>. The device node root/dev/<tty> is left to the test
// (a link to a pseudo-terminal).
class FakeSysfs {
  public:
    explicit FakeSysfs(std::string root) : root_(std::move(root)) {}

    struct UsbPort {
        std::string tty;
        int interfaceNumber = 0;
        int interfaceClass = 0xFF;
        int interfaceSubClass = 0xFF;
        int interfaceProtocol = 0xFF;
        std::string vendor = "abcd";
        std::string product = "0002";
        std::string byId;  // empty: no by-id link
    };
    void addUsbSerialPort(const UsbPort& port);
    // A tty that is not a USB serial port (a built-in UART).
    void addPlainTty(const std::string& tty);
    // root/dev/<tty>
    std::string devicePath(const std::string& tty) const { return root_ + "/dev/" + tty; }
    const std::string& root() const { return root_; }

  private:
    std::string root_;
    int nextBus_ = 1;
};

}  // namespace velmar::testing
