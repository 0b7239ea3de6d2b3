#include "common/sink.h"

#include <thread>

namespace vidshow::tools {

Command Sink::wait(std::chrono::nanoseconds time) {
    if (time.count() > 0) std::this_thread::sleep_for(time);
    return Command::none;
}

}  // namespace vidshow::tools
