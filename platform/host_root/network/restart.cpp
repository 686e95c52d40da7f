// SPDX-License-Identifier: MIT
#include "platform/host_root/network/restart.h"

#include <core/failure.h>
#include <tavicore/keyvalue.h>
#include <tavisdk/bridge.h>
#include <unistd.h>

#include <algorithm>
#include <cstdio>

#include "base/split.h"
#include "platform/host_root/network/error.h"
#include "platform/host_root/network/hostapd.h"
#include "platform/host_root/network/journal.h"
#include "platform/host_root/network/programs.h"

namespace taviwireless::network {

namespace {

std::vector<Program> ProgramsOf(const Plan& plan) {
    std::vector<Program> programs{Hostapd(plan.settings.interface)};
    for (const BridgeSettings& bridge : plan.settings.bridges) {
        programs.push_back(DhcpServer(bridge.name));
    }
    for (const std::string& name : plan.names) {
        programs.push_back(DhcpClient(name));
    }
    return programs;
}

// A DHCP client that is to go on keeps its lease.
bool GoesOn(const Plan& plan, const Program& program) {
    return program.name == "udhcpc" && plan.clients.count(program.interface) != 0 &&
           plan.wantedClients.count(program.interface) != 0;
}

void StopPrograms(const Plan& plan) {
    for (const Program& program : ProgramsOf(plan)) {
        if (!GoesOn(plan, program)) {
            Stop(program);
        }
    }
    unlink(Hostapd(plan.settings.interface).conf.c_str());  // it holds keys
}

// What the client's script wrote down; empty while there is no lease.
std::string Leased(const std::string& interface, const char* key) {
    char value[TAVI_NET_ADDRESS_SIZE];
    const std::string lease = "/etc/dhcpc/dhcpcd-" + interface + ".info";
    return VEXACFileGetKeyValue(lease.c_str(), key, value, sizeof value) > 0 ? value : "";
}

bool IsReached(const Interface& interface, const Route& route) {
    return rtnl_route_get_pref_src(route.kernel.get()) == nullptr &&
           (route.gateway.empty() ||
            std::any_of(interface.addresses.begin(), interface.addresses.end(),
                        [&](const Address& address) { return IsIn(address, route.gateway); }));
}

// A lease takes the place of the IPv4 addresses and default routes that were meant for the
// interface; without one, those hold until there is one.
void UseLease(const std::string& name, State& wanted) {
    const State now = ReadState();
    const Interface* interface = now.Find(name);
    if (interface == nullptr || Leased(name, "IPADDR").empty()) {
        return;
    }
    wanted.interfaces.at(name).addresses = interface->addresses;
    unsigned int metric = 0;
    std::vector<Route> routes;
    for (const Route& route : wanted.routes) {
        const bool isReplaced = route.device == name && route.isDefault &&
                                rtnl_route_get_family(route.kernel.get()) == AF_INET;
        if (isReplaced) {
            metric = rtnl_route_get_priority(route.kernel.get());
        } else if (route.device != name || IsReached(*interface, route)) {
            routes.push_back(route);
        }
    }
    const std::string gateway = Leased(name, "GATEWAY");
    if (!gateway.empty()) {
        routes.push_back(NewDefaultRoute(gateway, metric, name));
    }
    wanted.routes = std::move(routes);
}

// The client begins by taking all addresses from the interface.
void StartClients(const Plan& plan, State& wanted) {
    for (const std::string& name : plan.wantedClients) {
        const Program client = DhcpClient(name);
        if (!GoesOn(plan, client)) {
            try {
                Start(client);
            } catch (const Error& error) {
                throw Error("cannot start the DHCP client on " + name + ": " + error.what());
            }
            UseLease(name, wanted);
        }
    }
}

void StartHostapd(const Settings& settings) {
    try {
        WriteHostapdConf(settings.interface, settings.guests);
        Start(Hostapd(settings.interface));
    } catch (const Error& error) {
        fputs(error.what(), stderr);
        throw Error("cannot start hostapd on " + settings.interface +
                    "; its messages above say why");
    }
}

// What a program said last; it may have said nothing.
std::string LastLine(const std::string& output) {
    const std::vector<std::string> lines = Lines(output);
    return lines.empty() ? "the system log says why" : lines.back();
}

// Starts the server with the settings as they are now, whoever changed them.
void StartDhcpServer(const std::string& bridge) {
    const Program server = DhcpServer(bridge);
    unlink(server.conf.c_str());
    const TAVINetDhcpServer any{};
    if (TAVINetSetDhcpServerConfigFiles(&any, 0) != 1 || access(server.conf.c_str(), F_OK) != 0) {
        throw Error("the DHCP server on " + bridge + " cannot be run with the settings in " +
                    DhcpServerInfo(bridge));
    }
    try {
        Start(server);
    } catch (const Error& error) {
        throw Error("cannot start the DHCP server on " + bridge + ": " + LastLine(error.what()));
    }
}

// Waits until the radio is in its bridges. hostapd goes into the background before it has made the
// guests' interface and joined the bridges, since it may first listen for neighbours that need
// channels of 20 MHz.
void AwaitRadios(const Plan& plan, const State& wanted) {
    Names radios;
    for (const std::string& name : plan.names) {
        const Interface* interface = wanted.Find(name);
        if (interface != nullptr && interface->isRadio) {
            radios.insert(name);
        }
    }
    constexpr int kMostLooks = 500;
    constexpr useconds_t kPause = 20000;  // µs
    for (int i = 0; i < kMostLooks && Runs(Hostapd(plan.settings.interface)) &&
                    !FirstDifference(wanted, radios).empty();
         ++i) {
        usleep(kPause);
    }
}

void Verify(const Plan& plan, const State& wanted) {
    if (plan.settings.accessPoint) {
        AwaitRadios(plan, wanted);
    }
    std::string difference = FirstDifference(wanted, plan.names);
    if (plan.settings.accessPoint && !Runs(Hostapd(plan.settings.interface))) {
        difference = "hostapd has ended again";
    }
    for (const BridgeSettings& bridge : plan.settings.bridges) {
        if (bridge.servesLeases && !Runs(DhcpServer(bridge.name))) {
            difference = "the DHCP server on " + bridge.name + " has ended again";
        }
    }
    if (!difference.empty()) {
        throw Error("the network is not as it should be: " + difference);
    }
}

void Apply(const Plan& plan) {
    StopPrograms(plan);
    BringAbout(plan.wanted, plan.names);
    State wanted = plan.wanted;
    StartClients(plan, wanted);
    BringAbout(wanted, plan.names);
    if (plan.settings.accessPoint) {
        StartHostapd(plan.settings);
    }
    for (const BridgeSettings& bridge : plan.settings.bridges) {
        if (bridge.servesLeases) {
            StartDhcpServer(bridge.name);
        }
    }
    Verify(plan, wanted);
    for (const auto& [bridge, origins] : plan.origins) {
        WriteOrigins(bridge, origins);
    }
}

// Does one step of putting back what was: a failure is told, and the other steps are done all the
// same.
template <typename Step>
void Try(Step step) {
    try {
        step();
    } catch (const std::exception& error) {
        fprintf(stderr, "rc.network: in putting back what was: %s\n", error.what());
    } catch (const tavicore::Failure&) {
        fputs("rc.network: in putting back what was: the kernel refuses\n", stderr);
    }
}

void PutBack(const Plan& plan, const std::vector<Kept>& programs) {
    for (const Kept& kept : programs) {
        if (!kept.ran || kept.program.name != "udhcpc") {
            Try([&] { Stop(kept.program); });
        }
    }
    Try([&] { BringAbout(plan.now, plan.names); });
    for (const Kept& kept : programs) {
        Try([&] { network::PutBack(kept); });
    }
    // A DHCP client that was started has taken the addresses away.
    Try([&] { BringAbout(plan.now, plan.names); });
}

}  // namespace

void FinishKilledRestart() {
    Try([] {
        const std::optional<Journal> before = ReadJournal();
        if (!before) {
            return;
        }
        for (const std::string& name : before->names) {
            if (before->clients.count(name) == 0) {
                Stop(DhcpClient(name));  // it would take what is put back
            }
        }
        BringAbout(before->now, before->names);
        for (const std::string& name : before->clients) {
            if (!Runs(DhcpClient(name))) {
                Start(DhcpClient(name));
            }
        }
        BringAbout(before->now, before->names);
    });
    RemoveJournal();
}

void BringAbout(const Plan& plan) {
    WriteJournal({plan.now, plan.names, plan.clients});
    std::vector<Kept> before;
    for (const Program& program : ProgramsOf(plan)) {
        before.push_back(Keep(program));
    }
    try {
        Apply(plan);
    } catch (...) {
        PutBack(plan, before);
        RemoveJournal();
        throw;
    }
    RemoveJournal();
}

}  // namespace taviwireless::network
