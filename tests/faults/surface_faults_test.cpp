// Every call of the surface glue into Java refused in turn: what a look-up answers then, and that
// no thread stays attached.

#include <gtest/gtest.h>
#include <jni.h>
#include <vidshow-host/window.h>

#include "faults/in_turn.h"
#include "testkit/java_tables.h"
#include "vidshow/android_surface.h"

namespace {

using faults::IsRefused;
using faults::RefuseEachInTurn;

constexpr jint kValue = 0x1234;

/// A virtual machine that knows one class, and refuses what is due to be refused.
class RefusingJava : public JavaVM, public JNIEnv {
  public:
    explicit RefusingJava(bool attached) : m_attached(attached) {
        JavaVM::functions = &kInvoke;
        JNIEnv::functions = &kNative;
    }

    JavaVM* vm() { return this; }
    int attaches = 0;  ///< that were granted
    int detaches = 0;

    static RefusingJava* from(JavaVM* vm) { return static_cast<RefusingJava*>(vm); }

    static jint attach(JavaVM* vm, JNIEnv** env, void*) {
        if (IsRefused("AttachCurrentThread")) return JNI_ERR;
        ++from(vm)->attaches;
        *env = from(vm);
        return JNI_OK;
    }
    static jint detach(JavaVM* vm) {
        ++from(vm)->detaches;
        return IsRefused("DetachCurrentThread") ? JNI_ERR : JNI_OK;
    }
    static jint getEnv(JavaVM* vm, void** env, jint) {
        const bool granted = !IsRefused("GetEnv") && from(vm)->m_attached;
        *env = granted ? static_cast<JNIEnv*>(from(vm)) : nullptr;
        return granted ? JNI_OK : JNI_EDETACHED;
    }
    static jclass findClass(JNIEnv*, const char*) {
        return IsRefused("FindClass") ? nullptr : reinterpret_cast<jclass>(uintptr_t{0x100});
    }
    static jfieldID getFieldId(JNIEnv*, jclass type, const char*, const char*) {
        if (IsRefused("GetFieldID") || type == nullptr) return nullptr;
        return reinterpret_cast<jfieldID>(uintptr_t{0x200});
    }
    static jint getIntField(JNIEnv*, jobject, jfieldID field) {
        return IsRefused("GetIntField") || field == nullptr ? 0 : kValue;
    }

  private:
    static const JNIInvokeInterface kInvoke;
    static const JNINativeInterface kNative;

    const bool m_attached;
};

const JNIInvokeInterface RefusingJava::kInvoke = testkit::InvokeTable<RefusingJava>();
const JNINativeInterface RefusingJava::kNative = testkit::NativeTable<RefusingJava>();

class SurfaceFaults : public testing::Test {
  protected:
    SurfaceFaults() {
        vidshow::host::setLogSink([](int, const char*, const char*) {});  // failures are on purpose
    }
    ~SurfaceFaults() override {
        Forget();
        vidshow::host::setLogSink(nullptr);
    }

    static void Forget() {
        g_pJavaVM = nullptr;
        g_jLastSurface = nullptr;
        g_nLastNativeSurface = 0;
    }

    static void LookUpTwice(bool attached) {
        Forget();
        RefusingJava java(attached);
        int surface = 0;  // stands for a Java object, by its address
        VR_ANDROID_SURFACE_PARAM param = {java.vm(), &surface};
        const int32_t value = GetAndroidIomxSurface(&param);
        EXPECT_TRUE(value == kValue || value == 0) << value;
        EXPECT_EQ(g_nLastNativeSurface, value);
        EXPECT_EQ(java.detaches, java.attaches);
        EXPECT_EQ(GetAndroidIomxSurface(&param), kValue) << "a failure is not remembered";
        EXPECT_EQ(java.detaches, java.attaches);
    }
};

TEST_F(SurfaceFaults, LookupOnAForeignThread) {
    EXPECT_EQ(RefuseEachInTurn([] { LookUpTwice(false); }), 6);
}

TEST_F(SurfaceFaults, LookupOnAnAttachedThread) {
    EXPECT_EQ(RefuseEachInTurn([] { LookUpTwice(true); }), 4);
}

TEST_F(SurfaceFaults, Environment) {
    const int requests = RefuseEachInTurn([] {
        RefusingJava java(false);
        g_pJavaVM = java.vm();
        JNIEnv* const env = GetAndroidJEnv();
        EXPECT_EQ(env != nullptr, java.attaches == 1);
        if (env != nullptr) FreeAndroidJEnv();
        EXPECT_EQ(java.detaches, java.attaches);
    });
    EXPECT_EQ(requests, 2) << "attach and detach";
}

}  // namespace
