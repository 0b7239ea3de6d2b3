#include "vidshow/presenter.h"

extern "C" const char* getVersion() {
    return "Video presenter for Android, Vidshow Version:" VIDSHOW_VERSION;
}
