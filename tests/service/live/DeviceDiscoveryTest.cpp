// Finding the candidate diagnostic ports in a sysfs tree: USB serial ports with a vendor-specific
// interface, most likely first, with their by-id links, vendors, products and interfaces.
#include "service/live/DeviceDiscovery.h"

#include <gtest/gtest.h>

#include "tests/support/LiveModem.h"
#include "tests/support/TestPaths.h"

namespace velmar::live {
namespace {

TEST(DeviceDiscovery, FindsVendorSpecificUsbSerialPortsMostLikelyFirst) {
    testing::TemporaryDirectory root;
    testing::FakeSysfs sysfs(root.path());
    sysfs.addUsbSerialPort({"ttyUSB0", 0, 0xFF, 0xFF, 0xFF, "abcd", "0001", "usb-Maker_Modem_1-if00-port0"});
    sysfs.addUsbSerialPort({"ttyUSB1", 2, 0xFF, 0x00, 0x00, "abcd", "0001", "usb-Maker_Modem_1-if02-port0"});
    sysfs.addUsbSerialPort({"ttyUSB2", 3, 0xFF, 0xFF, 0x30, "2c7c", "0800", ""});
    sysfs.addUsbSerialPort({"ttyACM0", 1, 0x02, 0x02, 0x01, "1bc7", "1201", ""});  // a CDC modem's AT port
    sysfs.addPlainTty("ttyS0");

    const std::vector<CandidatePort> ports = findCandidatePorts(root.path());
    ASSERT_EQ(ports.size(), 3U);
    EXPECT_EQ(ports[0].tty, "ttyUSB2");  // the diagnostic triple FF/FF/30
    EXPECT_EQ(ports[1].tty, "ttyUSB0");  // interface 0
    EXPECT_EQ(ports[2].tty, "ttyUSB1");
    EXPECT_EQ(ports[0].devicePath, root.path() + "/dev/ttyUSB2");
    EXPECT_EQ(ports[0].byIdPath, "");
    EXPECT_EQ(ports[1].byIdPath, root.path() + "/dev/serial/by-id/usb-Maker_Modem_1-if00-port0");
    EXPECT_EQ(ports[1].vendor, "abcd");
    EXPECT_EQ(ports[1].product, "0001");
    EXPECT_EQ(ports[2].interfaceNumber, 2);
    EXPECT_EQ(ports[0].interfaceProtocol, 0x30);
    EXPECT_EQ(describeCandidate(ports[1]),
              root.path() + "/dev/ttyUSB0  " + root.path() +
                  "/dev/serial/by-id/usb-Maker_Modem_1-if00-port0  abcd:0001  interface 0 (ff/ff/ff)");
    EXPECT_EQ(describeCandidate(ports[0]),
              root.path() + "/dev/ttyUSB2  -  2c7c:0800  interface 3 (ff/ff/30)");
}

TEST(DeviceDiscovery, NoTreeMeansNoCandidates) {
    testing::TemporaryDirectory root;
    EXPECT_TRUE(findCandidatePorts(root.path()).empty());
    EXPECT_TRUE(findCandidatePorts(root.path() + "/missing").empty());
}

}  // namespace
}  // namespace velmar::live
