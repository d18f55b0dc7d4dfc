#include "service/modem-manager/BusMessages.h"

#include <systemd/sd-bus.h>

#include <cstdint>
#include <limits>
#include <string_view>

namespace velmar::modem {

namespace {

// The signature of the complete type at the current position.
std::string signatureOf(char type, const char* contents) {
    const std::string inner = contents != nullptr ? contents : "";
    switch (type) {
        case 'a':
            return "a" + inner;
        case 'r':
            return "(" + inner + ")";
        case 'e':
            return "{" + inner + "}";
        default:
            return std::string(1, type);
    }
}

bool skip(sd_bus_message* message, char type, const char* contents, BusValue& value) {
    value = BusValue{type, BusUnsupported{}};
    return sd_bus_message_skip(message, signatureOf(type, contents).c_str()) >= 0;
}

template <typename Number>
bool readNumber(sd_bus_message* message, char type, BusValue& value) {
    Number number{};
    if (sd_bus_message_read_basic(message, type, &number) <= 0) {
        return false;
    }
    value = BusValue::number(static_cast<std::int64_t>(number), type);
    return true;
}

// The names of an a(su) (a modem's ports: name and type).
bool readNamedPairs(sd_bus_message* message, std::vector<std::string>& names) {
    if (sd_bus_message_enter_container(message, 'a', "(su)") <= 0) {
        return false;
    }
    for (;;) {
        const char* name = nullptr;
        std::uint32_t kind = 0;
        const int result = sd_bus_message_read(message, "(su)", &name, &kind);
        if (result < 0) {
            return false;
        }
        if (result == 0) {
            break;
        }
        names.emplace_back(name != nullptr ? name : "");
    }
    return sd_bus_message_exit_container(message) >= 0;
}

// Reads an array of dictionary entries, each by readEntry (which reads the key and the value).
template <typename ReadEntry>
bool readEntries(sd_bus_message* message, const char* arrayContents, const char* entryContents,
                 const ReadEntry& readEntry) {
    if (sd_bus_message_enter_container(message, 'a', arrayContents) <= 0) {
        return false;
    }
    for (;;) {
        const int entered = sd_bus_message_enter_container(message, 'e', entryContents);
        if (entered < 0) {
            return false;
        }
        if (entered == 0) {
            break;
        }
        if (!readEntry() || sd_bus_message_exit_container(message) < 0) {
            return false;
        }
    }
    return sd_bus_message_exit_container(message) >= 0;
}

bool readAny(sd_bus_message* message, BusValue& value, int depth) {
    char type = 0;
    const char* contents = nullptr;
    if (sd_bus_message_peek_type(message, &type, &contents) <= 0) {
        return false;
    }
    if (depth > kMaxBusDepth) {
        return skip(message, type, contents, value);
    }
    switch (type) {
        case 'y':
            return readNumber<std::uint8_t>(message, type, value);
        case 'n':
            return readNumber<std::int16_t>(message, type, value);
        case 'q':
            return readNumber<std::uint16_t>(message, type, value);
        case 'i':
            return readNumber<std::int32_t>(message, type, value);
        case 'u':
            return readNumber<std::uint32_t>(message, type, value);
        case 'x':
            return readNumber<std::int64_t>(message, type, value);
        case 't': {
            std::uint64_t number = 0;
            if (sd_bus_message_read_basic(message, type, &number) <= 0) {
                return false;
            }
            value = number <= static_cast<std::uint64_t>(std::numeric_limits<std::int64_t>::max())
                        ? BusValue::number(static_cast<std::int64_t>(number), type)
                        : BusValue{type, BusUnsupported{}};
            return true;
        }
        case 'b': {
            int flag = 0;
            if (sd_bus_message_read_basic(message, type, &flag) <= 0) {
                return false;
            }
            value = BusValue::flag(flag != 0);
            return true;
        }
        case 'd': {
            double number = 0;
            if (sd_bus_message_read_basic(message, type, &number) <= 0) {
                return false;
            }
            value = BusValue::real(number);
            return true;
        }
        case 's':
        case 'o':
        case 'g': {
            const char* text = nullptr;
            if (sd_bus_message_read_basic(message, type, &text) <= 0) {
                return false;
            }
            value = BusValue::text(text != nullptr ? text : "", type);
            return true;
        }
        case 'v':
            return readVariant(message, value, depth);
        case 'a': {
            const std::string_view inner = contents != nullptr ? contents : "";
            if (inner == "s" || inner == "o") {
                std::vector<std::string> strings;
                if (!readStrings(message, inner[0], strings)) {
                    return false;
                }
                value = BusValue::texts(std::move(strings));
                return true;
            }
            if (inner == "(su)") {
                std::vector<std::string> names;
                if (!readNamedPairs(message, names)) {
                    return false;
                }
                value = BusValue::texts(std::move(names));
                return true;
            }
            if (inner == "{sv}") {
                BusDictionary dictionary;
                if (!readPropertyMap(message, dictionary, depth)) {
                    return false;
                }
                value = BusValue::dictionary(std::move(dictionary));
                return true;
            }
            if (inner == "a{sv}") {
                std::vector<BusDictionary> maps;
                if (!readPropertyMaps(message, maps, depth)) {
                    return false;
                }
                value = BusValue::dictionaries(std::move(maps));
                return true;
            }
            return skip(message, type, contents, value);
        }
        default:
            return skip(message, type, contents, value);
    }
}

}  // namespace

bool readVariant(sd_bus_message* message, BusValue& value, int depth) {
    char type = 0;
    const char* contents = nullptr;
    if (sd_bus_message_peek_type(message, &type, &contents) <= 0 || type != 'v') {
        return false;
    }
    if (sd_bus_message_enter_container(message, 'v', contents) <= 0) {
        return false;
    }
    if (!readAny(message, value, depth + 1)) {
        return false;
    }
    return sd_bus_message_exit_container(message) >= 0;
}

bool readPropertyMap(sd_bus_message* message, BusDictionary& properties, int depth) {
    return readEntries(message, "{sv}", "sv", [&] {
        const char* key = nullptr;
        BusValue value;
        if (sd_bus_message_read_basic(message, 's', &key) <= 0 || !readVariant(message, value, depth + 1)) {
            return false;
        }
        properties.insert_or_assign(key != nullptr ? key : "", std::move(value));
        return true;
    });
}

bool readPropertyMaps(sd_bus_message* message, std::vector<BusDictionary>& maps, int depth) {
    if (sd_bus_message_enter_container(message, 'a', "a{sv}") <= 0) {
        return false;
    }
    for (;;) {
        char type = 0;
        const char* contents = nullptr;
        const int more = sd_bus_message_peek_type(message, &type, &contents);
        if (more < 0) {
            return false;
        }
        if (more == 0) {
            break;
        }
        BusDictionary map;
        if (!readPropertyMap(message, map, depth + 1)) {
            return false;
        }
        maps.push_back(std::move(map));
    }
    return sd_bus_message_exit_container(message) >= 0;
}

bool readInterfaces(sd_bus_message* message, BusInterfaces& interfaces) {
    return readEntries(message, "{sa{sv}}", "sa{sv}", [&] {
        const char* name = nullptr;
        BusDictionary properties;
        if (sd_bus_message_read_basic(message, 's', &name) <= 0 || !readPropertyMap(message, properties)) {
            return false;
        }
        interfaces.insert_or_assign(name != nullptr ? name : "", std::move(properties));
        return true;
    });
}

bool readObjects(sd_bus_message* message, BusObjects& objects) {
    return readEntries(message, "{oa{sa{sv}}}", "oa{sa{sv}}", [&] {
        const char* path = nullptr;
        BusInterfaces interfaces;
        if (sd_bus_message_read_basic(message, 'o', &path) <= 0 || !readInterfaces(message, interfaces)) {
            return false;
        }
        objects.insert_or_assign(path != nullptr ? path : "", std::move(interfaces));
        return true;
    });
}

bool readStrings(sd_bus_message* message, char type, std::vector<std::string>& strings) {
    const char inner[2] = {type, '\0'};
    if (sd_bus_message_enter_container(message, 'a', inner) <= 0) {
        return false;
    }
    for (;;) {
        const char* text = nullptr;
        const int result = sd_bus_message_read_basic(message, type, &text);
        if (result < 0) {
            return false;
        }
        if (result == 0) {
            break;
        }
        strings.emplace_back(text != nullptr ? text : "");
    }
    return sd_bus_message_exit_container(message) >= 0;
}

}  // namespace velmar::modem
