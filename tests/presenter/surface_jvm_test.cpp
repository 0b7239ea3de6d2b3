// The surface glue in a real Java virtual machine, with a class of the platform's name.

#include <gtest/gtest.h>
#include <jni.h>
#include <vidshow-host/window.h>

#include <functional>
#include <string>
#include <thread>

#include "presenter/log_capture.h"
#include "vidshow/android_surface.h"

// The virtual machine finds null references by SIGSEGV, and keeps its memory to the end.
extern "C" __attribute__((visibility("default"))) const char* __asan_default_options() {
    return "handle_segv=0:detect_leaks=0";
}

namespace {

using vidshow::host::Window;

class SurfaceJvmTest : public testing::Test {
  protected:
    static void SetUpTestSuite() {
        std::string classes = std::string("-Djava.class.path=") + VIDSHOW_TEST_CLASSES;
        std::string heap = "-Xmx32m";
        std::string signals = "-Xrs";
        JavaVMOption options[3] = {};
        options[0].optionString = classes.data();
        options[1].optionString = heap.data();
        options[2].optionString = signals.data();
        JavaVMInitArgs arguments = {JNI_VERSION_1_6, 3, options, JNI_FALSE};
        void* env = nullptr;
        ASSERT_EQ(JNI_CreateJavaVM(&s_vm, &env, &arguments), JNI_OK);
        s_mainEnv = static_cast<JNIEnv*>(env);
        s_class = s_mainEnv->FindClass("android/view/Surface");
        ASSERT_NE(s_class, nullptr);
        s_class = static_cast<jclass>(s_mainEnv->NewGlobalRef(s_class));
    }
    static void TearDownTestSuite() {
        if (s_vm != nullptr) s_vm->DestroyJavaVM();
    }

    SurfaceJvmTest() {
        g_pJavaVM = nullptr;
        g_jLastSurface = nullptr;
        g_nLastNativeSurface = 0;
        surface = NewSurface(0x1234);
    }
    ~SurfaceJvmTest() override { s_mainEnv->DeleteGlobalRef(surface); }

    static jobject NewSurface(jint value) {
        const jmethodID constructor = s_mainEnv->GetMethodID(s_class, "<init>", "(I)V");
        const jobject local = s_mainEnv->NewObject(s_class, constructor, value);
        return s_mainEnv->NewGlobalRef(local);
    }
    void SetField(jint value) {
        const jfieldID field = s_mainEnv->GetFieldID(s_class, "mNativeSurface", "I");
        s_mainEnv->SetIntField(surface, field, value);
    }
    static int32_t Read(jobject from) {
        VR_ANDROID_SURFACE_PARAM param = {s_vm, from};
        return GetAndroidIomxSurface(&param);
    }
    static bool IsAttached() {
        void* env = nullptr;
        return s_vm->GetEnv(&env, JNI_VERSION_1_6) == JNI_OK;
    }
    static void OnForeignThread(const std::function<void()>& body) { std::thread(body).join(); }

    static JavaVM* s_vm;
    static JNIEnv* s_mainEnv;
    static jclass s_class;

    LogCapture log;
    jobject surface;
};

JavaVM* SurfaceJvmTest::s_vm = nullptr;
JNIEnv* SurfaceJvmTest::s_mainEnv = nullptr;
jclass SurfaceJvmTest::s_class = nullptr;

TEST_F(SurfaceJvmTest, LookupOnAttachedThreadLeavesItAttached) {
    EXPECT_EQ(Read(surface), 0x1234);
    EXPECT_TRUE(IsAttached());
    EXPECT_EQ(g_pJavaVM, s_vm);
    EXPECT_EQ(g_jLastSurface, surface);
    EXPECT_EQ(g_nLastNativeSurface, 0x1234);
    EXPECT_EQ(s_mainEnv->ExceptionCheck(), JNI_FALSE);
    EXPECT_TRUE(log.take().empty());
}

TEST_F(SurfaceJvmTest, LookupOnForeignThreadLeavesItDetached) {
    OnForeignThread([this] {
        ASSERT_FALSE(IsAttached());
        EXPECT_EQ(Read(surface), 0x1234);
        EXPECT_FALSE(IsAttached());
    });
}

TEST_F(SurfaceJvmTest, LookupOnAThreadAttachedBeforeLeavesItAttached) {
    OnForeignThread([this] {
        void* env = nullptr;
        ASSERT_EQ(s_vm->AttachCurrentThread(&env, nullptr), JNI_OK);
        EXPECT_EQ(Read(surface), 0x1234);
        EXPECT_TRUE(IsAttached());
        EXPECT_EQ(s_vm->DetachCurrentThread(), JNI_OK);
    });
}

TEST_F(SurfaceJvmTest, AllBitsOfTheFieldArrive) {
    for (const jint value : {INT32_MIN, INT32_MAX, -1, 1}) {
        SetField(value);
        g_jLastSurface = nullptr;
        EXPECT_EQ(Read(surface), value);
    }
}

TEST_F(SurfaceJvmTest, SecondLookupIsServedFromTheCacheUntilARelease) {
    ASSERT_EQ(Read(surface), 0x1234);
    SetField(0x4321);
    EXPECT_EQ(Read(surface), 0x1234);
    Window window;
    VR_ANDROID_SURFACE_PARAM param = {s_vm, window.get()};
    ReleaseAndroidSurface(GetAndroidSurface(&param));
    EXPECT_EQ(Read(surface), 0x4321);
}

TEST_F(SurfaceJvmTest, ZeroIsReadAgain) {
    SetField(0);
    EXPECT_EQ(Read(surface), 0);
    SetField(7);
    EXPECT_EQ(Read(surface), 7);
}

TEST_F(SurfaceJvmTest, ReferencesAreComparedNotObjects) {
    const jobject same = s_mainEnv->NewGlobalRef(surface);
    ASSERT_NE(same, surface);
    ASSERT_EQ(Read(surface), 0x1234);
    SetField(0x4321);
    EXPECT_EQ(Read(same), 0x4321) << "another reference to the same object is read anew";
    s_mainEnv->DeleteGlobalRef(same);
}

TEST_F(SurfaceJvmTest, EnvironmentOfAForeignThreadLastsUntilItIsFreed) {
    g_pJavaVM = s_vm;
    OnForeignThread([] {
        JNIEnv* const env = GetAndroidJEnv();
        ASSERT_NE(env, nullptr);
        EXPECT_GE(env->GetVersion(), JNI_VERSION_1_6);
        EXPECT_TRUE(IsAttached());
        EXPECT_EQ(GetAndroidJEnv(), env) << "attaching again changes nothing";
        FreeAndroidJEnv();
        EXPECT_FALSE(IsAttached());
    });
    EXPECT_TRUE(log.take().empty());
}

}  // namespace
