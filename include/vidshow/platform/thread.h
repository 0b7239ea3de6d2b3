#ifndef VIDSHOW_PLATFORM_THREAD_H
#define VIDSHOW_PLATFORM_THREAD_H

/// @file
/// Threads, thread messages and thread identity.
///
/// A thread's handle and its id are one value: the address of its `CLinuxThread`. Handles made by
/// `CreateThread` stand in a table of 128 places, and the functions that say so know only those.
///
/// Every thread object has a message queue. Which queue a thread *reads* is another matter: it is
/// that of the thread it created last (see `GetCurrentThread`).
///
/// Suspending uses the signals 10 (SIGUSR1) and 12 (SIGUSR2), whose handlers are installed when the
/// first thread is created; a client leaves both alone, and a thread that blocks them cannot be
/// suspended.
///
/// Thread rule: any thread may call, on any thread's handle, until that is closed.

#include <pthread.h>

#include <atomic>

#include "vidshow/platform/sync.h"

class CLNrwqueue;
namespace vidshow {
struct ThreadLife;
}

/// @name Numbers of threads and messages
/// @{
constexpr DWORD STILL_ACTIVE = 259;    ///< exit code of a thread whose function runs
constexpr DWORD CREATE_SUSPENDED = 4;  ///< `CreateThread`: start suspended
constexpr UINT WM_QUIT = 0x0012;       ///< reading it ends the process
constexpr UINT WM_TIMER = 0x0113;      ///< a timer (platform/timer.h) is due
constexpr UINT PM_NOREMOVE = 0;        ///< `PeekMessage`: leave the message in the queue
constexpr UINT PM_REMOVE = 1;          ///< `PeekMessage`: take the message out
/// @}

/// A message, as a thread reads it.
struct MSG {
    HANDLE hwnd;    ///< never written: there are no windows
    UINT message;   ///< what happened
    WPARAM wParam;  ///< WM_TIMER: the timer's sequence number
    LPARAM lParam;  ///< WM_TIMER: the timer's address
};

/// One thread, its exit code and its message queue.
///
/// Unless it says otherwise an operation returns 0 for success, and -1 or a POSIX error number for
/// failure.
class VIDSHOW_API CLinuxThread : public CLinuxSyncObject {
  public:
    CLinuxThread();            ///< no thread yet
    ~CLinuxThread() override;  ///< leaves a running thread alone: it goes on without its object

    /// Starts a thread, and returns when it runs. From then on it is the calling thread's
    /// current thread.
    /// @param function null: no thread is started, the object stands for the calling thread
    /// @param argument handed to the function
    /// @param priority not looked at
    /// @return the pthread id; -1, as an unsigned number, for failure
    unsigned long Init(unsigned int (*function)(void*), void* argument, int priority);

    void EnableSuspendOnCreate(bool enable);  ///< before `Init`: start suspended

    /// @return the thread that the calling thread created last; null when it has created none, or
    ///         when that one's object is gone
    static CLinuxThread* GetCurrentThread();

    /// Asks the thread to stop where it is; it may take a moment. Does not nest: one resume undoes
    /// any number of suspends.
    int Suspend();
    int Resume();  ///< undoes all suspends; a thread that is not suspended takes no notice

    /// @param priority below 0 and 0: ordinary scheduling; 1 to 99: first-in-first-out real-time
    ///                 scheduling of that priority; above: of 99
    /// @return not 0 also when the system refuses real-time scheduling
    int SetPriority(int priority);
    int GetPriority();  ///< @return the scheduling priority, 0 for ordinary scheduling; or -1

    int Cancel();                                      ///< does nothing; @return 0
    [[noreturn]] static void Exit(unsigned int code);  ///< ends the calling thread
    void SetExitCode(int code);                        ///< of this object
    int GetExitCode();                                 ///< 259 while the function runs
    int WaitForExit();                                 ///< joins; a second time fails

    const char* getType() const override;
    int WaitAction() override;  ///< `WaitForExit`

    /// INFINITE joins the thread. A finite wait looks at the exit code every millisecond and joins
    /// nothing. @return as in the base
    DWORD WaitForSignal(DWORD ms) override;

    /// Takes the oldest message of this object's queue, blocking until there is one. WM_QUIT ends
    /// the process with status 2.
    /// @param message,wParam,lParam receive the message; not null
    /// @return 1; 0 when the queue could not be made
    int GetMessage(unsigned int* message, unsigned int* wParam, long* lParam);

    /// Looks for the oldest message without blocking.
    /// @param message,wParam,lParam receive the message, if there is one; not null
    /// @param min, max              not looked at: every message counts
    /// @param remove                whether to take it out of the queue
    /// @return 1 when there was one, else 0
    int PeekMessage(unsigned int* message, unsigned int* wParam, long* lParam, unsigned int min,
                    unsigned int max, bool remove);

    /// Appends a message.
    /// @param message,wParam,lParam the message
    /// @return 1; 0 when more than 1004 are waiting, or before `Init`
    int PostMessage(unsigned int message, unsigned int wParam, long lParam);

  private:
    bool Prepare();

    std::atomic<pthread_t> m_thread;  ///< 0: no thread, or joined
    CLNrwqueue* m_queue;              ///< null before Init
    vidshow::ThreadLife* m_life;      ///< shared with the thread; null before Init
    std::atomic<int32_t> m_exitCode;
    bool m_suspendOnCreate;  ///< constant from Init on
};

extern "C" {

/// @name The table of threads
/// Data of the layer, exported for debugging; clients only look at it.
/// @{
extern VIDSHOW_API HANDLE gAllThreads[128];        ///< threads of `CreateThread`; 0: free
extern VIDSHOW_API CRITICAL_SECTION gCSAllThread;  ///< guards changes of `gAllThreads`
extern VIDSHOW_API uint8_t gCSInited;              ///< whether gCSAllThread is initialised
extern VIDSHOW_API CLinuxThread* mainthread;       ///< the thread that created the first thread
/// @}

/// @name Threads
/// @{

/// Starts a thread and enters it in the table. The process's first call must not run beside
/// another.
/// @param attributes, stackSize not looked at
/// @param function              what the thread runs; what it returns is the exit code
/// @param argument              handed to the function
/// @param flags 4 starts it suspended, until `ResumeThread`; any other value does not
/// @param id    receives the handle once more; may be null
/// @return the handle; 0xFFFFFFFF, with "thread full " on standard output, when 128 handles are
///         open; null when no thread can be started
VIDSHOW_API HANDLE CreateThread(void* attributes, DWORD stackSize, unsigned int (*function)(void*),
                                void* argument, DWORD flags, HANDLE* id);

/// Starts a thread that does not stand in the table.
/// @param function  what the thread runs
/// @param stackSize not looked at
/// @param argument  handed to the function
/// @return the handle; 0xFFFFFFFF for failure
VIDSHOW_API HANDLE _beginthread(unsigned int (*function)(void*), unsigned int stackSize,
                                void* argument);

/// Starts a thread that does not stand in the table.
/// @param security  null, or the address of a word, which is read and not used
/// @param stackSize not looked at
/// @param function  what the thread runs
/// @param argument  handed to the function
/// @param initFlags not looked at: it never starts suspended
/// @param id        receives the pthread id, not the handle; not null
/// @return the handle; null for failure
VIDSHOW_API HANDLE _beginthreadex(void* security, unsigned int stackSize,
                                  unsigned int (*function)(void*), void* argument,
                                  unsigned int initFlags, unsigned long* id);

/// Ends the calling thread. Its exit code stays 259: timed waits for it time out, only an INFINITE
/// one returns.
[[noreturn]] VIDSHOW_API void _endthread(void);
[[noreturn]] VIDSHOW_API void _endthreadex(unsigned int code);  ///< as `_endthread`
[[noreturn]] VIDSHOW_API void ExitThread(DWORD code);           ///< as `_endthread`

/// Ends nothing: the thread keeps running.
/// @param thread a handle
/// @param code   not looked at
/// @return 1; 0 for what is not in the table
VIDSHOW_API BOOL TerminateThread(HANDLE thread, DWORD code);

/// Tells a thread's exit code.
/// @param thread a handle
/// @param code   receives 259 while the thread's function runs, then what it returned
/// @return 1; 0 for what is not in the table, or a null `code`
VIDSHOW_API BOOL GetExitCodeThread(HANDLE thread, DWORD* code);

/// Tells a thread's priority.
/// @param thread a handle
/// @return the scheduling priority, 0 for ordinary scheduling; 0 for what is not in the table
VIDSHOW_API int GetThreadPriority(HANDLE thread);

/// Changes a thread's scheduling.
/// @param thread   a handle
/// @param priority as for `CLinuxThread::SetPriority`
/// @return 1; 0 for what is not in the table, or when the system refuses
VIDSHOW_API BOOL SetThreadPriority(HANDLE thread, int priority);

/// Asks a thread to stop where it is, whatever it holds; it may take a moment. Does not nest.
/// @param thread a handle
/// @return 1; 0xFFFFFFFF for what is not in the table, or when the thread is gone
VIDSHOW_API DWORD SuspendThread(HANDLE thread);

/// Lets a thread run again, however often it was suspended.
/// @param thread a handle
/// @return as `SuspendThread`
VIDSHOW_API DWORD ResumeThread(HANDLE thread);

/// @return the thread that the CALLING thread created last, not the calling thread: clients rely on
///         reading its queue. Null when it has created none, or when that handle is closed
VIDSHOW_API HANDLE GetCurrentThread(void);
VIDSHOW_API HANDLE GetCurrentThreadId(void);  ///< `GetCurrentThread`

/// @}

/// @name Messages
/// @{

/// Takes the oldest message of the current thread's queue, blocking until there is one. Reading
/// WM_QUIT ends the process with status 2.
/// @param message          receives the message; not null
/// @param window, min, max not looked at
/// @return 1; 0 without a current thread
VIDSHOW_API BOOL GetMessage(MSG* message, HANDLE window, unsigned int min, unsigned int max);

/// Looks for the oldest message of the current thread's queue without blocking.
/// @param message receives the message, if there is one; not null
/// @param window, min, max not looked at
/// @param remove PM_REMOVE takes the message out; any other value leaves it
/// @return 1 when there was one; 0 without one, or without a current thread
VIDSHOW_API BOOL PeekMessage(MSG* message, HANDLE window, unsigned int min, unsigned int max,
                             unsigned int remove);

/// Appends a message to a thread's queue; any thread may, and it never blocks.
/// @param thread                a handle
/// @param message,wParam,lParam the message
/// @return 1; 0 for null, for a closed handle, and when 1005 messages are waiting
VIDSHOW_API BOOL PostThreadMessage(HANDLE thread, unsigned int message, WPARAM wParam,
                                   LPARAM lParam);

/// @}

/// @return the id of the process that started this program: of the parent of the oldest ancestor
///         that runs the same executable. 0 when /proc does not tell. Not the calling process's id
VIDSHOW_API DWORD GetCurrentProcessId(void);

}  // extern "C"

#endif
