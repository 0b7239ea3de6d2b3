#include <errno.h>
#include <gtest/gtest.h>
#include <stdlib.h>

#include <string>

#include "testkit/guarded_buffer.h"
#include "vidshow/platform/file.h"

namespace {

const char kDllPath[] = "QZ_DLL_PATH";

std::string Variable(const char* name) {
    const char* value = getenv(name);
    return value != nullptr ? value : "(not set)";
}

class DllDirectory : public testing::Test {
  protected:
    DllDirectory() { unsetenv(kDllPath); }
    ~DllDirectory() override { unsetenv(kDllPath); }
};

TEST_F(DllDirectory, IsTheEnvironments) {
    char buffer[32] = "untouched";
    EXPECT_EQ(GetDllDirectory(sizeof buffer, buffer), 0u);
    EXPECT_STREQ(buffer, "untouched");
    setenv(kDllPath, "/usr/lib/modules", 1);
    EXPECT_EQ(GetDllDirectory(sizeof buffer, buffer), 16u);
    EXPECT_STREQ(buffer, "/usr/lib/modules");
}

TEST_F(DllDirectory, FiveCharactersNeedSix) {
    setenv(kDllPath, "/path", 1);
    char buffer[8] = "kept";
    EXPECT_EQ(GetDllDirectory(5, buffer), 0u);
    EXPECT_STREQ(buffer, "kept");
    EXPECT_EQ(GetDllDirectory(6, buffer), 5u);
    EXPECT_STREQ(buffer, "/path");
}

TEST_F(DllDirectory, SettingReturnsZeroForSuccess) {
    EXPECT_EQ(SetDllDirectory("/first"), 0);
    EXPECT_EQ(Variable(kDllPath), "/first");
    EXPECT_EQ(SetDllDirectory("/second"), 0) << "and replaces what was there";
    EXPECT_EQ(Variable(kDllPath), "/second");
}

TEST_F(DllDirectory, EmptyOneHasNoLength) {
    EXPECT_EQ(SetDllDirectory(""), 0);
    char buffer[4] = "old";
    EXPECT_EQ(GetDllDirectory(0, buffer), 0u);
    EXPECT_STREQ(buffer, "old");
    EXPECT_EQ(GetDllDirectory(1, buffer), 0u);
    EXPECT_STREQ(buffer, "") << "it fits, so it is stored";
}

TEST_F(DllDirectory, OfEveryLength) {
    for (size_t length = 0; length < 4096; length += length < 300 || length > 4000 ? 1 : 97) {
        const std::string path(length, 'p');
        ASSERT_EQ(SetDllDirectory(path.c_str()), 0) << length;
        testkit::GuardedBuffer exact(length + 1);
        char* text = reinterpret_cast<char*>(exact.data());
        ASSERT_EQ(GetDllDirectory(static_cast<DWORD>(length), text), 0u) << length;
        ASSERT_EQ(exact[0], 0xA5) << "nothing is stored";
        ASSERT_EQ(GetDllDirectory(static_cast<DWORD>(length + 1), text), length);
        ASSERT_EQ(text, path);
    }
}

TEST_F(DllDirectory, LongPathIsRefusedAndTheOldOneStays) {
    ASSERT_EQ(SetDllDirectory("/kept"), 0);
    for (size_t length : {4096u, 4097u, 100000u}) {
        errno = 0;
        EXPECT_EQ(SetDllDirectory(std::string(length, 'p').c_str()), -1);
        EXPECT_EQ(errno, ENAMETOOLONG);
        EXPECT_EQ(Variable(kDllPath), "/kept");
    }
}

TEST_F(DllDirectory, LongerOnesOfTheEnvironmentAreToldWhole) {
    const std::string path(10000, 'p');
    setenv(kDllPath, path.c_str(), 1);
    std::string buffer(10001, '?');
    EXPECT_EQ(GetDllDirectory(10000, &buffer[0]), 0u);
    EXPECT_EQ(GetDllDirectory(10001, &buffer[0]), 10000u);
    EXPECT_EQ(buffer.c_str(), path);
}

const char kName[] = "VIDSHOW_TEST_VARIABLE";

TEST(EnvironmentVariable, IsSetAndReplaced) {
    EXPECT_EQ(SetEnvironmentVariable(kName, "one"), 1);
    EXPECT_EQ(Variable(kName), "one");
    EXPECT_EQ(SetEnvironmentVariable(kName, ""), 1);
    EXPECT_EQ(Variable(kName), "");
    unsetenv(kName);
}

TEST(EnvironmentVariable, NullTakesItAwayAndReturnsZero) {
    ASSERT_EQ(SetEnvironmentVariable(kName, "one"), 1);
    EXPECT_EQ(SetEnvironmentVariable(kName, nullptr), 0);
    EXPECT_EQ(Variable(kName), "(not set)");
    EXPECT_EQ(SetEnvironmentVariable(kName, nullptr), 0);
}

TEST(EnvironmentVariable, ImpossibleNamesFail) {
    for (const char* name : {"", "a=b"}) {
        errno = 0;
        EXPECT_EQ(SetEnvironmentVariable(name, "value"), 0);
        EXPECT_EQ(errno, EINVAL);
    }
}

}  // namespace
