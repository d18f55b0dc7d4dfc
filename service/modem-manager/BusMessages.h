// BusMessages: reading the D-Bus messages of the ModemManager link into BusValues.
//
// Contract: each reader consumes exactly its value from the message's current position and answers false
// when the message does not hold that shape (or is damaged); what it filled in is then incomplete and must
// not be used. Inside a variant, a value of any type is accepted: basic types become numbers, texts or
// flags ('h' and 't' above INT64_MAX become BusUnsupported), as/ao and a(su) (the names) become string
// lists, a{sv} a dictionary, aa{sv} a list of dictionaries, anything else is skipped as BusUnsupported.
// Nesting deeper than kMaxBusDepth is skipped as BusUnsupported too.
#pragma once

#include <map>
#include <string>
#include <vector>

#include "service/modem-manager/BusValue.h"

struct sd_bus_message;

namespace velmar::modem {

inline constexpr int kMaxBusDepth = 8;

// An object's interfaces and their properties (a{sa{sv}}).
using BusInterfaces = std::map<std::string, BusDictionary, std::less<>>;
// The objects of an object manager (a{oa{sa{sv}}}).
using BusObjects = std::map<std::string, BusInterfaces, std::less<>>;

bool readVariant(sd_bus_message* message, BusValue& value, int depth = 0);
bool readPropertyMap(sd_bus_message* message, BusDictionary& properties, int depth = 0);
bool readInterfaces(sd_bus_message* message, BusInterfaces& interfaces);
bool readObjects(sd_bus_message* message, BusObjects& objects);
bool readStrings(sd_bus_message* message, char type, std::vector<std::string>& strings);
bool readPropertyMaps(sd_bus_message* message, std::vector<BusDictionary>& maps, int depth = 0);

}  // namespace velmar::modem
