// SPDX-License-Identifier: MIT
#include "platform/host_root/network/journal.h"

#include <netlink/msg.h>
#include <unistd.h>

#include <cstring>
#include <sstream>

#include "base/split.h"
#include "base/trusted_file.h"
#include "platform/host_root/network/error.h"
#include "platform/host_root/network/paths.h"
#include "platform/host_root/network/programs.h"

namespace taviwireless::network {

namespace {

constexpr off_t kLimit = 16'777'216;  // bytes; a router has many routes
constexpr char kNone[] = "-";

using Message = std::unique_ptr<nl_msg, decltype(&nlmsg_free)>;

// The message that gives the kernel an address or a route, as digits. It is freed.
std::string Digits(nl_msg* message) {
    const Message owner(message, nlmsg_free);
    const nlmsghdr* header = nlmsg_hdr(message);
    const auto* bytes = reinterpret_cast<const unsigned char*>(header);
    std::string digits;
    for (const unsigned char* byte = bytes; byte < bytes + header->nlmsg_len; ++byte) {
        constexpr char kDigits[] = "0123456789abcdef";
        digits += kDigits[*byte >> 4];
        digits += kDigits[*byte & 15];
    }
    return digits;
}

// The object in such a message; throws when there is none.
template <typename Object>
std::shared_ptr<Object> ObjectIn(const std::string& digits, void (*release)(Object*)) {
    std::vector<char> bytes;
    for (size_t i = 0; i + 2 <= digits.size(); i += 2) {
        bytes.push_back(static_cast<char>(std::stoi(digits.substr(i, 2), nullptr, 16)));
    }
    std::vector<nlmsghdr> aligned(bytes.size() / sizeof(nlmsghdr) + 1);
    memcpy(aligned.data(), bytes.data(), bytes.size());
    const bool isWhole = aligned[0].nlmsg_len <= bytes.size();
    const Message message(isWhole ? nlmsg_convert(aligned.data()) : nullptr, nlmsg_free);
    nl_object* object = nullptr;
    const auto keep = [](nl_object* parsed, void* place) {
        nl_object_get(parsed);
        *static_cast<nl_object**>(place) = parsed;
    };
    if (message) {
        nlmsg_set_proto(message.get(), NETLINK_ROUTE);
        nl_msg_parse(message.get(), keep, &object);
    }
    if (object == nullptr) {
        throw Error(std::string(kJournalFile) + " cannot be understood");
    }
    return {reinterpret_cast<Object*>(object), release};
}

void Write(const std::string& name, const Interface& interface, std::ostream& lines) {
    const auto word = [](const std::string& text) { return text.empty() ? kNone : text; };
    lines << "interface " << name << ' ' << interface.isBridge << ' ' << interface.isRadio << ' '
          << interface.isUp << ' ' << word(interface.master) << ' ' << word(interface.hardware)
          << '\n';
    for (const Address& address : interface.addresses) {
        nl_msg* message = nullptr;
        Require(rtnl_addr_build_add_request(address.kernel.get(), 0, &message), "note an address");
        lines << "address " << name << ' ' << Digits(message) << '\n';
    }
}

void Read(const std::string& line, Journal& journal) {
    std::istringstream words(line);
    std::string kind, name, digits;
    words >> kind >> name;
    journal.names.insert(name);
    if (kind == "interface") {
        Interface& interface = journal.now.interfaces[name];
        words >> interface.isBridge >> interface.isRadio >> interface.isUp >> interface.master >>
            interface.hardware;
        interface.master = interface.master == kNone ? "" : interface.master;
    } else if (kind == "address") {
        words >> digits;
        journal.now.interfaces[name].addresses.push_back(
            Describe(ObjectIn(digits, rtnl_addr_put).get()));
    } else if (kind == "route") {
        words >> digits;
        journal.now.routes.push_back(Describe(ObjectIn(digits, rtnl_route_put).get(), name));
    } else if (kind == "client") {
        journal.clients.insert(name);
    }
}

}  // namespace

void WriteJournal(const Journal& journal) {
    std::ostringstream lines;
    for (const std::string& name : journal.names) {
        const Interface* interface = journal.now.Find(name);
        if (interface == nullptr) {
            lines << "missing " << name << '\n';
        } else {
            Write(name, *interface, lines);
        }
    }
    for (const Route& route : journal.now.routes) {
        if (journal.names.count(route.device) != 0) {
            nl_msg* message = nullptr;
            Require(rtnl_route_build_add_request(route.kernel.get(), 0, &message), "note a route");
            lines << "route " << route.device << ' ' << Digits(message) << '\n';
        }
    }
    for (const std::string& name : journal.clients) {
        lines << "client " << name << '\n';
    }
    ReplaceText(kJournalFile, lines.str());
}

std::optional<Journal> ReadJournal() {
    const auto text = ReadTrusted(kJournalFile, kLimit);
    if (!text) {
        return std::nullopt;
    }
    Journal journal;
    for (const std::string& line : Lines(*text)) {
        Read(line, journal);
    }
    return journal;
}

void RemoveJournal() {
    unlink(kJournalFile);
}

}  // namespace taviwireless::network
