#include <gtest/gtest.h>

#include <cstring>

#include "testkit/capture.h"
#include "vidshow/platform/misc.h"

namespace {

TEST(Stubs, MessagesGoNowhere) {
    testkit::StdoutCapture capture;
    OutputDebugString("text");
    PostQuitMessage(3);
    EXPECT_EQ(SendMessage(nullptr, 1, 2, 3), 0);
    EXPECT_EQ(PostMessage(nullptr, 1, 2, 3), 1);
    EXPECT_EQ(DefWindowProc(nullptr, 1, 2, 3), 0);
    EXPECT_EQ(TranslateMessage(nullptr), 1);
    EXPECT_EQ(DispatchMessage(nullptr), 1);
    EXPECT_EQ(capture.text(), "");
}

TEST(Stubs, WindowsAreNotMade) {
    const WNDCLASS windowClass = {};
    EXPECT_EQ(RegisterClass(&windowClass), 0);
    const HWND window =
        CreateWindow("class", "title", 0, 0, 0, 640, 480, nullptr, nullptr, nullptr, nullptr);
    EXPECT_EQ(reinterpret_cast<uintptr_t>(window), 0x12345678u);
    EXPECT_EQ(GetWindowLong(window, -16), 0);
    EXPECT_EQ(SetWindowLong(window, -16, 7), 0);
    EXPECT_EQ(ShowWindow(window, 5), 1);
    EXPECT_EQ(SetWindowPos(window, nullptr, 0, 0, 1, 1, 0), 1);
    RECT rect = {1, 2, 3, 4};
    EXPECT_EQ(GetWindowRect(window, &rect), 0);
    EXPECT_EQ(rect.left, 1);
    EXPECT_EQ(rect.top, 2);
    EXPECT_EQ(rect.right, 3);
    EXPECT_EQ(rect.bottom, 4);
}

TEST(Stubs, SystemHasNothingToOffer) {
    EXPECT_EQ(LoadCursor(nullptr, "arrow"), nullptr);
    EXPECT_EQ(GetSystemMetrics(0), 0);
    EXPECT_EQ(GetModuleHandle(nullptr), nullptr);
    EXPECT_EQ(GetStockObject(0), nullptr);
}

TEST(Stubs, ComSucceeds) {
    EXPECT_EQ(CoInitialize(nullptr), 0);
    EXPECT_EQ(CoInitializeEx(nullptr, 2), 0);
    EXPECT_EQ(CoUninitialize(), 0);
}

TEST(Stubs, VolumeInformationWritesNothing) {
    char name[4] = "abc";
    char fileSystem[4] = "def";
    DWORD serial = 1, maxComponent = 2, flags = 3;
    EXPECT_EQ(GetVolumeInformation("/", name, sizeof name, &serial, &maxComponent, &flags,
                                   fileSystem, sizeof fileSystem),
              1);
    EXPECT_STREQ(name, "abc");
    EXPECT_STREQ(fileSystem, "def");
    EXPECT_EQ(serial, 1u);
    EXPECT_EQ(maxComponent, 2u);
    EXPECT_EQ(flags, 3u);
}

TEST(Stubs, TextIsNotConverted) {
    char narrow[8] = "unread";
    wchar_t wide[8] = L"kept";
    BOOL usedDefault = 9;
    EXPECT_EQ(WideCharToMultiByte(0, 0, wide, -1, narrow, 8, nullptr, &usedDefault), 0);
    EXPECT_EQ(MultiByteToWideChar(0, 0, "new", -1, wide, 8), 0);
    EXPECT_STREQ(narrow, "unread");
    EXPECT_STREQ(wide, L"kept");
    EXPECT_EQ(usedDefault, 9);
}

using TimesFunction = BOOL (*)(HANDLE, FILETIME*, FILETIME*, FILETIME*, FILETIME*);

class StubTimes : public testing::TestWithParam<TimesFunction> {};

TEST_P(StubTimes, FailAndWriteNothing) {
    FILETIME times[4];
    std::memset(times, 0x5A, sizeof times);
    EXPECT_EQ(GetParam()(nullptr, &times[0], &times[1], &times[2], &times[3]), 0);
    for (const FILETIME& time : times) {
        EXPECT_EQ(time.dwLowDateTime, 0x5A5A5A5Au);
        EXPECT_EQ(time.dwHighDateTime, 0x5A5A5A5Au);
    }
}

INSTANTIATE_TEST_SUITE_P(Of, StubTimes, testing::Values(GetProcessTimes, GetThreadTimes),
                         [](const auto& which) { return which.index == 0 ? "Process" : "Thread"; });

}  // namespace
