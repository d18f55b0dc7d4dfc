#include "service/sim/SimCardFiles.h"

#include <string>
#include <utility>
#include <vector>

#include "logfile/records/GsmRecords.h"

namespace velmar::sim {

PlistData buildSimCardRecord(std::uint64_t timestamp) {
    SimFilesRecord record;
    const std::pair<const char*, const char*> files[] = {
        {"kSimFile_ICCID", kSimIccid},
        {"kSimFile_IMSI", kSimImsi},
        {"kSimFile_MSISDN", kSimMsisdn},
        {"kSimFile_MBDN", "+15555550100"},
        {"kSimFile_HPPLMN", "30 minutes"},
        {"kSimFile_LOCI", "TMSI 0x5A3C91E2, LAI 001-01-8000, updated"},
        {"kSimFile_PSLOCI", "P-TMSI 0xC3A2F104, RAI 001-01-8000-17, updated"},
        {"kSimFile_ACC", "Class 7"},
        {"kSimFile_AD", "Normal operation, MNC length 2"},
        {"kSimFile_FPLMN", "001-02, 001-03"},
        {"kSimFile_AHPLMN", "001-01"},
        {"kSimFile_RATMODE", "Automatic"},
        {"kSimFile_PNN", "Test Network"},
        {"kSimFile_OPL", "001-01 LAC 0000-FFFE: PNN 1"},
        {"kSimFile_OPLMNAcT", "001-01: E-UTRAN, UTRAN, GSM"},
    };
    for (const auto& [key, value] : files) {
        record.files.emplace_back(key, PlistValue(std::string(value)));
    }
    return buildSimFilesRecord(record, timestamp);
}

}  // namespace velmar::sim
