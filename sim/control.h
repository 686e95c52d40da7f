// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_SIM_CONTROL_H
#define TAVIWIRELESS_SIM_CONTROL_H

#include <string>

#include "sim/simulator.h"

namespace taviwireless::sim {

// The commands that change the modems while they run.
class Control {
  public:
    explicit Control(Simulator& simulator) : simulator_(simulator) {}

    // Carries out one line. Returns what is to be printed: "ok", perhaps after other lines, or
    // "error: " and a sentence.
    std::string Execute(const std::string& line);

    // Makes the modem or port that `target` names (ID or ID.PORT) misbehave. Throws
    // std::invalid_argument with a sentence.
    void AddFault(const std::string& target, const std::string& fault);

    // True once "quit" was given.
    bool Quits() const { return quits_; }

    static std::string Help();

  private:
    struct Verb;
    struct Target;
    static const Verb kVerbs[];

    Target ParseTarget(const std::string& text);
    std::string Fault(std::string rest);
    std::string Set(std::string rest);
    std::string Reply(std::string rest);
    std::string ReplyOnce(std::string rest);
    std::string SetReply(std::string rest, bool once);
    std::string Received(std::string rest);
    std::string Send(std::string rest);
    std::string Plug(std::string rest);
    std::string Unplug(std::string rest);
    std::string ShowHelp(std::string rest);
    std::string Quit(std::string rest);

    Simulator& simulator_;
    bool quits_ = false;
};

}  // namespace taviwireless::sim

#endif
