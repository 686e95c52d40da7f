// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_PLATFORM_HOST_ROOT_IWLIST_NL80211_H
#define TAVIWIRELESS_PLATFORM_HOST_ROOT_IWLIST_NL80211_H

#include <netlink/msg.h>
#include <netlink/netlink.h>

#include <memory>
#include <stdexcept>
#include <string>
#include <vector>

#include "platform/host_root/iwlist/scan_table.h"

namespace taviwireless::iwlist {

// A failure, as one plain sentence.
struct Error : std::runtime_error {
    using std::runtime_error::runtime_error;
};

// A wireless interface as the kernel's nl80211 knows it. Everything here throws Error.
class WirelessInterface {
  public:
    explicit WirelessInterface(const std::string& name);

    // Looks for networks and waits for the result, 15 s at most. Whoever may not do so is left with
    // what the last look gave.
    void Scan();
    std::vector<ScanResult> Networks();
    // In MHz: what may be used under the rules of the country that is set.
    std::vector<int> UsableFrequencies();

  private:
    struct Release {
        void operator()(nl_sock* socket) const { nl_socket_free(socket); }
        void operator()(nl_msg* message) const { nlmsg_free(message); }
    };
    using Socket = std::unique_ptr<nl_sock, Release>;
    using Message = std::unique_ptr<nl_msg, Release>;

    static Socket Connect();
    Message NewMessage(uint8_t command, int flags) const;
    // Sends a question with many answers, each of which is given to the handler.
    void Ask(Message question, nl_recvmsg_msg_cb_t handler, void* handlersOwn);
    void WaitForEndOfScan(nl_sock* events) const;
    [[noreturn]] void Fail(const std::string& what, int result) const;

    std::string name_;
    unsigned int index_;
    Socket socket_;
    int family_;
};

}  // namespace taviwireless::iwlist

#endif
