#ifndef TAVIWIRELESS_SIM_DESCRIPTOR_H
#define TAVIWIRELESS_SIM_DESCRIPTOR_H

#include <unistd.h>

#include <utility>

namespace taviwireless::sim {

// Owns a file descriptor; a negative one stands for none.
class Descriptor {
  public:
    Descriptor() = default;
    explicit Descriptor(int number) : number_(number) {}
    Descriptor(Descriptor&& other) noexcept : number_(std::exchange(other.number_, -1)) {}
    Descriptor& operator=(Descriptor&& other) noexcept {
        std::swap(number_, other.number_);
        return *this;
    }
    ~Descriptor() {
        if (number_ >= 0) {
            close(number_);
        }
    }

    int Get() const { return number_; }

  private:
    int number_ = -1;
};

}  // namespace taviwireless::sim

#endif
