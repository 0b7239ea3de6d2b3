#include "common/ffmpeg.h"

namespace vidshow::tools {

std::string avErrorText(int error) {
    char text[AV_ERROR_MAX_STRING_SIZE] = {};
    av_strerror(error, text, sizeof text);
    return text;
}

}  // namespace vidshow::tools
