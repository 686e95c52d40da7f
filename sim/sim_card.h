// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_SIM_SIM_CARD_H
#define TAVIWIRELESS_SIM_SIM_CARD_H

#include <string>

namespace taviwireless::sim {

// What a command asks of the card before it is carried out.
enum class SimNeed { kNothing, kCard, kUnlocked };

// The SIM card: its PIN and PUK, the attempts left, and whether it is there at all. Operations
// return the name of the error (a key of a personality's "errors"), or an empty text when done.
class SimCard {
  public:
    // Changes one property by name, as a person sets up a situation: pin, puk, pin_attempts,
    // puk_attempts, lock (on, off), sim (ready, absent, busy, failure). Returns false when there is
    // no such property; throws std::invalid_argument when the value cannot be taken.
    bool Set(const std::string& name, const std::string& value);

    // The modem lost power: a protected card asks for its PIN again.
    void PowerCycle() { verified_ = false; }

    std::string Missing(SimNeed need) const;

    // "READY", "SIM PIN" or "SIM PUK".
    std::string StateText() const;
    bool IsProtected() const { return protected_; }
    int PinAttempts() const { return pinAttempts_; }
    int PukAttempts() const { return pukAttempts_; }

    std::string EnterPin(const std::string& pin);
    std::string EnterPuk(const std::string& puk, const std::string& newPin);
    std::string ChangePin(const std::string& oldPin, const std::string& newPin);
    std::string SetProtection(bool on, const std::string& pin);

  private:
    bool NeedsPuk() const { return pinAttempts_ == 0; }
    bool NeedsPin() const { return protected_ && !verified_; }
    std::string CheckPin(const std::string& pin);

    static constexpr int kPinAttempts = 3;
    static constexpr int kPukAttempts = 10;

    std::string presence_ = "ready";
    std::string pin_ = "0000";
    std::string puk_ = "12345678";
    int pinAttempts_ = kPinAttempts;
    int pukAttempts_ = kPukAttempts;
    bool protected_ = false;
    bool verified_ = false;
};

}  // namespace taviwireless::sim

#endif
