// The plug-in as GStreamer loads it.

#include <gst/gst.h>

#include "gstreamer/sink.h"

#define PACKAGE "vidshow"

namespace {

gboolean registerElements(GstPlugin* plugin) {
    return gst_element_register(plugin, "vidshowsink", GST_RANK_NONE, vidshow_sink_get_type());
}

}  // namespace

GST_PLUGIN_DEFINE(GST_VERSION_MAJOR, GST_VERSION_MINOR, vidshow,
                  "Frames on a window by vidshow's presenter", registerElements,
                  VIDSHOW_GSTREAMER_VERSION, GST_LICENSE_UNKNOWN, "vidshow",
                  "https://vidshow.invalid/")
