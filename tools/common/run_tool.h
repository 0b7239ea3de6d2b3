#pragma once

#include <cstdio>
#include <exception>
#include <optional>

#include "common/error.h"

extern "C" {
#include <libavutil/log.h>
}

namespace vidshow::tools {

/// What every tool's `main` does: reads the command line, does the work, tells in one line why it
/// could not.
/// @param read the command line to `options`; a status when there is nothing to be done
/// @param work with the options @return what the program exits with
template <typename Options, typename Read, typename Work>
int runTool(const char* name, const Read& read, const Work& work) {
    av_log_set_level(AV_LOG_QUIET);  // what matters comes back as an error
    try {
        Options options;
        if (const std::optional<int> status = read(&options)) return *status;
        return work(options);
    } catch (const std::exception& error) {
        std::fprintf(stderr, "%s: %s\n", name, error.what());
        return kExitFailed;
    }
}

}  // namespace vidshow::tools
