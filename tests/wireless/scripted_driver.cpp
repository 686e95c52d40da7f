// SPDX-License-Identifier: MIT
#include "tests/wireless/scripted_driver.h"

#include <dlfcn.h>

#include <algorithm>
#include <cerrno>
#include <cstdarg>
#include <cstdlib>
#include <cstring>

namespace taviwireless::test {
namespace {

ScriptedDriver* living = nullptr;

bool IsWirelessRequest(unsigned long request) {
    return request >= SIOCIWFIRST && request <= SIOCIWLAST;
}

int Fail(int error) {
    errno = error;
    return -1;
}

int Answer(ScriptedDriver& driver, unsigned long request, iwreq& argument) {
    if (driver.atEachRequest) {
        driver.atEachRequest();
    }
    const std::string interface(argument.ifr_name,
                                strnlen(argument.ifr_name, sizeof argument.ifr_name));
    if (driver.interfacesAskedFor.count(interface) == 0) {  // insert() takes memory at once
        driver.interfacesAskedFor.insert(interface);
    }
    if (driver.refused.count(request) > 0) {
        return Fail(EOPNOTSUPP);
    }
    switch (request) {
        case SIOCGIWNAME:
            memset(argument.u.name, 0, sizeof argument.u.name);
            driver.name.copy(argument.u.name, sizeof argument.u.name);
            return 0;
        case SIOCGIWESSID:
            if (driver.essid.size() > argument.u.essid.length) {
                return Fail(E2BIG);
            }
            driver.essid.copy(static_cast<char*>(argument.u.essid.pointer), driver.essid.size());
            argument.u.essid.length = static_cast<unsigned short>(driver.essid.size());
            return 0;
        case SIOCGIWMODE:
            argument.u.mode = driver.mode;
            return 0;
        case SIOCSIWMODE:
            driver.mode = argument.u.mode;
            driver.modesSet.push_back(driver.mode);
            return 0;
        case SIOCGIWAP:
            std::copy(driver.accessPoint.begin(), driver.accessPoint.end(),
                      argument.u.ap_addr.sa_data);
            return 0;
        case SIOCGIWENCODE:
            if (driver.keyLength > argument.u.encoding.length) {
                return Fail(E2BIG);
            }
            memset(argument.u.encoding.pointer, 'k', driver.keyLength);
            argument.u.encoding.length = driver.keyLength;
            argument.u.encoding.flags = driver.encodingFlags;
            return 0;
        default:
            return Fail(EOPNOTSUPP);
    }
}

}  // namespace

ScriptedDriver::ScriptedDriver() {
    if (living != nullptr) {
        abort();
    }
    living = this;
}

ScriptedDriver::~ScriptedDriver() {
    living = nullptr;
}

}  // namespace taviwireless::test

using taviwireless::test::living;

extern "C" __attribute__((visibility("default"))) int ioctl(int handle, unsigned long request,
                                                            ...) noexcept {
    va_list arguments;
    va_start(arguments, request);
    void* argument = va_arg(arguments, void*);
    va_end(arguments);
    if (living != nullptr && taviwireless::test::IsWirelessRequest(request)) {
        return taviwireless::test::Answer(*living, request, *static_cast<iwreq*>(argument));
    }
    using Ioctl = int (*)(int, unsigned long, ...);
    static const auto next = reinterpret_cast<Ioctl>(dlsym(RTLD_NEXT, "ioctl"));
    return next(handle, request, argument);
}
