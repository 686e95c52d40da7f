// SPDX-License-Identifier: MIT
#include "tests/support/public_calls.h"

#include <json/json.h>
#include <taviwireless/usbmodem_atif.h>
#include <taviwireless/usbmodem_client.h>
#include <taviwireless/usbmodem_enum_if.h>
#include <taviwireless/usbmodem_list.h>
#include <taviwireless/usbmodem_server.h>
#include <taviwireless/usbmodem_ui.h>

#include <sstream>
#include <type_traits>

#include "base/split.h"
#include "dbus/usbmodem_service.h"
#include "wireless/system/queue.h"

namespace taviwireless::test {
namespace {

using namespace dbus;
using namespace usbmodem_lib;
using semaphore::Semaphore;

constexpr char kId[] = "usbmodem1";
constexpr char kPin[] = "1234";
constexpr char kPuk[] = "12345678";
constexpr char kPins[] = "1234\n1234\n";
constexpr char kPukAndPin[] = "12345678\n1234\n";
constexpr char kAnswer[] = "+ANY: 1,2,3,\"name\",\"value\"\nOK\n";

std::ostream& operator<<(std::ostream& out, const WirelessNetwork& network) {
    char bssid[18];
    return out << network.essid << ' '
               << TAVIWirelessBssidStringGet(network.bssid, bssid, sizeof bssid) << ' '
               << network.channel << ' ' << network.opmode << ' ' << network.auth;
}

std::ostream& operator<<(std::ostream& out, const WirelessConf& conf) {
    return out << conf.network << ' ' << conf.key << ' ' << conf.ipAddr;
}

std::ostream& operator<<(std::ostream& out, const USBModem& modem) {
    return out << modem.GetDevId() << ' ' << modem.IsInited() << ' ' << modem.GetQueryNode();
}

template <typename Records>
void Print(std::ostream& out, Records&& records) {
    for (auto& record : records) {
        out << ' ' << record;
    }
}

// A client of the service that has begun a call, and sent it if it is to.
struct BegunCall : DBusClient {
    explicit BegunCall(const char* method, bool isSent = false,
                       const char* service = kUSBModemService)
        : DBusClient(service, kUSBModemPath, service, DBUS_BUS_SESSION) {
        NewMessage(method);
        if (isSent) {
            SendMessage(true, -1);
        }
    }
};

template <typename Call>
void PrintResult(std::ostream& out, Call call) {
    if constexpr (std::is_void_v<decltype(call())>) {
        call();
    } else {
        out << call();
    }
}

// The function's name in the text of a call.
std::string NameIn(const std::string& call) {
    return call.substr(0, call.find('('));
}

// A row of these statements, which print to `out`.
#define ROW(name, needs, ...)                                           \
    PublicCall {                                                        \
        name, Needs::needs, []([[maybe_unused]] Surroundings& around) { \
            [[maybe_unused]] std::ostringstream out;                    \
            __VA_ARGS__;                                                \
            return out.str();                                           \
        }                                                               \
    }
// A row of one call, of a function or of a member of `object`. It may set err and text.
#define CALL(scope, needs, object, call)                                                   \
    ROW(scope + NameIn(#call), needs, [[maybe_unused]] bool err = false; std::string text; \
        PrintResult(out, [&] { return object call; }); out << (err ? " (err)" : "") << text)

#define MODEM(call) CALL("usbmodem_lib::USBModem::", kModem, around.Modem()., call)
#define FRESH(call) \
    CALL("usbmodem_lib::USBModem::", kPlugged, USBModem(1, "/tmp/usbmodem.info1")., call)
#define LINK(call) CALL("usbmodem_lib::USBModem::", kConnection, around.Modem()., call)
#define NO_MODEM(call) CALL("usbmodem_lib::USBModemNull::", kNothing, USBModemNull()., call)
#define LIST(name, result)                                                                       \
    ROW("usbmodem_lib::USBModemList::" name, kPlugged, USBModemList list; list.SearchInfoPath(); \
        out << result; Print(out, list))
#define ATIF(call) CALL("usbmodem_lib::USBModem_ATIF::", kNothing, USBModem_ATIF()., call)
#define MADE_SET(call)                                             \
    ROW("usbmodem_lib::USBModem_ATIF::" + NameIn(#call), kNothing, \
        USBModem_ATIF::DeleteATIF(USBModem_ATIF::call))
#define DLINK(call) \
    CALL("usbmodem_lib::USBModem_ATIF_DLink::", kNothing, USBModem_ATIF_DLink()., call)
#define HUAWEI(call) \
    CALL("usbmodem_lib::USBModem_ATIF_Huawei::", kNothing, USBModem_ATIF_Huawei()., call)
#define CLIENT(call) CALL("dbus::USBModemClient::", kService, USBModemClient()., call)
#define BEGUN(client, call) CALL("dbus::DBusClient::", kService, client., call)
#define SERVER(name, ...)                                        \
    ROW("dbus::DBusServer::" name, kService,                     \
        DBusServer server("org.example", "/", DBUS_BUS_SESSION); \
        __VA_ARGS__)
#define UI(call) CALL("", kService, , usbmodem_ui::call)
#define WIFI(call) CALL("", kAdapter, , call)
#define WITH(needs, name, ...) ROW(#name, needs, __VA_ARGS__)

// clang-format off
const PublicCall kCalls[] = {
    MODEM(GetDefaultAPN(err)), MODEM(GetDefaultISP(err)), MODEM(GetDefaultLocation(err)),
    MODEM(GetIMSI(err)), MODEM(GetNetStatus(err)), MODEM(GetPINStatus(err)),
    MODEM(GetProductName(err)), MODEM(GetProfileAPN(err)), MODEM(GetProfileDefaultGW(err)),
    MODEM(GetProfileIMSI(err)), MODEM(GetProfileISP(err)), MODEM(GetProfileLocation(err)),
    MODEM(GetProfilePassword(err)), MODEM(GetProfilePhone(err)), MODEM(GetProfileUsername(err)),
    MODEM(GetSignalQuality(err)), MODEM(GetVendorName(err)), MODEM(IsNetDisconnected(err)),
    MODEM(IsPINReady(err)), FRESH(AssignConnectNode()), FRESH(AssignQuaryNode()),
    MODEM(BackupDefaultRoute()), MODEM(CloseFileDevice()), MODEM(DrainDeviceBuffer()),
    MODEM(GetConnectFailedAttempt()), MODEM(GetDevId()), MODEM(GetIfid()), MODEM(GetPINEnable()),
    MODEM(GetQueryNode()), MODEM(GetRSSI()), MODEM(IncreaseErrorCounter()), FRESH(InitInfo()),
    MODEM(InitProfile()), MODEM(InsertPPPModules()), MODEM(IsError()), MODEM(IsInfoExist()),
    MODEM(IsInited()), MODEM(IsNewPlugIn()), MODEM(IsNull()), MODEM(IsPortAlive()),
    MODEM(IsUSBModemBusy()), MODEM(NetConnect()), MODEM(PINGetAttemptRemain()),
    MODEM(PINGetEnableProtection()), MODEM(PUKGetAttemptRemain()), MODEM(ResetProfile()),
    MODEM(RestoreDefaultRoute()), MODEM(SetATInterface()), MODEM(SetNotNewPlugIn()),
    MODEM(SetProfileToDefault()), MODEM(TestConfToFile()), MODEM(UnsetATInterface()),
    MODEM(UpdateSIMStatus()),
    MODEM(BackgroundExec("/bin/true", "", "", "", "", "", "", "", "/var/lib/usbmodem/pid",
        "/var/lib/usbmodem/log")),
    MODEM(ChangePIN(kPin, kPin)), MODEM(ChangePINEnable(kPin, true)),
    MODEM(ChangePINWithPUK(kPuk, kPin)), MODEM(GetProfileWithKey("apn", err)),
    MODEM(GetProfileWithKeys({"apn"}, err).at(0)), FRESH(InitInfo("/dev/ttyUSB1")), FRESH(MakeReady(text)),
    MODEM(ModemCmd("AT+CSQ", text)),
    FRESH(OpenFileDevice("/dev/ttyUSB0")), MODEM(PINSet(kPin, "", true)), MODEM(PINUnlock(kPin)),
    MODEM(PUKSet(kPuk, kPin)), MODEM(SetDefaultRoute("false")), MODEM(SetHardwareFuncLvl("1")),
    MODEM(SetProfileAPN("internet")), MODEM(SetProfileDefaultGW("false")),
    MODEM(SetProfileISP("Example")), MODEM(SetProfileLocation("Germany")),
    MODEM(SetProfilePassword("secret")), MODEM(SetProfilePhone("*99#")),
    MODEM(SetProfileUsername("me")), MODEM(SetProfileWithKey("apn", "internet")),
    MODEM(SetUnsolicitedReports(false)), FRESH(TakeOver("/dev/ttyUSB1\n0\n")),
    FRESH(TestATCmd("AT", "/dev/ttyUSB0")),
    LINK(AssignConnectInfo()), LINK(EndConnection()), LINK(GetLinkStats()), LINK(NetDisconnect()),
    LINK(RecallConnection()), LINK(UpdateIP()), LINK(UpdateNetStatus()), LINK(GetNetIFName(err)),
    LINK(GetNetLocalIP(err)), LINK(GetRoaming(err)),
    ROW("usbmodem_lib::USBModem::Known", kModem, const KnownModem known = around.Modem().Known();
        out << known.vendor << ' ' << known.simStatus << ' ' << known.queryNode),
    ROW("usbmodem_lib::USBModem::ReadAPNData", kModem, Json::Value data;
        out << around.Modem().ReadAPNData(data) << data),
    ROW("usbmodem_lib::USBModem::USBModem", kNothing, out << USBModem(1, "/tmp/usbmodem.info1")),
    ROW("usbmodem_lib::USBModem::USBModem", kModem, out << USBModem(around.Modem())),
    ROW("usbmodem_lib::USBModem::USBModem", kModem, out << USBModem(std::move(around.Modem()))),
    ROW("usbmodem_lib::USBModem::operator=", kModem, 
        USBModem other(1, ""); out << (other = around.Modem())),
    ROW("usbmodem_lib::USBModem::operator=", kModem, 
        USBModem other(1, ""); out << (other = std::move(around.Modem()))),
    NO_MODEM(GetDevId()), NO_MODEM(IsInfoExist()), NO_MODEM(IsInited()), NO_MODEM(IsNull()),
    ROW("usbmodem_lib::USBModemNull::USBModemNull", kNothing, out << USBModemNull()),
    LIST("USBModemList", ""), LIST("SearchInfoPath", list.SearchInfoPath()),
    LIST("Update", list.Update()), LIST("DropUnplugged", (list.DropUnplugged(), "")),
    LIST("Drop", (list.Drop(1), "")), LIST("FindUSBModem", list.FindUSBModem(1)),
    LIST("FindUSBModem", list.FindUSBModem(kId)),
    CALL("semaphore::Semaphore::", kNothing, Semaphore(1)., Enter()),
    CALL("semaphore::Semaphore::", kNothing, Semaphore(1)., Release()),
    CALL("semaphore::Semaphore::", kNothing, Semaphore(1)., Get(std::make_unique<int>().get())),
    CALL("semaphore::Semaphore::", kNothing, , Semaphore(1).Enter()),
    ROW("TAVIUSBModemEnumIf", kNothing, VEXACSzList* list = VEXACSzListAlloc(64);
        out << TAVIUSBModemEnumIf(&list); VEXACSzListFree(list)),
    MADE_SET(CreateATIF("12d1")), MADE_SET(CreateATIFDLink()), MADE_SET(CreateATIFHuawei()),
    ATIF(CreateVendorHash()), ATIF(DeleteATIF(nullptr)), ATIF(GetATCommandChangePINCode(kPin, kPin)),
    ATIF(GetATCommandChangePINEnable("1", kPin)), ATIF(GetATCommandGetDefaultAPN()),
    ATIF(GetATCommandGetDefaultISP()), ATIF(GetATCommandGetHardwareFuncLvl()),
    ATIF(GetATCommandGetIMSI()), ATIF(GetATCommandGetPINEnable()),
    ATIF(GetATCommandGetProductName()), ATIF(GetATCommandGetRSSI()), ATIF(GetATCommandGetRoaming()),
    ATIF(GetATCommandGetUnsolicitedReports()), ATIF(GetATCommandGetVendorName()),
    ATIF(GetATCommandPINPUKAttempt()), ATIF(GetATCommandQuarySIMStatus()),
    ATIF(GetATCommandSetHardwareFuncLvl("1")), ATIF(GetATCommandSetSIMPIN(kPin)),
    ATIF(GetATCommandSetSIMPUK(kPuk, kPin)), ATIF(GetATCommandSetUnsolicitedReports(true)),
    ATIF(GetLineWithDelim(kAnswer, ',', 1, text)), ATIF(ParseRetStringDefaultAPN(kAnswer, text)),
    ATIF(ParseRetStringDefaultFormat(kAnswer, text)), ATIF(ParseRetStringDefaultISP(kAnswer, text)),
    ATIF(ParseRetStringGetRSSI(kAnswer, text)), ATIF(ParseRetStringGetRoaming(kAnswer, text)),
    ATIF(ParseRetStringIsOK(kAnswer)), ATIF(ParseRetStringPINRemainAttempt(kAnswer, text)),
    ATIF(ParseRetStringPUKRemainAttempt(kAnswer, text)),
    ATIF(ParseRetStringQuarySIMStatus(kAnswer)), DLINK(GetATCommandPINPUKAttempt()),
    DLINK(GetATCommandSetSIMPIN(kPin)), DLINK(GetATCommandSetSIMPUK(kPuk, kPin)),
    HUAWEI(GetATCommandGetUnsolicitedReports()), HUAWEI(GetATCommandPINPUKAttempt()),
    HUAWEI(GetATCommandSetUnsolicitedReports(true)),
    HUAWEI(ParseRetStringPINRemainAttempt(kAnswer, text)),
    UI(Connect(kId)), UI(Disconnect(kId)), UI(GetProfile(kId)), UI(GetUSBModem(kId)),
    UI(SetPIN(kId, kPin, "", true)), UI(SetProfile(kId, "apn=internet\n")),
    UI(UnlockPIN(kId, kPuk, kPin)), UI(UnlockSIM(kId, kPin)),
    ROW("usbmodem_ui::GetUSBModemIfList", kService, std::vector<std::string> list;
        out << usbmodem_ui::GetUSBModemIfList(list); Print(out, list)),
    ROW("usbmodem_ui::GetUSBModemList", kService, std::vector<std::string> list;
        out << usbmodem_ui::GetUSBModemList(list); Print(out, list)),
    CLIENT(Connect(kId)), CLIENT(Disconnect(kId)), CLIENT(GetProfile(kId, text)),
    CLIENT(GetUSBModem(kId, text)), CLIENT(GetUSBModemIfList(text)), CLIENT(GetUSBModemList(text)),
    CLIENT(IsServerReady()), CLIENT(SetPIN(kId, kPin, "", true)),
    CLIENT(SetProfile(kId, "apn=internet\n")), CLIENT(UnlockPIN(kId, kPuk, kPin)),
    CLIENT(UnlockSIM(kId, kPin)),
    ROW("dbus::USBModemClient::USBModemClient", kService, out << USBModemClient().IsServerReady()),
    ROW("dbus::DBusClient::DBusClient", kService, BegunCall("Connect")),
    BEGUN(BegunCall("Connect"), Append(kId)), BEGUN(BegunCall("SetPIN"), Append(true)),
    BEGUN(BegunCall("GetUSBModemList", true), GetReply(text)),
    ROW("dbus::DBusClient::GetReply", kService, std::vector<std::string> list;
        out << BegunCall("ListActivatableNames", true, DBUS_SERVICE_DBUS).GetReply(list); Print(out, list)),
    BEGUN(BegunCall("Connect"), NewMessage("GetUSBModemList")),
    BEGUN(BegunCall("GetUSBModemList"), SendMessage(true, -1)), SERVER("DBusServer", (void)0),
    SERVER("GetBusName", out << server.GetBusName()),
    SERVER("GetConnectionName", out << (server.GetConnectionName() != nullptr)),
    SERVER("GetInterface", out << server.GetInterface()),
    SERVER("GetPath", out << server.GetPath()), SERVER("QuitLoop", server.QuitLoop()),
    SERVER("StartLoop", g_idle_add([](gpointer loop) {
        static_cast<DBusServer*>(loop)->QuitLoop(); return FALSE; }, &server);
        server.StartLoop()),
    SERVER("initialize", static const DBusGObjectInfo kNone{1, nullptr, 0, "", "", ""};
        const GType type = usbmodem_object_get_type();
        auto* object = static_cast<GObject*>(g_object_new(type, nullptr));
        out << server.initialize(type, &kNone, object); g_object_unref(object)),
    CALL("dbus::USBModemServer::", kService, USBModemServer()., Initialize()),
    ROW("dbus::USBModemServer::GetList", kService, Print(out, *USBModemServer().GetList())),
    ROW("dbus::USBModemServer::USBModemServer", kService, out << USBModemServer().GetPath()),
    ROW("dbus::usbmodem_object_get_type", kNothing, out << (usbmodem_object_get_type() != 0)),
    WIFI(TAVIWirelessAPEnable()), WIFI(TAVIWirelessAPInterfaceGet()),
    WIFI(TAVIWirelessAPIsConnecting()), WIFI(TAVIWirelessAPIsSupported()),
    WIFI(TAVIWirelessAdapterNum()), WIFI(TAVIWirelessAuthParse("WPA2PSK")),
    WIFI(TAVIWirelessAuthStringGet(1)), WIFI(TAVIWirelessAutoConnect()),
    WIFI(TAVIWirelessCheckBlock()), WIFI(TAVIWirelessConnStatusGet()),
    WIFI(TAVIWirelessDefaultGatewaySet("192.168.9.1")), WIFI(TAVIWirelessEncryptParse("AES")),
    WIFI(TAVIWirelessEncryptStringGet(8, 0)), WIFI(TAVIWirelessInterfaceGet_core()),
    WIFI(TAVIWirelessIsSingle_core()), WIFI(TAVIWirelessIsSupported_core()),
    WIFI(TAVIWirelessModeChange(1)), WIFI(TAVIWirelessOpmodeGet()),
    WIFI(TAVIWirelessOpmodeParse("Managed")), WIFI(TAVIWirelessOpmodeSet(2)),
    WIFI(TAVIWirelessOpmodeStringGet(2)), WIFI(TAVIWirelessProtocolParse("11b/g")),
    WIFI(TAVIWirelessProtocolStringGet(1)), WIFI(TAVIWirelessTestAPMode()),
    WITH(kAccessPoint, TAVIWirelessAPDisable, out << TAVIWirelessAPDisable()),
    WITH(kJoined, TAVIWirelessNetworkDisconnect_core, out << TAVIWirelessNetworkDisconnect_core()),
    WITH(kAdapter, TAVIWirelessAdhocCreate, WirelessConf conf = MakeConf("adhoc", "",
        WIRELESS_AUTH_OPEN, WIRELESS_ENCRYPT_NONE); conf.network.opmode = WIRELESS_OPMODE_ADHOC;
        out << TAVIWirelessAdhocCreate(&conf)),
    WITH(kAdapter, TAVIWirelessAdhocNetworkGet, around.Adapter().driver.mode = IW_MODE_ADHOC;
        WirelessNetwork network{}; out << TAVIWirelessAdhocNetworkGet(&network) << network),
    WITH(kAdapter, TAVIWirelessApConfigSecNameGet, char name[32] = ""; out <<
        TAVIWirelessApConfigSecNameGet(name, sizeof name) << name),
    WITH(kAdapter, TAVIWirelessBssidParse, WirelessNetwork network{}; out <<
        TAVIWirelessBssidParse("00:11:22:33:44:55", network.bssid) << network),
    WITH(kAdapter, TAVIWirelessBssidStringGet, out << WirelessNetwork{}),
    WITH(kAdapter, TAVIWirelessConfEnum, wireless::OwnedList<WirelessConf> confs; out <<
        TAVIWirelessConfEnum(confs.Head()); Print(out, confs)),
    WITH(kAdapter, TAVIWirelessConfEnumByAtime, wireless::OwnedList<WirelessConf> confs; out <<
        TAVIWirelessConfEnumByAtime(confs.Head()); Print(out, confs)),
    WITH(kAdapter, TAVIWirelessConfGet, WirelessConf conf{}; out <<
        TAVIWirelessConfGet("00:11:22:AA:BB:CC", &conf) << conf),
    WITH(kAdapter, TAVIWirelessConfSet, const WirelessConf conf = MakeConf("Other"); out <<
        TAVIWirelessConfSet(&conf)),
    WITH(kJoined, TAVIWirelessCurInfoGet, WirelessInfo info{}; out <<
        TAVIWirelessCurInfoGet(WIRELESS_INFO_CONN_STATUS, &info) << info.value),
    WITH(kJoined, TAVIWirelessDefaultGatewayConfGet_core, char gateway[20] = ""; out <<
        TAVIWirelessDefaultGatewayConfGet_core(gateway, sizeof gateway) << gateway),
    WITH(kAdapter, TAVIWirelessGetAPConfig, WirelessAPSettings settings{}; out <<
        TAVIWirelessGetAPConfig("stick", &settings) << settings.ap.ssid),
    WITH(kAdapter, TAVIWirelessIfconfigSet, const WirelessConf conf = MakeConf(); out <<
        TAVIWirelessIfconfigSet("wlan0", &conf)),
    WITH(kAdapter, TAVIWirelessNetworkConnect, WirelessConf conf = MakeConf(); out <<
        TAVIWirelessNetworkConnect(&conf)),
    WITH(kAdapter, TAVIWirelessNetworkGet, WirelessNetwork network{}; out <<
        TAVIWirelessNetworkGet("My Net", WIRELESS_KEY_ESSID, &network) << network),
    WITH(kAdapter, TAVIWirelessNetworkScan, wireless::OwnedList<WirelessNetwork> networks; out
        << TAVIWirelessNetworkScan(0, networks.Head()); Print(out, networks)),
    WITH(kAdapter, TAVIWirelessSetAPConfig, WirelessAPSettings settings{};
        out << (TAVIWirelessGetAPConfig("stick", &settings) == 1 ?
        TAVIWirelessSetAPConfig(&settings) : -1)),
    WITH(kAdapter, TAVIWirelessSetHostAPConf, WirelessAPSettings settings{};
        out << (TAVIWirelessGetAPConfig("stick", &settings) == 1 ?
        TAVIWirelessSetHostAPConf("wlan0", &settings.ap) : -1)),
    WITH(kJoined, TAVIWirelessStatusGet, WirelessStatus status{};
        TAVIWirelessStatusGet(&status); out << status.status << status.network),
};

// Without the modem service; most are called with it, too.
const CommandCall kCommands[] = {
    {"modem list", Needs::kPlugged, false, {}}, {"modem show", Needs::kPlugged, false, {kId}},
    {"modem watch", Needs::kPlugged, false, {}},
    {"modem unlock", Needs::kPlugged, true, {kId}, kPins},
    {"modem pin set", Needs::kPlugged, true, {kId}, kPins},
    {"modem pin protect", Needs::kPlugged, true, {kId}, kPins},
    {"modem pin unprotect", Needs::kPlugged, true, {kId}, kPins},
    {"modem puk", Needs::kPlugged, true, {kId}, kPukAndPin},
    {"modem profile show", Needs::kPlugged, true, {kId}},
    {"modem profile set", Needs::kPlugged, true, {kId, "apn=internet"}},
    {"modem profile reset", Needs::kPlugged, true, {kId}},
    {"modem connect", Needs::kPlugged, true, {kId}},
    {"modem disconnect", Needs::kDialled, true, {kId}},
    {"modem status", Needs::kPlugged, false, {kId}},
    {"modem interfaces", Needs::kPlugged, false, {}}, {"modem usage", Needs::kPlugged, false, {}},
    {"modem at", Needs::kPlugged, false, {kId, "AT+CSQ"}}, {"wifi status", Needs::kAdapter, false, {}},
    {"wifi scan", Needs::kAdapter, false, {}}, {"wifi watch", Needs::kJoined, false, {}},
    {"wifi saved edit", Needs::kAdapter, true, {"My Net", "dhcp=yes"}},
    {"wifi forget", Needs::kAdapter, true, {"My Net"}},
    {"wifi radio", Needs::kAdapter, true, {"off"}},
    {"wifi connect", Needs::kAdapter, true, {"My Net", "--new-key"}, "another key\n"},
    {"wifi disconnect", Needs::kJoined, true, {}}, {"wifi auto", Needs::kAdapter, true, {}},
    {"wifi saved list", Needs::kAdapter, false, {}},
    {"wifi saved show", Needs::kAdapter, false, {"My Net"}},
    {"wifi adhoc", Needs::kAdapter, true, {"adhoc"}},
    {"wifi mode", Needs::kAdapter, true, {"client"}}, {"wifi gateway", Needs::kJoined, false, {}},
    {"ap status", Needs::kAdapter, false, {}}, {"ap show", Needs::kAdapter, false, {}},
    {"ap set", Needs::kAdapter, true, {"ssid=Other"}}, {"ap check", Needs::kAdapter, false, {}},
    {"ap enable", Needs::kAdapter, true, {}}, {"ap disable", Needs::kAccessPoint, true, {}},
    {"ap hotspot", Needs::kAdapter, true, {}}, {"ap qr", Needs::kAdapter, false, {}},
    {"ap stations", Needs::kAccessPoint, false, {}},
    {"wifi qr", Needs::kAdapter, false, {"My Net"}}, {"doctor", Needs::kAdapter, false, {}},
};
// clang-format on

// What the SIM has to be like for the call to have something to do.
std::string SimFor(const std::string& name) {
    for (const char* part : {"PUKSet", "WithPUK", "UnlockPIN", "modem puk"}) {
        if (name.find(part) != std::string::npos) {
            return "pin_attempts 0";
        }
    }
    return name == "modem pin protect" ? "lock off" : kReadySim;
}

}  // namespace

const std::vector<PublicCall>& PublicCalls() {
    static const std::vector<PublicCall> calls = [] {
        std::vector<PublicCall> all(std::begin(kCalls), std::end(kCalls));
        for (PublicCall& call : all) {
            call.sim = SimFor(call.name);
        }
        return all;
    }();
    return calls;
}

const std::vector<CommandCall>& CommandCalls() {
    static const std::vector<CommandCall> calls = [] {
        std::vector<CommandCall> all;
        for (CommandCall call : kCommands) {
            call.sim = SimFor(call.name);
            all.push_back(call);
            if (call.IsOfModems() && call.name != "modem profile reset") {
                call.needs =
                    call.needs == Needs::kDialled ? Needs::kServedConnection : Needs::kService;
                all.push_back(call);
            }
        }
        return all;
    }();
    return calls;
}

std::vector<std::string> CommandCall::Argv() const {
    std::vector<std::string> argv = Split(name, ' ');
    argv.insert(argv.end(), arguments.begin(), arguments.end());
    argv.insert(argv.begin(),
                BuiltProgram(IsOfModems() ? "taviwireless" : "taviwireless_with_wifi"));
    if (needs == Needs::kPlugged || needs == Needs::kDialled) {
        argv.insert(argv.begin() + 2, "--direct");
    }
    if (name == "modem watch" || name == "wifi watch") {
        argv.insert(argv.begin(), {"timeout", "--preserve-status", "--signal=INT", "2"});
    }
    return WithShortWaits(argv);
}

}  // namespace taviwireless::test
