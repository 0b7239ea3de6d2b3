#include "playkit/y4m.h"

#include <gtest/gtest.h>

#include <sstream>

#include "playkit/process.h"

namespace playkit {

namespace {

const std::string kFrameLine = "FRAME\n";

// Takes one frame's planes from `at` on.
RawFrame takeFrame(const std::string& bytes, size_t* at, int width, int height) {
    RawFrame frame = {width, height, {}};
    for (int i = 0; i < 3; ++i) {
        const int w = i == 0 ? width : (width + 1) / 2;
        const int h = i == 0 ? height : (height + 1) / 2;
        const size_t size = static_cast<size_t>(w) * static_cast<size_t>(h);
        if (*at + size > bytes.size()) {
            ADD_FAILURE() << "the file ends inside a frame";
            *at = bytes.size();
            return frame;
        }
        frame.planes[i].assign(bytes.begin() + static_cast<ptrdiff_t>(*at),
                               bytes.begin() + static_cast<ptrdiff_t>(*at + size));
        *at += size;
    }
    return frame;
}

}  // namespace

Y4m readY4m(const std::string& path) {
    const std::string bytes = readFile(path);
    Y4m file;
    file.header = bytes.substr(0, bytes.find('\n'));
    if (file.header.rfind("YUV4MPEG2 ", 0) != 0) {
        ADD_FAILURE() << path << " begins with: " << file.header.substr(0, 40);
        return file;
    }
    const int width = std::stoi(y4mTag(file, 'W'));
    const int height = std::stoi(y4mTag(file, 'H'));
    for (size_t at = file.header.size() + 1; at < bytes.size();) {
        if (bytes.compare(at, kFrameLine.size(), kFrameLine) != 0) {
            ADD_FAILURE() << "no frame begins at byte " << at;
            break;
        }
        at += kFrameLine.size();
        file.frames.push_back(takeFrame(bytes, &at, width, height));
    }
    return file;
}

std::string y4mTag(const Y4m& file, char tag) {
    std::istringstream words(file.header);
    std::string word;
    words >> word;
    while (words >> word) {
        if (word[0] == tag) return word.substr(1);
    }
    return "";
}

void expectSameFrames(const std::vector<RawFrame>& shown, const std::vector<RawFrame>& expected) {
    ASSERT_EQ(shown.size(), expected.size());
    for (size_t i = 0; i < shown.size(); ++i) {
        ASSERT_EQ(shown[i].width, expected[i].width) << "frame " << i;
        ASSERT_EQ(shown[i].height, expected[i].height) << "frame " << i;
        for (int p = 0; p < 3; ++p) {
            ASSERT_TRUE(shown[i].planes[p] == expected[i].planes[p])
                << "frame " << i << ", plane " << p;
        }
    }
}

}  // namespace playkit
