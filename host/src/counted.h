#pragma once

#include <atomic>
#include <cstdint>

struct android_native_base_t;

namespace vidshow::host {

/// Reference counts for a `Native` (a window or a buffer), behind its `common` hooks. `Derived`
/// goes with the last reference. It starts without one: hold it in an `android::sp`.
template <typename Derived, typename Native>
class Counted : public Native {
  public:
    Counted(const Counted&) = delete;
    Counted& operator=(const Counted&) = delete;

    int32_t strongCount() const { return m_strong.load(std::memory_order_relaxed); }

    /// How many objects of the class exist in the process.
    static int32_t live() { return s_live.load(std::memory_order_relaxed); }

  protected:
    Counted() {
        this->common.incRef = acquire;
        this->common.decRef = release;
        s_live.fetch_add(1, std::memory_order_relaxed);
    }
    ~Counted() { s_live.fetch_sub(1, std::memory_order_relaxed); }

  private:
    static Counted* from(android_native_base_t* base) {
        // The head is the first member of a window and of a buffer.
        return static_cast<Counted*>(reinterpret_cast<Native*>(base));
    }
    static void acquire(android_native_base_t* base) {
        from(base)->m_strong.fetch_add(1, std::memory_order_relaxed);
    }
    static void release(android_native_base_t* base) {
        Counted* const self = from(base);
        // Release: what this holder did comes before the end. Acquire: the end sees what all did.
        if (self->m_strong.fetch_sub(1, std::memory_order_acq_rel) != 1) return;
        delete static_cast<Derived*>(self);
    }

    static inline std::atomic<int32_t> s_live{0};
    std::atomic<int32_t> m_strong{0};
};

}  // namespace vidshow::host
