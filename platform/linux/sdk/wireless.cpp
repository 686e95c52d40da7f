// SPDX-License-Identifier: MIT
// The public names of Wi-Fi functions. libtaviwireless needs this library and not the other way
// round, so its functions are looked up among what the process has loaded.
#include <dlfcn.h>
#include <tavisdk/wireless.h>

#include <memory>

#include "core/failure.h"

using namespace tavicore;

namespace {

constexpr char kLibrary[] = "libtaviwireless.so.4";

// Calls the function of this name; throws when it is not loaded.
template <typename Result>
Result Call(const char* name) {
    struct Unload {
        void operator()(void* library) const { dlclose(library); }
    };
    std::unique_ptr<void, Unload> library;  // held while it is being called
    void* function = dlsym(RTLD_DEFAULT, name);
    if (function == nullptr) {
        // A plugin may have loaded it for itself alone.
        library.reset(dlopen(kLibrary, RTLD_LAZY | RTLD_NOLOAD));
        function = library ? dlsym(library.get(), name) : nullptr;
    }
    if (function == nullptr) {
        throw Failure{VEXAC_ERR_NOT_FOUND};
    }
    return reinterpret_cast<Result (*)()>(function)();
}

}  // namespace

const char* TAVIWirelessInterfaceGet() {
    return Guarded<const char*>(nullptr,
                                [] { return Call<const char*>("TAVIWirelessInterfaceGet_core"); });
}

int TAVIWirelessIsSupported() {
    return Guarded(0, [] { return Call<int>("TAVIWirelessIsSupported_core"); });
}

int TAVIWirelessNetworkDisconnect() {
    return Guarded(-1, [] { return Call<int>("TAVIWirelessNetworkDisconnect_core"); });
}
