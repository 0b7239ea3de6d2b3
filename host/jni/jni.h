#ifndef VIDSHOW_HOST_JNI_H
#define VIDSHOW_HOST_JNI_H

// The part of the Java Native Interface that the presenter calls, so that building it takes no JDK.
// Names and signatures are those of the device's header; the functions lie at their published
// places in the tables, and those in between are only counted.

#include <cstddef>
#include <cstdint>

typedef int32_t jint;

class _jobject {};
class _jclass : public _jobject {};
typedef _jobject* jobject;
typedef _jclass* jclass;

struct _jfieldID;
typedef _jfieldID* jfieldID;

enum {
    JNI_OK = 0,
    JNI_ERR = -1,
    JNI_EDETACHED = -2,
    JNI_VERSION_1_6 = 0x00010006,
};

struct JNIEnv_;
struct JavaVM_;
typedef JNIEnv_ JNIEnv;
typedef JavaVM_ JavaVM;

/// What a thread can ask of the virtual machine.
struct JNINativeInterface {
    void* slots0To5[6];
    jclass (*FindClass)(JNIEnv*, const char* name);
    void* slots7To93[87];
    jfieldID (*GetFieldID)(JNIEnv*, jclass, const char* name, const char* signature);
    void* slots95To99[5];
    jint (*GetIntField)(JNIEnv*, jobject, jfieldID);
    void* slots101To232[132];
};

/// What anybody can ask of the virtual machine. Results below 0 are failures.
struct JNIInvokeInterface {
    void* slots0To3[4];
    jint (*AttachCurrentThread)(JavaVM*, JNIEnv** env, void* arguments);
    jint (*DetachCurrentThread)(JavaVM*);
    jint (*GetEnv)(JavaVM*, void** env, jint version);
    void* slot7;
};

static_assert(offsetof(JNINativeInterface, FindClass) == 6 * sizeof(void*), "slot 6");
static_assert(offsetof(JNINativeInterface, GetFieldID) == 94 * sizeof(void*), "slot 94");
static_assert(offsetof(JNINativeInterface, GetIntField) == 100 * sizeof(void*), "slot 100");
static_assert(sizeof(JNINativeInterface) == 233 * sizeof(void*), "JNI 1.6");
static_assert(offsetof(JNIInvokeInterface, AttachCurrentThread) == 4 * sizeof(void*), "slot 4");
static_assert(offsetof(JNIInvokeInterface, GetEnv) == 6 * sizeof(void*), "slot 6");
static_assert(sizeof(JNIInvokeInterface) == 8 * sizeof(void*), "eight slots");

struct JNIEnv_ {
    const JNINativeInterface* functions;

    jclass FindClass(const char* name) { return functions->FindClass(this, name); }
    jfieldID GetFieldID(jclass type, const char* name, const char* signature) {
        return functions->GetFieldID(this, type, name, signature);
    }
    jint GetIntField(jobject object, jfieldID field) {
        return functions->GetIntField(this, object, field);
    }
};

struct JavaVM_ {
    const JNIInvokeInterface* functions;

    jint AttachCurrentThread(JNIEnv** env, void* arguments) {
        return functions->AttachCurrentThread(this, env, arguments);
    }
    jint DetachCurrentThread() { return functions->DetachCurrentThread(this); }
    jint GetEnv(void** env, jint version) { return functions->GetEnv(this, env, version); }
};

#endif
