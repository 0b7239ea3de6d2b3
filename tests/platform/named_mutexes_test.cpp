#include <gtest/gtest.h>

#include <string>

#include "platform/sync_kit.h"
#include "testkit/capture.h"

namespace {

using sync_kit::Handle;
using sync_kit::Mutex;
using sync_kit::OnAnotherThread;

constexpr int kMaxNames = 127;
const char kLimitMessage[] = "CreateMutex exceed the limit\n";

HANDLE Open(const std::string& name) {
    return OpenMutex(0, FALSE, name.c_str());
}

std::vector<Handle> CreateNamed(int count) {
    std::vector<Handle> mutexes;
    for (int i = 0; i < count; ++i)
        mutexes.push_back(Mutex(("name" + std::to_string(i)).c_str()));
    return mutexes;
}

// The registry is the process's: each test finds it empty and leaves it so.
class NamedMutex : public testing::Test {
  protected:
    void TearDown() override {
        for (bool emptied = false; !emptied;) {
            testkit::StdoutCapture capture;
            const Handle mutex = Mutex("filler");
            emptied = capture.text() == kLimitMessage;
        }
    }
};

TEST_F(NamedMutex, OpenFindsEachByItsName) {
    const std::vector<Handle> mutexes = CreateNamed(5);
    for (int i = 0; i < 5; ++i) {
        EXPECT_EQ(Open("name" + std::to_string(i)), static_cast<HANDLE>(mutexes[size_t(i)]));
    }
}

TEST_F(NamedMutex, OpenOfAnUnknownNameGivesNull) {
    EXPECT_EQ(Open("name0"), nullptr);
    const std::vector<Handle> mutexes = CreateNamed(2);
    EXPECT_EQ(Open("name"), nullptr);
    EXPECT_EQ(Open("name00"), nullptr);
    EXPECT_EQ(Open(""), nullptr);
    EXPECT_EQ(OpenMutex(0, FALSE, nullptr), nullptr);
}

TEST_F(NamedMutex, NameIsCopied) {
    char name[] = "first";
    const Handle mutex = Mutex(name);
    name[0] = 'F';
    EXPECT_EQ(Open("first"), static_cast<HANDLE>(mutex));
    EXPECT_EQ(Open("First"), nullptr);
}

TEST_F(NamedMutex, TwoOfOneNameAreTwoMutexesAndTheOldestIsFound) {
    const Handle older = Mutex("name");
    const Handle newer = Mutex("name");
    EXPECT_NE(static_cast<HANDLE>(older), static_cast<HANDLE>(newer));
    EXPECT_EQ(Open("name"), static_cast<HANDLE>(older));
}

TEST_F(NamedMutex, ReleaseTakesTheNameAwayAndKeepsTheOthers) {
    const std::vector<Handle> mutexes = CreateNamed(4);
    ASSERT_EQ(WaitForSingleObject(mutexes[1], 0), 0u);
    EXPECT_EQ(ReleaseMutex(mutexes[1]), 1);
    EXPECT_EQ(Open("name1"), nullptr);
    for (size_t i : {0u, 2u, 3u}) {
        EXPECT_EQ(Open("name" + std::to_string(i)), static_cast<HANDLE>(mutexes[i]));
    }
    EXPECT_EQ(WaitForSingleObject(mutexes[1], 0), 0u) << "it works on without its name";
    EXPECT_EQ(ReleaseMutex(mutexes[1]), 1);
}

// The name goes before it is known whether the release succeeds. Clients rely on it: kept.
TEST_F(NamedMutex, ReleaseThatFailsTakesTheNameAwayToo) {
    const Handle mutex = Mutex("name");
    EXPECT_EQ(ReleaseMutex(mutex), 0) << "nobody owns it";
    EXPECT_EQ(Open("name"), nullptr);
}

TEST_F(NamedMutex, ReleaseOfAnUnnamedMutexKeepsTheNames) {
    const Handle named = Mutex("name");
    const Handle unnamed = Mutex();
    ASSERT_EQ(WaitForSingleObject(unnamed, 0), 0u);
    EXPECT_EQ(ReleaseMutex(unnamed), 1);
    EXPECT_EQ(Open("name"), static_cast<HANDLE>(named));
}

TEST_F(NamedMutex, ClosedMutexIsNotFoundButCounted) {
    std::vector<Handle> mutexes = CreateNamed(kMaxNames);
    mutexes[5].Close();
    EXPECT_EQ(Open("name5"), nullptr);
    EXPECT_EQ(Open("name6"), static_cast<HANDLE>(mutexes[6]));

    testkit::StdoutCapture capture;
    const Handle mutex = Mutex("one more");
    EXPECT_EQ(capture.text(), kLimitMessage) << "the place of a closed one is not free";
}

TEST_F(NamedMutex, ClosedMutexUncoversAnotherOfItsName) {
    Handle older = Mutex("name");
    const Handle newer = Mutex("name");
    older.Close();
    EXPECT_EQ(Open("name"), static_cast<HANDLE>(newer));
}

TEST_F(NamedMutex, NullHandleMatchesNoClosedMutex) {
    Handle closed = Mutex("name");
    closed.Close();
    const std::vector<Handle> mutexes = CreateNamed(kMaxNames - 1);
    EXPECT_EQ(ReleaseMutex(nullptr), 0);
    testkit::StdoutCapture capture;
    const Handle mutex = Mutex("one more");
    EXPECT_EQ(capture.text(), kLimitMessage) << "a place became free";
}

TEST_F(NamedMutex, The128thEmptiesTheRegistryAndStillWorks) {
    const std::vector<Handle> mutexes = CreateNamed(kMaxNames);
    EXPECT_EQ(Open("name126"), static_cast<HANDLE>(mutexes[126]));

    testkit::StdoutCapture capture;
    const Handle last = Mutex("last");
    EXPECT_EQ(capture.text(), kLimitMessage);
    EXPECT_EQ(Open("last"), nullptr);
    EXPECT_EQ(Open("name0"), nullptr);
    EXPECT_EQ(Open("name126"), nullptr);
    EXPECT_EQ(WaitForSingleObject(last, 0), 0u);
    OnAnotherThread([&] { EXPECT_EQ(WaitForSingleObject(last, 0), 258u); });
    EXPECT_EQ(ReleaseMutex(last), 1);

    const Handle next = Mutex("next");
    EXPECT_EQ(Open("next"), static_cast<HANDLE>(next)) << "the registry fills again";
}

TEST_F(NamedMutex, The127thIsWithinTheLimit) {
    testkit::StdoutCapture capture;
    const std::vector<Handle> mutexes = CreateNamed(kMaxNames);
    EXPECT_EQ(capture.text(), "");
}

TEST_F(NamedMutex, ThreadsReleaseAndCloseTheirOwnAtTheSameTime) {
    const size_t rounds = sync_kit::Load(2000);
    const auto work = [rounds](const char* name) {
        for (size_t i = 0; i < rounds; ++i) {
            const Handle mutex = Mutex(name);
            EXPECT_EQ(WaitForSingleObject(mutex, 0), 0u);
            EXPECT_EQ(ReleaseMutex(mutex), 1);
        }
    };
    std::thread a(work, "a");
    std::thread b(work, "b");
    a.join();
    b.join();
    EXPECT_EQ(Open("a"), nullptr);
    EXPECT_EQ(Open("b"), nullptr);
}

}  // namespace
