#include "common/y4m_sink.h"

#include <cerrno>
#include <cstring>
#include <filesystem>

#include "common/error.h"

namespace vidshow::tools {

namespace {

// Where chroma samples lie, in the words of the format; 4:2:0 unless told is JPEG's.
const char* chromaTag(AVChromaLocation location) {
    switch (location) {
        case AVCHROMA_LOC_LEFT:
            return "420mpeg2";
        case AVCHROMA_LOC_TOPLEFT:
            return "420paldv";
        default:
            return "420jpeg";
    }
}

char interlaceTag(const Look& look, bool deinterlaced) {
    if (!look.interlaced || deinterlaced) return 'p';
    return look.topFieldFirst ? 't' : 'b';
}

}  // namespace

std::string numberedName(const std::string& path, int number) {
    if (number == 1) return path;
    const std::filesystem::path whole(path);
    const std::string name =
        whole.stem().string() + "-" + std::to_string(number) + whole.extension().string();
    return (whole.parent_path() / name).string();
}

Y4mSink::Y4mSink(const std::string& path, AVRational frameRate, bool deinterlaced)
    : m_path(path), m_frameRate(frameRate), m_deinterlaced(deinterlaced) {
    open();  // at once, so that a wrong name shows before the work
}

void Y4mSink::open() {
    ++m_files;
    if (takesStandardOutput()) {
        m_name = "standard output";
        m_file.reset(stdout);
        return;
    }
    m_name = numberedName(m_path, m_files);
    m_file.reset(std::fopen(m_name.c_str(), "wb"));
    if (!m_file) throw Error("cannot write " + m_name + ": " + std::strerror(errno));
}

void Y4mSink::close() {
    std::FILE* const file = m_file.release();
    if (file == nullptr) return;
    if ((file == stdout ? std::fflush(file) : std::fclose(file)) != 0) {
        throw Error("cannot write " + m_name + ": " + std::strerror(errno));
    }
}

void Y4mSink::startFile(const Picture& picture) {
    if (m_width != 0) {
        if (takesStandardOutput()) {
            throw Error("the clip changes its size, which standard output cannot follow");
        }
        close();
        open();
    }
    m_width = picture.planes.width;
    m_height = picture.planes.height;
    const Look& look = picture.look;
    char header[160];
    const int length = std::snprintf(
        header, sizeof header, "YUV4MPEG2 W%d H%d F%d:%d I%c A%d:%d C%s XCOLORRANGE=%s\n", m_width,
        m_height, m_frameRate.num, m_frameRate.den, interlaceTag(look, m_deinterlaced),
        look.pixelAspect.num, look.pixelAspect.den, chromaTag(look.chroma),
        look.colour.range == Range::full ? "FULL" : "LIMITED");
    write(header, static_cast<size_t>(length));
}

void Y4mSink::show(const Picture& picture) {
    const Planes& planes = picture.planes;
    if (planes.width != m_width || planes.height != m_height) startFile(picture);
    write("FRAME\n", 6);
    for (int i = 0; i < 3; ++i) {
        const uint8_t* row = planes.data[i];
        for (int y = 0; y < planes.planeHeight(i); ++y, row += planes.stride[i]) {
            write(row, static_cast<size_t>(planes.planeWidth(i)));
        }
    }
}

void Y4mSink::write(const void* data, size_t bytes) {
    if (std::fwrite(data, 1, bytes, m_file.get()) != bytes) {
        throw Error("cannot write " + m_name + ": " + std::strerror(errno));
    }
}

std::string Y4mSink::finish() {
    close();
    if (m_files == 1) return "";
    return "the clip changes its size: its parts are in " + m_path + " to " + m_name;
}

}  // namespace vidshow::tools
