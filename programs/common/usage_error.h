// An error in what the user asked for: one line that says what is wrong and, where it helps, what would be
// right. The programs' main functions catch and print it.
#pragma once

#include <stdexcept>

namespace velmora::hosts {

class UsageError : public std::runtime_error {
  public:
    using std::runtime_error::runtime_error;
};

}  // namespace velmora::hosts
