#pragma once

#include <gst/video/gstvideosink.h>

G_BEGIN_DECLS

/// vidshowsink: hands I420 and NV12 frames to a presenter on a window of the host.
///
/// Properties: `display` (show the window on the desktop where there is one, true at first),
/// `deinterlace` (a mode of the presenter), `frames-shown` (read only). Signal
/// `window-frame`: a frame has arrived at the window, in the streaming thread; width and height in
/// pixels and stride in bytes (guint), the bytes of its YV12 buffer (gpointer), their number
/// (guint64). A second element of a process that is started is refused.
G_DECLARE_FINAL_TYPE(VidshowSink, vidshow_sink, VIDSHOW, SINK, GstVideoSink)

G_END_DECLS
