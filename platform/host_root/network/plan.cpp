// SPDX-License-Identifier: MIT
#include "platform/host_root/network/plan.h"

#include <linux/rtnetlink.h>
#include <tavisdk/network.h>

#include <algorithm>

#include "platform/host_root/network/error.h"

namespace taviwireless::network {

namespace {

bool IsMember(const BridgeSettings& bridge, const std::string& name) {
    return bridge.isOn &&
           std::find(bridge.members.begin(), bridge.members.end(), name) != bridge.members.end();
}

// Makes the wanted state of what is now, bridge by bridge.
class Planner {
  public:
    explicit Planner(const Settings& settings) {
        plan_.settings = settings;
        plan_.now = ReadState();
        plan_.wanted = plan_.now;
    }

    Plan Make() {
        for (const BridgeSettings& bridge : plan_.settings.bridges) {
            CheckBridge(bridge);
        }
        for (BridgeSettings& bridge : plan_.settings.bridges) {
            plan_.origins[bridge.name] = ReadOrigins(bridge.name);
            if (HasServedItsTurn(bridge)) {
                bridge.isOn = bridge.servesLeases = false;
            }
            bridge.isOn ? TakeUp(bridge) : TakeDown(bridge);
        }
        ReleaseRadio();
        LookAtClients();
        CheckRoute();
        return plan_;
    }

  private:
    State& Wanted() { return plan_.wanted; }
    Interface& WantedOf(const std::string& name) { return plan_.wanted.interfaces.at(name); }
    const std::string& Radio() const { return plan_.settings.interface; }

    void CheckBridge(const BridgeSettings& bridge) const {
        const Interface* existing = plan_.now.Find(bridge.name);
        if (bridge.name == Radio() || (existing != nullptr && !existing->isBridge)) {
            throw Error(bridge.name + " is an interface of its own and not a bridge");
        }
        if (IsMember(bridge, bridge.name)) {
            throw Error(bridge.name + " cannot be a bridge around itself");
        }
    }

    // Whether the bridge was made for the access point alone, around an interface that another tool
    // configures, and the access point is off now. Its settings stay as they are, but it is taken
    // down, so that the tool finds its interface as it knows it.
    bool HasServedItsTurn(const BridgeSettings& bridge) {
        const Origins& origins = plan_.origins[bridge.name];
        const Names ports = plan_.now.PortsOf(bridge.name);
        return bridge.isOn && !plan_.settings.accessPoint &&
               origins.count({bridge.name, kForAccessPoint}) != 0 && !HasFiles(bridge) &&
               std::all_of(ports.begin(), ports.end(),
                           [&](const std::string& port) { return IsOurs(bridge, port); });
    }

    bool HasFiles(const BridgeSettings& bridge) const {
        return !OwnCard(bridge.name).IsEmpty() ||
               std::any_of(bridge.members.begin(), bridge.members.end(),
                           [this](const std::string& member) {
                               return member != Radio() && HasFile(member);
                           });
    }

    void TakeUp(const BridgeSettings& bridge) {
        plan_.names.insert(bridge.name);
        Interface& wanted = Wanted().interfaces[bridge.name];
        if (plan_.now.Find(bridge.name) == nullptr) {
            wanted.isBridge = true;
            wanted.hardware = HardwareFor(bridge);
            if (plan_.settings.accessPoint && !HasFiles(bridge)) {
                plan_.origins[bridge.name].emplace(bridge.name, kForAccessPoint);
            }
        }
        wanted.isUp = true;
        ForgetOldSettings(bridge);
        for (const std::string& port : plan_.now.PortsOf(bridge.name)) {
            if (!IsMember(bridge, port) && IsOurs(bridge, port)) {
                Leave(bridge, port);
            }
        }
        for (const std::string& member : bridge.members) {
            Join(bridge, member);
        }
        GiveCard(bridge.name, bridge.card, plan_.origins[bridge.name]);
    }

    // Addresses and routes that somebody else gave the bridge go to its first wired port, by which
    // the network came.
    void TakeDown(const BridgeSettings& bridge) {
        const Interface* existing = plan_.now.Find(bridge.name);
        if (existing == nullptr) {
            plan_.origins[bridge.name].clear();
            return;
        }
        plan_.names.insert(bridge.name);
        ForgetOldSettings(bridge);
        std::string heir;
        for (const std::string& port : plan_.now.PortsOf(bridge.name)) {
            const bool isWired = port != Radio() && !plan_.now.Find(port)->isRadio;
            heir = heir.empty() && isWired ? port : heir;
            if (isWired || port == Radio()) {
                Leave(bridge, port);
            }
        }
        if (!heir.empty()) {
            for (const Address& address : std::vector<Address>(WantedOf(bridge.name).addresses)) {
                Move(address, bridge.name, heir);
            }
            MoveRoutes(bridge.name, heir, [](const Route&) { return true; });
            if (HasClient(bridge.name) && WantedOf(heir).addresses.empty()) {
                plan_.wantedClients.insert(heir);
            }
        }
        Drop(bridge.name);
        Wanted().interfaces.erase(bridge.name);
        plan_.origins[bridge.name].clear();
    }

    // While the access point is off, the radio is in no bridge but those that the settings name.
    void ReleaseRadio() {
        const Interface* radio = Wanted().Find(Radio());
        if (radio == nullptr || radio->master.empty() || plan_.settings.accessPoint) {
            return;
        }
        for (const BridgeSettings& bridge : plan_.settings.bridges) {
            if (IsMember(bridge, Radio())) {
                return;
            }
        }
        plan_.names.insert(Radio());
        WantedOf(Radio()).master.clear();
    }

    // Whether this program put the port into the bridge, or the port's file says that it belongs
    // there. Other ports are somebody else's and stay.
    bool IsOurs(const BridgeSettings& bridge, const std::string& port) {
        return port == Radio() || plan_.origins[bridge.name].count({port, ""}) != 0 ||
               HasFile(port);
    }

    std::string HardwareFor(const BridgeSettings& bridge) const {
        for (const std::string& member : bridge.members) {
            const Interface* interface = plan_.now.Find(member);
            if (interface != nullptr && member != Radio()) {
                return interface->hardware;
            }
        }
        return "";
    }

    // Removes addresses that earlier settings gave the bridge.
    void ForgetOldSettings(const BridgeSettings& bridge) {
        Origins& origins = plan_.origins[bridge.name];
        for (const auto& origin : Origins(origins)) {
            if (origin.first == bridge.name && origin.second != bridge.card.address &&
                origin.second != kForAccessPoint) {
                Remove(bridge.name, origin.second);
                origins.erase(origin);
            }
        }
    }

    // An interface that is not plugged in is passed over: it joins when it is there and the program
    // is called again.
    void Join(const BridgeSettings& bridge, const std::string& member) {
        if (plan_.now.Find(member) == nullptr) {
            return;
        }
        plan_.names.insert(member);
        Interface& interface = WantedOf(member);
        if (member != Radio() && !interface.master.empty() && interface.master != bridge.name) {
            LeaveOther(interface.master, member);
        }
        if (!interface.isRadio || plan_.settings.accessPoint) {
            interface.master = bridge.name;
        }
        interface.isUp = interface.isUp || !interface.isRadio;
        if (member == Radio()) {
            Drop(member);  // those of a station
            return;
        }
        Origins& origins = plan_.origins[bridge.name];
        origins.emplace(member, "");
        for (const Address& address : std::vector<Address>(interface.addresses)) {
            Move(address, member, bridge.name);
            origins.emplace(member, address.text);
        }
        MoveRoutes(member, bridge.name, [](const Route&) { return true; });
        if (HasClient(member)) {
            plan_.wantedClients.insert(bridge.name);
        }
    }

    // Takes the interface out of another bridge, into which an earlier run of this program put it.
    void LeaveOther(const std::string& other, const std::string& member) {
        plan_.origins[other] = ReadOrigins(other);
        if (plan_.origins[other].count({member, ""}) == 0) {
            throw Error(member + " is a port of " + other + ", which would be cut off");
        }
        plan_.names.insert(other);
        BridgeSettings left;
        left.name = other;
        Leave(left, member);
    }

    // The port gets back what it brought into the bridge, and what its file gives it.
    void Leave(const BridgeSettings& bridge, const std::string& port) {
        plan_.names.insert(port);
        WantedOf(port).master.clear();
        Origins& origins = plan_.origins[bridge.name];
        for (const auto& origin : Origins(origins)) {
            if (origin.first == port) {
                for (const Address& address :
                     std::vector<Address>(WantedOf(bridge.name).addresses)) {
                    if (address.text == origin.second) {
                        Move(address, bridge.name, port);
                    }
                }
                origins.erase(origin);
            }
        }
        if (port == Radio()) {
            return;
        }
        const std::vector<Address>& own = WantedOf(port).addresses;
        MoveRoutes(bridge.name, port, [&own](const Route& route) {
            return !route.gateway.empty() &&
                   std::any_of(own.begin(), own.end(), [&](const Address& address) {
                       return IsIn(address, route.gateway);
                   });
        });
        Origins none;
        GiveCard(port, OwnCard(port), none);
    }

    // Gives the interface its card. What it did not have before is noted in origins.
    void GiveCard(const std::string& name, const Card& card, Origins& origins) {
        if (card.byDhcp) {
            plan_.wantedClients.insert(name);
        }
        if (card.address.empty()) {
            return;
        }
        const Address address = NewAddress(card.address);
        Interface& interface = WantedOf(name);
        if (!Has(interface, address.text)) {
            interface.addresses.push_back(address);
            origins.emplace(name, address.text);
        }
        GiveGateway(name, address);
    }

    // The configured gateway takes the place of default routes that the settings gave before. It is
    // not put beside somebody else's.
    void GiveGateway(const std::string& name, const Address& address) {
        const std::string& gateway = plan_.settings.gateway;
        if (gateway.empty() || !IsIn(address, gateway)) {
            return;
        }
        std::vector<Route>& routes = Wanted().routes;
        unsigned int metric = 0;
        const auto old = std::find_if(routes.begin(), routes.end(), [&](const Route& route) {
            return route.isDefault && route.device == name && IsIn(address, route.gateway) &&
                   rtnl_route_get_protocol(route.kernel.get()) == RTPROT_BOOT;
        });
        if (old != routes.end()) {
            metric = rtnl_route_get_priority(old->kernel.get());
            routes.erase(old);
        }
        if (std::none_of(routes.begin(), routes.end(), IsDefaultIPv4)) {
            routes.push_back(NewDefaultRoute(gateway, metric, name));
        }
    }

    static bool IsDefaultIPv4(const Route& route) {
        return route.isDefault && rtnl_route_get_family(route.kernel.get()) == AF_INET;
    }

    void Move(const Address& address, const std::string& from, const std::string& to) {
        Remove(from, address.text);
        if (!Has(WantedOf(to), address.text)) {
            WantedOf(to).addresses.push_back(address);
        }
        WantedOf(to).isUp = true;
    }

    template <typename Which>
    void MoveRoutes(const std::string& from, const std::string& to, Which which) {
        for (Route& route : Wanted().routes) {
            if (route.device == from && which(route)) {
                route.device = to;
            }
        }
    }

    void Remove(const std::string& name, const std::string& address) {
        std::vector<Address>& all = WantedOf(name).addresses;
        all.erase(std::remove_if(all.begin(), all.end(),
                                 [&](const Address& one) { return one.text == address; }),
                  all.end());
    }

    // Takes all addresses and routes from the interface.
    void Drop(const std::string& name) {
        WantedOf(name).addresses.clear();
        std::vector<Route>& routes = Wanted().routes;
        routes.erase(std::remove_if(routes.begin(), routes.end(),
                                    [&](const Route& route) { return route.device == name; }),
                     routes.end());
    }

    static bool HasClient(const std::string& name) { return BlTAVILnxIsDHCP(name.c_str()) == 1; }

    // Finds the DHCP clients that run. One that runs on a bridge already keeps its lease.
    void LookAtClients() {
        for (const std::string& name : plan_.names) {
            if (HasClient(name)) {
                plan_.clients.insert(name);
            }
        }
        for (const BridgeSettings& bridge : plan_.settings.bridges) {
            if (bridge.isOn && bridge.card.IsEmpty() && HasClient(bridge.name)) {
                plan_.wantedClients.insert(bridge.name);
            }
        }
    }

    // Refuses to take the last default route away. One through the radio does not count: whoever
    // makes the adapter an access point gives it up.
    void CheckRoute() const {
        const auto counts = [this](const Route& route) {
            return route.isDefault && route.device != Radio();
        };
        const auto& before = plan_.now.routes;
        const auto& after = plan_.wanted.routes;
        const auto lost = std::find_if(before.begin(), before.end(), counts);
        if (lost != before.end() && std::none_of(after.begin(), after.end(), counts) &&
            plan_.wantedClients.empty()) {
            throw Error(
                "this would cut the machine off: no interface would be left for the route " +
                lost->text + " on " + lost->device);
        }
    }

    Plan plan_;
};

}  // namespace

Plan MakePlan(const Settings& settings) {
    return Planner(settings).Make();
}

}  // namespace taviwireless::network
