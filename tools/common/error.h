#pragma once

#include <stdexcept>
#include <string>

namespace vidshow::tools {

/// Something that ends the program, told in one line.
class Error : public std::runtime_error {
  public:
    using std::runtime_error::runtime_error;
};

/// What the program exits with.
enum ExitStatus : int {
    kExitDone = 0,
    kExitFailed = 1,   ///< the clip cannot be used, or the output not written, or frames failed
    kExitUsage = 2,    ///< the command line is wrong
    kExitDamaged = 3,  ///< the clip is cut off or damaged; what there is was used
};

}  // namespace vidshow::tools
