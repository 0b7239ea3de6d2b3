// Every request of the platform layer refused in turn: what its calls answer then, and that nothing
// stays behind.

#include <fcntl.h>
#include <sys/mman.h>
#include <unistd.h>

#include <cstdio>

#include "faults/in_turn.h"
#include "vidshow/platform.h"

namespace {

using faults::RefuseEachInTurn;

void Close(HANDLE handle) {
    EXPECT_EQ(CloseHandle(handle), handle != nullptr);
}

/// A wait without time for an object that is there: it is taken, or the wait says that it failed.
bool TakeNow(HANDLE handle) {
    const DWORD result = WaitForSingleObject(handle, 0);
    EXPECT_TRUE(result == WAIT_OBJECT_0 || result == WAIT_FAILED) << result;
    return result == WAIT_OBJECT_0;
}

TEST(PlatformFaults, Event) {
    const int requests = RefuseEachInTurn([] {
        const HANDLE event = CreateEvent(nullptr, FALSE, FALSE, nullptr);
        const BOOL set = SetEvent(event);
        EXPECT_TRUE(event != nullptr || set == FALSE);
        if (set != FALSE) {
            TakeNow(event);
        } else {
            EXPECT_EQ(WaitForSingleObject(event, 0), event != nullptr ? WAIT_TIMEOUT : WAIT_FAILED);
        }
        EXPECT_TRUE(ResetEvent(event) == (event != nullptr) || set != FALSE);
        Close(event);
    });
    EXPECT_GE(requests, 4) << "memory, and a lock for each call";
}

TEST(PlatformFaults, Semaphore) {
    const int requests = RefuseEachInTurn([] {
        const HANDLE semaphore = CreateSemaphore(nullptr, 1, 1, nullptr);
        LONG before = 1;
        const BOOL released = ReleaseSemaphore(semaphore, 2, &before);
        EXPECT_EQ(before, 1) << "what there was, or nothing said";
        EXPECT_TRUE(semaphore != nullptr || released == FALSE);
        if (released != FALSE) TakeNow(semaphore);
        Close(semaphore);
    });
    EXPECT_GE(requests, 6);
}

TEST(PlatformFaults, Mutex) {
    const int requests = RefuseEachInTurn([] {
        const HANDLE mutex = CreateMutex(nullptr, FALSE, nullptr);
        if (mutex != nullptr && WaitForSingleObject(mutex, 0) == WAIT_OBJECT_0) {
            const BOOL released = ReleaseMutex(mutex);
            EXPECT_TRUE(released != FALSE || ReleaseMutex(mutex) != FALSE)
                << "one refusal, one failure";
        }
        Close(mutex);
    });
    EXPECT_GE(requests, 4);
}

TEST(PlatformFaults, WaitsForSeveral) {
    const int requests = RefuseEachInTurn([] {
        const HANDLE events[] = {CreateEvent(nullptr, TRUE, FALSE, nullptr),
                                 CreateEvent(nullptr, TRUE, FALSE, nullptr)};
        if (events[0] != nullptr && events[1] != nullptr) {
            for (const HANDLE event : events)
                EXPECT_TRUE(SetEvent(event) != FALSE || SetEvent(event) != FALSE);
            const DWORD any = WaitForMultipleObjects(2, events, FALSE, INFINITE);
            EXPECT_TRUE(any == WAIT_OBJECT_0 || any == WAIT_OBJECT_0 + 1 || any == WAIT_FAILED)
                << any;
            const DWORD all = WaitForMultipleObjects(2, events, TRUE, INFINITE);
            EXPECT_TRUE(all == WAIT_OBJECT_0 || all == WAIT_FAILED) << all;
        }
        for (const HANDLE event : events)
            Close(event);
    });
    EXPECT_GE(requests, 8);
}

unsigned int Return7(void*) {
    return 7;
}

// As the waits say: INFINITE joins, and a join that could not be tried may be asked for again.
void Join(HANDLE thread) {
    if (WaitForSingleObject(thread, INFINITE) == WAIT_OBJECT_0) return;
    EXPECT_EQ(WaitForSingleObject(thread, INFINITE), WAIT_OBJECT_0);
}

TEST(PlatformFaults, Thread) {
    const int requests = RefuseEachInTurn([] {
        HANDLE id = nullptr;
        const HANDLE thread = CreateThread(nullptr, 0, Return7, nullptr, 0, &id);
        if (thread == nullptr || thread == INVALID_HANDLE_VALUE) return;
        EXPECT_EQ(id, thread);
        Join(thread);
        DWORD code = 0;
        EXPECT_EQ(GetExitCodeThread(thread, &code), TRUE);
        EXPECT_EQ(code, 7u);
        Close(thread);
    });
    EXPECT_GE(requests, 4);
}

// The queue looks at no result of its own mutex: one whose release is refused stays with the
// thread.
TEST(PlatformFaults, Queue) {
    const auto scenario = [] {
        CLNrwqueue queue(2, sizeof(int));
        int item = 5;
        const int written = queue.WriteItem(&item);
        queue.EndOfFile();  // a reader is let go in any case
        int got = 5;
        const int read = queue.ReadItem(&got);
        EXPECT_TRUE(read == 0 || (written == 1 && got == 5));
        queue.Flush(nullptr);
        EXPECT_EQ(queue.GetCount(), 0u);
    };
    EXPECT_GE(RefuseEachInTurn(scenario, 1), 5);
}

class File {
  public:
    File() {
        const int file = mkstemp(m_path);
        EXPECT_GE(file, 0);
        close(file);
    }
    ~File() { unlink(m_path); }
    const char* path() const { return m_path; }

  private:
    char m_path[32] = "/tmp/vidshow-faults-XXXXXX";
};

void MapAndLook(HANDLE file) {
    const HANDLE mapping = CreateFileMapping(file, nullptr, MAP_SHARED, 0, 0, nullptr);
    if (mapping == INVALID_HANDLE_VALUE) return;
    void* const view = MapViewOfFile(mapping, PROT_READ, 0, 0, 0);
    if (view != nullptr) {
        EXPECT_EQ(*static_cast<const char*>(view), 'x');
        EXPECT_EQ(UnmapViewOfFileEx(view, 4), TRUE);
    }
    Close(mapping);
}

TEST(PlatformFaults, FileAndMapping) {
    const File file;
    const int requests = RefuseEachInTurn([&] {
        const HANDLE handle = CreateFile(file.path(), O_RDWR, 0, nullptr, 0, 0);
        if (handle == INVALID_HANDLE_VALUE) return;
        DWORD written = 0;
        EXPECT_EQ(WriteFile(handle, "xyz", 4, &written, nullptr), TRUE);
        EXPECT_EQ(written, 4u);
        MapAndLook(handle);
        Close(handle);
    });
    EXPECT_EQ(requests, 5) << "memory twice, open, dup and mmap";
}

TEST(PlatformFaults, Pipe) {
    const int requests = RefuseEachInTurn([] {
        HANDLE readEnd = nullptr, writeEnd = nullptr;
        const BOOL made = CreatePipe(&readEnd, &writeEnd, nullptr, 0);
        EXPECT_EQ(made != FALSE, readEnd != nullptr);
        EXPECT_EQ(made != FALSE, writeEnd != nullptr);
        Close(readEnd);
        Close(writeEnd);
    });
    EXPECT_EQ(requests, 3) << "the pipe and two ends";
}

void DoNothing(void*, unsigned int, unsigned int, DWORD) {}

TEST(PlatformFaults, Timer) {
    const int requests = RefuseEachInTurn([] {
        CLinuxTimerMgr manager;
        CLinuxTimer* const timer = manager.SetTimer(60000, DoNothing);
        if (timer != nullptr) manager.KillTimer(timer);
    });
    EXPECT_GE(requests, 4);
}

}  // namespace
