// Interlocked counters.
//
// The two pairs differ in strength, and clients rely on each as it is: increments and decrements
// are atomic and totally ordered across the process, the exchanges are plain loads and stores.

#include "vidshow/platform/misc.h"
#include "vidshow/platform/sync.h"

namespace {

// The library's only object with a constructor that runs at load and a destructor that runs at
// exit.
CCRITCALSECTION g_countersLock;

LONG WrappingAdd(LONG a, LONG b) {
    return static_cast<LONG>(static_cast<DWORD>(a) + static_cast<DWORD>(b));
}

// The lock orders the counters among themselves; the exchange keeps the word whole for clients that
// count on it by other atomic means.
LONG AddInOrder(LONG* value, LONG addend) {
    g_countersLock.Enter();
    LONG seen = __atomic_load_n(value, __ATOMIC_RELAXED);
    while (!__atomic_compare_exchange_n(value, &seen, WrappingAdd(seen, addend), true,
                                        __ATOMIC_SEQ_CST, __ATOMIC_RELAXED)) {
    }
    const LONG result = __atomic_load_n(value, __ATOMIC_RELAXED);
    g_countersLock.Leave();
    return result;
}

}  // namespace

extern "C" {

LONG InterlockedIncrement(LONG* value) {
    return AddInOrder(value, 1);
}

LONG InterlockedDecrement(LONG* value) {
    return AddInOrder(value, -1);
}

LONG InterlockedExchange(LONG* value, LONG replacement) {
    const LONG previous = *value;
    *value = replacement;
    return previous;
}

// The sum, not the previous value: clients rely on it.
LONG InterlockedExchangeAdd(LONG* value, LONG addend) {
    *value = WrappingAdd(*value, addend);
    return *value;
}

}  // extern "C"
