// SPDX-License-Identifier: MIT
// Lists the modems that are ready for use. Given one, unlocks its SIM, with the PIN from standard
// input, and dials:
//   modem_dial [DEVICE]    # such as usbmodem0; usbmodemd runs on the session bus
//
//   g++ -std=c++17 modem_dial.cpp -o modem_dial $(pkg-config --cflags --libs taviwireless)
#include <json/json.h>
#include <taviwireless/usbmodem_ui.h>
#include <unistd.h>

#include <algorithm>
#include <iostream>
#include <sstream>
#include <stdexcept>
#include <string>
#include <vector>

namespace ui = taviwireless::usbmodem_ui;

// What the service says of a modem, which it asks.
static Json::Value Look(const std::string& device) {
    std::istringstream document(ui::GetUSBModem(device));
    Json::Value modem;
    std::string errors;
    if (!Json::parseFromStream(Json::CharReaderBuilder(), document, &modem, &errors)) {
        throw std::runtime_error("cannot ask " + device);
    }
    return modem;
}

static std::vector<std::string> Devices() {
    std::vector<std::string> devices;
    if (const int result = ui::GetUSBModemList(devices); result != 1) {
        throw std::runtime_error(result == 0 ? "there is no modem service on the session bus"
                                             : "cannot ask the modem service");
    }
    return devices;
}

static void List() {
    for (const std::string& device : Devices()) {
        const Json::Value modem = Look(device);
        std::cout << device << ": " << modem["vendor"].asString() << ' '
                  << modem["product"].asString() << ", SIM " << modem["sim_status"].asString()
                  << ", " << modem["net_status"].asString() << '\n';
    }
}

// A modem that was just plugged in takes some seconds.
static void WaitFor(const std::string& device) {
    for (int i = 0; i < 30; ++i) {
        const std::vector<std::string> devices = Devices();
        if (std::find(devices.begin(), devices.end(), device) != devices.end()) {
            return;
        }
        sleep(1);
    }
    throw std::runtime_error("there is no modem " + device + " that answers");
}

static void Unlock(const std::string& device) {
    if (Look(device)["sim_status"] == "pin_protect") {
        std::string pin;
        std::cerr << "PIN: ";
        std::getline(std::cin, pin);
        if (const int result = ui::UnlockSIM(device, pin); result != 1) {
            throw std::runtime_error(result == -2
                                         ? "the SIM refused the PIN, which costs an attempt"
                                         : "the PIN could not be entered");
        }
    }
    if (const std::string sim = Look(device)["sim_status"].asString(); sim != "ready") {
        throw std::runtime_error("the SIM is not ready: " + sim);
    }
}

static void Dial(const std::string& device) {
    if (Look(device)["net_status"] != "connected" && ui::Connect(device) != 1) {
        throw std::runtime_error("cannot ask the modem service");
    }
    Json::Value modem;
    do {  // the service answers when the dialler was started, or could not be
        sleep(1);
        modem = Look(device);
    } while (modem["net_status"] == "connecting");
    if (modem["net_status"] != "connected") {
        throw std::runtime_error("no connection; the system log tells why");
    }
    std::cout << device << ": connected, " << Look(device)["ip"].asString() << '\n';
}

int main(int count, char** arguments) try {
    if (count < 2) {
        List();
        return 0;
    }
    WaitFor(arguments[1]);
    Unlock(arguments[1]);
    Dial(arguments[1]);
    return 0;
} catch (const std::exception& error) {
    std::cerr << "modem_dial: " << error.what() << '\n';
    return 1;
}
