// SPDX-License-Identifier: MIT
// DHCP service on bridges, by udhcpd. It serves one interface, so there is one configuration, and
// one server, for each; the network script runs those whose ".info" file is switched on.
#include <arpa/inet.h>
#include <tavicore/file.h>
#include <tavisdk/bridge.h>

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <string>

#include "core/failure.h"
#include "core/line.h"
#include "core/text_file.h"
#include "sdk/interface_name.h"
#include "sdk/settings_files.h"

using namespace tavicore;
using namespace tavisdk;

namespace {

constexpr char kFolder[] = "/etc/dhcpd";
constexpr char kFilePrefix[] = "dhcpd-";

// Settings in use, and those of a service that was put aside.
constexpr const char* kSuffixes[] = {".info", ".info.manual"};
constexpr char kConfiguration[] = ".conf";  // of the server

std::string PathOf(const char* interface, const char* bridge, const char* suffix) {
    return std::string(kFolder) + '/' + kFilePrefix + interface + '-' + bridge + suffix;
}

bool EndsWith(const std::string& text, const char* end) {
    const size_t length = strlen(end);
    return text.size() >= length && text.compare(text.size() - length, length, end) == 0;
}

template <size_t size>
void Read(const std::string& file, const char* key, char (&value)[size]) {
    ReadSetting(file, key, value, size);  // what is missing is empty
}

int ReadNumber(const std::string& file, const char* key) {
    char value[16];
    Read(file, key, value);
    return atoi(value);
}

TAVINetDhcpServer ReadServer(const std::string& file) {
    TAVINetDhcpServer server{};
    server.enabled = HasSetting(file, "enable", "yes") ? 1 : 0;
    server.reserved = ReadNumber(file, "reserved");
    server.leaseTime = ReadNumber(file, "lease");
    Read(file, "start", server.rangeStart);
    Read(file, "end", server.rangeEnd);
    Read(file, "interface", server.interface);
    Read(file, "bridge", server.bridge);
    Read(file, "gateway", server.gateway);
    Read(file, "nameserver", server.nameServer);
    Read(file, "netmask", server.netmask);
    return server;
}

std::string Settings(const TAVINetDhcpServer& server) {
    const PairFormat format("%s=\"%s\"\n");
    return format.Line("enable", server.enabled != 0 ? "yes" : "no") +
           format.Line("reserved", std::to_string(server.reserved)) +
           format.Line("lease", std::to_string(server.leaseTime)) +
           format.Line("start", server.rangeStart) + format.Line("end", server.rangeEnd) +
           format.Line("interface", server.interface) + format.Line("bridge", server.bridge) +
           format.Line("gateway", server.gateway) + format.Line("nameserver", server.nameServer) +
           format.Line("netmask", server.netmask);
}

// An address as a number in the machine's byte order.
uint32_t ParseNumber(const char* address) {
    in_addr number;
    if (inet_pton(AF_INET, address, &number) != 1) {
        throw Failure{VEXAC_ERR_BAD_PARAMETER};
    }
    return ntohl(number.s_addr);
}

// Throws when a value is missing or is no name, address or number where one belongs: the server's
// configuration has no quotes, so nothing else may get into it.
void Check(const TAVINetDhcpServer& server) {
    RequireInterfaceName(server.interface);
    RequireInterfaceName(server.bridge);
    ParseNumber(server.netmask);
    for (const char* address : {server.gateway, server.nameServer}) {
        if (*address != '\0') {
            ParseNumber(address);
        }
    }
    if (ParseNumber(server.rangeStart) > ParseNumber(server.rangeEnd) || server.leaseTime <= 0) {
        throw Failure{VEXAC_ERR_BAD_PARAMETER};
    }
}

// A client talks to the bridge, which is what the server listens on.
std::string Configuration(const TAVINetDhcpServer& server) {
    constexpr uint32_t kMostLeases = 1024;  // the server keeps room for all of them
    const uint32_t addresses = ParseNumber(server.rangeEnd) - ParseNumber(server.rangeStart);
    const PairFormat line("%s %s\n");
    const PairFormat option("option %s %s\n");
    std::string text =
        line.Line("interface", server.bridge) + line.Line("start", server.rangeStart) +
        line.Line("end", server.rangeEnd) +
        line.Line("max_leases", std::to_string(std::min(addresses, kMostLeases - 1) + 1)) +
        line.Line("lease_file", PathOf(server.interface, server.bridge, ".leases")) +
        line.Line("pidfile", std::string("/var/run/udhcpd-") + server.bridge + ".pid") +
        option.Line("subnet", server.netmask) +
        option.Line("lease", std::to_string(server.leaseTime));
    if (server.gateway[0] != '\0') {
        text += option.Line("router", server.gateway);
    }
    if (server.nameServer[0] != '\0') {
        text += option.Line("dns", server.nameServer);
    }
    return text;
}

// "gbr-gbr" of "dhcpd-gbr-gbr.info": of which interface and bridge the file is.
std::string NameOf(const std::string& file, const char* suffix) {
    const size_t begin = strlen(kFilePrefix);
    return file.substr(begin, file.size() - begin - strlen(suffix));
}

// A file without valid settings of its own bridge is passed over: it must not keep another bridge's
// access point from being switched on or off. Its old configuration is removed, so that nothing is
// served from it any more.
void WriteConfiguration(const std::string& file, const char* suffix) {
    const std::string name = NameOf(file, suffix);
    const std::string configuration =
        std::string(kFolder) + '/' + kFilePrefix + name + kConfiguration;
    TAVINetDhcpServer server{};
    const bool isValid = Guarded(-1, [&] {
                             server = ReadServer(std::string(kFolder) + '/' + file);
                             Check(server);
                             return 0;
                         }) == 0;
    if (isValid && name == std::string(server.interface) + '-' + server.bridge) {
        ReplaceFile(configuration.c_str(), Configuration(server));
    } else {
        VEXACSysUnlink(configuration.c_str());
    }
}

void WriteConfigurations() {
    const StringList names = ListFiles(kFolder, kFilePrefix);
    // Settings in use come last, and so win over those put aside of the same bridge.
    for (const char* suffix : {kSuffixes[1], kSuffixes[0]}) {
        for (int i = 0; i < names->count; ++i) {
            const std::string name = VEXACSzListGet(names.get(), i);
            if (EndsWith(name, suffix)) {
                WriteConfiguration(name, suffix);
            }
        }
    }
}

void RequireConfiguration(const char* interface, const char* bridge) {
    if (VEXACFileExist(PathOf(interface, bridge, kConfiguration).c_str()) == 0) {
        throw Failure{VEXAC_ERR_IO};
    }
}

}  // namespace

int TAVINetGetDhcpServerConf(const char* interface, const char* bridge, TAVINetDhcpServer* server) {
    return Guarded(-1, [&] {
        RequireAll(interface, bridge, server);
        *server = TAVINetDhcpServer{};
        RequireInterfaceName(interface);
        RequireInterfaceName(bridge);
        for (const char* suffix : kSuffixes) {
            const std::string file = PathOf(interface, bridge, suffix);
            if (VEXACFileExist(file.c_str()) != 0) {
                *server = ReadServer(file);
                return 0;
            }
            if (VEXACErrGet() != VEXAC_ERR_NOT_FOUND) {
                throw Failure{VEXACErrGet()};
            }
        }
        throw Failure{VEXAC_ERR_NOT_FOUND};
    });
}

int TAVINetSetDhcpServerConfigFiles(const TAVINetDhcpServer* server, int save) {
    return Guarded(0, [&] {
        RequireAll(server);
        if (save != 0) {
            Check(*server);
            MakeFolder(kFolder);
            ReplaceFile(PathOf(server->interface, server->bridge, kSuffixes[0]).c_str(),
                        Settings(*server));
        }
        WriteConfigurations();
        if (save != 0) {  // not passed over, since these are valid
            RequireConfiguration(server->interface, server->bridge);
        }
        return 1;
    });
}

int TAVINetIsSameSubnet(const char* address, const char* network, const char* netmask) {
    return Guarded(0, [&] {
        RequireAll(address, network, netmask);
        const uint32_t difference = ParseNumber(address) ^ ParseNumber(network);
        return (difference & ParseNumber(netmask)) == 0 ? 1 : 0;
    });
}
