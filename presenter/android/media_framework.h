#pragma once

// What the presenter uses of the device's private media framework, declared so that names, vtable
// order and object layout are those of Android 4.4. The classes live in the device's libraries
// (libutils, libui, libstagefright); on a desktop the host library defines the same ones.
//
// The device's libraries carry no type information: a source that derives from `RefBase` is
// compiled without it.

#include <cstdint>

#include "presenter/android/system_window.h"

#define VIDSHOW_FRAMEWORK_API __attribute__((visibility("default")))

namespace android {

/// Base of everything counted. An object starts without references, and goes with the last strong
/// one; its counters go with the last reference of either kind.
class VIDSHOW_FRAMEWORK_API RefBase {
  public:
    /// The counters. A weak reference keeps them, not the object.
    class VIDSHOW_FRAMEWORK_API weakref_type {
      public:
        RefBase* refBase() const;
        void incWeak(const void* id);
        void decWeak(const void* id);
        /// Takes a strong reference if the object is still there. @return whether it was
        bool attemptIncStrong(const void* id);
        int32_t getWeakCount() const;  ///< strong references count here too
    };

    void incStrong(const void* id) const;
    void decStrong(const void* id) const;
    int32_t getStrongCount() const;
    weakref_type* createWeak(const void* id) const;  ///< takes a weak reference
    weakref_type* getWeakRefs() const;

    RefBase(const RefBase&) = delete;
    RefBase& operator=(const RefBase&) = delete;

  protected:
    RefBase();
    virtual ~RefBase();
    virtual void onFirstRef();
    virtual void onLastStrongRef(const void* id);
    virtual bool onIncStrongAttempted(uint32_t flags, const void* id);
    virtual void onLastWeakRef(const void* id);

  private:
    friend class weakref_type;
    class weakref_impl;
    weakref_impl* const mRefs;
};

static_assert(sizeof(RefBase) == 2 * sizeof(void*), "a vtable and the counters");

/// A strong reference to anything with `incStrong` and `decStrong`.
template <typename T>
class sp {
  public:
    sp() = default;
    sp(T* other) : m_ptr(other) {
        if (m_ptr != nullptr) m_ptr->incStrong(this);
    }
    sp(const sp& other) : sp(other.m_ptr) {}
    ~sp() {
        if (m_ptr != nullptr) m_ptr->decStrong(this);
    }
    // NOLINTNEXTLINE(bugprone-unhandled-self-assignment,cert-oop54-cpp): counted up, then down
    sp& operator=(const sp& other) {
        T* const old = m_ptr;
        if (other.m_ptr != nullptr) other.m_ptr->incStrong(this);
        m_ptr = other.m_ptr;
        if (old != nullptr) old->decStrong(this);
        return *this;
    }

    T* get() const { return m_ptr; }
    T* operator->() const { return m_ptr; }
    T& operator*() const { return *m_ptr; }

  private:
    T* m_ptr = nullptr;
};

/// Graphics memory. Where its counting base lies differs between releases, so references are
/// counted through the hooks of its native buffer, which every release has in the same place.
class VIDSHOW_FRAMEWORK_API GraphicBuffer {
  public:
    ANativeWindowBuffer* getNativeBuffer() const;

    void incStrong(const void* id) const { getNativeBuffer()->incStrong(id); }
    void decStrong(const void* id) const { getNativeBuffer()->decStrong(id); }

    GraphicBuffer(const GraphicBuffer&) = delete;
    GraphicBuffer& operator=(const GraphicBuffer&) = delete;

  protected:
    GraphicBuffer() = default;
    ~GraphicBuffer() = default;
};

/// Values under four-character keys, attached to a buffer by whoever made it.
class VIDSHOW_FRAMEWORK_API MetaData : public RefBase {
  public:
    bool setInt32(uint32_t key, int32_t value);    ///< @return whether it replaced a value
    bool findInt32(uint32_t key, int32_t* value);  ///< @return whether the key has a value

  protected:
    MetaData();
    ~MetaData() override;
};

/// A decoder's output. Objects are the decoder's; nobody else makes or counts them.
class VIDSHOW_FRAMEWORK_API MediaBuffer {
  public:
    sp<GraphicBuffer> graphicBuffer() const;
    sp<MetaData> meta_data();

    MediaBuffer(const MediaBuffer&) = delete;
    MediaBuffer& operator=(const MediaBuffer&) = delete;

  protected:
    MediaBuffer() = default;
    ~MediaBuffer() = default;
};

}  // namespace android
