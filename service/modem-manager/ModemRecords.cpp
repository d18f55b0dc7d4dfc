#include "service/modem-manager/ModemRecords.h"

#include <charconv>
#include <cmath>
#include <limits>

#include "core/platform/KxServerProtocol.h"
#include "core/platform/StringFormat.h"
#include "core/platform/plist/PlistCodec.h"
#include "logfile/records/LteRecords.h"
#include "logfile/records/RecordBuilder.h"
#include "service/modem-manager/LteBandOfEarfcn.h"

namespace velmar::modem {

namespace {

// What a property must be to be used; a mismatch is one problem line naming where it was found.
struct Reader {
    const BusDictionary& properties;
    std::string_view where;  // "SIM", "bearer 3", "cell 1" ...
    std::vector<std::string>& problems;

    const BusValue* find(std::string_view key) const {
        const auto found = properties.find(key);
        return found == properties.end() ? nullptr : &found->second;
    }
    void wrongType(std::string_view key, const BusValue& value, std::string_view expected) const {
        problems.push_back(stringWithFormat(
            "%.*s: %.*s is not %.*s (D-Bus type '%c'); skipped", static_cast<int>(where.size()), where.data(),
            static_cast<int>(key.size()), key.data(), static_cast<int>(expected.size()), expected.data(),
            value.type != '\0' ? value.type : '?'));
    }
    void outOfRange(std::string_view key, std::string_view shown) const {
        problems.push_back(stringWithFormat(
            "%.*s: %.*s %.*s is out of range; skipped", static_cast<int>(where.size()), where.data(),
            static_cast<int>(key.size()), key.data(), static_cast<int>(shown.size()), shown.data()));
    }

    std::optional<std::string> text(std::string_view key) const {
        const BusValue* value = find(key);
        if (value == nullptr) {
            return std::nullopt;
        }
        const std::string* text = value->asText();
        if (text == nullptr) {
            wrongType(key, *value, "a string");
            return std::nullopt;
        }
        return *text;
    }
    std::optional<bool> flag(std::string_view key) const {
        const BusValue* value = find(key);
        if (value == nullptr) {
            return std::nullopt;
        }
        const auto flag = value->asFlag();
        if (!flag) {
            wrongType(key, *value, "a boolean");
        }
        return flag;
    }
    std::optional<std::int64_t> number(std::string_view key, std::int64_t low, std::int64_t high) const {
        const BusValue* value = find(key);
        if (value == nullptr) {
            return std::nullopt;
        }
        const auto number = value->asNumber();
        if (!number) {
            wrongType(key, *value, "an integer");
            return std::nullopt;
        }
        if (*number < low || *number > high) {
            outOfRange(key, std::to_string(*number));
            return std::nullopt;
        }
        return number;
    }
    std::optional<std::int64_t> rounded(std::string_view key, double low, double high) const {
        const BusValue* value = find(key);
        if (value == nullptr) {
            return std::nullopt;
        }
        const auto real = value->asReal();
        if (!real) {
            wrongType(key, *value, "a double");
            return std::nullopt;
        }
        if (!std::isfinite(*real) || *real < low || *real > high) {
            outOfRange(key, stringWithFormat("%g", *real));
            return std::nullopt;
        }
        return static_cast<std::int64_t>(std::lround(*real));
    }
    // An identity that ModemManager writes as upper-case hexadecimal without leading zeros ("1A2B").
    std::optional<std::int64_t> hexadecimal(std::string_view key, std::int64_t high) const {
        const auto shown = text(key);
        if (!shown) {
            return std::nullopt;
        }
        std::int64_t number = 0;
        const char* end = shown->data() + shown->size();
        const auto [stop, error] = std::from_chars(shown->data(), end, number, 16);
        if (shown->empty() || shown->size() > 8 || error != std::errc() || stop != end || number < 0 ||
            number > high) {
            outOfRange(key, "\"" + *shown + "\"");
            return std::nullopt;
        }
        return number;
    }
    // "operator-id": the MCC and MNC together, five or six digits.
    bool plmn(std::optional<std::int64_t>& mcc, std::optional<std::int64_t>& mnc) const {
        const auto id = text("operator-id");
        if (!id) {
            return false;
        }
        bool digits = id->size() == 5 || id->size() == 6;
        for (const char c : *id) {
            digits = digits && c >= '0' && c <= '9';
        }
        if (!digits) {
            outOfRange("operator-id", "\"" + *id + "\"");
            return false;
        }
        mcc = std::stoll(id->substr(0, 3));
        mnc = std::stoll(id->substr(3));
        return true;
    }
};

bool isIdentityText(const std::string& text, std::size_t maxLength) {
    if (text.empty() || text.size() > maxLength) {
        return false;
    }
    for (const char c : text) {
        const bool hex = (c >= '0' && c <= '9') || (c >= 'A' && c <= 'F') || (c >= 'a' && c <= 'f');
        if (!hex) {
            return false;
        }
    }
    return true;
}

std::string ipType(std::int64_t family) {
    switch (family) {
        case 1:
            return "IPv4";
        case 2:
            return "IPv6";
        case 4:
            return "IPv4v6";
        case 8:
            return "Non-IP";
        default:
            return "";
    }
}

std::int64_t trailingNumber(std::string_view path) {
    std::size_t start = path.size();
    while (start > 0 && path[start - 1] >= '0' && path[start - 1] <= '9') {
        --start;
    }
    std::int64_t number = 0;
    const auto [stop, error] = std::from_chars(path.data() + start, path.data() + path.size(), number);
    return error == std::errc() ? number : 0;
}

}  // namespace

SimFilesRecord simFilesFrom(const BusDictionary* sim, const BusDictionary& modem,
                            std::vector<std::string>& problems) {
    SimFilesRecord record;
    if (sim != nullptr) {
        const Reader reader{*sim, "SIM", problems};
        if (const auto iccid = reader.text("SimIdentifier"); iccid && !iccid->empty()) {
            if (isIdentityText(*iccid, 22)) {
                record.files.emplace_back("kSimFile_ICCID", PlistValue(*iccid));
            } else {
                reader.outOfRange("SimIdentifier", "\"" + *iccid + "\"");
            }
        }
        if (const auto imsi = reader.text("Imsi"); imsi && !imsi->empty()) {
            if (isIdentityText(*imsi, 15)) {
                record.files.emplace_back("kSimFile_IMSI", PlistValue(*imsi));
            } else {
                reader.outOfRange("Imsi", "\"" + *imsi + "\"");
            }
        }
    }
    const Reader reader{modem, "modem", problems};
    if (const BusValue* numbers = reader.find("OwnNumbers")) {
        if (const auto* list = numbers->asTexts()) {
            for (const std::string& number : *list) {
                if (!number.empty()) {
                    record.files.emplace_back("kSimFile_MSISDN", PlistValue(number));
                    break;
                }
            }
        } else {
            reader.wrongType("OwnNumbers", *numbers, "a list of strings");
        }
    }
    return record;
}

std::optional<BearerContext> bearerContextFrom(std::string_view bearerPath, const BusDictionary& bearer,
                                               std::vector<std::string>& problems) {
    const std::int64_t id = trailingNumber(bearerPath);
    const std::string where = "bearer " + std::to_string(id);
    const Reader reader{bearer, where, problems};
    if (reader.flag("Connected") != true) {
        return std::nullopt;
    }
    BearerContext result;
    PdpContext& context = result.context;
    context.contextId = id;
    if (const auto name = reader.text("Interface")) {
        result.interfaceName = *name;
    }
    if (const BusValue* settings = reader.find("Properties")) {
        if (const BusDictionary* dictionary = settings->asDictionary()) {
            const Reader properties{*dictionary, where, problems};
            context.apn = properties.text("apn").value_or("");
            if (const auto family = properties.number("ip-type", 0, 0xFFFFFFFF)) {
                context.pdpType = ipType(*family);
                if (context.pdpType.empty()) {
                    properties.outOfRange("ip-type", std::to_string(*family));
                }
            }
        } else {
            reader.wrongType("Properties", *settings, "a dictionary");
        }
    }
    for (const std::string_view key : {"Ip4Config", "Ip6Config"}) {
        const BusValue* config = reader.find(key);
        if (config == nullptr) {
            continue;
        }
        const BusDictionary* dictionary = config->asDictionary();
        if (dictionary == nullptr) {
            reader.wrongType(key, *config, "a dictionary");
            continue;
        }
        const Reader ip{*dictionary, where, problems};
        const auto address = ip.text("address");
        if (address && !address->empty() && context.address.empty()) {
            context.address = *address;
        }
        for (const std::string_view server : {"dns1", "dns2", "dns3"}) {
            if (const auto dns = ip.text(server); dns && !dns->empty()) {
                result.dns.push_back(*dns);
            }
        }
    }
    return result;
}

bool BearerContext::operator==(const BearerContext& other) const {
    return context.contextId == other.context.contextId && context.apn == other.context.apn &&
           context.pdpType == other.context.pdpType && context.address == other.context.address &&
           dns == other.dns && interfaceName == other.interfaceName;
}

PlistValue bearerContextDictionary(const BearerContext& bearer) {
    PlistValue dictionary = pdpContextDictionary(bearer.context);
    if (!bearer.dns.empty()) {
        auto servers = PlistArray::create();
        for (const std::string& server : bearer.dns) {
            servers->append(PlistValue(server));
        }
        dictionary.dictionary()->set("DNS", PlistValue(servers));
    }
    if (!bearer.interfaceName.empty()) {
        dictionary.dictionary()->set("Interface", bearer.interfaceName);
    }
    return dictionary;
}

PlistData buildBearerContextsRecord(const std::vector<BearerContext>& bearers) {
    auto array = PlistArray::create();
    for (const BearerContext& bearer : bearers) {
        array->append(bearerContextDictionary(bearer));
    }
    const std::optional<PlistData> bytes = serializeBinary(array);
    return buildExtendedPacket(0x0002, bytes ? ByteView(*bytes) : ByteView());
}

PlistValue cellMonitorFrom(const std::vector<BusDictionary>& cells, std::vector<std::string>& problems) {
    auto array = PlistArray::create();
    for (std::size_t index = 0; index < cells.size(); ++index) {
        const std::string where = "cell " + std::to_string(index);
        const Reader reader{cells[index], where, problems};
        const auto type = reader.number("cell-type", 0, std::numeric_limits<std::uint32_t>::max());
        if (!type) {
            continue;
        }
        const bool serving = reader.flag("serving").value_or(false);
        const std::string cellType(serving ? kKxCellMonitorCellTypeServing : kKxCellMonitorCellTypeNeighbor);
        switch (static_cast<BusCellType>(*type)) {
            case BusCellType::Lte: {
                LteCellMonitorCell cell;
                cell.technology = std::string(kKxCellMonitorRadioAccessTechnologyLTE);
                cell.cellType = cellType;
                cell.trackingAreaCode = reader.hexadecimal("tac", 0xFFFFFF);
                cell.cellId = reader.hexadecimal("ci", 0xFFFFFFF);
                cell.physicalCellId = reader.hexadecimal("physical-ci", 503);
                cell.uarfcn = reader.number("earfcn", 0, 262143);
                // The cell list names no band; the EARFCN's downlink range gives it.
                cell.bandInfo = cell.uarfcn ? lteBandOfEarfcn(*cell.uarfcn) : std::nullopt;
                array->append(lteCellMonitorDictionary(cell));
                break;
            }
            case BusCellType::Gsm: {
                CellMonitorEntry entry;
                entry.technology = std::string(kKxCellMonitorRadioAccessTechnologyGSM);
                entry.cellType = cellType;
                reader.plmn(entry.mcc, entry.mnc);
                entry.lac = reader.hexadecimal("lac", 0xFFFF);
                entry.cellId = reader.hexadecimal("ci", 0xFFFF);
                entry.arfcn = reader.number("arfcn", 0, 1023);
                // RXLEV 0..63 stands for -110 dBm and below up to -48 dBm and above, 1 dB a step.
                if (const auto level = reader.number("rx-level", 0, 63)) {
                    entry.rssi = *level - 110;
                }
                array->append(cellMonitorEntryDictionary(entry));
                break;
            }
            case BusCellType::Umts: {
                CellMonitorEntry entry;
                entry.technology = std::string(kKxCellMonitorRadioAccessTechnologyUMTS);
                entry.cellType = cellType;
                reader.plmn(entry.mcc, entry.mnc);
                entry.lac = reader.hexadecimal("lac", 0xFFFF);
                entry.cellId = reader.hexadecimal("ci", 0xFFFFFFF);
                entry.uarfcn = reader.number("uarfcn", 0, 16383);
                entry.psc = reader.number("psc", 0, 511);
                entry.rscp = reader.rounded("rscp", -140.0, 0.0);
                entry.ecn0 = reader.rounded("ecio", -50.0, 0.0);
                array->append(cellMonitorEntryDictionary(entry));
                break;
            }
        }
    }
    return array;
}

}  // namespace velmar::modem
