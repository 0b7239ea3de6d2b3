// Events, semaphores and mutexes, waited for one by one, for any and for all along random schedules
// of two threads, and compared with a model of a few numbers. The threads take turns, so that the
// model knows the outcome; only a wait that the other thread is about to end is left to sleep
// beside it.

#include <cstdint>
#include <functional>
#include <vector>

#include "fuzz/bytes.h"
#include "fuzz/worker.h"
#include "vidshow/platform/sync.h"

namespace {

using fuzz::Bytes;
using fuzz::Require;
using fuzz::Worker;

const HANDLE kNoHandle = reinterpret_cast<HANDLE>(static_cast<uintptr_t>(0xFFFFFFFF));

enum Kind { manualEvent, autoEvent, semaphore, mutex, kKinds };

/// An object, and what it should be.
struct Object {
    HANDLE handle;
    Kind kind;
    LONG units;      ///< of an event 1 if it is set; of a mutex how often it is owned
    int owner = -1;  ///< of a mutex: the thread that owns it

    bool IsTakeable(int thread) const {
        return kind == mutex ? owner == -1 || owner == thread : units > 0;
    }
    void Take(int thread) {
        if (kind == mutex) {
            ++units;
            owner = thread;
        } else if (kind != manualEvent) {
            --units;
        }
    }
    void GiveBack() {
        if (kind == manualEvent) return;
        if (kind != mutex) {
            ++units;
        } else if (--units == 0) {
            owner = -1;
        }
    }
};

Object MakeObject(Bytes& bytes) {
    const Kind kind = static_cast<Kind>(bytes.Below(kKinds));
    const LONG units =
        kind == mutex ? 0 : static_cast<LONG>(bytes.Below(kind == semaphore ? 3 : 2));
    const HANDLE handle = kind == mutex ? CreateMutex(nullptr, bytes.Bit(), nullptr)
                          : kind == semaphore
                              ? CreateSemaphore(nullptr, units, 1, nullptr)
                              : CreateEvent(nullptr, kind == manualEvent, units, nullptr);
    Require(handle != nullptr, "an object is made");
    return {handle, kind, units};
}

class Schedule {
  public:
    Schedule(Bytes& bytes, Worker& worker) : m_bytes(bytes), m_worker(worker) {
        const size_t count = 1 + bytes.Below(5);
        for (size_t i = 0; i < count; ++i)
            m_objects.push_back(MakeObject(bytes));
    }

    ~Schedule() {
        for (Object& object : m_objects)
            Close(object);
    }
    Schedule(const Schedule&) = delete;
    Schedule& operator=(const Schedule&) = delete;

    void Step() {
        const uint32_t step = m_bytes.Below(16);
        m_thread = m_bytes.Bit() ? 1 : 0;
        if (step < 4) return Change(Any());
        if (step < 8) return WaitForOne(Any());
        if (step < 10) return WaitForAny();
        if (step < 13) return WaitForAll();
        if (step == 13) return AskWithoutHandle();
        if (step == 14) return SleepUntilChanged();
        Object& object = Any();
        Close(object);
        object = MakeObject(m_bytes);
    }

    /// Takes from every object what is left, and counts it.
    void Drain() {
        m_thread = 0;
        for (Object& object : m_objects) {
            LONG left = object.kind == mutex ? object.IsTakeable(0) : object.units;
            for (; left > 0; --left) {
                Require(WaitForSingleObject(object.handle, 0) == WAIT_OBJECT_0, "there is more");
                object.Take(0);
            }
            if (object.kind == manualEvent && object.units > 0) continue;
            if (object.kind == mutex && object.owner == 0) continue;
            Require(WaitForSingleObject(object.handle, 0) == WAIT_TIMEOUT, "there is no more");
        }
    }

  private:
    using Objects = std::vector<Object*>;

    Object& Any() { return m_objects[m_bytes.Below(16) % m_objects.size()]; }

    // On the step's thread.
    void Do(const std::function<void()>& job, int thread) {
        if (thread == 0) return job();
        m_worker.Start(job);
        m_worker.Finish();
    }
    void Do(const std::function<void()>& job) { Do(job, m_thread); }

    void Change(Object& object) {
        if (object.kind == semaphore) return Post(object);
        if (object.kind == mutex) return GiveUp(object);
        const bool set = m_bytes.Bit();
        Do([&] {
            const BOOL done = set ? SetEvent(object.handle) : ResetEvent(object.handle);
            Require(done != 0, "an event is set and reset");
        });
        object.units = set ? 1 : 0;
    }

    void Post(Object& object) {
        const LONG count = static_cast<LONG>(m_bytes.Below(5)) - 1;
        const bool asks = m_bytes.Bit();
        LONG previous = object.units;
        Do([&] {
            Require(ReleaseSemaphore(object.handle, count, asks ? &previous : nullptr) != 0,
                    "a semaphore has no limit");
        });
        Require(previous == object.units, "what there was before");
        if (count > 0) object.units += count;
    }

    void GiveUp(Object& object) {
        Do([&] {
            Require((ReleaseMutex(object.handle) != 0) == (object.owner == m_thread),
                    "its owner gives a mutex back, and nobody else");
        });
        if (object.owner == m_thread) object.GiveBack();
    }

    void WaitForOne(Object& object) {
        const bool takeable = object.IsTakeable(m_thread);
        const DWORD times[] = {0, 60000, INFINITE};
        const DWORD ms = takeable ? m_bytes.Of(times) : 0;
        Do([&] {
            Require(
                WaitForSingleObject(object.handle, ms) == (takeable ? WAIT_OBJECT_0 : WAIT_TIMEOUT),
                "a wait takes what there is");
        });
        if (takeable) object.Take(m_thread);
    }

    // Some objects, one of them more than once perhaps.
    Objects Some() {
        Objects some(m_bytes.Below(5));
        for (Object*& object : some)
            object = &Any();
        return some;
    }
    static std::vector<HANDLE> HandlesOf(const Objects& objects) {
        std::vector<HANDLE> handles;
        for (const Object* object : objects)
            handles.push_back(object != nullptr ? object->handle : nullptr);
        return handles;
    }
    DWORD Wait(const Objects& objects, bool all, DWORD ms) {
        const std::vector<HANDLE> handles = HandlesOf(objects);
        DWORD result = 0;
        Do([&] {
            result =
                WaitForMultipleObjects(static_cast<DWORD>(handles.size()), handles.data(), all, ms);
        });
        return result;
    }

    void WaitForAny() {
        Objects some = Some();
        if (!some.empty() && m_bytes.Below(4) == 0) some[0] = nullptr;
        size_t first = 0;
        while (first < some.size() &&
               (some[first] == nullptr || !some[first]->IsTakeable(m_thread)))
            ++first;
        const bool waits = first < some.size() && m_bytes.Below(4) != 0;
        const DWORD result = Wait(some, false, waits ? INFINITE : 0);
        Require(result == (waits ? WAIT_OBJECT_0 + static_cast<DWORD>(first) : WAIT_FAILED),
                "the first that there is; without time none");
        if (waits) some[first]->Take(m_thread);
    }

    void WaitForAll() {
        const Objects some = Some();
        const std::vector<Object> before = m_objects;
        size_t taken = 0;
        for (; taken < some.size() && some[taken]->IsTakeable(m_thread); ++taken)
            some[taken]->Take(m_thread);
        const bool complete = taken == some.size() && taken > 0;
        if (!complete) m_objects = before;
        const DWORD result = Wait(some, true, complete && m_bytes.Bit() ? INFINITE : 0);
        Require(result == (some.empty() ? WAIT_FAILED
                           : complete   ? WAIT_OBJECT_0
                                        : WAIT_TIMEOUT),
                "all of them or none");
    }

    void AskWithoutHandle() {
        const HANDLE handle = m_bytes.Bit() ? nullptr : kNoHandle;
        Do([&] {
            Require(WaitForSingleObject(handle, INFINITE) == WAIT_FAILED, "no handle, no wait");
            Require(SetEvent(handle) == 0 && ResetEvent(handle) == 0, "no handle, no event");
            Require(ReleaseSemaphore(handle, 1, nullptr) == 0, "no handle, no semaphore");
            Require(ReleaseMutex(handle) == 0, "no handle, no mutex");
            Require(CloseHandle(handle) == 0, "no handle, nothing to close");
        });
    }

    // The worker waits for what this thread then makes takeable.
    void SleepUntilChanged() {
        Objects wanted;
        const bool all = m_bytes.Bit();
        for (Object& object : m_objects) {
            if ((all || wanted.empty()) && m_bytes.Below(4) != 0) wanted.push_back(&object);
        }
        if (wanted.empty()) return;
        const std::vector<HANDLE> handles = HandlesOf(wanted);
        DWORD result = WAIT_FAILED;
        m_worker.Start([&] {
            result = all ? WaitForMultipleObjects(static_cast<DWORD>(handles.size()),
                                                  handles.data(), TRUE, INFINITE)
                         : WaitForSingleObject(handles[0], INFINITE);
        });
        for (Object* object : wanted)
            MakeTakeable(*object);
        m_worker.Finish();
        Require(result == WAIT_OBJECT_0, "a wait ends when it can");
        for (Object* object : wanted)
            object->Take(1);
    }

    static void MakeTakeable(Object& object) {
        if (object.IsTakeable(1)) return;
        if (object.kind == mutex) {
            while (object.owner == 0) {
                Require(ReleaseMutex(object.handle) != 0, "the owner gives it back");
                object.GiveBack();
            }
            return;
        }
        Require(object.kind == semaphore ? ReleaseSemaphore(object.handle, 1, nullptr) != 0
                                         : SetEvent(object.handle) != 0,
                "it is made takeable");
        object.units = 1;
    }

    void Close(Object& object) {
        while (object.kind == mutex && object.units > 0) {
            Do([&] { Require(ReleaseMutex(object.handle) != 0, "the owner gives it back"); },
               object.owner);
            object.GiveBack();
        }
        Require(CloseHandle(object.handle) != 0, "an object is closed");
    }

    Bytes& m_bytes;
    Worker& m_worker;
    std::vector<Object> m_objects;
    int m_thread = 0;
};

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    static Worker worker;
    Bytes bytes(data, size);
    Schedule schedule(bytes, worker);
    while (!bytes.empty())
        schedule.Step();
    schedule.Drain();
    return 0;
}
