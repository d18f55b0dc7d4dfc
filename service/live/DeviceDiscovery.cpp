#include "service/live/DeviceDiscovery.h"

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>

namespace velmar::live {

namespace {

namespace fs = std::filesystem;

constexpr int kVendorSpecificClass = 0xFF;
constexpr int kDiagnosticProtocol = 0x30;
constexpr int kLevelsToInterface = 3;  // the device link itself and up to two parents

// The first line of a small sysfs attribute file, or "" when it cannot be read.
std::string attribute(const fs::path& file) {
    std::ifstream in(file);
    std::string line;
    if (!in || !std::getline(in, line)) {
        return {};
    }
    constexpr std::size_t kMaxAttribute = 64;
    line.resize(std::min(line.size(), kMaxAttribute));
    while (!line.empty() && (line.back() == '\n' || line.back() == '\r' || line.back() == ' ')) {
        line.pop_back();
    }
    return line;
}

int hexAttribute(const fs::path& file) {
    const std::string text = attribute(file);
    if (text.empty() || text.size() > 4 ||
        text.find_first_not_of("0123456789abcdefABCDEF") != std::string::npos) {
        return -1;
    }
    return static_cast<int>(std::strtol(text.c_str(), nullptr, 16));
}

int rank(const CandidatePort& port) {
    if (port.interfaceSubClass == kVendorSpecificClass && port.interfaceProtocol == kDiagnosticProtocol) {
        return 0;
    }
    return port.interfaceNumber == 0 ? 1 : 2;
}

std::string hex2(int value) {
    if (value < 0) {
        return "?";
    }
    char text[16];
    std::snprintf(text, sizeof text, "%02x", value);
    return text;
}

// Fills the USB facts of port from the tty's device link; false when it is not a USB serial port.
bool readUsbInterface(const fs::path& ttyDirectory, CandidatePort& port) {
    std::error_code error;
    fs::path device = fs::canonical(ttyDirectory / "device", error);
    if (error) {
        return false;
    }
    for (int level = 0; level < kLevelsToInterface; ++level, device = device.parent_path()) {
        if (!fs::exists(device / "bInterfaceNumber", error)) {
            continue;
        }
        port.interfaceNumber = hexAttribute(device / "bInterfaceNumber");
        port.interfaceClass = hexAttribute(device / "bInterfaceClass");
        port.interfaceSubClass = hexAttribute(device / "bInterfaceSubClass");
        port.interfaceProtocol = hexAttribute(device / "bInterfaceProtocol");
        port.vendor = attribute(device.parent_path() / "idVendor");
        port.product = attribute(device.parent_path() / "idProduct");
        return true;
    }
    return false;
}

}  // namespace

std::string deviceRoot() {
    const char* root = std::getenv("VELMAR_SYSROOT");
    return root != nullptr ? std::string(root) : std::string();
}

std::vector<CandidatePort> findCandidatePorts(const std::string& root) {
    std::vector<CandidatePort> ports;
    std::error_code error;
    const fs::path ttys = fs::path(root + "/sys/class/tty");
    for (fs::directory_iterator entry(ttys, error), end; !error && entry != end; entry.increment(error)) {
        CandidatePort port;
        port.tty = entry->path().filename().string();
        if (!readUsbInterface(entry->path(), port) || port.interfaceClass != kVendorSpecificClass) {
            continue;
        }
        port.devicePath = root + "/dev/" + port.tty;
        ports.push_back(std::move(port));
    }
    const fs::path byId = fs::path(root + "/dev/serial/by-id");
    for (fs::directory_iterator entry(byId, error), end; !error && entry != end; entry.increment(error)) {
        std::error_code linkError;
        const fs::path target = fs::read_symlink(entry->path(), linkError);
        if (linkError) {
            continue;
        }
        for (CandidatePort& port : ports) {
            if (target.filename() == port.tty && port.byIdPath.empty()) {
                port.byIdPath = entry->path().string();
            }
        }
    }
    std::sort(ports.begin(), ports.end(), [](const CandidatePort& a, const CandidatePort& b) {
        return rank(a) != rank(b) ? rank(a) < rank(b) : a.tty < b.tty;
    });
    return ports;
}

std::string describeCandidate(const CandidatePort& port) {
    const std::string vendor = port.vendor.empty() ? "?" : port.vendor;
    const std::string product = port.product.empty() ? "?" : port.product;
    return port.devicePath + "  " + (port.byIdPath.empty() ? "-" : port.byIdPath) + "  " + vendor + ":" +
           product + "  interface " +
           (port.interfaceNumber < 0 ? "?" : std::to_string(port.interfaceNumber)) + " (" +
           hex2(port.interfaceClass) + "/" + hex2(port.interfaceSubClass) + "/" +
           hex2(port.interfaceProtocol) + ")";
}

}  // namespace velmar::live
