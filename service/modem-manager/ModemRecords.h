// ModemRecords: what ModemManager reports about a modem, turned into the extra records the monitor decodes:
// the SIM files (0xFF0000), the cell-monitor array (0xFF0001) and the packet-data contexts (0xFF0002), in
// the same framing and with the same keys as the simulated baseband's.
//
// Contract:
// - Every value is checked for its D-Bus type and its range before it is used; a value of the wrong type or
//   out of range is left out and described in one line appended to problems (the caller rate-limits the
//   log). A value that is absent is left out silently: absent SIM files stay absent.
// - simFilesFrom: "kSimFile_ICCID" from the SIM's SimIdentifier, "kSimFile_IMSI" from its Imsi,
//   "kSimFile_MSISDN" from the first non-empty entry of the modem's OwnNumbers.
// - bearerContextFrom: a context only for a connected bearer ("Connected" true); its id is the number that
// ends
//   the bearer's object path, APN and IP type from its "Properties", address from Ip4Config (else Ip6Config),
//   DNS servers and the network interface when the bearer names them.
// - cellMonitorFrom: one dictionary per GSM, UMTS or LTE cell of GetCellInfo, in the order given; cells of
//   other technologies have no cell-monitor form and are left out silently. An LTE cell's band is the band
//   whose downlink range holds its EARFCN.
#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "core/platform/plist/PlistValue.h"
#include "logfile/records/GsmRecords.h"
#include "service/modem-manager/BusValue.h"

namespace velmar::modem {

// The cell types of GetCellInfo's "cell-type".
enum class BusCellType : std::int64_t { Gsm = 2, Umts = 3, Lte = 5 };

SimFilesRecord simFilesFrom(const BusDictionary* sim, const BusDictionary& modem,
                            std::vector<std::string>& problems);
// A bearer as a packet-data context: the context's own keys, plus "DNS" (an array of the servers, in order)
// and "Interface" when the bearer names them.
struct BearerContext {
    PdpContext context;
    std::vector<std::string> dns;
    std::string interfaceName;
    bool operator==(const BearerContext& other) const;
};
std::optional<BearerContext> bearerContextFrom(std::string_view bearerPath, const BusDictionary& bearer,
                                               std::vector<std::string>& problems);
PlistValue bearerContextDictionary(const BearerContext& bearer);
// The 0xFF0002 record of the bearers, in order.
PlistData buildBearerContextsRecord(const std::vector<BearerContext>& bearers);
PlistValue cellMonitorFrom(const std::vector<BusDictionary>& cells, std::vector<std::string>& problems);

}  // namespace velmar::modem
