#include <dlfcn.h>
#include <errno.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <cstdlib>
#include <filesystem>
#include <string>

#include "platform/file_kit.h"
#include "platform/sync_kit.h"
#include "testkit/guarded_buffer.h"
#include "vidshow/platform/file.h"

namespace {

const char kModule[] = VIDSHOW_TEST_MODULE;

TEST(Modules, AreLoadedSearchedCalledAndFreed) {
    void* module = LoadLibrary(kModule);
    ASSERT_NE(module, nullptr);
    auto* add = reinterpret_cast<int (*)(int, int)>(GetProcAddress(module, "AddNumbers"));
    ASSERT_NE(add, nullptr);
    EXPECT_EQ(add(40, 2), 42);
    auto* number = static_cast<int*>(GetProcAddress(module, "g_number"));
    ASSERT_NE(number, nullptr);
    EXPECT_EQ(*number, 1234);

    bool unloaded = false;
    auto** flag = static_cast<bool**>(GetProcAddress(module, "g_unloaded"));
    ASSERT_NE(flag, nullptr);
    *flag = &unloaded;
    EXPECT_EQ(FreeLibrary(module), 1);
    EXPECT_TRUE(unloaded);
}

TEST(Modules, LoadedTwiceAreFreedTwice) {
    void* first = LoadLibrary(kModule);
    void* second = LoadLibrary(kModule);
    ASSERT_NE(first, nullptr);
    EXPECT_EQ(first, second);
    bool unloaded = false;
    *static_cast<bool**>(GetProcAddress(first, "g_unloaded")) = &unloaded;
    EXPECT_EQ(FreeLibrary(first), 1);
    EXPECT_FALSE(unloaded);
    EXPECT_EQ(FreeLibrary(second), 1);
    EXPECT_TRUE(unloaded);
}

// The module calls a function that nobody has: that shows only if somebody calls it.
TEST(Modules, FindTheirFunctionsLazily) {
    if (std::getenv("LD_BIND_NOW") != nullptr) GTEST_SKIP() << "the loader was told otherwise";
    void* module = LoadLibrary(VIDSHOW_TEST_LAZY_MODULE);
    EXPECT_NE(module, nullptr);
    EXPECT_EQ(FreeLibrary(module), 1);
}

TEST(Modules, MissingOnesAreNull) {
    EXPECT_EQ(LoadLibrary("/no/such/module.so"), nullptr);
    EXPECT_EQ(FreeLibrary(nullptr), 0);
    void* module = LoadLibrary(kModule);
    EXPECT_EQ(GetProcAddress(module, "NoSuchFunction"), nullptr);
    EXPECT_EQ(FreeLibrary(module), 1);
}

TEST(Modules, LongPathsAreRefusedAndNotCut) {
    std::string path = kModule;
    path.insert(0, 4096 - path.size(), '/');
    ASSERT_EQ(path.size(), 4096u);
    errno = 0;
    EXPECT_EQ(LoadLibrary(path.c_str()), nullptr);
    EXPECT_EQ(errno, ENAMETOOLONG);
    void* module = LoadLibrary(path.c_str() + 1);
    EXPECT_NE(module, nullptr) << "4095 characters are a path";
    EXPECT_EQ(FreeLibrary(module), 1);
}

class ModuleFileName : public testing::Test {
  protected:
    const std::string m_program = std::filesystem::canonical("/proc/self/exe").string();
};

TEST_F(ModuleFileName, IsTheProgramsWhateverTheModule) {
    for (HANDLE module : {HANDLE{nullptr}, sync_kit::HandleValue(7)}) {
        char buffer[5000];
        EXPECT_EQ(GetModuleFileName(module, buffer, sizeof buffer), m_program.size());
        EXPECT_EQ(buffer, m_program);
    }
}

TEST_F(ModuleFileName, IsCutToTheBuffer) {
    for (size_t size = 2; size < m_program.size() + 3; ++size) {
        testkit::GuardedBuffer buffer(size);
        char* text = reinterpret_cast<char*>(buffer.data());
        const size_t length = std::min(size - 1, m_program.size());
        EXPECT_EQ(GetModuleFileName(nullptr, text, static_cast<DWORD>(size)), length);
        EXPECT_EQ(text, m_program.substr(0, length));
    }
}

TEST_F(ModuleFileName, NeedsRoomForACharacterAndTheEnd) {
    char buffer[2] = {'?', '?'};
    for (uint32_t size : {0u, 1u}) {
        EXPECT_EQ(GetModuleFileName(nullptr, buffer, size), 0u);
        EXPECT_EQ(buffer[0], '?');
    }
}

TEST_F(ModuleFileName, RoomMayBeAnyNumber) {
    for (uint32_t size : {0x7FFFFFFFu, 0x80000000u, 0xFFFFFFFFu}) {
        char buffer[5000];
        EXPECT_EQ(GetModuleFileName(nullptr, buffer, size), m_program.size());
        EXPECT_EQ(buffer, m_program);
    }
}

}  // namespace
