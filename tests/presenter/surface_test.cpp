// The surface glue on function tables made by hand, which count calls and fail on request.

#include "vidshow/android_surface.h"

#include <gtest/gtest.h>
#include <jni.h>
#include <vidshow-host/window.h>

#include <string>
#include <utility>
#include <vector>

#include "presenter/log_capture.h"
#include "testkit/java_tables.h"

namespace {

using Lines = std::vector<std::string>;
using vidshow::host::Window;

static_assert(sizeof(VR_ANDROID_SURFACE_PARAM) == 2 * sizeof(void*), "two addresses");
static_assert(offsetof(VR_ANDROID_SURFACE_PARAM, m_pJvm) == 0, "first word");
static_assert(offsetof(VR_ANDROID_SURFACE_PARAM, m_pJobj) == sizeof(void*), "second word");
static_assert(sizeof(g_nLastNativeSurface) == 4, "a Java int");

// A virtual machine with one thread, one class and one field, which notes what it is asked.
class FakeJava : public JavaVM, public JNIEnv {
  public:
    FakeJava() {
        JavaVM::functions = &kInvoke;
        JNIEnv::functions = &kNative;
    }

    JavaVM* vm() { return this; }
    JNIEnv* env() { return this; }
    std::vector<std::string> takeCalls() { return std::exchange(m_calls, {}); }

    jint attachResult = JNI_OK;
    jint getEnvResult = JNI_OK;
    bool getEnvSetsEnvironment = false;  // the thread is attached
    jint fieldValue = 0x1234;
    void* objectRead = nullptr;

    static FakeJava* from(JavaVM* vm) { return static_cast<FakeJava*>(vm); }
    static FakeJava* from(JNIEnv* env) { return static_cast<FakeJava*>(env); }
    static jclass theClass() { return reinterpret_cast<jclass>(uintptr_t{0x100}); }
    static jfieldID theField() { return reinterpret_cast<jfieldID>(uintptr_t{0x200}); }

    static jint attach(JavaVM* vm, JNIEnv** out, void* arguments) {
        FakeJava* const self = from(vm);
        self->m_calls.push_back(arguments == nullptr ? "attach" : "attach with arguments");
        if (self->attachResult >= 0) *out = self;
        return self->attachResult;
    }
    static jint detach(JavaVM* vm) {
        from(vm)->m_calls.push_back("detach");
        return JNI_OK;
    }
    static jint getEnv(JavaVM* vm, void** out, jint version) {
        FakeJava* const self = from(vm);
        self->m_calls.push_back("getEnv " + std::to_string(version));
        *out = self->getEnvSetsEnvironment ? self->env() : nullptr;
        return self->getEnvResult;
    }
    static jclass findClass(JNIEnv* env, const char* name) {
        from(env)->m_calls.push_back(std::string("findClass ") + name);
        return theClass();
    }
    static jfieldID getFieldId(JNIEnv* env, jclass type, const char* name, const char* signature) {
        EXPECT_EQ(type, theClass());
        from(env)->m_calls.push_back(std::string("field ") + name + " " + signature);
        return theField();
    }
    static jint getIntField(JNIEnv* env, jobject object, jfieldID field) {
        EXPECT_EQ(field, theField());
        from(env)->m_calls.push_back("read");
        from(env)->objectRead = object;
        return from(env)->fieldValue;
    }

  private:
    static const JNIInvokeInterface kInvoke;
    static const JNINativeInterface kNative;

    std::vector<std::string> m_calls;
};

const JNIInvokeInterface FakeJava::kInvoke = testkit::InvokeTable<FakeJava>();
const JNINativeInterface FakeJava::kNative = testkit::NativeTable<FakeJava>();

const Lines kReadOnAttached = {"getEnv 65542", "findClass android/view/Surface",
                               "field mNativeSurface I", "read"};
const Lines kReadOnForeign = {"getEnv 65542",           "attach", "findClass android/view/Surface",
                              "field mNativeSurface I", "read",   "detach"};

class SurfaceTest : public testing::Test {
  protected:
    SurfaceTest() { Forget(); }
    ~SurfaceTest() override { Forget(); }

    static void Forget() {
        g_pJavaVM = nullptr;
        g_pWindow = nullptr;
        g_jLastSurface = nullptr;
        g_nLastNativeSurface = 0;
    }

    int32_t Read(FakeJava* from, void* object) {
        VR_ANDROID_SURFACE_PARAM param = {from->vm(), object};
        return GetAndroidIomxSurface(&param);
    }

    LogCapture log;
    FakeJava java;
    FakeJava otherJava;
    int surface = 0;  // stands for a Java object, by its address
    int otherSurface = 0;
    Window window;
};

TEST_F(SurfaceTest, NullRecordYieldsNoWindow) {
    EXPECT_EQ(GetAndroidSurface(nullptr), nullptr);
    EXPECT_EQ(log.take(), Lines{"[GetAndroidSurface #] GetAndroidSurface faile  pParam = 0x0 \n"});
    EXPECT_EQ(g_pJavaVM, nullptr);
}

TEST_F(SurfaceTest, WindowIsAcquiredAndRecordedWithoutJni) {
    VR_ANDROID_SURFACE_PARAM param = {java.vm(), window.get()};
    EXPECT_EQ(GetAndroidSurface(&param), window.get());
    EXPECT_EQ(g_pJavaVM, java.vm());
    EXPECT_EQ(g_pWindow, window.get());
    EXPECT_EQ(window.state().strongCount, 2);
    EXPECT_EQ(java.takeCalls(), Lines());
    EXPECT_EQ(log.take(), Lines());
    ReleaseAndroidSurface(window.get());
}

TEST_F(SurfaceTest, EveryCallTakesOneMoreReference) {
    VR_ANDROID_SURFACE_PARAM param = {nullptr, window.get()};
    for (int i = 0; i < 3; ++i)
        EXPECT_EQ(GetAndroidSurface(&param), window.get());
    EXPECT_EQ(window.state().strongCount, 4);
    EXPECT_EQ(g_pJavaVM, nullptr);
    for (int i = 0; i < 3; ++i)
        ReleaseAndroidSurface(window.get());
    EXPECT_EQ(window.state().strongCount, 1);
}

TEST_F(SurfaceTest, ReleaseOfNullDoesNothing) {
    VR_ANDROID_SURFACE_PARAM param = {java.vm(), window.get()};
    GetAndroidSurface(&param);
    g_jLastSurface = reinterpret_cast<jobject>(&surface);
    ReleaseAndroidSurface(nullptr);
    EXPECT_EQ(g_pWindow, window.get());
    EXPECT_NE(g_jLastSurface, nullptr);
    ReleaseAndroidSurface(window.get());
}

TEST_F(SurfaceTest, ReleaseForgetsWindowAndJavaSurfaceButNotTheValue) {
    VR_ANDROID_SURFACE_PARAM param = {java.vm(), window.get()};
    GetAndroidSurface(&param);
    g_jLastSurface = reinterpret_cast<jobject>(&surface);
    g_nLastNativeSurface = 7;
    ReleaseAndroidSurface(window.get());
    EXPECT_EQ(window.state().strongCount, 1);
    EXPECT_EQ(g_pWindow, nullptr);
    EXPECT_EQ(g_jLastSurface, nullptr);
    EXPECT_EQ(g_nLastNativeSurface, 7);
    EXPECT_EQ(g_pJavaVM, java.vm());
}

TEST_F(SurfaceTest, NoEnvironmentWithoutVirtualMachine) {
    EXPECT_EQ(GetAndroidJEnv(), nullptr);
    FreeAndroidJEnv();
    EXPECT_EQ(log.take(), Lines());
}

TEST_F(SurfaceTest, EnvironmentAttachesUnconditionallyAndFreeDetaches) {
    g_pJavaVM = java.vm();
    java.getEnvSetsEnvironment = true;  // already attached; nobody asks
    EXPECT_EQ(GetAndroidJEnv(), java.env());
    EXPECT_EQ(GetAndroidJEnv(), java.env());
    EXPECT_EQ(java.takeCalls(), (Lines{"attach", "attach"}));
    FreeAndroidJEnv();
    EXPECT_EQ(java.takeCalls(), Lines{"detach"});
    EXPECT_EQ(g_pJavaVM, java.vm());
}

TEST_F(SurfaceTest, EnvironmentFailsOnlyOnANegativeResult) {
    g_pJavaVM = java.vm();
    java.attachResult = 1;
    EXPECT_EQ(GetAndroidJEnv(), java.env());
    EXPECT_EQ(log.take(), Lines());
    java.attachResult = -1;
    EXPECT_EQ(GetAndroidJEnv(), nullptr);
    EXPECT_EQ(log.take(), Lines{"[GetAndroidJEnv #] Attach Current thread failed!!"});
}

TEST_F(SurfaceTest, LookupOfNullRecordIsZero) {
    EXPECT_EQ(GetAndroidIomxSurface(nullptr), 0);
    EXPECT_EQ(log.take(),
              Lines{"[GetAndroidIomxSurface #] GetAndroidSurface faile  pParam = 0x0 \n"});
}

TEST_F(SurfaceTest, LookupOnAttachedThreadNeitherAttachesNorDetaches) {
    java.getEnvSetsEnvironment = true;
    EXPECT_EQ(Read(&java, &surface), 0x1234);
    EXPECT_EQ(java.takeCalls(), kReadOnAttached);
    EXPECT_EQ(java.objectRead, &surface);
    EXPECT_EQ(g_pJavaVM, java.vm());
    EXPECT_EQ(g_jLastSurface, reinterpret_cast<jobject>(&surface));
    EXPECT_EQ(g_nLastNativeSurface, 0x1234);
    EXPECT_EQ(log.take(), Lines());
}

TEST_F(SurfaceTest, LookupOnForeignThreadAttachesAndDetaches) {
    java.getEnvResult = JNI_EDETACHED;
    EXPECT_EQ(Read(&java, &surface), 0x1234);
    EXPECT_EQ(java.takeCalls(), kReadOnForeign);
    EXPECT_EQ(log.take(), Lines());
}

TEST_F(SurfaceTest, EnvironmentPointerCountsNotTheResultOfGetEnv) {
    java.getEnvSetsEnvironment = true;
    java.getEnvResult = JNI_ERR;
    EXPECT_EQ(Read(&java, &surface), 0x1234);
    EXPECT_EQ(java.takeCalls(), kReadOnAttached);

    otherJava.getEnvSetsEnvironment = false;
    otherJava.getEnvResult = JNI_OK;
    EXPECT_EQ(Read(&otherJava, &otherSurface), 0x1234);
    EXPECT_EQ(otherJava.takeCalls(), kReadOnForeign);
}

TEST_F(SurfaceTest, AttachWithPositiveResultSucceeds) {
    java.attachResult = 5;
    EXPECT_EQ(Read(&java, &surface), 0x1234);
    EXPECT_EQ(java.takeCalls(), kReadOnForeign);
}

TEST_F(SurfaceTest, FailedAttachLogsTheResultAndLeavesTheCachesCleared) {
    java.getEnvSetsEnvironment = true;
    ASSERT_EQ(Read(&java, &surface), 0x1234);
    otherJava.attachResult = -4;
    EXPECT_EQ(Read(&otherJava, &otherSurface), 0);
    EXPECT_EQ(otherJava.takeCalls(), (Lines{"getEnv 65542", "attach"}));
    EXPECT_EQ(log.take(),
              Lines{"[GetAndroidIomxSurface #] Attach Current thread failed!! Error -4"});
    EXPECT_EQ(g_jLastSurface, nullptr);
    EXPECT_EQ(g_nLastNativeSurface, 0);
    EXPECT_EQ(g_pJavaVM, otherJava.vm());
}

TEST_F(SurfaceTest, SecondLookupOfTheSameSurfaceReadsNothing) {
    ASSERT_EQ(Read(&java, &surface), 0x1234);
    java.takeCalls();
    java.fieldValue = 0x4321;
    EXPECT_EQ(Read(&java, &surface), 0x1234);
    EXPECT_EQ(java.takeCalls(), Lines());
}

TEST_F(SurfaceTest, CacheHitIsOfTheReferenceAloneAndKeepsTheVirtualMachine) {
    ASSERT_EQ(Read(&java, &surface), 0x1234);
    EXPECT_EQ(Read(&otherJava, &surface), 0x1234);
    EXPECT_EQ(otherJava.takeCalls(), Lines());
    EXPECT_EQ(g_pJavaVM, java.vm());
}

TEST_F(SurfaceTest, AnotherSurfaceIsReadAndTakesThePlaceOfTheFirst) {
    ASSERT_EQ(Read(&java, &surface), 0x1234);
    java.fieldValue = 0x4321;
    EXPECT_EQ(Read(&java, &otherSurface), 0x4321);
    java.fieldValue = 0x5555;
    EXPECT_EQ(Read(&java, &surface), 0x5555) << "one entry only";
}

TEST_F(SurfaceTest, ReleaseForcesANewRead) {
    ASSERT_EQ(Read(&java, &surface), 0x1234);
    VR_ANDROID_SURFACE_PARAM param = {java.vm(), window.get()};
    GetAndroidSurface(&param);
    ReleaseAndroidSurface(window.get());
    java.takeCalls();
    java.fieldValue = 0x4321;
    EXPECT_EQ(Read(&java, &surface), 0x4321);
    EXPECT_EQ(java.takeCalls(), kReadOnForeign);
}

TEST_F(SurfaceTest, ZeroIsNeverServedFromTheCache) {
    java.fieldValue = 0;
    EXPECT_EQ(Read(&java, &surface), 0);
    EXPECT_EQ(g_jLastSurface, reinterpret_cast<jobject>(&surface));
    java.takeCalls();
    java.fieldValue = -9;
    EXPECT_EQ(Read(&java, &surface), -9);
    EXPECT_EQ(java.takeCalls(), kReadOnForeign);
}

}  // namespace
