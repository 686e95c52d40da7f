// SPDX-License-Identifier: MIT
// usbmodemd: serves the USB modems that are plugged in on the session bus.
#include <fcntl.h>
#include <glib-unix.h>
#include <malloc.h>
#include <syslog.h>
#include <taviwireless/usbmodem_client.h>
#include <taviwireless/usbmodem_server.h>
#include <unistd.h>

#include <cstdio>
#include <cstdlib>
#include <exception>
#include <optional>
#include <stdexcept>
#include <string>

#include "daemon/background.h"
#include "daemon/probe.h"
#include "daemon/served_modems.h"
#include "daemon/session_bus.h"
#include "daemon/watchdog.h"
#include "dbus/usbmodem_service.h"
#include "usbmodem/rules/trace.h"

using namespace taviwireless::daemon;
using taviwireless::dbus::kUSBModemService;
using taviwireless::dbus::USBModemServer;

namespace {

constexpr char kName[] = "usbmodemd";
constexpr char kBusLost[] = "the session bus has gone away; ending";
constexpr char kIsServed[] = " is served by another process already; end that first";
constexpr int kUsageError = 2;

constexpr char kDescription[] =
    "Serves the USB modems that are plugged in as com.merilond.usbmodem on the session bus.\n"
    "What is known of them, and its changes, are objects of com.merilond.usbmodem.Objects.\n"
    "A modem is plugged in while there is an info file \"/tmp/usbmodem.info\" and a number.\n"
    "taviwireless modem shows what it serves; SIGTERM ends it, connections stay up.\n"
    "\n"
    "Exit status:\n"
    "  0  ended by SIGTERM or SIGINT\n"
    "  1  failed\n"
    "  2  wrong usage";

struct Options {
    gboolean foreground = FALSE;
    gboolean version = FALSE;
    gboolean debug = FALSE;
    gint refresh = 30;  // seconds
    gint probe = -1;
    gboolean isProbe = FALSE;
};

Options options;

gboolean TakeProbe(const gchar*, const gchar* value, gpointer, GError**) {
    options.probe = atoi(value);
    options.isProbe = TRUE;
    return TRUE;
}

// False after a message about wrong usage.
bool ParseOptions(int argc, char** argv) {
    const GOptionEntry entries[] = {
        {"foreground", 'f', 0, G_OPTION_ARG_NONE, &options.foreground,
         "Stay in the foreground and log to standard error as well", nullptr},
        {"refresh", 0, 0, G_OPTION_ARG_INT, &options.refresh,
         "Pause between looks at a modem while somebody listens, 30 if not given; 0: never look",
         "SECONDS"},
        {"debug", 0, 0, G_OPTION_ARG_NONE, &options.debug,
         "Log the dialogue with the modems as well, with PINs and PUKs masked", nullptr},
        {"version", 0, 0, G_OPTION_ARG_NONE, &options.version, "Show the version", nullptr},
        {"probe", 0, G_OPTION_FLAG_HIDDEN, G_OPTION_ARG_CALLBACK,
         reinterpret_cast<gpointer>(TakeProbe), nullptr, nullptr},
        {}};
    GOptionContext* context = g_option_context_new(nullptr);
    g_option_context_set_summary(context, kDescription);
    g_option_context_add_main_entries(context, entries, nullptr);
    GError* error = nullptr;
    bool isRight = g_option_context_parse(context, &argc, &argv, &error);
    if (!isRight) {
        fprintf(stderr, "%s: %s; see %s --help\n", kName, error->message, kName);
        g_error_free(error);
    } else if (argc > 1) {
        fprintf(stderr, "%s: there are no arguments such as %s; see %s --help\n", kName, argv[1],
                kName);
        isRight = false;
    } else if (options.refresh < 0) {
        fprintf(stderr, "%s: the pause of --refresh is not below 0; see %s --help\n", kName, kName);
        isRight = false;
    }
    g_option_context_free(context);
    return isRight;
}

// Whoever started the program may have closed these. A socket that got one of their numbers would
// be overwritten by what is meant for a standard one.
void FillStandardDescriptors() {
    int descriptor = 0;
    while (descriptor >= 0 && descriptor <= STDERR_FILENO) {
        descriptor = open("/dev/null", O_RDWR);
    }
    close(descriptor);
}

// What GLib and dbus-glib have to say goes where everything else goes.
void LogToSystem(const gchar* domain, GLogLevelFlags level, const gchar* message, gpointer) {
    if ((level & (G_LOG_LEVEL_INFO | G_LOG_LEVEL_DEBUG)) == 0) {
        syslog(LOG_WARNING, "%s: %s", domain != nullptr ? domain : "GLib", message);
    }
}

void TakeName(USBModemServer& server, const SessionBus& bus) {
    const bool isTaken = server.Initialize();
    const std::string owner = bus.OwnerOf(kUSBModemService);
    if (bus.IsLost()) {
        throw std::runtime_error(kBusLost);
    }
    if (!isTaken) {
        throw std::runtime_error(std::string("the session bus refuses the name ") +
                                 kUSBModemService);
    }
    const char* self = server.GetConnectionName();
    if (self == nullptr || owner != self) {
        throw std::runtime_error(std::string(kUSBModemService) + kIsServed);
    }
}

gboolean End(gpointer server) {
    syslog(LOG_INFO, "told to end; connections stay up");
    static_cast<USBModemServer*>(server)->QuitLoop();
    return G_SOURCE_CONTINUE;
}

// Serves until a signal or the end of the bus. Returns the exit status.
int Serve(std::optional<Background>& background) {
    int status = EXIT_SUCCESS;
    USBModemServer* running = nullptr;
    ServedModems* served = nullptr;
    SessionBus bus([&] { served->HasServed(); },
                   [&] {
                       syslog(LOG_ERR, "%s", kBusLost);
                       status = EXIT_FAILURE;
                       running->QuitLoop();
                   });
    USBModemServer server;
    running = &server;
    if (taviwireless::dbus::USBModemClient().IsServerReady()) {
        throw std::runtime_error(std::string(kUSBModemService) + kIsServed);
    }
    // Whoever finds the service finds the objects, too.
    ServedModems modems(*server.GetList(), static_cast<unsigned int>(options.refresh));
    served = &modems;
    TakeName(server, bus);
    for (const int number : {SIGTERM, SIGINT}) {
        g_unix_signal_add(number, End, &server);
    }
    FeedWatchdog();
    if (background) {
        background->Ready();
    }
    modems.Begin();
    server.StartLoop();
    return status;
}

}  // namespace

int main(int argc, char** argv) {
    mallopt(M_ARENA_MAX, 1);  // one for each thread would be memory for nothing
    FillStandardDescriptors();
    if (!ParseOptions(argc, argv)) {
        return kUsageError;
    }
    if (options.version) {
        puts("usbmodemd " TAVI_VERSION);
        return EXIT_SUCCESS;
    }
    if (options.debug) {
        taviwireless::usbmodem_lib::SwitchTraceOn();
    }
    openlog(kName, LOG_PID | (options.foreground ? LOG_PERROR : 0), LOG_DAEMON);
    if (options.isProbe) {
        return Probe::Run(options.probe);
    }
    g_log_set_default_handler(LogToSystem, nullptr);
    try {
        std::optional<Background> background;
        if (!options.foreground) {
            background.emplace();
        }
        return Serve(background);
    } catch (const std::exception& error) {
        syslog(LOG_ERR, "%s", error.what());
        if (!options.foreground) {
            fprintf(stderr, "%s: %s\n", kName, error.what());
        }
        return EXIT_FAILURE;
    }
}
