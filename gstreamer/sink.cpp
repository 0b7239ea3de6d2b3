#include "gstreamer/sink.h"

#include <gst/video/video.h>

#include <memory>

#include "common/deinterlace.h"
#include "common/error.h"
#include "gstreamer/display.h"
#include "gstreamer/presentation.h"

using vidshow::gst::Display;
using vidshow::gst::Picture;
using vidshow::gst::Presentation;

GST_DEBUG_CATEGORY_STATIC(vidshow_sink_debug);
#define GST_CAT_DEFAULT vidshow_sink_debug

struct _VidshowSink {
    GstVideoSink parent;

    GstVideoInfo info;
    std::unique_ptr<Presentation> presentation;  // while started
    std::unique_ptr<Display> display;            // from the first frame on
    gboolean displayWanted;
    guint deinterlace;
    guint64 framesShown;
};

G_DEFINE_TYPE(VidshowSink, vidshow_sink, GST_TYPE_VIDEO_SINK)

namespace {

enum { kPropDisplay = 1, kPropDeinterlace, kPropFramesShown };

constexpr char kCaps[] = GST_VIDEO_CAPS_MAKE("{ I420, NV12 }");
guint g_windowFrame = 0;

// The names of the modes as GObject wants them.
GType deinterlaceType() {
    static GEnumValue values[vidshow::tools::kDeinterlaceNames.size() + 1] = {};
    static const GType type = [] {
        for (size_t i = 0; i < vidshow::tools::kDeinterlaceNames.size(); ++i) {
            const char* const name = vidshow::tools::kDeinterlaceNames[i];
            values[i] = {static_cast<gint>(i), name, name};
        }
        return g_enum_register_static("VidshowSinkDeinterlace", values);
    }();
    return type;
}

// Matrix and range as a stream's format code has them.
uint32_t colourCode(const GstVideoColorimetry& colours) {
    constexpr uint32_t kFullRange = 1u << 8;
    const uint32_t range = colours.range == GST_VIDEO_COLOR_RANGE_0_255 ? kFullRange : 0;
    switch (colours.matrix) {
        case GST_VIDEO_COLOR_MATRIX_BT709:
        case GST_VIDEO_COLOR_MATRIX_BT2020:
            return range | 1;
        case GST_VIDEO_COLOR_MATRIX_FCC:
            return range | 4;
        case GST_VIDEO_COLOR_MATRIX_SMPTE240M:
            return range | 7;
        default:
            return range | 6;
    }
}

Picture pictureOf(const GstVideoFrame& frame) {
    Picture picture = {};
    picture.width = GST_VIDEO_FRAME_WIDTH(&frame);
    picture.height = GST_VIDEO_FRAME_HEIGHT(&frame);
    picture.pairs = GST_VIDEO_FRAME_FORMAT(&frame) == GST_VIDEO_FORMAT_NV12;
    for (guint i = 0; i < GST_VIDEO_FRAME_N_PLANES(&frame); ++i) {
        picture.planes[i] = static_cast<const uint8_t*>(GST_VIDEO_FRAME_PLANE_DATA(&frame, i));
        picture.strides[i] = GST_VIDEO_FRAME_PLANE_STRIDE(&frame, i);
    }
    return picture;
}

// A buffer of the window: Cr behind Y, Cb behind Cr, chroma rows of half the stride rounded up to
// 16 bytes.
Picture pictureOf(const vidshow::host::Frame& frame, const GstVideoInfo& info) {
    const int chromaStride = (frame.stride / 2 + 15) / 16 * 16;
    const uint8_t* const cr = frame.bits + ptrdiff_t{frame.stride} * frame.height;
    const uint8_t* const cb = cr + ptrdiff_t{chromaStride} * ((frame.height + 1) / 2);
    return {{frame.bits, cb, cr},
            {frame.stride, chromaStride, chromaStride},
            GST_VIDEO_INFO_WIDTH(&info),
            GST_VIDEO_INFO_HEIGHT(&info),
            false};
}

void showOnDisplay(VidshowSink* self, const vidshow::host::Frame& frame) {
    if (!self->displayWanted) return;
    try {
        if (!self->display) self->display = std::make_unique<Display>();
        self->display->show(pictureOf(frame, self->info));
    } catch (const vidshow::tools::Error& error) {
        GST_INFO_OBJECT(self, "not shown on a display: %s", error.what());
        self->displayWanted = FALSE;
    }
}

void onWindowFrame(VidshowSink* self, const vidshow::host::Frame& frame) {
    GST_OBJECT_LOCK(self);
    ++self->framesShown;
    GST_OBJECT_UNLOCK(self);
    g_signal_emit(self, g_windowFrame, 0, static_cast<guint>(frame.width),
                  static_cast<guint>(frame.height), static_cast<guint>(frame.stride), frame.bits,
                  static_cast<guint64>(frame.bytes));
    showOnDisplay(self, frame);
}

gboolean start(GstBaseSink* sink) {
    VidshowSink* const self = VIDSHOW_SINK(sink);
    try {
        self->presentation = std::make_unique<Presentation>(
            [self](const vidshow::host::Frame& frame) { onWindowFrame(self, frame); });
    } catch (const std::exception& error) {
        GST_ELEMENT_ERROR(self, RESOURCE, BUSY, ("%s", error.what()), (nullptr));
        return FALSE;
    }
    self->framesShown = 0;
    return TRUE;
}

gboolean stop(GstBaseSink* sink) {
    VidshowSink* const self = VIDSHOW_SINK(sink);
    self->presentation.reset();
    self->display.reset();
    return TRUE;
}

gboolean setInfo(GstVideoSink* sink, GstCaps*, const GstVideoInfo* info) {
    VIDSHOW_SINK(sink)->info = *info;
    return TRUE;
}

// Buffers may have rows of any stride: their makers need not copy for us.
gboolean proposeAllocation(GstBaseSink*, GstQuery* query) {
    gst_query_add_allocation_meta(query, GST_VIDEO_META_API_TYPE, nullptr);
    return TRUE;
}

GstFlowReturn present(VidshowSink* self, const GstVideoFrame& frame) {
    GST_OBJECT_LOCK(self);
    const guint mode = self->deinterlace;
    GST_OBJECT_UNLOCK(self);
    try {
        self->presentation->setDeinterlace(mode);
        self->presentation->show(pictureOf(frame), colourCode(self->info.colorimetry));
    } catch (const std::exception& error) {
        GST_ELEMENT_ERROR(self, RESOURCE, WRITE, ("%s", error.what()), (nullptr));
        return GST_FLOW_ERROR;
    }
    if (self->display && self->display->closed()) {
        GST_ELEMENT_ERROR(self, RESOURCE, NOT_FOUND, ("the window was closed"), (nullptr));
        return GST_FLOW_ERROR;
    }
    return GST_FLOW_OK;
}

GstFlowReturn showFrame(GstVideoSink* sink, GstBuffer* buffer) {
    VidshowSink* const self = VIDSHOW_SINK(sink);
    GstVideoFrame frame;
    if (!gst_video_frame_map(&frame, &self->info, buffer, GST_MAP_READ)) {
        GST_ELEMENT_ERROR(self, RESOURCE, READ, ("a buffer cannot be read"), (nullptr));
        return GST_FLOW_ERROR;
    }
    const GstFlowReturn result = present(self, frame);
    gst_video_frame_unmap(&frame);
    return result;
}

void setProperty(GObject* object, guint id, const GValue* value, GParamSpec* spec) {
    VidshowSink* const self = VIDSHOW_SINK(object);
    GST_OBJECT_LOCK(self);
    if (id == kPropDisplay) {
        self->displayWanted = g_value_get_boolean(value);
    } else if (id == kPropDeinterlace) {
        self->deinterlace = static_cast<guint>(g_value_get_enum(value));
    } else {
        G_OBJECT_WARN_INVALID_PROPERTY_ID(object, id, spec);
    }
    GST_OBJECT_UNLOCK(self);
}

void getProperty(GObject* object, guint id, GValue* value, GParamSpec* spec) {
    VidshowSink* const self = VIDSHOW_SINK(object);
    GST_OBJECT_LOCK(self);
    if (id == kPropDisplay) {
        g_value_set_boolean(value, self->displayWanted);
    } else if (id == kPropDeinterlace) {
        g_value_set_enum(value, static_cast<gint>(self->deinterlace));
    } else if (id == kPropFramesShown) {
        g_value_set_uint64(value, self->framesShown);
    } else {
        G_OBJECT_WARN_INVALID_PROPERTY_ID(object, id, spec);
    }
    GST_OBJECT_UNLOCK(self);
}

// What is constructed in `vidshow_sink_init`; both are empty by now.
void finalize(GObject* object) {
    VidshowSink* const self = VIDSHOW_SINK(object);
    std::destroy_at(&self->presentation);
    std::destroy_at(&self->display);
    G_OBJECT_CLASS(vidshow_sink_parent_class)->finalize(object);
}

void installProperties(GObjectClass* klass) {
    const GParamFlags readWrite =
        static_cast<GParamFlags>(G_PARAM_READWRITE | G_PARAM_STATIC_STRINGS);
    const GParamFlags readOnly =
        static_cast<GParamFlags>(G_PARAM_READABLE | G_PARAM_STATIC_STRINGS);
    g_object_class_install_property(
        klass, kPropDisplay,
        g_param_spec_boolean("display", "Display",
                             "Show the window on the desktop, where there is one", TRUE,
                             readWrite));
    g_object_class_install_property(
        klass, kPropDeinterlace,
        g_param_spec_enum("deinterlace", "Deinterlace", "How the two fields of a frame become one",
                          deinterlaceType(), 0, readWrite));
    g_object_class_install_property(
        klass, kPropFramesShown,
        g_param_spec_uint64(
            "frames-shown", "Frames shown",
            "Frames that arrived at the window since the start, those of a pause twice", 0,
            G_MAXUINT64, 0, readOnly));
}

}  // namespace

static void vidshow_sink_class_init(VidshowSinkClass* klass) {
    GST_DEBUG_CATEGORY_INIT(vidshow_sink_debug, "vidshowsink", 0, "vidshow's sink");
    GObjectClass* const object = G_OBJECT_CLASS(klass);
    object->set_property = setProperty;
    object->get_property = getProperty;
    object->finalize = finalize;
    installProperties(object);
    g_windowFrame = g_signal_new("window-frame", G_TYPE_FROM_CLASS(klass), G_SIGNAL_RUN_LAST, 0,
                                 nullptr, nullptr, nullptr, G_TYPE_NONE, 5, G_TYPE_UINT,
                                 G_TYPE_UINT, G_TYPE_UINT, G_TYPE_POINTER, G_TYPE_UINT64);

    static GstStaticPadTemplate pad =
        GST_STATIC_PAD_TEMPLATE("sink", GST_PAD_SINK, GST_PAD_ALWAYS, GST_STATIC_CAPS(kCaps));
    GstElementClass* const element = GST_ELEMENT_CLASS(klass);
    gst_element_class_add_static_pad_template(element, &pad);
    gst_element_class_set_static_metadata(
        element, "vidshow sink", "Sink/Video",
        "Hands frames to vidshow's presenter on a window of the host", "vidshow");

    GstBaseSinkClass* const base = GST_BASE_SINK_CLASS(klass);
    base->start = start;
    base->stop = stop;
    base->propose_allocation = proposeAllocation;
    GstVideoSinkClass* const video = GST_VIDEO_SINK_CLASS(klass);
    video->set_info = setInfo;
    video->show_frame = showFrame;
}

// GObject hands out zeroed memory, in which C++ members are not alive yet.
static void vidshow_sink_init(VidshowSink* self) {
    new (&self->presentation) std::unique_ptr<Presentation>();
    new (&self->display) std::unique_ptr<Display>();
    gst_video_info_init(&self->info);
    self->displayWanted = TRUE;
}
