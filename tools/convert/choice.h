#pragma once

#include <string>

#include "vidshow/imageproc.h"

namespace vidshow::tools {

extern const char* const kRotationNames[6];
extern const char* const kCaseNames[8];

/// Which kernel the pipeline runs for a processor, by the pipeline's own tables.
struct Choice {
    std::string kernel;  ///< its exported name where it has one
    std::string why;     ///< the settings that led to it
};

Choice choiceFor(const QZ_IMAGEPROC_PARAMSET& processor);

}  // namespace vidshow::tools
