// Native handles out of what the Java side hands over.

#include <android/native_window.h>

#include "presenter/log.h"
#include "vidshow/android_surface.h"

namespace {

using vidshow::kLogError;
using vidshow::Log;
using vidshow::Word;

const VR_ANDROID_SURFACE_PARAM* SurfaceParam(void* pParam) {
    return static_cast<const VR_ANDROID_SURFACE_PARAM*>(pParam);
}

// Asks neither for an exception nor for the class's local reference: the field exists on every
// release that has it as an int, and the reference goes when the thread returns to Java.
jint ReadNativeSurface(JNIEnv* env, jobject surface) {
    const jclass type = env->FindClass("android/view/Surface");
    const jfieldID field = env->GetFieldID(type, "mNativeSurface", "I");
    return env->GetIntField(surface, field);
}

}  // namespace

extern "C" {

JavaVM* g_pJavaVM = nullptr;
ANativeWindow* g_pWindow = nullptr;
jobject g_jLastSurface = nullptr;
int32_t g_nLastNativeSurface = 0;

ANativeWindow* GetAndroidSurface(void* pParam) {
    if (pParam == nullptr) {
        Log(kLogError, "[%s %d] GetAndroidSurface faile  pParam = 0x%x \n", __func__, __LINE__,
            Word(pParam));
        return nullptr;
    }
    const VR_ANDROID_SURFACE_PARAM* const param = SurfaceParam(pParam);
    VIDSHOW_TRACE("[%s %d] pParam 0x%x \n", __func__, __LINE__, Word(pParam));
    VIDSHOW_TRACE("[%s %d] pParam->m_pJvm 0x%x, pParam->m_pJobj 0x%x \n", __func__, __LINE__,
                  Word(param->m_pJvm), Word(param->m_pJobj));
    g_pJavaVM = param->m_pJvm;
    ANativeWindow* const window = static_cast<ANativeWindow*>(param->m_pJobj);
    ANativeWindow_acquire(window);
    g_pWindow = window;
    return window;
}

void ReleaseAndroidSurface(void* window) {
    if (window == nullptr) return;
    ANativeWindow_release(static_cast<ANativeWindow*>(window));
    // Whichever window goes, the last one acquired counts as gone, and the next look-up of a Java
    // surface reads it anew.
    g_jLastSurface = nullptr;
    g_pWindow = nullptr;
}

JNIEnv* GetAndroidJEnv() {
    if (g_pJavaVM == nullptr) return nullptr;
    JNIEnv* env = nullptr;
    if (g_pJavaVM->AttachCurrentThread(&env, nullptr) < 0) {
        Log(kLogError, "[%s %d] Attach Current thread failed!!", __func__, __LINE__);
        return nullptr;
    }
    return env;
}

void FreeAndroidJEnv() {
    if (g_pJavaVM != nullptr) g_pJavaVM->DetachCurrentThread();
}

int32_t GetAndroidIomxSurface(void* pParam) {
    if (pParam == nullptr) {
        Log(kLogError, "[%s %d] GetAndroidSurface faile  pParam = 0x%x \n", __func__, __LINE__,
            Word(pParam));
        return 0;
    }
    const VR_ANDROID_SURFACE_PARAM* const param = SurfaceParam(pParam);
    VIDSHOW_TRACE("[%s %d] pParam 0x%x \n", __func__, __LINE__, Word(pParam));
    VIDSHOW_TRACE("[%s %d] pParam->m_pJvm 0x%x, pParam->m_pJobj 0x%x \n", __func__, __LINE__,
                  Word(param->m_pJvm), Word(param->m_pJobj));
    const jobject surface = static_cast<jobject>(param->m_pJobj);
    if (g_jLastSurface == surface && g_nLastNativeSurface != 0) {
        VIDSHOW_TRACE("same surface, return");
        return g_nLastNativeSurface;
    }
    JavaVM* const vm = param->m_pJvm;
    g_pJavaVM = vm;
    g_nLastNativeSurface = 0;
    g_jLastSurface = nullptr;

    void* known = nullptr;
    vm->GetEnv(&known, JNI_VERSION_1_6);
    JNIEnv* env = static_cast<JNIEnv*>(known);
    const bool attachedHere = env == nullptr;
    if (attachedHere) {
        const jint result = vm->AttachCurrentThread(&env, nullptr);
        if (result < 0) {
            Log(kLogError, "[%s %d] Attach Current thread failed!! Error %d", __func__, __LINE__,
                result);
            return 0;
        }
    }
    VIDSHOW_TRACE("[%s %d] jni env = 0x%x \n", __func__, __LINE__, Word(env));
    const jint value = ReadNativeSurface(env, surface);
    if (attachedHere) vm->DetachCurrentThread();

    g_jLastSurface = surface;
    g_nLastNativeSurface = value;
    return value;
}

}  // extern "C"
