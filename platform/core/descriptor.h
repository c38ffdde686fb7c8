// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Owner of a file descriptor.
#ifndef TAVOCORE_DESCRIPTOR_H_
#define TAVOCORE_DESCRIPTOR_H_

#include <unistd.h>

#include <utility>

namespace mediidx::platform {

class Descriptor {
 public:
  Descriptor() = default;
  explicit Descriptor(int number) : number_(number) {}
  Descriptor(Descriptor&& other) noexcept : number_(other.release()) {}
  Descriptor& operator=(Descriptor&& other) noexcept {
    std::swap(number_, other.number_);
    return *this;
  }
  ~Descriptor() {
    if (number_ >= 0) close(number_);
  }

  explicit operator bool() const { return number_ >= 0; }
  int get() const { return number_; }
  int release() { return std::exchange(number_, -1); }

 private:
  int number_ = -1;
};

}  // namespace mediidx::platform

#endif
