// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_SIM_PORT_H
#define TAVIWIRELESS_SIM_PORT_H

#include <chrono>
#include <deque>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "sim/call.h"
#include "sim/faults.h"
#include "sim/modem.h"
#include "sim/serial_line.h"
#include "sim/transcript.h"

namespace taviwireless::sim {

using Clock = std::chrono::steady_clock;

// One serial port of a modem: turns bytes into command lines and replies into bytes, with echo,
// framing, faults and timing. It stays when its line is unplugged and comes back with a new one.
class Port {
  public:
    // `name` is how the transcript calls it, such as "0.2". The command `onDial`, if not empty, has
    // the line during a connection, and its end ends the connection.
    Port(Modem& modem, PortRole role, std::string name, std::string onDial, Transcript& transcript)
        : modem_(modem),
          role_(role),
          name_(std::move(name)),
          onDial_(std::move(onDial)),
          transcript_(transcript) {}

    void Plug(std::unique_ptr<SerialLine> line);
    void Unplug();
    SerialLine* Line() const { return line_.get(); }
    PortRole Role() const { return role_; }
    // What becomes readable when there is work to do.
    int Awaited() const { return call_ ? call_->Get() : line_->Get(); }

    enum class Outcome { kServed, kHungUp, kVanishes };

    // Takes what has arrived and sends what is due. Tells when a given tty was hung up, or when a
    // fault makes the modem vanish now.
    Outcome Work(Clock::time_point now);

    // When Work is to be called again even if nothing arrives; nothing: not before.
    std::optional<Clock::time_point> NextDue() const;
    // True when something is due that the line did not take.
    bool IsBlocked() const { return blocked_; }

    // Sends text that nobody asked for.
    void Send(const std::string& text, Clock::time_point now);

    // The command lines received since the last call.
    std::vector<std::string> TakeReceived() { return std::exchange(received_, {}); }

    Faults faults;

  private:
    struct Chunk {
        Clock::time_point due;
        std::string bytes;
    };

    void Receive(const std::string& bytes, Clock::time_point now);
    void ReceiveLine(Clock::time_point now);
    void EndCall(Clock::time_point now);
    void StartCall();
    void LeaveData(Clock::time_point now);
    void Echo(char c, Clock::time_point now);
    void Respond(const Reply& reply, Clock::time_point now);
    std::string Render(const Reply& reply) const;
    void Queue(const std::string& bytes, Clock::time_point due);
    void SendDue(Clock::time_point now);
    void Babble(Clock::time_point now);
    void Forget();

    Modem& modem_;
    PortRole role_;
    std::string name_;
    std::string onDial_;
    Transcript& transcript_;
    std::unique_ptr<SerialLine> line_;
    std::unique_ptr<Call> call_;  // ends before the line
    bool inData_ = false;
    bool blocked_ = false;
    std::string typed_;
    std::deque<Chunk> output_;
    std::optional<Clock::time_point> vanishAt_;
    std::optional<Clock::time_point> settledAt_;
    Clock::time_point nextBabble_;
    std::vector<std::string> received_;
};

}  // namespace taviwireless::sim

#endif
