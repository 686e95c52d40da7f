#ifndef TAVIWIRELESS_PLATFORM_ROOT_PRIVATE_SYSTEM_H
#define TAVIWIRELESS_PLATFORM_ROOT_PRIVATE_SYSTEM_H

namespace taviwireless {

// Lays out the file systems and brings lo up, as appliance_root.h describes them. The process must
// be the first one of new mount, network and PID namespaces. `inUserNamespace` says that it is root
// in a user namespace only. Throws std::system_error with one plain sentence.
void SetUpPrivateSystem(bool inUserNamespace);

}  // namespace taviwireless

#endif
