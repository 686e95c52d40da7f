#include <glob.h>
#include <taviwireless/wireless.h>

#include "common/log.h"

namespace {

struct Matches : glob_t {
    Matches() : glob_t() {}
    ~Matches() { globfree(this); }
};

}  // namespace

int TAVIWirelessAdapterNum() {
    Matches adapters;
    switch (glob("/sys/class/net/wlan*", GLOB_ONLYDIR, nullptr, &adapters)) {
        case 0:
            return static_cast<int>(adapters.gl_pathc);
        case GLOB_NOSPACE:
            TAVI_LOG_ERROR("Failed to allocate memory to hold the result");
            return -1;
        case GLOB_ABORTED:
            TAVI_LOG_ERROR("There was an error opening a directory");
            return -1;
        default:
            return 0;
    }
}
