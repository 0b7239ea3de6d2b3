// vidshowsink: what is pushed into it arrives at the presenter's window, sample for sample.

#include <gmock/gmock.h>
#include <gst/check/gstharness.h>
#include <gst/video/video.h>
#include <gtest/gtest.h>

#include <cstdlib>
#include <string>
#include <vector>

namespace {

using Bytes = std::vector<uint8_t>;

// What arrived at the window: the planes of its YV12 buffer without the gaps between rows.
struct Arrived {
    guint width;
    guint height;
    Bytes y;
    Bytes cb;
    Bytes cr;
};

Bytes packed(const uint8_t* bits, guint stride, guint width, guint height) {
    Bytes plane;
    for (guint row = 0; row < height; ++row)
        plane.insert(plane.end(), bits + row * stride, bits + row * stride + width);
    return plane;
}

void note(GstElement*, guint width, guint height, guint stride, gpointer data, guint64 bytes,
          std::vector<Arrived>* frames) {
    const uint8_t* const bits = static_cast<const uint8_t*>(data);
    const guint chroma = (stride / 2 + 15) / 16 * 16;
    const uint8_t* const cr = bits + stride * height;
    const uint8_t* const cb = cr + chroma * (height / 2);
    ASSERT_GE(bytes, stride * height + chroma * (height / 2) + chroma * (height / 2 - 1));
    frames->push_back({width, height, packed(bits, stride, width, height),
                       packed(cb, chroma, width / 2, height / 2),
                       packed(cr, chroma, width / 2, height / 2)});
}

std::string capsOf(const std::string& format, int width, int height) {
    return "video/x-raw,format=" + format + ",width=" + std::to_string(width) +
           ",height=" + std::to_string(height) + ",framerate=25/1";
}

// An element of its own, fed by hand.
class Sink {
  public:
    explicit Sink(const std::string& caps)
        : m_element(gst_element_factory_make("vidshowsink", nullptr)) {
        gst_object_ref_sink(m_element);
        // The first frame is shown once more when a pause ends, unless it is not shown in the
        // pause.
        g_object_set(m_element, "show-preroll-frame", FALSE, "sync", FALSE, "display", FALSE,
                     nullptr);
        g_signal_connect(m_element, "window-frame", G_CALLBACK(note), &m_frames);
        m_harness = gst_harness_new_with_element(m_element, "sink", nullptr);
        setCaps(caps);
    }
    ~Sink() {
        gst_harness_teardown(m_harness);
        gst_object_unref(m_element);
    }
    Sink(const Sink&) = delete;
    Sink& operator=(const Sink&) = delete;

    void setCaps(const std::string& caps) { gst_harness_set_src_caps_str(m_harness, caps.c_str()); }
    GstElement* element() const { return m_element; }
    const std::vector<Arrived>& frames() const { return m_frames; }

    GstFlowReturn push(GstBuffer* buffer) { return gst_harness_push(m_harness, buffer); }
    GstFlowReturn push(const Bytes& bytes) {
        return push(gst_buffer_new_memdup(bytes.data(), bytes.size()));
    }

  private:
    GstElement* const m_element;
    GstHarness* m_harness;
    std::vector<Arrived> m_frames;
};

Bytes noise(size_t count, unsigned seed) {
    Bytes bytes;
    for (size_t i = 0; i < count; ++i)
        bytes.push_back(static_cast<uint8_t>((i + seed) * 2654435761u >> 13));
    return bytes;
}

// Three planes, rows without gaps.
struct Frame {
    Frame(int itsWidth, int itsHeight)
        : width(itsWidth),
          height(itsHeight),
          y(noise(static_cast<size_t>(width * height), 1)),
          cb(noise(static_cast<size_t>(chromaWidth() * chromaHeight()), 2000)),
          cr(noise(static_cast<size_t>(chromaWidth() * chromaHeight()), 7000)) {}

    int chromaWidth() const { return (width + 1) / 2; }
    int chromaHeight() const { return (height + 1) / 2; }

    int width;
    int height;
    Bytes y;
    Bytes cb;
    Bytes cr;
};

// As GStreamer lays I420 and NV12 out by itself: rows are padded to multiples of four bytes.
void appendRows(Bytes* to, const Bytes& plane, int width) {
    for (size_t at = 0; at < plane.size(); at += static_cast<size_t>(width)) {
        const auto row = plane.begin() + static_cast<ptrdiff_t>(at);
        to->insert(to->end(), row, row + width);
        to->resize((to->size() + 3) / 4 * 4);
    }
}

// With an even number of rows, so that nothing but rows needs padding.
Bytes i420(const Frame& frame) {
    Bytes bytes;
    appendRows(&bytes, frame.y, frame.width);
    appendRows(&bytes, frame.cb, frame.chromaWidth());
    appendRows(&bytes, frame.cr, frame.chromaWidth());
    return bytes;
}

Bytes nv12(const Frame& frame) {
    Bytes pairs;
    for (size_t i = 0; i < frame.cb.size(); ++i) {
        pairs.push_back(frame.cb[i]);
        pairs.push_back(frame.cr[i]);
    }
    Bytes bytes;
    appendRows(&bytes, frame.y, frame.width);
    appendRows(&bytes, pairs, 2 * frame.chromaWidth());
    return bytes;
}

// A plane as wide and high as this, its last column and row repeated.
Bytes extended(const Bytes& plane, int width, int height, int newWidth, int newHeight) {
    Bytes result;
    for (int y = 0; y < newHeight; ++y) {
        for (int x = 0; x < newWidth; ++x) {
            const int row = y < height ? y : height - 1;
            const int column = x < width ? x : width - 1;
            result.push_back(plane[static_cast<size_t>(row * width + column)]);
        }
    }
    return result;
}

void expectFrame(const Arrived& arrived, const Frame& frame) {
    EXPECT_EQ(arrived.width, static_cast<guint>(frame.width));
    EXPECT_EQ(arrived.height, static_cast<guint>(frame.height));
    EXPECT_EQ(arrived.y, frame.y);
    EXPECT_EQ(arrived.cb, frame.cb);
    EXPECT_EQ(arrived.cr, frame.cr);
}

TEST(VidshowSink, I420ArrivesSampleForSample) {
    const Frame frame(64, 48);
    Sink sink(capsOf("I420", 64, 48));
    ASSERT_EQ(sink.push(i420(frame)), GST_FLOW_OK);
    ASSERT_EQ(sink.frames().size(), 1u);
    expectFrame(sink.frames()[0], frame);
}

TEST(VidshowSink, Nv12ArrivesSampleForSample) {
    const Frame frame(64, 48);
    Sink sink(capsOf("NV12", 64, 48));
    ASSERT_EQ(sink.push(nv12(frame)), GST_FLOW_OK);
    ASSERT_EQ(sink.frames().size(), 1u);
    expectFrame(sink.frames()[0], frame);
}

TEST(VidshowSink, SizesThatThePresenterWouldCutAreExtended) {
    const Frame frame(62, 46);
    for (const bool pairs : {false, true}) {
        SCOPED_TRACE(pairs);
        Sink sink(capsOf(pairs ? "NV12" : "I420", 62, 46));
        ASSERT_EQ(sink.push(pairs ? nv12(frame) : i420(frame)), GST_FLOW_OK);
        ASSERT_EQ(sink.frames().size(), 1u);
        const Arrived& arrived = sink.frames()[0];
        ASSERT_EQ(arrived.width, 64u);
        ASSERT_EQ(arrived.height, 48u);
        EXPECT_EQ(arrived.y, extended(frame.y, 62, 46, 64, 48));
        EXPECT_EQ(arrived.cb, extended(frame.cb, 31, 23, 32, 24));
        EXPECT_EQ(arrived.cr, extended(frame.cr, 31, 23, 32, 24));
    }
}

// Decoders hand out rows with gaps and planes at places of their own.
TEST(VidshowSink, BuffersTellTheirOwnStrides) {
    const Frame frame(64, 48);
    constexpr size_t kStride = 80;
    Bytes bytes(kStride * 48 * 2, 9);
    const auto place = [&bytes](const Bytes& plane, size_t offset, size_t width) {
        for (size_t row = 0; row * width < plane.size(); ++row) {
            const auto from = plane.begin() + static_cast<ptrdiff_t>(row * width);
            std::copy(from, from + static_cast<ptrdiff_t>(width),
                      bytes.begin() + static_cast<ptrdiff_t>(offset + row * kStride));
        }
    };
    gsize offsets[GST_VIDEO_MAX_PLANES] = {0, kStride * 48, kStride * 72};
    gint strides[GST_VIDEO_MAX_PLANES] = {kStride, kStride, kStride};
    place(frame.y, offsets[0], 64);
    place(frame.cb, offsets[1], 32);
    place(frame.cr, offsets[2], 32);
    GstBuffer* const buffer = gst_buffer_new_memdup(bytes.data(), bytes.size());
    gst_buffer_add_video_meta_full(buffer, GST_VIDEO_FRAME_FLAG_NONE, GST_VIDEO_FORMAT_I420, 64, 48,
                                   3, offsets, strides);
    Sink sink(capsOf("I420", 64, 48));
    ASSERT_EQ(sink.push(buffer), GST_FLOW_OK);
    ASSERT_EQ(sink.frames().size(), 1u);
    expectFrame(sink.frames()[0], frame);
}

TEST(VidshowSink, SizeAndFormatMayChangeOnTheWay) {
    Sink sink(capsOf("I420", 64, 48));
    ASSERT_EQ(sink.push(i420(Frame(64, 48))), GST_FLOW_OK);
    sink.setCaps(capsOf("NV12", 32, 16));
    ASSERT_EQ(sink.push(nv12(Frame(32, 16))), GST_FLOW_OK);
    ASSERT_EQ(sink.frames().size(), 2u);
    expectFrame(sink.frames()[1], Frame(32, 16));
}

// `bob` shows one field, its lines doubled or between its own: the other field must not be seen.
TEST(VidshowSink, DeinterlacesWhenAsked) {
    Frame frame(64, 48);
    for (size_t i = 0; i < frame.y.size(); ++i)
        frame.y[i] = i / 64 % 2 == 0 ? 200 : 20;
    Sink sink(capsOf("I420", 64, 48));
    ASSERT_EQ(sink.push(i420(frame)), GST_FLOW_OK);
    gst_util_set_object_arg(G_OBJECT(sink.element()), "deinterlace", "bob");
    ASSERT_EQ(sink.push(i420(frame)), GST_FLOW_OK);
    gst_util_set_object_arg(G_OBJECT(sink.element()), "deinterlace", "off");
    ASSERT_EQ(sink.push(i420(frame)), GST_FLOW_OK);
    ASSERT_EQ(sink.frames().size(), 3u);
    expectFrame(sink.frames()[0], frame);
    // The last line has none of its own field below it.
    const Bytes& seen = sink.frames()[1].y;
    EXPECT_THAT(Bytes(seen.begin(), seen.end() - 64), testing::Each(200));
    expectFrame(sink.frames()[2], frame);
}

TEST(VidshowSink, CountsWhatArrived) {
    Sink sink(capsOf("I420", 64, 48));
    for (int i = 0; i < 3; ++i)
        ASSERT_EQ(sink.push(i420(Frame(64, 48))), GST_FLOW_OK);
    guint64 shown = 0;
    g_object_get(sink.element(), "frames-shown", &shown, nullptr);
    EXPECT_EQ(shown, 3u);
}

TEST(VidshowSink, TakesTheTwoFormatsAlone) {
    GstElementFactory* const factory = gst_element_factory_find("vidshowsink");
    ASSERT_NE(factory, nullptr);
    for (const char* format : {"I420", "NV12", "YV12", "NV21", "Y42B", "BGRA"}) {
        GstCaps* const caps = gst_caps_from_string(capsOf(format, 64, 48).c_str());
        const bool taken = gst_element_factory_can_sink_all_caps(factory, caps) != FALSE;
        EXPECT_EQ(taken, format == std::string("I420") || format == std::string("NV12")) << format;
        gst_caps_unref(caps);
    }
    gst_object_unref(factory);
}

// The presenter's renderer is one for the process.
TEST(VidshowSink, SecondOneOfAProcessIsRefusedUntilTheFirstStops) {
    const auto starts = [] {
        GstElement* const second = gst_element_factory_make("vidshowsink", nullptr);
        gst_object_ref_sink(second);
        const bool started =
            gst_element_set_state(second, GST_STATE_READY) != GST_STATE_CHANGE_FAILURE;
        gst_element_set_state(second, GST_STATE_NULL);
        gst_object_unref(second);
        return started;
    };
    {
        const Sink first(capsOf("I420", 64, 48));
        EXPECT_FALSE(starts());
    }
    EXPECT_TRUE(starts());
}

// The plug-in is loaded from where it was built, whatever is installed.
class Plugin : public testing::Environment {
  public:
    void SetUp() override {
        setenv("GST_REGISTRY_DISABLE", "yes", 1);
        gst_init(nullptr, nullptr);
        GError* error = nullptr;
        GstPlugin* const plugin = gst_plugin_load_file(VIDSHOW_GSTREAMER_PLUGIN, &error);
        ASSERT_NE(plugin, nullptr) << (error != nullptr ? error->message : "");
        gst_registry_add_plugin(gst_registry_get(), plugin);
        gst_object_unref(plugin);
    }
};
const testing::Environment* const g_plugin = testing::AddGlobalTestEnvironment(new Plugin);

}  // namespace
