// BusValue: a D-Bus value as the ModemManager link keeps it once read off the bus, so that what the modem
// reports can be turned into records (and tested) without a bus.
//
// Contract: a value remembers the D-Bus type character it came with ('s', 'o', 'b', 'u', 'i', 'd', ...;
// 'a' for arrays and dictionaries, 'v' never: variants are unwrapped). Integers of every width are held as a
// signed 64-bit number; a 't' above INT64_MAX is never made into a BusValue (the reader skips it). Arrays
// of strings or object paths are a string list; a{sv} is a dictionary; aa{sv} is a list of dictionaries.
// Anything else (structs, other arrays) is kept as an Unsupported value, so that a property of a shape the
// link does not read is seen and skipped rather than misread.
#pragma once

#include <cstdint>
#include <map>
#include <optional>
#include <string>
#include <variant>
#include <vector>

namespace velmar::modem {

struct BusValue;
using BusDictionary = std::map<std::string, BusValue, std::less<>>;

struct BusUnsupported {
    bool operator==(const BusUnsupported&) const = default;
};

struct BusValue {
    char type = '\0';  // the D-Bus type character of the value ('a' for every array)
    std::variant<BusUnsupported, bool, std::int64_t, double, std::string, std::vector<std::string>,
                 BusDictionary, std::vector<BusDictionary>>
        value;

    static BusValue text(std::string s, char type = 's') { return {type, std::move(s)}; }
    static BusValue number(std::int64_t n, char type = 'u') { return {type, n}; }
    static BusValue real(double d) { return {'d', d}; }
    static BusValue flag(bool b) { return {'b', b}; }
    static BusValue texts(std::vector<std::string> list) { return {'a', std::move(list)}; }
    static BusValue dictionary(BusDictionary d) { return {'a', std::move(d)}; }
    static BusValue dictionaries(std::vector<BusDictionary> list) { return {'a', std::move(list)}; }

    const std::string* asText() const { return std::get_if<std::string>(&value); }
    std::optional<std::int64_t> asNumber() const {
        const auto* n = std::get_if<std::int64_t>(&value);
        return n != nullptr ? std::optional(*n) : std::nullopt;
    }
    std::optional<double> asReal() const {
        const auto* d = std::get_if<double>(&value);
        return d != nullptr ? std::optional(*d) : std::nullopt;
    }
    std::optional<bool> asFlag() const {
        const auto* b = std::get_if<bool>(&value);
        return b != nullptr ? std::optional(*b) : std::nullopt;
    }
    const std::vector<std::string>* asTexts() const { return std::get_if<std::vector<std::string>>(&value); }
    const BusDictionary* asDictionary() const { return std::get_if<BusDictionary>(&value); }
    const std::vector<BusDictionary>* asDictionaries() const {
        return std::get_if<std::vector<BusDictionary>>(&value);
    }
    bool operator==(const BusValue&) const = default;
};

}  // namespace velmar::modem
