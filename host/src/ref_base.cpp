// Counted objects. Every strong reference holds a weak one, so the counters outlive the object. The
// strong count starts at a large value instead of 0, which tells an object that was never
// referenced from one whose references are gone.

#include <atomic>

#include "presenter/android/media_framework.h"

namespace android {

namespace {

constexpr int32_t kNeverReferenced = 1 << 28;
constexpr uint32_t kFirstIncStrong = 1;  // flag of onIncStrongAttempted

}  // namespace

class RefBase::weakref_impl : public RefBase::weakref_type {
  public:
    explicit weakref_impl(RefBase* object) : base(object) {}

    static weakref_impl* from(weakref_type* counters) {
        return static_cast<weakref_impl*>(counters);
    }
    static const weakref_impl* from(const weakref_type* counters) {
        return static_cast<const weakref_impl*>(counters);
    }

    // Adds a strong reference unless the object is gone. Returns the count before; 0 is "gone".
    int32_t tryAddStrong() {
        int32_t count = strong.load(std::memory_order_relaxed);
        while (count > 0 && !strong.compare_exchange_weak(count, count + 1)) {
        }
        return count;
    }

    // Whoever takes the first reference drops the starting value and tells the object.
    void announceFirst(int32_t countBefore) {
        if (countBefore != kNeverReferenced) return;
        strong.fetch_sub(kNeverReferenced, std::memory_order_relaxed);
        base->onFirstRef();
    }

    std::atomic<int32_t> strong{kNeverReferenced};
    std::atomic<int32_t> weak{0};
    RefBase* const base;
};

RefBase* RefBase::weakref_type::refBase() const {
    return weakref_impl::from(this)->base;
}

void RefBase::weakref_type::incWeak(const void* /*id*/) {
    weakref_impl::from(this)->weak.fetch_add(1, std::memory_order_relaxed);
}

void RefBase::weakref_type::decWeak(const void* /*id*/) {
    weakref_impl* const counters = weakref_impl::from(this);
    // Release: what this holder did comes before the end. Acquire: the end sees what all did.
    if (counters->weak.fetch_sub(1, std::memory_order_acq_rel) != 1) return;
    if (counters->strong.load(std::memory_order_relaxed) == kNeverReferenced) {
        delete counters->base;  // its destructor frees the counters
    } else {
        delete counters;
    }
}

bool RefBase::weakref_type::attemptIncStrong(const void* id) {
    incWeak(id);
    weakref_impl* const counters = weakref_impl::from(this);
    const int32_t before = counters->tryAddStrong();
    if (before <= 0) {
        decWeak(id);
        return false;
    }
    counters->announceFirst(before);
    return true;
}

int32_t RefBase::weakref_type::getWeakCount() const {
    return weakref_impl::from(this)->weak.load(std::memory_order_relaxed);
}

RefBase::RefBase() : mRefs(new weakref_impl(this)) {}

RefBase::~RefBase() {
    // Without a strong reference ever taken, nobody else comes to free the counters.
    if (mRefs->strong.load(std::memory_order_relaxed) == kNeverReferenced) delete mRefs;
}

void RefBase::incStrong(const void* id) const {
    mRefs->incWeak(id);
    mRefs->announceFirst(mRefs->strong.fetch_add(1, std::memory_order_relaxed));
}

void RefBase::decStrong(const void* id) const {
    weakref_impl* const counters = mRefs;  // the object may go before they do
    if (counters->strong.fetch_sub(1, std::memory_order_acq_rel) == 1) {
        counters->base->onLastStrongRef(id);
        delete this;
    }
    counters->decWeak(id);
}

int32_t RefBase::getStrongCount() const {
    return mRefs->strong.load(std::memory_order_relaxed);
}

RefBase::weakref_type* RefBase::createWeak(const void* id) const {
    mRefs->incWeak(id);
    return mRefs;
}

RefBase::weakref_type* RefBase::getWeakRefs() const {
    return mRefs;
}

void RefBase::onFirstRef() {}

void RefBase::onLastStrongRef(const void* /*id*/) {}

bool RefBase::onIncStrongAttempted(uint32_t flags, const void* /*id*/) {
    return (flags & kFirstIncStrong) != 0;
}

void RefBase::onLastWeakRef(const void* /*id*/) {}

}  // namespace android
