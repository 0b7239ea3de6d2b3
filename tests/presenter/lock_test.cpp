// Which operations of the presenter take its lock, and when it is destroyed. The program stands
// between the library and the C library.

#include <map>

#include "platform/posix_hooks.h"
#include "presenter/presenter_fixture.h"

namespace {

using posix_hooks::Replacement;

std::map<const void*, int> g_locked;     // how often each mutex was locked
std::map<const void*, int> g_destroyed;  // and destroyed
int g_depth;                             // locks of any mutex that are held

int CountLock(pthread_mutex_t* mutex) {
    ++g_locked[mutex];
    ++g_depth;
    return posix_hooks::mutexLock.Real(mutex);
}

int CountUnlock(pthread_mutex_t* mutex) {
    --g_depth;
    return posix_hooks::mutexUnlock.Real(mutex);
}

int CountDestroy(pthread_mutex_t* mutex) {
    ++g_destroyed[mutex];
    return posix_hooks::mutexDestroy.Real(mutex);
}

class PresenterLockTest : public PresenterFixture {
  protected:
    pthread_mutex_t* Mutex() { return &MemberOf(presenter, &PresenterImage::lock)->mutex; }

    /// How often `operation` takes the presenter's lock; it must give it back as often.
    template <typename Operation>
    int LocksOf(Operation operation) {
        g_locked.clear();
        g_depth = 0;
        const Replacement<int(pthread_mutex_t*)> lock(posix_hooks::mutexLock, CountLock);
        const Replacement<int(pthread_mutex_t*)> unlock(posix_hooks::mutexUnlock, CountUnlock);
        operation();
        EXPECT_EQ(g_depth, 0);
        return g_locked[Mutex()];
    }
    int LocksOfSet(DWORD id) {
        uint8_t data[64] = {1};
        return LocksOf([&] { SetData(id, data); });
    }
};

TEST_F(PresenterLockTest, OpenAndCloseTakeItOnceTheirRefusalsNever) {
    EXPECT_EQ(LocksOf([this] { presenter->Close(); }), 0);
    EXPECT_EQ(LocksOf([this] { presenter->Open(&options, 41); }), 0);
    EXPECT_EQ(LocksOf([this] { EXPECT_EQ(Open(), S_OK); }), 1);
    VP_OpenOptionsAdv again = {};
    HRESULT second = S_OK;
    EXPECT_EQ(LocksOf([&] { second = presenter->Open(&again, sizeof again); }), 0);
    EXPECT_EQ(second, E_FAIL);
    EXPECT_EQ(LocksOf([this] { EXPECT_EQ(presenter->Close(), S_OK); }), 1);
}

TEST_F(PresenterLockTest, ReadingNeverTakesIt) {
    ASSERT_EQ(Open(), S_OK);
    EXPECT_EQ(LocksOf([this] { presenter->Render(0); }), 0);
    for (const DWORD id : {0x0000u, 0x0001u, 0x0002u, 0x0003u, 0x0303u, 0x0310u, 0x0401u, 0x0402u,
                           0x0409u, 0x0603u}) {
        uint8_t data[64];
        EXPECT_EQ(LocksOf([&] { GetData(id, data); }), 0) << id;
    }
}

TEST_F(PresenterLockTest, SomePropertiesAreWrittenUnderIt) {
    EXPECT_EQ(LocksOfSet(0x0303), 0) << "closed";
    ASSERT_EQ(Open(), S_OK);
    for (const DWORD id : {0x0001u, 0x0003u, 0x0303u, 0x0402u})
        EXPECT_EQ(LocksOfSet(id), 1) << id;
    EXPECT_EQ(LocksOfSet(0x0003), 1) << "also when the rectangle is the same";
    for (const DWORD id : {0x0002u, 0x0401u, 0x0403u, 0x0404u})
        EXPECT_EQ(LocksOfSet(id), 0) << id;
    for (const DWORD id : {0x030Au, 0x0313u}) {
        EXPECT_EQ(LocksOf([&] { SetSurface(id, window.get()); }), 0) << id;
        EXPECT_EQ(LocksOf([&] { SetSurface(id, otherWindow.get()); }), 0) << id;
    }
}

TEST_F(PresenterLockTest, TableChangesTakeItOnceTheirRefusalsNever) {
    VP_OPEN_STREAM_PARAMS params = {0x1000, 16, 16, 0, {}};
    IJxVideoPresenterStream* stream = nullptr;
    EXPECT_EQ(LocksOf([&] { presenter->CreateStream(&params, 0, &stream); }), 0) << "closed";
    ASSERT_EQ(Open(), S_OK);
    EXPECT_EQ(LocksOf([&] { presenter->CreateStream(&params, 0, &stream); }), 1);
    ASSERT_NE(stream, nullptr);
    params.dwType = 0;
    IJxVideoPresenterStream* none = nullptr;
    EXPECT_EQ(LocksOf([&] { presenter->CreateStream(&params, 0, &none); }), 0);
    EXPECT_EQ(LocksOf([this] { presenter->DestroyStream(nullptr); }), 0);
    EXPECT_EQ(LocksOf([&] { EXPECT_EQ(presenter->DestroyStream(stream), S_OK); }), 1);
    EXPECT_EQ(LocksOf([&] { EXPECT_EQ(presenter->DestroyStream(stream), E_FAIL); }), 0);
}

TEST_F(PresenterLockTest, DestructorsDestroyTheLocksDestroyStreamDoesNot) {
    ASSERT_EQ(Open(), S_OK);
    CVidshowStream* const freed = CreateStream();
    CVidshowStream* const kept = CreateStream();
    pthread_mutex_t* const presenterMutex = Mutex();
    pthread_mutex_t* const freedMutex = &MemberOf(freed, &StreamImage::lock)->mutex;
    pthread_mutex_t* const keptMutex = &MemberOf(kept, &StreamImage::lock)->mutex;
    g_destroyed.clear();
    const Replacement<int(pthread_mutex_t*)> destroy(posix_hooks::mutexDestroy, CountDestroy);
    EXPECT_EQ(presenter->DestroyStream(freed), S_OK);
    EXPECT_EQ(g_destroyed[freedMutex], 0) << "its destructor does not run";
    delete presenter;
    presenter = nullptr;
    EXPECT_EQ(g_destroyed[presenterMutex], 1);
    EXPECT_EQ(g_destroyed[keptMutex], 0) << "streams stay";
    delete kept;
    EXPECT_EQ(g_destroyed[keptMutex], 1);
}

}  // namespace
