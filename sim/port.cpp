// SPDX-License-Identifier: MIT
#include "sim/port.h"

#include <algorithm>

#include "sim/at_text.h"

namespace taviwireless::sim {
namespace {

constexpr size_t kLongestLine = 4096;    // bytes; a longer line is no command
constexpr Milliseconds kBabblePause{5};  // keeps a babbling modem from taking a whole processor
constexpr char kBabble[] = "\r\n^DSFLOWRPT:00000000,00000000,00000000,00000000,00000000\r\n";
constexpr char kGarbage[] = "\xff\xfe\x80\x01\x1b\xc3\x28\x7f";
constexpr char kFiller[] = "^FILL: 0123456789abcdefghijklmnopqrstuvwxyz0123456789";
// What a client sent before it closed the line may arrive so much later, without waking anybody.
constexpr Milliseconds kSettling{10};
// Bytes still unread are lost when a line is hung up, so the client gets this long to take them:
// less than the 200 ms of silence after which it takes a reply for whole.
constexpr Milliseconds kVanishPause{120};

}  // namespace

void Port::Plug(std::unique_ptr<SerialLine> line) {
    Forget();
    line_ = std::move(line);
}

void Port::Unplug() {
    Forget();
    line_.reset();
    settledAt_.reset();
}

void Port::Forget() {
    call_.reset();
    inData_ = blocked_ = false;
    typed_.clear();
    output_.clear();
    vanishAt_.reset();
}

Port::Outcome Port::Work(Clock::time_point now) {
    if (call_) {
        if (!call_->HasEnded()) {
            return Outcome::kServed;  // the line is the far end's
        }
        EndCall(now);
    }
    const SerialLine::Input input = line_->Read();
    if (input.hasNewClient) {
        Forget();
    }
    SendDue(now);  // what the line takes again by now makes room for replies
    if (!input.bytes.empty()) {
        transcript_.Note(name_, '<', input.bytes);
        Receive(input.bytes, now);
    }
    if (input.isReleased && !vanishAt_) {
        Forget();
    }
    if (input.mayBeLate) {
        settledAt_ = now + kSettling;
    } else if (settledAt_ && now >= *settledAt_) {
        settledAt_.reset();
    }
    Babble(now);
    SendDue(now);
    StartCall();
    if (vanishAt_ && now >= *vanishAt_) {
        faults.vanishAfter.reset();
        return Outcome::kVanishes;
    }
    return input.isHungUp ? Outcome::kHungUp : Outcome::kServed;
}

void Port::Receive(const std::string& bytes, Clock::time_point now) {
    if (inData_) {
        // A frame of the connection ends in another byte, so no pause around it is asked for.
        if (bytes.size() >= 3 && bytes.compare(bytes.size() - 3, 3, "+++") == 0) {
            LeaveData(now);
        }
        return;
    }
    for (const char c : bytes) {
        if (inData_) {
            return;  // already the connection's
        }
        if (c == '\r') {
            ReceiveLine(now);
        } else if (c != '\n') {
            Echo(c, now);
            typed_ += c;
        }
    }
    if (typed_.size() > kLongestLine) {
        typed_.clear();
    }
}

void Port::ReceiveLine(Clock::time_point now) {
    const std::string line = std::exchange(typed_, {});
    if (line.empty()) {
        return;
    }
    Echo('\r', now);
    received_.push_back(line);
    if (role_ == PortRole::kMute || faults.silent) {
        return;
    }
    const bool fails = !faults.failing.empty() && MatchesPattern(faults.failing, Normalise(line));
    Respond(fails ? Reply{{}, "ERROR"} : modem_.Answer(line), now);
}

void Port::StartCall() {
    if (inData_ && output_.empty() && !onDial_.empty()) {
        call_ = std::make_unique<Call>(onDial_, line_->Get());
    }
}

// The far end has hung up, and so does the modem.
void Port::EndCall(Clock::time_point now) {
    call_.reset();
    line_->Restart();
    inData_ = false;
    Respond(Reply{{}, "NO CARRIER"}, now);
}

void Port::LeaveData(Clock::time_point now) {
    inData_ = false;
    Respond(Reply{}, now);
}

void Port::Echo(char c, Clock::time_point now) {
    const bool echoes = role_ != PortRole::kMute && !faults.silent && !faults.noEcho;
    if (echoes && modem_.Value("echo") == "1") {
        Queue(std::string(1, c), now);
    }
}

void Port::Respond(const Reply& reply, Clock::time_point now) {
    std::string bytes = Render(reply);
    if (faults.vanishAfter) {
        bytes.resize(std::min(bytes.size(), *faults.vanishAfter));
    }
    Clock::time_point due = now + faults.slow;
    const size_t size = faults.pieceSize > 0 ? faults.pieceSize : std::max<size_t>(bytes.size(), 1);
    for (size_t begin = 0; begin < bytes.size(); begin += size, due += faults.pieceGap) {
        Queue(bytes.substr(begin, size), due);
    }
    if (faults.vanishAfter) {
        vanishAt_ = due + kVanishPause;
    }
    inData_ = reply.startsData;
}

std::string Port::Render(const Reply& reply) const {
    std::string bytes = faults.garbage ? kGarbage : "";
    const std::string unsolicited =
        faults.unsolicited.empty() ? "" : "\r\n" + faults.unsolicited + "\r\n";
    bytes += unsolicited;
    if (reply.isRaw) {
        return bytes + reply.lines[0];
    }
    for (const auto& line : reply.lines) {
        bytes += (&line == &reply.lines[0] ? "\r\n" : "") + line + "\r\n";
    }
    const std::string result = reply.result.empty() ? "" : "\r\n" + reply.result + "\r\n";
    while (bytes.size() + result.size() < faults.longReply) {
        bytes += std::string("\r\n") + kFiller + "\r\n";
    }
    return bytes + unsolicited + result;
}

void Port::Send(const std::string& text, Clock::time_point now) {
    Queue(text, now);
    SendDue(now);
}

// Nothing overtakes what waits already. What comes while the client does not read is lost.
void Port::Queue(const std::string& bytes, Clock::time_point due) {
    if (blocked_) {
        return;
    }
    if (!output_.empty()) {
        due = std::max(due, output_.back().due);
        if (output_.back().due == due) {
            output_.back().bytes += bytes;
            return;
        }
    }
    output_.push_back({due, bytes});
}

void Port::SendDue(Clock::time_point now) {
    blocked_ = false;
    if (!line_->HasClient()) {
        output_.clear();
        return;
    }
    while (!output_.empty() && output_.front().due <= now) {
        std::string& bytes = output_.front().bytes;
        const size_t count = line_->Write(bytes);
        if (count > 0) {
            transcript_.Note(name_, '>', bytes.substr(0, count));
        }
        bytes.erase(0, count);
        if (!bytes.empty()) {
            blocked_ = true;
            return;
        }
        output_.pop_front();
    }
}

void Port::Babble(Clock::time_point now) {
    if (faults.babble && line_->HasClient() && !blocked_ && now >= nextBabble_) {
        Queue(kBabble, now);
        nextBabble_ = now + kBabblePause;
    }
}

std::optional<Clock::time_point> Port::NextDue() const {
    std::optional<Clock::time_point> next = vanishAt_;
    const auto consider = [&next](Clock::time_point due) {
        next = next ? std::min(*next, due) : due;
    };
    if (settledAt_) {
        consider(*settledAt_);
    }
    if (!output_.empty() && !blocked_) {
        consider(output_.front().due);
    }
    if (line_ && faults.babble && line_->HasClient() && !blocked_) {
        consider(nextBabble_);
    }
    return next;
}

}  // namespace taviwireless::sim
