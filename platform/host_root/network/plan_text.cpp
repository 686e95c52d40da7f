// SPDX-License-Identifier: MIT
// The plan as a person reads it: what differs between now and then.
#include <algorithm>

#include "platform/host_root/network/plan.h"

namespace taviwireless::network {

namespace {

// "address", "10.9.0.5/16", "moves from eth0 to br0"
struct Line {
    std::string kind, what, change;
};
using Lines = std::vector<Line>;

Names Owners(const State& state, const std::string& address) {
    Names owners;
    for (const auto& [name, interface] : state.interfaces) {
        if (Has(interface, address)) {
            owners.insert(name);
        }
    }
    return owners;
}

Names Devices(const State& state, const std::string& route) {
    Names devices;
    for (const Route& other : state.routes) {
        if (other.text == route) {
            devices.insert(other.device);
        }
    }
    return devices;
}

// Empty when the owners stay.
std::string Change(const Names& before, const Names& after) {
    const auto without = [](const Names& names, const Names& others) {
        const auto found = std::find_if(names.begin(), names.end(), [&](const std::string& name) {
            return others.count(name) == 0;
        });
        return found == names.end() ? "" : *found;
    };
    const std::string from = without(before, after);
    const std::string to = without(after, before);
    if (from.empty() || to.empty()) {
        return !from.empty() ? "is taken from " + from : !to.empty() ? "is given to " + to : "";
    }
    return "moves from " + from + " to " + to;
}

void AddInterfaces(const Plan& plan, Lines& lines) {
    for (const std::string& name : plan.names) {
        const Interface *is = plan.now.Find(name), *shall = plan.wanted.Find(name);
        if (is == nullptr || shall == nullptr) {
            lines.push_back({"bridge", name, is == nullptr ? "is made" : "is removed"});
        } else if (is->master != shall->master) {
            const bool joins = !shall->master.empty();
            lines.push_back(
                {"interface", name, joins ? "joins " + shall->master : "leaves " + is->master});
        } else if (!is->isUp && shall->isUp) {
            lines.push_back({"interface", name, "is switched on"});
        }
    }
}

void AddAddresses(const Plan& plan, Lines& lines) {
    Names all;
    for (const State* state : {&plan.now, &plan.wanted}) {
        for (const auto& [name, interface] : state->interfaces) {
            for (const Address& address : interface.addresses) {
                all.insert(address.text);
            }
        }
    }
    for (const std::string& address : all) {
        lines.push_back(
            {"address", address, Change(Owners(plan.now, address), Owners(plan.wanted, address))});
    }
}

void AddRoutes(const Plan& plan, Lines& lines) {
    Names all;
    for (const State* state : {&plan.now, &plan.wanted}) {
        for (const Route& route : state->routes) {
            if (!route.gateway.empty() || route.isDefault) {
                all.insert(route.text);
            }
        }
    }
    for (const std::string& route : all) {
        lines.push_back(
            {"route", route, Change(Devices(plan.now, route), Devices(plan.wanted, route))});
    }
}

void AddPrograms(const Plan& plan, Lines& lines) {
    for (const std::string& name : plan.clients) {
        lines.push_back(
            {"program", "udhcpc",
             (plan.wantedClients.count(name) == 0 ? "ends on " : "goes on on ") + name});
    }
    for (const std::string& name : plan.wantedClients) {
        lines.push_back(
            {"program", "udhcpc", plan.clients.count(name) == 0 ? "is started on " + name : ""});
    }
    const Settings& settings = plan.settings;
    lines.push_back({"program", "hostapd",
                     !settings.accessPoint ? "is not to run on " + settings.interface
                                           : "is started anew on " + settings.interface +
                                                 (settings.guests ? ", with guests" : "")});
    for (const BridgeSettings& bridge : settings.bridges) {
        lines.push_back(
            {"program", "udhcpd",
             (bridge.servesLeases ? "is started anew on " : "is not to run on ") + bridge.name});
    }
}

}  // namespace

std::string Rendered(const Plan& plan) {
    Lines lines;
    AddInterfaces(plan, lines);
    AddAddresses(plan, lines);
    AddRoutes(plan, lines);
    AddPrograms(plan, lines);
    size_t width = 0;
    for (const Line& line : lines) {
        width = std::max(width, line.change.empty() ? 0 : line.what.size());
    }
    std::string text;
    for (auto& [kind, what, change] : lines) {
        if (!change.empty()) {
            constexpr size_t kKindWidth = sizeof "interface";
            kind.resize(kKindWidth + 1, ' ');
            what.resize(width + 2, ' ');
            text += kind + what + change + '\n';
        }
    }
    return text;
}

}  // namespace taviwireless::network
