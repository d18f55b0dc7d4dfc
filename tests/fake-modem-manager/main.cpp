// fake-modem-manager: a ModemManager-shaped service for the tests of the service's ModemManager link, run on
// a private dbus-daemon. It owns org.freedesktop.ModemManager1 on the bus given as its first argument and
// exports, under an object manager at /org/freedesktop/ModemManager1, one modem (Modem/0, ports ttyUSB0 and
// wwan0) with a SIM (SIM/0), two connected bearers (Bearer/0 and Bearer/1) and GetCellInfo answering an LTE
// serving cell and two neighbours.
//
// Options after the address:
//   --two-modems   a second modem (Modem/1, port ttyUSB2) with its own SIM (SIM/1) and one connected bearer
//                  (Bearer/2)
//   --port NAME    the second modem also lists the port NAME (so that it owns the diagnostic port)
//   --wrong-types  GetCellInfo gives the neighbours' "earfcn" as a string instead of an unsigned integer
//
// SIGUSR1 removes Modem/0 (InterfacesRemoved), SIGUSR2 brings it back (InterfacesAdded), SIGTERM ends the
// program. It prints "ready" once it owns its name and "removed" / "added" after each change.
#include <signal.h>
#include <systemd/sd-bus.h>
#include <systemd/sd-event.h>

#include <algorithm>
#include <cstddef>
#include <cstdio>
#include <cstring>
#include <initializer_list>
#include <string>
#include <vector>

namespace {

constexpr const char* kRoot = "/org/freedesktop/ModemManager1";
constexpr const char* kModemInterface = "org.freedesktop.ModemManager1.Modem";
constexpr const char* kSimInterface = "org.freedesktop.ModemManager1.Sim";
constexpr const char* kBearerInterface = "org.freedesktop.ModemManager1.Bearer";

struct Sim {
    const char* path;
    const char* identifier;
    const char* imsi;
};

struct Bearer {
    const char* path;
    int connected;
    const char* interfaceName;
    const char* apn;
    unsigned ipType;
    const char* address;
    const char* dns;
};

struct Modem {
    const char* path;
    const char* simPath;
    std::vector<const char*> bearerPaths;
    const char* ownNumber;
    std::vector<std::string> ports;  // each of type 3 (a serial port)
    sd_bus_slot* slot = nullptr;
};

Sim theSims[2] = {{"/org/freedesktop/ModemManager1/SIM/0", "8900101234567890123", "001010123456789"},
                  {"/org/freedesktop/ModemManager1/SIM/1", "8900109876543210987", "001010987654321"}};
Bearer theBearers[3] = {
    {"/org/freedesktop/ModemManager1/Bearer/0", 1, "wwan0", "internet.test", 1, "10.45.17.201", "10.45.0.1"},
    {"/org/freedesktop/ModemManager1/Bearer/1", 1, "wwan1", "ims.test", 4, "10.45.17.202", "10.45.0.2"},
    {"/org/freedesktop/ModemManager1/Bearer/2", 1, "wwan2", "second.test", 1, "10.45.18.1", "10.45.0.3"}};
Modem theModems[2] = {{"/org/freedesktop/ModemManager1/Modem/0",
                       theSims[0].path,
                       {theBearers[0].path, theBearers[1].path},
                       "+15555550123",
                       {"ttyUSB0", "wwan0"}},
                      {"/org/freedesktop/ModemManager1/Modem/1",
                       theSims[1].path,
                       {theBearers[2].path},
                       "+15555550199",
                       {"ttyUSB2"}}};
bool wrongTypes = false;

int modemSim(sd_bus*, const char*, const char*, const char*, sd_bus_message* reply, void* userdata,
             sd_bus_error*) {
    return sd_bus_message_append(reply, "o", static_cast<const Modem*>(userdata)->simPath);
}

int modemBearers(sd_bus*, const char*, const char*, const char*, sd_bus_message* reply, void* userdata,
                 sd_bus_error*) {
    const auto* modem = static_cast<const Modem*>(userdata);
    int result = sd_bus_message_open_container(reply, 'a', "o");
    for (const char* path : modem->bearerPaths) {
        if (result >= 0) {
            result = sd_bus_message_append(reply, "o", path);
        }
    }
    return result < 0 ? result : sd_bus_message_close_container(reply);
}

int modemNumbers(sd_bus*, const char*, const char*, const char*, sd_bus_message* reply, void* userdata,
                 sd_bus_error*) {
    return sd_bus_message_append(reply, "as", 1, static_cast<const Modem*>(userdata)->ownNumber);
}

int modemPorts(sd_bus*, const char*, const char*, const char*, sd_bus_message* reply, void* userdata,
               sd_bus_error*) {
    const auto* modem = static_cast<const Modem*>(userdata);
    int result = sd_bus_message_open_container(reply, 'a', "(su)");
    for (const std::string& port : modem->ports) {
        if (result >= 0) {
            result = sd_bus_message_append(reply, "(su)", port.c_str(), 3U);
        }
    }
    return result < 0 ? result : sd_bus_message_close_container(reply);
}

int bearerProperties(sd_bus*, const char*, const char*, const char*, sd_bus_message* reply, void* userdata,
                     sd_bus_error*) {
    const auto* bearer = static_cast<const Bearer*>(userdata);
    return sd_bus_message_append(reply, "a{sv}", 2, "apn", "s", bearer->apn, "ip-type", "u", bearer->ipType);
}

int bearerIp4(sd_bus*, const char*, const char*, const char*, sd_bus_message* reply, void* userdata,
              sd_bus_error*) {
    const auto* bearer = static_cast<const Bearer*>(userdata);
    return sd_bus_message_append(reply, "a{sv}", 4, "method", "u", 3U, "address", "s", bearer->address,
                                 "prefix", "u", 30U, "dns1", "s", bearer->dns);
}

int appendLteCell(sd_bus_message* reply, int serving, const char* pci, unsigned earfcn) {
    if (serving != 0) {
        return sd_bus_message_append(reply, "a{sv}", 7, "cell-type", "u", 5U, "serving", "b", 1,
                                     "operator-id", "s", "00101", "tac", "s", "1A2B", "ci", "s", "1234567",
                                     "physical-ci", "s", pci, "earfcn", "u", earfcn);
    }
    if (wrongTypes) {
        const std::string text = std::to_string(earfcn);
        return sd_bus_message_append(reply, "a{sv}", 5, "cell-type", "u", 5U, "serving", "b", 0,
                                     "physical-ci", "s", pci, "earfcn", "s", text.c_str(), "rsrp", "d",
                                     -101.5);
    }
    return sd_bus_message_append(reply, "a{sv}", 5, "cell-type", "u", 5U, "serving", "b", 0, "physical-ci",
                                 "s", pci, "earfcn", "u", earfcn, "rsrp", "d", -101.5);
}

int getCellInfo(sd_bus_message* call, void*, sd_bus_error*) {
    sd_bus_message* reply = nullptr;
    int result = sd_bus_message_new_method_return(call, &reply);
    if (result >= 0) {
        result = sd_bus_message_open_container(reply, 'a', "a{sv}");
    }
    if (result >= 0) {
        result = appendLteCell(reply, 1, "1F", 1300);
    }
    if (result >= 0) {
        result = appendLteCell(reply, 0, "20", 1300);
    }
    if (result >= 0) {
        result = appendLteCell(reply, 0, "2A", 6300);
    }
    if (result >= 0) {
        result = sd_bus_message_close_container(reply);
    }
    if (result >= 0) {
        result = sd_bus_send(nullptr, reply, nullptr);
    }
    sd_bus_message_unref(reply);
    return result;
}

const sd_bus_vtable kModemVtable[] = {
    SD_BUS_VTABLE_START(0),
    SD_BUS_PROPERTY("Sim", "o", modemSim, 0, SD_BUS_VTABLE_PROPERTY_CONST),
    SD_BUS_PROPERTY("Bearers", "ao", modemBearers, 0, SD_BUS_VTABLE_PROPERTY_CONST),
    SD_BUS_PROPERTY("OwnNumbers", "as", modemNumbers, 0, SD_BUS_VTABLE_PROPERTY_CONST),
    SD_BUS_PROPERTY("Ports", "a(su)", modemPorts, 0, SD_BUS_VTABLE_PROPERTY_CONST),
    SD_BUS_METHOD("GetCellInfo", "", "aa{sv}", getCellInfo, 0),
    SD_BUS_VTABLE_END,
};

const sd_bus_vtable kSimVtable[] = {
    SD_BUS_VTABLE_START(0),
    SD_BUS_PROPERTY("SimIdentifier", "s", nullptr, offsetof(Sim, identifier), SD_BUS_VTABLE_PROPERTY_CONST),
    SD_BUS_PROPERTY("Imsi", "s", nullptr, offsetof(Sim, imsi), SD_BUS_VTABLE_PROPERTY_CONST),
    SD_BUS_VTABLE_END,
};

const sd_bus_vtable kBearerVtable[] = {
    SD_BUS_VTABLE_START(0),
    SD_BUS_PROPERTY("Connected", "b", nullptr, offsetof(Bearer, connected), SD_BUS_VTABLE_PROPERTY_CONST),
    SD_BUS_PROPERTY("Interface", "s", nullptr, offsetof(Bearer, interfaceName), SD_BUS_VTABLE_PROPERTY_CONST),
    SD_BUS_PROPERTY("Properties", "a{sv}", bearerProperties, 0, SD_BUS_VTABLE_PROPERTY_CONST),
    SD_BUS_PROPERTY("Ip4Config", "a{sv}", bearerIp4, 0, SD_BUS_VTABLE_PROPERTY_CONST),
    SD_BUS_VTABLE_END,
};

int addModem(sd_bus* bus, Modem& modem) {
    const int result =
        sd_bus_add_object_vtable(bus, &modem.slot, modem.path, kModemInterface, kModemVtable, &modem);
    return result < 0 ? result : sd_bus_emit_interfaces_added(bus, modem.path, kModemInterface, nullptr);
}

int onSignal(sd_event_source* source, const struct signalfd_siginfo* info, void* userdata) {
    auto* bus = static_cast<sd_bus*>(userdata);
    Modem& modem = theModems[0];
    if (info->ssi_signo == SIGUSR1 && modem.slot != nullptr) {
        sd_bus_emit_interfaces_removed(bus, modem.path, kModemInterface, nullptr);
        modem.slot = sd_bus_slot_unref(modem.slot);
        std::puts("removed");
    } else if (info->ssi_signo == SIGUSR2 && modem.slot == nullptr) {
        addModem(bus, modem);
        std::puts("added");
    } else if (info->ssi_signo == SIGTERM) {
        sd_event_exit(sd_event_source_get_event(source), 0);
    }
    std::fflush(stdout);
    return 0;
}

int fail(const char* what, int result) {
    std::fprintf(stderr, "fake-modem-manager: %s: %s\n", what, std::strerror(-result));
    return 1;
}

int usage() {
    std::fprintf(stderr,
                 "usage: fake-modem-manager BUS-ADDRESS [--two-modems] [--port NAME] [--wrong-types]\n");
    return 2;
}

}  // namespace

int main(int argc, char** argv) {
    if (argc < 2) {
        return usage();
    }
    int modems = 1;
    for (int index = 2; index < argc; ++index) {
        const std::string option = argv[index];
        if (option == "--two-modems") {
            modems = 2;
        } else if (option == "--port" && index + 1 < argc) {
            theModems[1].ports.emplace_back(argv[++index]);
        } else if (option == "--wrong-types") {
            wrongTypes = true;
        } else {
            return usage();
        }
    }
    sigset_t signals;
    sigemptyset(&signals);
    sigaddset(&signals, SIGUSR1);
    sigaddset(&signals, SIGUSR2);
    sigaddset(&signals, SIGTERM);
    sigprocmask(SIG_BLOCK, &signals, nullptr);

    sd_bus* bus = nullptr;
    sd_event* event = nullptr;
    int result = sd_bus_new(&bus);
    if (result >= 0) {
        result = sd_bus_set_address(bus, argv[1]);
    }
    if (result >= 0) {
        result = sd_bus_set_bus_client(bus, 1);
    }
    if (result >= 0) {
        result = sd_bus_start(bus);
    }
    if (result < 0) {
        return fail("connect", result);
    }
    if ((result = sd_event_default(&event)) < 0 || (result = sd_bus_attach_event(bus, event, 0)) < 0) {
        return fail("event loop", result);
    }
    sd_bus_add_object_manager(bus, nullptr, kRoot);
    for (int index = 0; index < modems; ++index) {
        Modem& modem = theModems[index];
        Sim& sim = theSims[index];
        sd_bus_add_object_vtable(bus, nullptr, sim.path, kSimInterface, kSimVtable, &sim);
        for (Bearer& bearer : theBearers) {
            if (std::find(modem.bearerPaths.begin(), modem.bearerPaths.end(), bearer.path) !=
                modem.bearerPaths.end()) {
                sd_bus_add_object_vtable(bus, nullptr, bearer.path, kBearerInterface, kBearerVtable, &bearer);
            }
        }
        if ((result = addModem(bus, modem)) < 0) {
            return fail("modem object", result);
        }
    }
    for (const int signal : {SIGUSR1, SIGUSR2, SIGTERM}) {
        sd_event_add_signal(event, nullptr, signal, onSignal, bus);
    }
    if ((result = sd_bus_request_name(bus, "org.freedesktop.ModemManager1", 0)) < 0) {
        return fail("request name", result);
    }
    std::puts("ready");
    std::fflush(stdout);
    result = sd_event_loop(event);
    for (Modem& modem : theModems) {
        modem.slot = sd_bus_slot_unref(modem.slot);
    }
    sd_bus_flush_close_unref(bus);
    sd_event_unref(event);
    return result < 0 ? 1 : 0;
}
