#pragma once

// libavfilter's filters as contenders: frames in, frames out, on one thread.

#include <cstdio>
#include <cstdlib>
#include <memory>
#include <string>

extern "C" {
#include <libavfilter/avfilter.h>
#include <libavfilter/buffersink.h>
#include <libavfilter/buffersrc.h>
#include <libavutil/frame.h>
}

namespace bench {

/// A chain of filters between a source and a sink. A benchmark has no use for less than it asked
/// for: whatever fails ends the program.
class FilterGraph {
  public:
    /// @param filters as FFmpeg's `-vf` takes them
    FilterGraph(int width, int height, int pixelFormat, const std::string& filters) {
        const std::string source =
            "video_size=" + std::to_string(width) + "x" + std::to_string(height) +
            ":pix_fmt=" + std::to_string(pixelFormat) + ":time_base=1/25:pixel_aspect=1/1";
        m_graph->nb_threads = 1;
        Require(avfilter_graph_create_filter(&m_source, avfilter_get_by_name("buffer"), "in",
                                             source.c_str(), nullptr, m_graph) >= 0);
        Require(avfilter_graph_create_filter(&m_sink, avfilter_get_by_name("buffersink"), "out",
                                             nullptr, nullptr, m_graph) >= 0);
        AVFilterInOut* from = End("in", m_source);
        AVFilterInOut* to = End("out", m_sink);
        Require(avfilter_graph_parse_ptr(m_graph, filters.c_str(), &to, &from, nullptr) >= 0);
        avfilter_inout_free(&from);
        avfilter_inout_free(&to);
        Require(avfilter_graph_config(m_graph, nullptr) >= 0);
        m_frame->format = pixelFormat;
        m_frame->width = width;
        m_frame->height = height;
        Require(av_frame_get_buffer(m_frame, 0) >= 0);
    }
    ~FilterGraph() {
        av_frame_free(&m_frame);
        avfilter_graph_free(&m_graph);
    }
    FilterGraph(const FilterGraph&) = delete;
    FilterGraph& operator=(const FilterGraph&) = delete;

    /// What goes in each time; its samples are the caller's to fill.
    AVFrame* input() { return m_frame; }

    /// One picture in, one picture out; nothing is copied on the way in.
    void Run() {
        m_frame->pts = m_time++;
        AVFrame* out = av_frame_alloc();
        Require(av_buffersrc_add_frame_flags(m_source, m_frame, AV_BUFFERSRC_FLAG_KEEP_REF) >= 0);
        const bool first = m_time == 1;  // some filters wait for a second picture
        Require(av_buffersink_get_frame(m_sink, out) >= 0 || first);
        av_frame_free(&out);
    }

  private:
    static void Require(bool holds) {
        if (holds) return;
        std::fputs("libavfilter refuses what the benchmark asks of it\n", stderr);
        std::exit(1);
    }

    static AVFilterInOut* End(const char* name, AVFilterContext* filter) {
        AVFilterInOut* end = avfilter_inout_alloc();
        Require(end != nullptr);
        end->name = av_strdup(name);
        end->filter_ctx = filter;
        end->pad_idx = 0;
        end->next = nullptr;
        return end;
    }

    AVFilterGraph* m_graph = avfilter_graph_alloc();
    AVFilterContext* m_source = nullptr;
    AVFilterContext* m_sink = nullptr;
    AVFrame* m_frame = av_frame_alloc();
    int64_t m_time = 0;
};

}  // namespace bench
