#ifndef VIDSHOW_PLATFORM_TIMER_H
#define VIDSHOW_PLATFORM_TIMER_H

/// @file
/// Periodic timers that post messages to their owner's thread.
///
/// A client makes a `CLinuxTimerMgr` and sets timers with it; the layer has none of its own. The
/// plain functions at the end are inert.
///
/// A timer belongs to what `GetCurrentThreadId` answers when the timer is made: to the thread that
/// the caller created LAST, whose messages the caller's `GetMessage` reads. Starting the timer
/// thread makes that the last one. A thread that is to read its timers therefore calls
/// `LaunchTimerThread` first and sets its timers then; a timer that is set before has no owner, or
/// an older one.

#include <pthread.h>

#include <atomic>

#include "vidshow/types.h"

/// A moment of the wall clock.
class VIDSHOW_API CLinuxTimeVal {
  public:
    CLinuxTimeVal();  ///< zero

    void Now();              ///< zero when the clock cannot be read
    void Add(uint64_t ms);   ///< moves it later; the seconds wrap at 32 bits
    operator DWORD() const;  ///< milliseconds, modulo 2^32

    int32_t sec;   ///< seconds since 1970
    int32_t nsec;  ///< 0..999999999
};
static_assert(sizeof(CLinuxTimeVal) == 8, "two words");

/// One periodic timer.
class VIDSHOW_API CLinuxTimer {
  public:
    CLinuxTimer();  ///< owned by the calling thread's current thread
    CLinuxTimer(const CLinuxTimer&) = delete;
    CLinuxTimer& operator=(const CLinuxTimer&) = delete;
    virtual ~CLinuxTimer();

    /// Sets the period, and the first expiry to one period from now. @param ms 0 means 15
    /// @return 0
    int Init(DWORD ms);

    bool IsValid(DWORD sequence) const;  ///< whether that is the timer's sequence number

  private:
    friend class CLinuxTimerMgr;

    HANDLE m_owner;    ///< receives the messages; null: nobody
    DWORD m_sequence;  ///< 1 for the process's first timer
    DWORD m_period;    ///< milliseconds
    CLinuxTimeVal m_expiry;
    CLinuxTimer* m_next;  ///< in the manager's list

    static std::atomic<DWORD> _sequence_count;
};

/// What a client passes along with a timer. It is never called.
typedef void (*TIMERPROC)(void* window, unsigned int message, unsigned int id, DWORD time);

/// A list of timers and the thread that posts their messages: WM_TIMER with the timer's sequence
/// number as wParam and its address as lParam. A message may wait in its queue after its timer is
/// killed; `IsValid` tells.
///
/// Timers are by the wall clock. Any thread may call, except the timer thread and, for
/// `KillTimerThread`, a second one at the same time.
class VIDSHOW_API CLinuxTimerMgr {
  public:
    CLinuxTimerMgr();  ///< no timer, no thread
    CLinuxTimerMgr(const CLinuxTimerMgr&) = delete;
    CLinuxTimerMgr& operator=(const CLinuxTimerMgr&) = delete;
    ~CLinuxTimerMgr();  ///< `KillTimerThread`

    /// Makes and starts a timer. @param ms the period in milliseconds; 0 means 15
    /// @param callback not looked at @return the timer; null for failure
    CLinuxTimer* SetTimer(unsigned int ms, TIMERPROC callback);

    /// Starts a timer, and the timer thread if there is none. Adding a timer of the list again
    /// moves it to where its expiry belongs, before others of the same. The list owns its timers.
    /// @return 0; 1 for null or when a lock or a condition reports an error
    int AddTimer(CLinuxTimer* timer);

    /// Takes a timer out of the list; it is the caller's then. One that is not there is no error.
    /// @return as `AddTimer`
    int RemoveTimer(CLinuxTimer* timer);

    /// Removes and deletes a timer. @return 0; -1 for null; -2 when it could not be removed
    int KillTimer(CLinuxTimer* timer);

    /// @return whether the timer, which may be gone, is in the list and has that sequence number
    bool IsValid(const CLinuxTimer* timer, DWORD sequence);

    /// Starts the timer thread, which becomes the calling thread's current thread.
    /// @return 0; -1 when there is one
    int LaunchTimerThread();

    /// Ends the timer thread and deletes all timers. A timer that is set later starts a new thread.
    /// @return 0; -1 when there is no thread
    int KillTimerThread();

    static unsigned int ThreadFn(void* manager);  ///< the timer thread; -1 for null

    void PrintAlarmList(const char* title) const;  ///< prints nothing

  private:
    int Thread();
    bool IsNext(const CLinuxTimer* timer) const;
    int WaitForTimers();
    int WaitUntilDue(const CLinuxTimer* timer, bool* due);
    int PostAndAdvance(CLinuxTimer* timer);
    int addToAlarmList(CLinuxTimer* timer);
    int removeFromAlarmList(CLinuxTimer* timer);
    void DeleteTimers();

    HANDLE m_thread;      ///< null: none. Guarded by m_mutex, like the rest
    CLinuxTimer* m_head;  ///< ascending by expiry; of equal ones the last added is first
    pthread_mutex_t m_mutex;
    pthread_cond_t m_condition;  ///< with m_mutex; signalled at every change
    CLinuxTimeVal m_current;     ///< what the timer thread waits for; zero when for nothing
    bool m_quit;                 ///< the timer thread is to end
};

extern "C" {

/// The most milliseconds that a message was ever posted after its timer's expiry.
extern VIDSHOW_API DWORD TR_max_expire_delay;

/// @name Inert functions
/// @{
VIDSHOW_API UINT SetTimer(void* window, unsigned int id, unsigned int ms,
                          TIMERPROC callback);              ///< does nothing; @return 1
VIDSHOW_API BOOL KillTimer(void* window, unsigned int id);  ///< does nothing; @return 1
VIDSHOW_API void ZEB_KillTimerThread(void);                 ///< does nothing
VIDSHOW_API BOOL ZEB_IsValidTimer(unsigned int sequence);   ///< @return 1
/// @}

}  // extern "C"

#endif
