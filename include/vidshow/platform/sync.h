#ifndef VIDSHOW_PLATFORM_SYNC_H
#define VIDSHOW_PLATFORM_SYNC_H

/// @file
/// Critical sections, and the objects that can be waited for: events, semaphores, mutexes.
///
/// A handle is the address of an object of the `CLinuxSyncObject` family. Functions refuse the
/// invalid values that are listed with them; any other value is trusted to be an object of the
/// class that the function is about. Every object lives until `CloseHandle`; nothing is counted,
/// and a handle must not be closed while a thread waits for it.
///
/// Thread rule: any thread may call anything here at any time, on the same object too, once that
/// is made and until it is closed.

#include <pthread.h>
#include <semaphore.h>

#include <atomic>

#include "vidshow/types.h"

/// What `CreateFile`, `CreateFileMapping` and a full thread table answer; never a handle.
#define INVALID_HANDLE_VALUE (reinterpret_cast<HANDLE>(static_cast<uintptr_t>(0xFFFFFFFFu)))

/// A recursive mutex with the attribute object that it was made with, which lives as long.
struct CRITICAL_SECTION {
    pthread_mutex_t mutex;          ///< recursive
    pthread_mutexattr_t attribute;  ///< what it was made with
};

extern "C" {

/// Makes a recursive mutex. Every section is initialised before use and deleted once. None of these
/// calls takes null.
/// @param cs memory of a section, owned by the caller
VIDSHOW_API void InitializeCriticalSection(CRITICAL_SECTION* cs);

/// Destroys the mutex, then its attributes. No thread may hold the section.
VIDSHOW_API void DeleteCriticalSection(CRITICAL_SECTION* cs);

/// Enters, waiting while another thread is inside. The owner may enter again, and leaves as often.
VIDSHOW_API void EnterCriticalSection(CRITICAL_SECTION* cs);

/// @return 1 when entered (also by the owner, once more); 0 when another thread is inside
VIDSHOW_API BOOL TryEnterCriticalSection(CRITICAL_SECTION* cs);

/// Leaves a section that the calling thread entered.
VIDSHOW_API void LeaveCriticalSection(CRITICAL_SECTION* cs);

}  // extern "C"

/// Owns one critical section.
class VIDSHOW_API CCRITCALSECTION {
  public:
    CCRITCALSECTION();
    CCRITCALSECTION(const CCRITCALSECTION&) = delete;
    CCRITCALSECTION& operator=(const CCRITCALSECTION&) = delete;
    virtual ~CCRITCALSECTION();

    void Enter();  ///< `EnterCriticalSection`
    void Leave();  ///< `LeaveCriticalSection`

  private:
    CRITICAL_SECTION m_cs;
};

/// An object that can be waited for.
///
/// A wait is made of three virtual operations: `isSignaled` (can it be taken now), `WaitAction`
/// (take it) and `WaitForSignal` (block until it can be taken, and take it). `Release` undoes a
/// take. Taking and testing happen under the state lock, so that among the waiters of one object
/// each take has one winner.
///
/// Unless it says otherwise an operation returns 0 for success, and -1 or a POSIX error number for
/// failure.
class VIDSHOW_API CLinuxSyncObject {
  public:
    CLinuxSyncObject();  ///< not signalled
    CLinuxSyncObject(const CLinuxSyncObject&) = delete;
    CLinuxSyncObject& operator=(const CLinuxSyncObject&) = delete;
    virtual ~CLinuxSyncObject();

    /// @return the same empty text for every class: it does not tell classes apart
    virtual const char* getType() const = 0;

    /// Takes the object. The state lock is held and `isSignaled` has just answered true.
    virtual int WaitAction() = 0;

    /// Blocks until the object can be taken, takes it, and returns.
    /// @param ms milliseconds of the wall clock; 0 does not block, INFINITE has no end
    /// @return WAIT_OBJECT_0; WAIT_TIMEOUT; WAIT_FAILED if the clock cannot be read, a lock or a
    ///         wait reports an error, or the take fails. Wake-ups without cause do not show.
    virtual DWORD WaitForSignal(DWORD ms);

    /// @return whether the object can be taken now; certain only under the state lock
    virtual bool isSignaled();

    /// Undoes one take. Here: nothing.
    virtual int Release();

    /// Sets or clears the signalled flag. Going from clear to set wakes all waiters; each looks for
    /// itself whether the object is left for it.
    /// @param signaled the flag's new value
    /// @param lock     take the state lock; false when the caller holds it
    int SetSignaled(bool signaled, bool lock);

    /// `::WaitForMultipleObjects`
    static DWORD WaitForMultipleObjects(DWORD count, const HANDLE* handles, BOOL all, DWORD ms);

  protected:
    pthread_mutex_t m_lock;      ///< the state lock, recursive
    pthread_cond_t m_condition;  ///< with m_lock; broadcast when m_signaled becomes true
    bool m_signaled;             ///< guarded by m_lock
    bool m_flag;                 ///< the subclass's; constant while the object is shared
};

/// Signalled or not, until somebody changes it. A wait clears an auto-reset event, so that one
/// `Set` lets one waiter through.
class VIDSHOW_API CLinuxEvent : public CLinuxSyncObject {
  public:
    CLinuxEvent();
    ~CLinuxEvent() override;

    int Init(bool manualReset, bool initialState);  ///< before first use; @return 0
    int Set();                                      ///< signals the event
    int Reset();                                    ///< clears the signal

    const char* getType() const override;
    int WaitAction() override;
    int Release() override;  ///< auto-reset: `Set`; manual-reset: nothing
};

/// A number of units; a wait takes one.
class VIDSHOW_API CLinuxSemaphore : public CLinuxSyncObject {
  public:
    CLinuxSemaphore();
    ~CLinuxSemaphore() override;

    /// Before first use.
    /// @param initial units at the start, 0..SEM_VALUE_MAX
    /// @param maximum not looked at: the units have no limit of their own
    /// @return 0; not 0 when `initial` is negative or above the system's SEM_VALUE_MAX
    int Init(LONG initial, LONG maximum);

    /// Adds up to `count` units, stopping where the system's SEM_VALUE_MAX is reached. Nothing is
    /// added for a `count` of 0 or less.
    /// @param count    units to add
    /// @param previous receives the units there were before; may be null
    /// @return 0 when a unit was added or none was asked for
    int Release(LONG count, LONG* previous);

    const char* getType() const override;
    int WaitAction() override;
    int Release() override;  ///< adds one unit

  private:
    sem_t m_semaphore;  ///< changed under m_lock
};

/// Owned by one thread at a time, which may take it again and releases it as often.
class VIDSHOW_API CLinuxMutex : public CLinuxSyncObject {
  public:
    CLinuxMutex();
    ~CLinuxMutex() override;

    int Init();    ///< before first use: free
    int Delete();  ///< back to the state before `Init`; waits and releases fail from then on

    const char* getType() const override;
    int WaitAction() override;
    DWORD WaitForSignal(DWORD ms) override;  ///< WAIT_FAILED at once before `Init`
    bool isSignaled() override;              ///< free, or the calling thread's already
    int Release() override;                  ///< fails unless the calling thread is the owner

  private:
    bool IsMine() const;

    pthread_mutex_t m_mutex;  ///< recursive; locked and unlocked under m_lock
    int32_t m_count;          ///< takes of the owner; guarded by m_lock
    pthread_t m_owner;        ///< 0xDEADBEEF without one; guarded by m_lock
};

/// One wait for any of several objects, from registration to destruction, on the waiter's stack.
/// At most 20 are registered at any time in the process.
class VIDSHOW_API CLinuxMultiWait : public CLinuxSyncObject {
  public:
    enum { kMaxWaiters = 20 };

    /// @param count   how many handles
    /// @param handles kept by address as long as the wait lives; null entries are passed over
    CLinuxMultiWait(DWORD count, const HANDLE* handles);
    ~CLinuxMultiWait() override;  ///< unregisters

    int Init();                      ///< registers; not 0 when 20 waiters are registered
    DWORD GetSignaledIndex() const;  ///< which object `isSignaled` took

    /// Marks every registered wait whose handles contain `object` as signalled. Waits do not need
    /// it: they look at their objects by themselves.
    /// @return 0; 1 when nobody is registered, 2 when nobody waits for `object`, or a lock error
    static int Signal(HANDLE object);

    const char* getType() const override;
    int WaitAction() override;  ///< unregisters; the caller holds m_mutex

    /// Looks at the objects every 10 ms. @return 0; 0xFFFFFFFF when `ms` have passed: a wait of
    /// 0 ms looks at nothing
    DWORD WaitForSignal(DWORD ms) override;

    /// Takes the first object that can be taken, if there is one.
    bool isSignaled() override;

  private:
    DWORD m_count;
    const HANDLE* m_handles;
    DWORD m_index;

    static pthread_mutex_t m_mutex;                  ///< guards the two below
    static std::atomic<uint32_t> m_waitcount;        ///< filled places; read without the lock
    static CLinuxMultiWait* m_waiters[kMaxWaiters];  ///< null: free
};

extern "C" {

/// @name Waits
/// @{

/// Waits until an object can be taken, and takes it: clears an auto-reset event, takes a unit of a
/// semaphore, owns a mutex.
/// @param handle an object of any class
/// @param ms     milliseconds of the wall clock; 0 does not block, INFINITE has no end
/// @return WAIT_OBJECT_0; WAIT_TIMEOUT; WAIT_FAILED for the handles 0 and 0xFFFFFFFF, or when the
///         wait itself fails
VIDSHOW_API DWORD WaitForSingleObject(HANDLE handle, DWORD ms);

/// Waits for any object, or for all.
///
/// For any: looks at the objects every 10 ms, in order, and takes the first that can be taken. The
/// time ends when `timeGetTime()` reaches its present value plus `ms`, modulo 2^32; at its end, so
/// at once for 0, nothing is looked at.
///
/// For all: takes the objects one at a time, gives back what it has when one is missing, and then
/// blocks on that one; at the end all are taken or none. Naming an object twice that cannot be
/// taken twice never ends.
/// @param count   any: of the handles; null handles are passed over. all: at least 1
/// @param handles the objects, not null; read only during the call
/// @param all     not 0: all
/// @param ms      milliseconds of the wall clock; INFINITE has no end
/// @return any: WAIT_OBJECT_0 + index; WAIT_FAILED, not WAIT_TIMEOUT, when the time runs out, and
///         when 20 such waits are under way. all: WAIT_OBJECT_0; WAIT_TIMEOUT; WAIT_FAILED for a
///         count of 0 or when waiting for an object fails
VIDSHOW_API DWORD WaitForMultipleObjects(DWORD count, const HANDLE* handles, BOOL all, DWORD ms);

/// Destroys an object of any class at once; nobody may be waiting for it.
/// @param handle the object
/// @return 1; 0 for the handles 0 and 0xFFFFFFFF
VIDSHOW_API BOOL CloseHandle(HANDLE handle);

/// @}

/// @name Events
/// `attributes` and `name` are not looked at: events are never shared by name.
/// @{

/// Makes an event, to be closed by `CloseHandle`.
/// @param attributes,name not looked at, may be null
/// @param manual  not 0: stays signalled until `ResetEvent`; 0: until one wait has taken it
/// @param initial not 0: signalled from the start
/// @return the event; null without memory
VIDSHOW_API HANDLE CreateEvent(void* attributes, BOOL manual, BOOL initial, const char* name);

/// Signals an event; one waiter of an auto-reset event takes it, all those of a manual-reset one.
/// @param event the event
/// @return 1; 0 for the handles 0 and 0xFFFFFFFF or when a lock reports an error
VIDSHOW_API BOOL SetEvent(HANDLE event);

/// Clears an event's signal.
/// @param event the event
/// @return as `SetEvent`
VIDSHOW_API BOOL ResetEvent(HANDLE event);

/// @}

/// @name Semaphores
/// `attributes` and `name` are not looked at: semaphores are never shared by name.
/// @{

/// Makes a semaphore, to be closed by `CloseHandle`.
/// @param attributes,name not looked at, may be null
/// @param initial         units at the start
/// @param maximum         not looked at
/// @return the semaphore; null when `initial` is negative or above SEM_VALUE_MAX, or without memory
VIDSHOW_API HANDLE CreateSemaphore(void* attributes, LONG initial, LONG maximum, const char* name);

/// Adds units.
/// @param semaphore the semaphore
/// @param count     how many; 0 or less adds none and only tells
/// @param previous  receives the units there were before; may be null
/// @return 1; 0 for the handles 0 and 0xFFFFFFFF, or when SEM_VALUE_MAX leaves no room for one unit
VIDSHOW_API BOOL ReleaseSemaphore(HANDLE semaphore, LONG count, LONG* previous);

/// @}

/// @name Mutexes
/// @{

/// Makes a free mutex, to be closed by `CloseHandle`. Two calls with one name make two mutexes.
/// @param attributes   not looked at, may be null
/// @param initialOwner not looked at: the caller does not own it
/// @param name         remembered for `OpenMutex`; may be null. 127 names are remembered; one more
///                     forgets all of them, its own too, and prints "CreateMutex exceed the limit"
/// @return the mutex; null when memory or a lock cannot be had
VIDSHOW_API HANDLE CreateMutex(void* attributes, BOOL initialOwner, const char* name);

/// Finds a mutex by its name, which `ReleaseMutex` or `CloseHandle` makes it lose. The handle found
/// is the one that `CreateMutex` returned, to be closed once.
/// @param access,inherit not looked at
/// @param name           the name; null finds none
/// @return the oldest mutex of that name; null when there is none
VIDSHOW_API HANDLE OpenMutex(DWORD access, BOOL inherit, const char* name);

/// Gives up the calling thread's last take of a mutex. In any case the mutex loses its name.
/// @param mutex the mutex
/// @return 1; 0 when the calling thread does not own it, and for 0, 0xFFFFFFFE and 0xFFFFFFFF
VIDSHOW_API BOOL ReleaseMutex(HANDLE mutex);

/// @}

}  // extern "C"

#endif
