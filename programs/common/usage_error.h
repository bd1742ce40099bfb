// A wish of the user that cannot be fulfilled as it was put: one line that names what is wrong and, where it
// helps, what would be right. Caught by the programs' main functions, which print it.
#pragma once

#include <stdexcept>

namespace velmora::hosts {

class UsageError : public std::runtime_error {
  public:
    using std::runtime_error::runtime_error;
};

}  // namespace velmora::hosts
