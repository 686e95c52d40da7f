// The PPP interfaces of USB modems.
#include <glob.h>
#include <tavicore/error.h>
#include <taviwireless/usbmodem_enum_if.h>

#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <string>

#include "common/log.h"

namespace {

constexpr char kInterfacePrefix[] = "/sys/class/net/ppp";
constexpr int kFirstModemUnit = 100;

// The paths that match a pattern; frees itself.
class DirectoryMatches {
  public:
    explicit DirectoryMatches(const std::string& pattern)
        : result_(glob(pattern.c_str(), GLOB_ONLYDIR, nullptr, &matches_)) {}
    ~DirectoryMatches() { globfree(&matches_); }
    DirectoryMatches(const DirectoryMatches&) = delete;
    DirectoryMatches& operator=(const DirectoryMatches&) = delete;

    int Result() const { return result_; }
    char** begin() const { return matches_.gl_pathv; }
    char** end() const { return matches_.gl_pathv + matches_.gl_pathc; }

  private:
    glob_t matches_{};
    int result_;
};

}  // namespace

int TAVIUSBModemEnumIf(VEXACSzList** list) {
    if (list == nullptr) {
        VEXACErrSet(VEXAC_ERR_BAD_PARAMETER);
        return -1;
    }
    const DirectoryMatches paths(std::string(kInterfacePrefix) + "*");
    if (paths.Result() == GLOB_NOSPACE) {
        TAVI_LOG_ERROR("Failed to allocate memory to hold the result");
        return -1;
    }
    if (paths.Result() == GLOB_ABORTED) {
        TAVI_LOG_ERROR("There was an error opening a directory");
        return -1;
    }
    if (paths.Result() != 0) {
        return 0;
    }
    int count = 0;
    for (const char* path : paths) {
        const char* number = path + std::strlen(kInterfacePrefix);
        char* end = nullptr;
        const long unit = std::strtol(number, &end, 10);
        if (end == number) {
            TAVI_LOG_DEBUG("Failed to parse usbmodem id [%s], errno=%s", path, strerror(errno));
        } else if (unit >= kFirstModemUnit) {
            VEXACSzListPush(list, ("ppp" + std::to_string(unit)).c_str());
            ++count;
        }
    }
    return count;
}
