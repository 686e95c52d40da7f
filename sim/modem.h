// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_SIM_MODEM_H
#define TAVIWIRELESS_SIM_MODEM_H

#include <string>
#include <vector>

#include "sim/personality.h"
#include "sim/sim_card.h"

namespace taviwireless::sim {

struct Reply {
    std::vector<std::string> lines;
    std::string result = "OK";
    bool isRaw = false;  // lines holds one text to be sent as it stands, and there is no result
    bool startsData = false;
};

// One modem as its AT commands show it: personality, settings and SIM card. All its ports share it.
class Modem {
  public:
    explicit Modem(Personality personality)
        : personality_(std::move(personality)), initial_(personality_.variables) {}

    // Carries a command line out. One that does not begin with AT gets no result and no lines.
    Reply Answer(const std::string& line);

    // Changes a setting: a property of the SIM card or a variable of the personality. Throws
    // std::invalid_argument with a sentence when that cannot be.
    void Set(const std::string& name, const std::string& value);

    // Answers commands that match the pattern with this text instead of carrying them out.
    void OverrideReply(const std::string& pattern, const std::string& text, bool once);
    void RemoveOverride(const std::string& pattern);

    void PowerCycle();

    std::string Value(const std::string& name) const;
    const Personality& Kind() const { return personality_; }

  private:
    struct Override {
        std::string pattern;
        std::string text;
        bool once;
    };

    bool TakeOverride(const std::string& line, Reply* reply);
    std::string Execute(const std::string& command, Reply* reply);
    std::string ApplyEffect(Effect effect, const std::vector<std::string>& arguments, Reply* reply);
    std::string Fill(const std::string& line) const;
    std::string Render(const std::string& error) const;

    Personality personality_;
    std::map<std::string, std::string> initial_;  // what a reset goes back to
    SimCard sim_;
    std::vector<Override> overrides_;
};

}  // namespace taviwireless::sim

#endif
