#pragma once

#include <jni.h>

namespace testkit {

/// @name The function tables of a virtual machine made by hand
/// Their entries are static functions of `Java`; what the surface glue does not call is null.
/// @{
template <class Java>
JNIInvokeInterface InvokeTable() {
    JNIInvokeInterface table = {};
    table.AttachCurrentThread = Java::attach;
    table.DetachCurrentThread = Java::detach;
    table.GetEnv = Java::getEnv;
    return table;
}
template <class Java>
JNINativeInterface NativeTable() {
    JNINativeInterface table = {};
    table.FindClass = Java::findClass;
    table.GetFieldID = Java::getFieldId;
    table.GetIntField = Java::getIntField;
    return table;
}
/// @}

}  // namespace testkit
