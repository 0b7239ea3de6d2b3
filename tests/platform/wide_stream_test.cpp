#include <errno.h>
#include <gtest/gtest.h>
#include <stdarg.h>
#include <stdio.h>
#include <unistd.h>
#include <wchar.h>

#include <memory>
#include <string>

#include "platform/file_kit.h"
#include "platform/wide_kit.h"
#include "testkit/capture.h"
#include "vidshow/platform/misc.h"

namespace {

using file_kit::TempDirectory;
using wide_kit::Wide;

struct Closer {
    void operator()(FILE* stream) const { fclose(stream); }
};
using Stream = std::unique_ptr<FILE, Closer>;

Stream Holding(const std::string& contents) {
    Stream stream(tmpfile());
    fwrite(contents.data(), 1, contents.size(), stream.get());
    rewind(stream.get());
    return stream;
}

std::string Contents(FILE* stream) {
    std::string all;
    rewind(stream);
    for (int c; (c = fgetc(stream)) != EOF;)
        all += static_cast<char>(c);
    return all;
}

std::string AllBytes() {
    std::string all;
    for (int c = 0; c < 256; ++c)
        all += static_cast<char>(c);
    return all;
}

TEST(WideStream, CharactersAreRead) {
    for (auto get : {OURS(fgetwc), OURS(getwc)}) {
        const Stream stream = Holding(AllBytes());
        for (wint_t c = 0; c < 256; ++c)
            EXPECT_EQ(get(stream.get()), c);
        EXPECT_EQ(get(stream.get()), WEOF);
        EXPECT_NE(feof(stream.get()), 0);
    }
}

TEST(WideStream, CharactersOfStandardInputAreRead) {
    const Stream stream = Holding(
        "\xFE"
        "b");
    const int saved = dup(STDIN_FILENO);
    dup2(fileno(stream.get()), STDIN_FILENO);
    const auto get = OURS(getwchar);
    EXPECT_EQ(get(), 0xFEu);
    EXPECT_EQ(get(), static_cast<wint_t>('b'));
    EXPECT_EQ(get(), WEOF);
    clearerr(stdin);
    dup2(saved, STDIN_FILENO);
    close(saved);
}

TEST(WideStream, LowBytesAreWritten) {
    for (auto put : {OURS(fputwc), OURS(putwc)}) {
        const Stream stream = Holding("");
        for (wchar_t c = 0; c < 256; ++c)
            EXPECT_EQ(put(c + 0x1200, stream.get()), static_cast<wint_t>(c));
        EXPECT_EQ(put(static_cast<wchar_t>(WEOF), stream.get()), 255u);
        EXPECT_EQ(Contents(stream.get()), AllBytes() + "\xFF");
    }
}

TEST(WideStream, LowBytesAreWrittenToStandardOutput) {
    testkit::StdoutCapture capture;
    const auto put = OURS(putwchar);
    EXPECT_EQ(put(L'a'), static_cast<wint_t>('a'));
    EXPECT_EQ(put(0x1262), static_cast<wint_t>('b'));
    EXPECT_EQ(capture.text(), "ab");
}

TEST(WideStream, WritingWhereOneCannotIsWeof) {
    const Stream full(fopen("/dev/full", "w"));
    setvbuf(full.get(), nullptr, _IONBF, 0);
    errno = 0;
    EXPECT_EQ(OURS(fputwc)(L'a', full.get()), WEOF);
    EXPECT_EQ(errno, ENOSPC);
    EXPECT_EQ(OURS(fputws)(Wide("ab"), full.get()), EOF);
}

TEST(WideStream, LowBytesArePutBack) {
    const auto putBack = OURS(ungetwc);
    for (wint_t c : {wint_t{'x'}, wint_t{0x1278}, wint_t{0}, wint_t{255}}) {
        const Stream stream = Holding("abc");
        EXPECT_EQ(putBack(c, stream.get()), c & 255);
        EXPECT_EQ(fgetc(stream.get()), static_cast<int>(c & 255));
        EXPECT_EQ(fgetc(stream.get()), 'a');
    }
}

TEST(WideStream, WeofIsPutBackAsByte255) {
    const Stream stream = Holding("abc");
    EXPECT_EQ(OURS(ungetwc)(WEOF, stream.get()), 255u);
    EXPECT_EQ(fgetc(stream.get()), 255);
}

TEST(WideStream, LinesAreBytes) {
    const Stream stream = Holding("one\ntwo and more");
    char buffer[8];
    const auto line = OURS(fgetws);
    EXPECT_EQ(line(Wide(buffer), sizeof buffer, stream.get()), Wide(buffer));
    EXPECT_STREQ(buffer, "one\n");
    EXPECT_EQ(line(Wide(buffer), sizeof buffer, stream.get()), Wide(buffer));
    EXPECT_STREQ(buffer, "two and") << "seven bytes and the end";
    EXPECT_EQ(line(Wide(buffer), sizeof buffer, stream.get()), Wide(buffer));
    EXPECT_EQ(line(Wide(buffer), sizeof buffer, stream.get()), nullptr);
    const Stream out = Holding("");
    EXPECT_GE(OURS(fputws)(Wide("some bytes\n"), out.get()), 0);
    EXPECT_EQ(Contents(out.get()), "some bytes\n");
}

TEST(WideStream, OrientationIsWhatIsAskedFor) {
    const Stream stream = Holding("a");
    for (int mode : {-5, 0, 1, 77})
        EXPECT_EQ(OURS(fwide)(stream.get(), mode), mode);
    EXPECT_EQ(fgetc(stream.get()), 'a') << "and the stream stays one of bytes";
}

template <typename Function>
int CallWithList(Function function, ...) {
    va_list list;
    va_start(list, function);
    const int result = function(list);
    va_end(list);
    return result;
}

class WideFormat : public testing::Test {
  protected:
    void ExpectFailure(int result) {
        EXPECT_EQ(result, -1);
        EXPECT_EQ(errno, EOPNOTSUPP);
        errno = 0;
    }
    const Stream m_stream = Holding("42");
    wchar_t m_text[4] = L"abc";
};

TEST_F(WideFormat, PrintsNothing) {
    testkit::StdoutCapture capture;
    errno = 0;
    ExpectFailure(OURS(fwprintf)(m_stream.get(), L"%d", 7));
    ExpectFailure(OURS(wprintf)(L"%d", 7));
    ExpectFailure(OURS(swprintf)(m_text, 4, L"%d", 7));
    ExpectFailure(_swprintf(m_text, L"%d", 7));
    ExpectFailure(CallWithList(
        [&](va_list list) { return OURS(vfwprintf)(m_stream.get(), L"%d", list); }, 7));
    ExpectFailure(CallWithList([&](va_list list) { return OURS(vwprintf)(L"%d", list); }, 7));
    ExpectFailure(
        CallWithList([&](va_list list) { return OURS(vswprintf)(m_text, 4, L"%d", list); }, 7));
    EXPECT_STREQ(m_text, L"abc");
    EXPECT_EQ(Contents(m_stream.get()), "42");
    EXPECT_EQ(capture.text(), "");
}

TEST_F(WideFormat, ScansNothing) {
    int number = 5;
    errno = 0;
    ExpectFailure(OURS(fwscanf)(m_stream.get(), L"%d", &number));
    ExpectFailure(OURS(swscanf)(L"42", L"%d", &number));
    ExpectFailure(OURS(wscanf)(L"%d", &number));
    EXPECT_EQ(number, 5);
    EXPECT_EQ(ftell(m_stream.get()), 0);
}

class WideOpen : public testing::Test {
  protected:
    static Stream Open(const std::string& path, const char* mode) {
        return Stream(_wfopen(Wide(path.c_str()), Wide(mode)));
    }
    TempDirectory m_directory;
};

TEST_F(WideOpen, OpensByBytes) {
    const std::string path = m_directory.path("f");
    {
        const Stream stream = Open(path, "w");
        ASSERT_NE(stream, nullptr);
        fputs("written", stream.get());
    }
    const Stream stream = Open(path, "rb");
    ASSERT_NE(stream, nullptr);
    EXPECT_EQ(Contents(stream.get()), "written");
}

TEST_F(WideOpen, FailureTellsWhy) {
    errno = 0;
    EXPECT_EQ(Open(m_directory.path("missing"), "r"), nullptr);
    EXPECT_EQ(errno, ENOENT);
    EXPECT_EQ(Open(m_directory.path("missing"), "?"), nullptr);
    EXPECT_EQ(errno, EINVAL);
}

// The C library looks for a character set's name in the whole mode, and refuses one that it does
// not know.
TEST_F(WideOpen, ModeIsCutToNineBytes) {
    const std::string path = m_directory.file("f", "x");
    EXPECT_EQ(Stream(fopen(path.c_str(), "r       ,ccs=none")), nullptr);
    EXPECT_NE(Open(path, "r       ,ccs=none"), nullptr);
}

TEST_F(WideOpen, PathsOf4095BytesAreWholeAndLongerOnesFail) {
    std::string path = m_directory.path();
    m_directory.file("f", "x");
    path.append(4095 - path.size() - 1, '/');
    path += "f";
    ASSERT_EQ(path.size(), 4095u);
    EXPECT_NE(Open(path, "r"), nullptr);
    for (const char* more : {"f", "ff", "/and/much/more"}) {
        errno = 0;
        EXPECT_EQ(Open(path + more, "w"), nullptr);
        EXPECT_EQ(errno, ENAMETOOLONG);
    }
    EXPECT_EQ(file_kit::ContentsOf(m_directory.path("f")), "x");
}

}  // namespace
