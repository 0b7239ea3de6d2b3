#ifndef VIDSHOW_ANDROID_SURFACE_H
#define VIDSHOW_ANDROID_SURFACE_H

/// @file
/// What the Java side of a player hands over, turned into native handles.
///
/// The state behind these functions is process-wide and unguarded: one control thread at a time.

#include "vidshow/types.h"

// With a JDK or an NDK at hand its own header gives the types; without one the names suffice.
#if defined(__has_include)
#if __has_include(<jni.h>)
#include <jni.h>
#define VIDSHOW_HAS_JNI_H 1
#endif
#endif
#ifndef VIDSHOW_HAS_JNI_H
struct JNIEnv_;
struct JavaVM_;
class _jobject;
typedef JNIEnv_ JNIEnv;     ///< a thread's environment, opaque here
typedef JavaVM_ JavaVM;     ///< a Java virtual machine, opaque here
typedef _jobject* jobject;  ///< a reference to a Java object, opaque here
#endif

struct ANativeWindow;

/// The data of the presenter's surface properties.
struct VR_ANDROID_SURFACE_PARAM {
    JavaVM* m_pJvm;  ///< the process's Java virtual machine; `GetAndroidSurface` only records it,
                     ///< null too; `GetAndroidIomxSurface` calls it
    void* m_pJobj;   ///< `GetAndroidSurface`: the `ANativeWindow*`; `GetAndroidIomxSurface`: a
                     ///< reference to a Java `android.view.Surface`
};
static_assert(sizeof(VR_ANDROID_SURFACE_PARAM) == 2 * sizeof(void*), "two addresses");

extern "C" {

/// Attaches the calling thread to the recorded virtual machine. Pair with `FreeAndroidJEnv`.
/// @return the thread's environment; null without a virtual machine or when attaching fails
VIDSHOW_API JNIEnv* GetAndroidJEnv(void);

/// Detaches the calling thread from the recorded virtual machine, if there is one.
VIDSHOW_API void FreeAndroidJEnv(void);

/// Records the virtual machine and takes one more reference of the window in the record.
/// @param pParam a `VR_ANDROID_SURFACE_PARAM` whose `m_pJobj` is a valid window
/// @return the window, to be given back by `ReleaseAndroidSurface`; null for null
VIDSHOW_API ANativeWindow* GetAndroidSurface(void* pParam);

/// Reads the int field `mNativeSurface` of a Java `android.view.Surface`. A thread without an
/// environment is attached for the length of the call. The value of the last surface is kept,
/// unless it was 0, until `ReleaseAndroidSurface` or another surface comes; surfaces are told apart
/// by their references.
/// @param pParam a `VR_ANDROID_SURFACE_PARAM` whose `m_pJobj` is a Java reference
/// @return the value; 0 for null or when the thread cannot be attached
VIDSHOW_API int32_t GetAndroidIomxSurface(void* pParam);

/// Gives back a reference taken by `GetAndroidSurface`, and forgets the last window and the last
/// Java surface, whichever they were.
/// @param window an `ANativeWindow*`; null does nothing
VIDSHOW_API void ReleaseAndroidSurface(void* window);

extern VIDSHOW_API JavaVM* g_pJavaVM;             ///< last virtual machine received
extern VIDSHOW_API ANativeWindow* g_pWindow;      ///< last window acquired; null after a release
extern VIDSHOW_API jobject g_jLastSurface;        ///< surface of the last successful read, or null
extern VIDSHOW_API int32_t g_nLastNativeSurface;  ///< the value read for it

}  // extern "C"

#endif
