// SPDX-License-Identifier: MIT
#include "platform/host_root/iwlist/nl80211.h"

#include <linux/nl80211.h>
#include <net/if.h>
#include <netlink/genl/ctrl.h>
#include <netlink/genl/genl.h>
#include <poll.h>

#include <algorithm>
#include <chrono>

namespace taviwireless::iwlist {

namespace {

constexpr char kFamily[] = "nl80211";

// The attributes of a message; those it lacks are null.
struct Attributes {
    explicit Attributes(nl_msg* message) {
        genlmsg_parse(nlmsg_hdr(message), 0, all, NL80211_ATTR_MAX, nullptr);
    }
    nlattr* all[NL80211_ATTR_MAX + 1] = {};
};

// The attribute when it has the type's size, else another value.
template <typename T>
T ValueOr(const nlattr* attribute, T otherwise) {
    if (attribute == nullptr || nla_len(attribute) != sizeof(T)) {
        return otherwise;
    }
    return *static_cast<const T*>(nla_data(attribute));
}

std::optional<ScanResult> ReadScanResult(nlattr* described) {
    constexpr uint16_t kPrivacy = 1 << 4;
    nlattr* bss[NL80211_BSS_MAX + 1] = {};
    if (described == nullptr || nla_parse_nested(bss, NL80211_BSS_MAX, described, nullptr) != 0) {
        return std::nullopt;
    }
    ScanResult network;
    network.bssid = ValueOr(bss[NL80211_BSS_BSSID], network.bssid);
    network.frequency = static_cast<int>(ValueOr<uint32_t>(bss[NL80211_BSS_FREQUENCY], 0));
    if (bss[NL80211_BSS_SIGNAL_MBM] != nullptr) {
        constexpr int kMilli = 100;  // hundredths of dBm
        network.signalDbm = ValueOr<int32_t>(bss[NL80211_BSS_SIGNAL_MBM], 0) / kMilli;
    }
    network.signalPercent = ValueOr<uint8_t>(bss[NL80211_BSS_SIGNAL_UNSPEC], 0);
    network.isPrivate = (ValueOr<uint16_t>(bss[NL80211_BSS_CAPABILITY], 0) & kPrivacy) != 0;
    if (const nlattr* elements = bss[NL80211_BSS_INFORMATION_ELEMENTS]) {
        network.elements.assign(static_cast<const char*>(nla_data(elements)),
                                static_cast<size_t>(nla_len(elements)));
    }
    return network;
}

int AddNetwork(nl_msg* message, void* networks) {
    if (auto network = ReadScanResult(Attributes(message).all[NL80211_ATTR_BSS])) {
        static_cast<std::vector<ScanResult>*>(networks)->push_back(std::move(*network));
    }
    return NL_OK;
}

void AddUsable(nlattr* described, std::vector<int>* frequencies) {
    nlattr* frequency[NL80211_FREQUENCY_ATTR_MAX + 1] = {};
    if (nla_parse_nested(frequency, NL80211_FREQUENCY_ATTR_MAX, described, nullptr) == 0 &&
        frequency[NL80211_FREQUENCY_ATTR_FREQ] != nullptr &&
        frequency[NL80211_FREQUENCY_ATTR_DISABLED] == nullptr) {
        frequencies->push_back(
            static_cast<int>(ValueOr<uint32_t>(frequency[NL80211_FREQUENCY_ATTR_FREQ], 0)));
    }
}

int AddFrequencies(nl_msg* message, void* frequencies) {
    nlattr* bands = Attributes(message).all[NL80211_ATTR_WIPHY_BANDS];
    if (bands == nullptr) {
        return NL_OK;
    }
    nlattr* band;
    int bandsLeft;
    nla_for_each_nested(band, bands, bandsLeft) {
        nlattr* all =
            nla_find(static_cast<nlattr*>(nla_data(band)), nla_len(band), NL80211_BAND_ATTR_FREQS);
        if (all != nullptr) {
            nlattr* frequency;
            int left;
            nla_for_each_nested(frequency, all, left) {
                AddUsable(frequency, static_cast<std::vector<int>*>(frequencies));
            }
        }
    }
    return NL_OK;
}

struct EndOfScan {
    unsigned int interface;
    bool hasCome;
};

int NoticeEndOfScan(nl_msg* message, void* end) {
    auto* awaited = static_cast<EndOfScan*>(end);
    const auto* header = static_cast<genlmsghdr*>(nlmsg_data(nlmsg_hdr(message)));
    const bool isEnd =
        header->cmd == NL80211_CMD_NEW_SCAN_RESULTS || header->cmd == NL80211_CMD_SCAN_ABORTED;
    if (isEnd &&
        ValueOr<uint32_t>(Attributes(message).all[NL80211_ATTR_IFINDEX], 0) == awaited->interface) {
        awaited->hasCome = true;
    }
    return NL_OK;
}

}  // namespace

WirelessInterface::WirelessInterface(const std::string& name)
    : name_(name),
      index_(if_nametoindex(name.c_str())),
      socket_(Connect()),
      family_(genl_ctrl_resolve(socket_.get(), kFamily)) {
    if (family_ < 0) {
        throw Error("the kernel has no nl80211: load the driver of a wireless adapter");
    }
    if (index_ == 0) {
        throw Error("there is no interface " + name + ": plug the adapter in");
    }
}

void WirelessInterface::Scan() {
    const Socket events = Connect();
    nl_socket_disable_seq_check(events.get());  // nobody asks for events
    const int group = genl_ctrl_resolve_grp(events.get(), kFamily, NL80211_MULTICAST_GROUP_SCAN);
    int result = group < 0 ? group : nl_socket_add_membership(events.get(), group);
    if (result < 0) {
        Fail("cannot listen for the end of a scan", result);
    }
    result = nl_send_sync(socket_.get(), NewMessage(NL80211_CMD_TRIGGER_SCAN, 0).release());
    if (result == -NLE_PERM) {
        return;
    }
    if (result < 0 && result != -NLE_BUSY) {  // busy: it is looking already
        Fail("cannot scan, the interface must be a wireless one and up", result);
    }
    WaitForEndOfScan(events.get());
}

std::vector<ScanResult> WirelessInterface::Networks() {
    std::vector<ScanResult> networks;
    Ask(NewMessage(NL80211_CMD_GET_SCAN, NLM_F_DUMP), AddNetwork, &networks);
    return networks;
}

std::vector<int> WirelessInterface::UsableFrequencies() {
    Message question = NewMessage(NL80211_CMD_GET_WIPHY, NLM_F_DUMP);
    nla_put_flag(question.get(), NL80211_ATTR_SPLIT_WIPHY_DUMP);  // or it is cut off at 4096 bytes
    std::vector<int> frequencies;
    Ask(std::move(question), AddFrequencies, &frequencies);
    std::sort(frequencies.begin(), frequencies.end());
    return frequencies;
}

WirelessInterface::Socket WirelessInterface::Connect() {
    Socket socket(nl_socket_alloc());
    if (!socket || genl_connect(socket.get()) < 0) {
        throw Error("cannot talk to the kernel about wireless interfaces");
    }
    return socket;
}

WirelessInterface::Message WirelessInterface::NewMessage(uint8_t command, int flags) const {
    Message message(nlmsg_alloc());
    if (!message ||
        genlmsg_put(message.get(), NL_AUTO_PORT, NL_AUTO_SEQ, family_, 0, flags, command, 0) ==
            nullptr ||
        nla_put_u32(message.get(), NL80211_ATTR_IFINDEX, index_) < 0) {
        throw Error("there is not enough memory");
    }
    return message;
}

void WirelessInterface::Ask(Message question, nl_recvmsg_msg_cb_t handler, void* handlersOwn) {
    nl_socket_modify_cb(socket_.get(), NL_CB_VALID, NL_CB_CUSTOM, handler, handlersOwn);
    int result = nl_send_auto(socket_.get(), question.get());
    if (result >= 0) {
        result = nl_recvmsgs_default(socket_.get());
    }
    // What changed while it was told is told as it was or as it is.
    if (result < 0 && result != -NLE_DUMP_INTR) {
        Fail("the kernel does not answer", result);
    }
}

void WirelessInterface::WaitForEndOfScan(nl_sock* events) const {
    using Clock = std::chrono::steady_clock;
    const auto deadline = Clock::now() + std::chrono::seconds(15);
    EndOfScan end{index_, false};
    nl_socket_modify_cb(events, NL_CB_VALID, NL_CB_CUSTOM, NoticeEndOfScan, &end);
    while (!end.hasCome) {
        const auto left =
            std::chrono::duration_cast<std::chrono::milliseconds>(deadline - Clock::now()).count();
        pollfd event{nl_socket_get_fd(events), POLLIN, 0};
        if (left <= 0 || poll(&event, 1, static_cast<int>(left)) <= 0) {
            throw Error(name_ + ": the scan has not ended after 15 seconds, try again");
        }
        nl_recvmsgs_default(events);
    }
}

void WirelessInterface::Fail(const std::string& what, int result) const {
    throw Error(name_ + ": " + what + " (" + nl_geterror(result) + ")");
}

}  // namespace taviwireless::iwlist
