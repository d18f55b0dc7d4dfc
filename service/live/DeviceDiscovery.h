// DeviceDiscovery: the USB serial ports that may be a modem's diagnostic port, found through sysfs.
//
// Contract: findCandidatePorts() walks <root>/sys/class/tty/*: a tty whose device link leads (the link
// itself, or up to two levels above it) to a USB interface (a directory holding bInterfaceNumber) is a
// USB serial port; its interface number and class triple come from that directory, vendor and product from
// its parent (the USB device). Candidates are the vendor-specific interfaces (class 0xFF), most likely
// first: the triple FF/FF/30 that newer modules give their diagnostic port, then interface 0 (where common
// layouts put it), then the others, each group by tty name. Each candidate's device node is <root>/dev/<tty>
// and its by-id name the /dev/serial/by-id link that points to it, if any. root is "" (the real system)
// or the directory $VELMAR_SYSROOT names (tests). Files that are missing or unreadable leave their fields
// empty; nothing fails.
#pragma once

#include <optional>
#include <string>
#include <vector>

namespace velmar::live {

struct CandidatePort {
    std::string tty;         // "ttyUSB0"
    std::string devicePath;  // "/dev/ttyUSB0" (under the root)
    std::string byIdPath;    // "/dev/serial/by-id/usb-...-if00-port0", or empty
    std::string vendor;      // "abcd" (idVendor), or empty
    std::string product;     // "0002" (idProduct), or empty
    int interfaceNumber = -1;
    int interfaceClass = -1;
    int interfaceSubClass = -1;
    int interfaceProtocol = -1;
};

// The root of sysfs and /dev lookups: $VELMAR_SYSROOT, or "".
std::string deviceRoot();

std::vector<CandidatePort> findCandidatePorts(const std::string& root);

// "ttyUSB0  /dev/serial/by-id/...  abcd:0002  interface 0 (ff/ff/30)" without the verdict.
std::string describeCandidate(const CandidatePort& port);

}  // namespace velmar::live
