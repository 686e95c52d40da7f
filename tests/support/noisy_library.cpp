// A shared library that logs and sleeps, as the product does: optimised with _FORTIFY_SOURCE, as a
// distribution builds it, and without.
#include <syslog.h>
#include <unistd.h>

#include <cstdarg>

extern "C" {

__attribute__((visibility("default"))) unsigned SleepFor(unsigned seconds) {
    return sleep(seconds);
}

__attribute__((visibility("default"))) void Log(const char* format, ...) {
    va_list arguments;
    va_start(arguments, format);
    vsyslog(LOG_INFO, format, arguments);
    va_end(arguments);
}

__attribute__((visibility("default"))) void LogNumber(int number) {
    syslog(LOG_ERR, "number %d", number);
}

}  // extern "C"
