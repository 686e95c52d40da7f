// SPDX-License-Identifier: MIT
// What reaches the log and the terminal: text of others is printable there and as it was otherwise,
// and no PIN or PUK is in it, whatever stands around the command that carries it.
#include <glib.h>
#include <taviwireless/usbmodem_atif.h>

#include <algorithm>

#include "cli/terminal.h"
#include "common/log.h"
#include "tests/fuzz/fuzz.h"
#include "tests/support/log_capture.h"
#include "usbmodem/loggable.h"

namespace taviwireless::fuzz {
namespace {

using namespace usbmodem_lib;

constexpr char kPIN[] = "7351";
constexpr char kPUK[] = "84629573";

// With a "?" for each byte that is no part of a printable character.
std::string PrintableForm(const std::string& text) {
    std::string form;
    for (size_t at = 0, length = 0; at < text.size(); at += length) {
        const gunichar character =
            g_utf8_get_char_validated(&text[at], static_cast<gssize>(text.size() - at));
        const bool isOne = character < 0x110000 && g_unichar_type(character) != G_UNICODE_CONTROL;
        length = isOne ? static_cast<size_t>(g_unichar_to_utf8(character, nullptr)) : 1;
        const bool isEnd = text[at] == '\n' && at + 1 == text.size();
        form += isOne || isEnd ? text.substr(at, length) : "?";
    }
    return form;
}

std::string WithoutMarks(std::string text) {
    text.erase(std::remove(text.begin(), text.end(), '?'), text.end());
    return text;
}

void CheckPrinting(const std::string& text) {
    const test::LogCapture log;
    TAVI_LOG_ERROR("%s", text.c_str());
    const std::string place = "log_line_fuzz.cpp:" + std::to_string(__LINE__ - 1) + " ";
    const std::string form = PrintableForm(text.substr(0, 2047));
    Demand(log.Text() == place + form + "\n", "a line is the text in print", text);
    std::string again = form;
    MakePrintable(again.data());
    Demand(again == form, "what is printable stays", form);
    const std::string shown = cli::Printable(text);  // one "?" for a whole character
    Demand(cli::Printable(shown) == shown, "what is shown is printable", shown);
    Demand(g_utf8_validate(text.c_str(), -1, nullptr) == FALSE ||
               WithoutMarks(shown + '\n') == WithoutMarks(PrintableForm(text + "\n\n")),
           "no terminal is steered", shown);
}

void CheckCodes(const std::string& before, const std::string& command, const std::string& after) {
    for (const std::string& logged :
         {LoggableCommand(before + command + after), LoggableReply(before + command + after),
          LoggableReply(before + kPIN + after + kPUK, {kPUK, kPIN})}) {
        Demand(logged.find(kPIN) == logged.npos && logged.find(kPUK) == logged.npos,
               "codes are masked", logged);
    }
    for (const char* code : {kPIN, kPUK}) {
        const std::string logged = LoggableReplyTo(command, before + code + after);
        Demand(command.find(code) == command.npos || logged.find(code) == logged.npos,
               "the codes of the command are masked", logged);
    }
    const std::string line = before.substr(0, before.find_first_of("\r\n"));
    const std::string damaged = LoggableReply("A" + line, {kPIN});
    Demand(damaged.find_first_of("0123456789") == damaged.npos, "no digit is left", damaged);
    const std::string harmless = line.substr(0, line.find('='));
    Demand(LoggableCommand(harmless) == harmless, "other commands stay readable", harmless);
}

}  // namespace

void Fuzz(Input input) {
    USBModem_ATIF_DLink quoting;
    USBModem_ATIF plain;
    USBModem_ATIF& set = input.Flag() ? quoting : plain;
    const std::string commands[] = {
        set.GetATCommandSetSIMPIN(kPIN), set.GetATCommandSetSIMPUK(kPUK, kPIN),
        set.GetATCommandChangePINCode(kPIN, kPUK), set.GetATCommandChangePINEnable("1", kPIN)};
    std::string command = commands[input.Choice(std::size(commands))];
    if (input.Flag()) {
        std::transform(command.begin(), command.end(), command.begin(), g_ascii_tolower);
    }
    const std::string before = input.Text();
    const std::string after = input.Text();
    CheckPrinting(before);
    if ((before + after).find(kPIN) == before.npos && (before + after).find(kPUK) == before.npos) {
        CheckCodes(before, command, after);
    }
}

}  // namespace taviwireless::fuzz
