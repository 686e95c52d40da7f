// SPDX-License-Identifier: MIT
// taviwireless modem unlock, pin and puk: what the SIM in a modem asks for.
#include <algorithm>

#include "cli/deadline.h"
#include "cli/modem/modem_access.h"
#include "cli/modem/modem_commands.h"
#include "cli/modem/modem_report.h"
#include "cli/terminal.h"

namespace taviwireless::cli {

namespace {

constexpr size_t kPINMin = 4;
constexpr size_t kPINMax = 8;
constexpr size_t kPUKLength = 8;

// A code of another form is never sent: it would cost an attempt, or do worse in the command line
// that it becomes a part of.
void CheckForm(const std::string& code, const char* name, size_t min, size_t max) {
    const bool isNumber =
        std::all_of(code.begin(), code.end(), [](char c) { return c >= '0' && c <= '9'; });
    if (!isNumber || code.size() < min || code.size() > max) {
        const std::string length =
            min == max ? std::to_string(max) : std::to_string(min) + " to " + std::to_string(max);
        throw CommandError(kUsage, std::string("a ") + name + " has " + length +
                                       " digits; nothing was sent to the modem");
    }
}

std::string ReadPIN(const char* prompt) {
    const std::string pin = ReadSecret(prompt);
    CheckForm(pin, "PIN", kPINMin, kPINMax);
    return pin;
}

std::string ReadNewPIN() {
    const std::string pin = ReadNewSecret("New PIN");
    CheckForm(pin, "PIN", kPINMin, kPINMax);
    return pin;
}

std::string AttemptsLeft(int count) {
    return count == 1 ? "1 attempt is left" : std::to_string(count) + " attempts are left";
}

// One of the commands here, on one modem.
class PINCommand {
  public:
    explicit PINCommand(const Options& options)
        : options_(options), access_(MakeAccess(options)), deadline_(options) {}

    void Unlock() {
        const ModemState state = Look();
        if (state.simStatus == kReady) {
            return Report(state, "the SIM is ready already; no PIN was needed");
        }
        Require(state, kWantsPIN);
        ConfirmLastAttempt("PIN", state.pinRemains);
        const std::string pin = ReadPIN("PIN");
        Try("PIN", [&] { return access_->EnterPIN(options_.id, pin); });
        ReportReady();
    }

    void UsePUK() {
        const ModemState state = Look();
        Require(state, kWantsPUK);
        ConfirmLastAttempt("PUK", state.pukRemains);
        const std::string puk = ReadSecret("PUK");
        CheckForm(puk, "PUK", kPUKLength, kPUKLength);
        const std::string pin = ReadNewPIN();
        Try("PUK", [&] { return access_->EnterPUK(options_.id, puk, pin); });
        ReportReady();
    }

    void ChangePIN() {
        const ModemState state = Look();
        Require(state, kReady);
        if (!state.pinProtected) {
            throw CommandError(kFailure,
                               "a SIM changes its PIN only while it is protected by it; "
                               "taviwireless modem pin protect " +
                                   options_.id + " switches that on");
        }
        ConfirmLastAttempt("PIN", state.pinRemains);
        const std::string oldPIN = ReadPIN("PIN");
        const std::string newPIN = ReadNewPIN();
        Try("PIN", [&] { return access_->SetPIN(options_.id, oldPIN, newPIN, true); });
        Report(Look(), "the PIN is changed");
    }

    void Protect(bool on) {
        const std::string done = on ? "protected by its PIN" : "not protected by its PIN";
        const ModemState state = Look();
        Require(state, kReady);
        if (state.pinProtected == on) {
            return Report(state, "the SIM is " + done + " already");
        }
        ConfirmLastAttempt("PIN", state.pinRemains);
        const std::string pin = ReadPIN("PIN");
        Try("PIN", [&] { return access_->SetPIN(options_.id, pin, "", on); });
        const ModemState after = Look();
        if (after.pinProtected != on) {
            throw CommandError(kFailure, "the protection of the SIM of " + options_.id +
                                             " is as before; --verbose shows why");
        }
        Report(after, "the SIM is " + done + " from now on");
    }

  private:
    // Refuses a modem that is dialling: the library would do nothing and report success.
    ModemState Look() {
        const ModemState state = deadline_.Limit([this] { return access_->Look(options_.id); });
        if (state.netStatus == kConnecting) {
            throw CommandError(kBusy, options_.id + " is connecting; try again when that is over");
        }
        return state;
    }

    void Require(const ModemState& state, const std::string& simStatus) const {
        if (state.simStatus == simStatus) {
            return;
        }
        const std::string sim = "the SIM of " + options_.id;
        if (state.simStatus == kWantsPIN) {
            throw CommandError(kFailure, sim + " wants its PIN; taviwireless modem unlock " +
                                             options_.id + " enters it");
        }
        if (state.simStatus == kWantsPUK) {
            throw CommandError(kFailure, sim + " wants its PUK; taviwireless modem puk " +
                                             options_.id + " enters it");
        }
        throw CommandError(kFailure, state.simStatus == kReady
                                         ? sim + " does not want its PUK"
                                         : "there is no usable SIM in " + options_.id);
    }

    void ConfirmLastAttempt(const std::string& code, int remains) const {
        if (remains != 1 || options_.force) {
            return;
        }
        const std::string last = "the SIM of " + options_.id + " allows one more " + code;
        const std::string loss = code == "PIN" ? "it wants its PUK" : "it is blocked for ever";
        if (!Confirm(last + "; after a wrong one " + loss + ". Go on?",
                     last + ", and after a wrong one " + loss + "; add --force to use it")) {
            throw CommandError(kFailure, "nothing was sent to the modem");
        }
    }

    template <typename Operation>
    void Try(const std::string& code, const Operation& operation) {
        ShowProgress("Telling " + options_.id + " ...");
        const int result = deadline_.Limit(operation);
        if (result == ModemAccess::kDone) {
            return;
        }
        if (result != ModemAccess::kRefused) {
            throw CommandError(kFailure, "could not send the " + code + " to " + options_.id +
                                             "; --verbose shows why");
        }
        const ModemState state = Look();
        const int remains = code == "PIN" ? state.pinRemains : state.pukRemains;
        std::string sentence = options_.id + " refused the " + code;
        if (remains >= 0) {
            sentence += "; " + AttemptsLeft(remains);
        }
        if (code == "PIN" && state.simStatus == kWantsPUK) {
            sentence += ", and the SIM wants its PUK: taviwireless modem puk " + options_.id;
        }
        throw CommandError(kFailure, sentence);
    }

    void ReportReady() {
        const ModemState state = Look();
        if (state.simStatus != kReady) {
            throw CommandError(kFailure, "the SIM of " + options_.id +
                                             " took the code but is not ready yet; taviwireless "
                                             "modem show " +
                                             options_.id + " tells its state");
        }
        Report(state, "the SIM is ready");
    }

    void Report(const ModemState& state, const std::string& sentence) const {
        PrintOutcome(options_, state.id + ": " + sentence, [&] { return Describe(state); });
    }

    const Options& options_;
    const std::unique_ptr<ModemAccess> access_;
    Deadline deadline_;
};

}  // namespace

void UnlockSIM(const Options& options) {
    PINCommand(options).Unlock();
}

void ChangePIN(const Options& options) {
    PINCommand(options).ChangePIN();
}

void ProtectSIM(const Options& options) {
    PINCommand(options).Protect(true);
}

void UnprotectSIM(const Options& options) {
    PINCommand(options).Protect(false);
}

void UsePUK(const Options& options) {
    PINCommand(options).UsePUK();
}

}  // namespace taviwireless::cli
