// SPDX-License-Identifier: MIT
// What USBModem::ModemCmd costs above the waits that the serial line demands: 100 ms of silence
// before the command and 200 ms after the reply; added_ms is the median. Each modem is a child
// process that answers each command at once over a pseudo-terminal. Of ten modems each is asked by
// a process of its own all the time.
#include <benchmark/benchmark.h>
#include <fcntl.h>
#include <signal.h>
#include <stdlib.h>
#include <sys/prctl.h>
#include <taviwireless/usbmodem.h>
#include <unistd.h>

#include <algorithm>
#include <chrono>
#include <stdexcept>
#include <string>
#include <vector>

#include "platform/appliance_root/appliance_root.h"

namespace {

using Clock = std::chrono::steady_clock;
using taviwireless::usbmodem_lib::USBModem;

constexpr double kDemandedWaits = 0.300;  // seconds

// Answers every line that is a command; never returns.
[[noreturn]] void AnswerAtOnce(int line) {
    std::string command;
    for (char c; read(line, &c, 1) == 1;) {
        if (c != '\r') {
            command += c;
            continue;
        }
        if (!command.empty()) {
            const std::string reply = command + "\r\r\n+CSQ: 17,99\r\n\r\nOK\r\n";
            (void)!write(line, reply.data(), reply.size());
        }
        command.clear();
    }
    _exit(0);
}

// A pseudo-terminal with a modem behind it that lives as long as this object.
class AnsweringModem {
  public:
    AnsweringModem() : line_(posix_openpt(O_RDWR | O_NOCTTY | O_CLOEXEC)) {
        if (line_ < 0 || grantpt(line_) != 0 || unlockpt(line_) != 0) {
            throw std::runtime_error("cannot open a pseudo-terminal");
        }
        node_ = ptsname(line_);
        child_ = fork();
        if (child_ == 0) {
            prctl(PR_SET_PDEATHSIG, SIGKILL);
            AnswerAtOnce(line_);
        }
    }
    ~AnsweringModem() {
        kill(child_, SIGKILL);
        close(line_);
    }
    AnsweringModem(const AnsweringModem&) = delete;
    AnsweringModem& operator=(const AnsweringModem&) = delete;

    const std::string& Node() const { return node_; }

  private:
    int line_;
    std::string node_;
    pid_t child_ = -1;
};

// Modems that answer, each asked by a process of its own for as long as this object lives.
class TalkingModems {
  public:
    explicit TalkingModems(unsigned int count) : modems_(count) {
        for (const AnsweringModem& modem : modems_) {
            askers_.push_back(fork());
            if (askers_.back() == 0) {
                prctl(PR_SET_PDEATHSIG, SIGKILL);
                AskForEver(static_cast<unsigned int>(askers_.size()) + 1, modem.Node());
            }
        }
    }
    ~TalkingModems() {
        for (const pid_t asker : askers_) {
            kill(asker, SIGKILL);
        }
    }
    TalkingModems(const TalkingModems&) = delete;
    TalkingModems& operator=(const TalkingModems&) = delete;

  private:
    [[noreturn]] static void AskForEver(unsigned int id, const std::string& node) {
        USBModem modem(id, "/tmp/usbmodem.info" + std::to_string(id));
        modem.OpenFileDevice(node);
        for (std::string reply; modem.ModemCmd("AT+CSQ", reply) == 0;) {
        }
        _exit(1);
    }

    std::vector<AnsweringModem> modems_;
    std::vector<pid_t> askers_;
};

// The argument is the number of modems that talk.
void ModemCmd(benchmark::State& state) {
    AnsweringModem answering;
    const TalkingModems others(static_cast<unsigned int>(state.range(0)) - 1);
    USBModem modem(1, "/tmp/usbmodem.info1");
    if (modem.OpenFileDevice(answering.Node()) != 0) {
        state.SkipWithError("cannot open the line");
        return;
    }
    std::string reply;
    std::vector<double> added;
    for (auto _ : state) {
        const auto begin = Clock::now();
        if (modem.ModemCmd("AT+CSQ", reply) != 0 || reply != "+CSQ: 17,99\nOK\n") {
            state.SkipWithError("wrong reply");
            return;
        }
        const std::chrono::duration<double> took = Clock::now() - begin;
        added.push_back((took.count() - kDemandedWaits) * 1000);
    }
    const auto median = added.begin() + static_cast<std::ptrdiff_t>(added.size() / 2);
    std::nth_element(added.begin(), median, added.end());
    state.counters["added_ms"] = *median;
}

BENCHMARK(ModemCmd)->Arg(1)->Arg(10)->Unit(benchmark::kMillisecond)->UseRealTime()->Iterations(20);

}  // namespace

int main(int argc, char** argv) {
    taviwireless::EnterApplianceRoot();
    benchmark::Initialize(&argc, argv);
    benchmark::RunSpecifiedBenchmarks();
}
