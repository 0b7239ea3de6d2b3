# The surface glue in a real Java virtual machine, where there is a JDK for the machine that the
# tests run on. A virtual machine and ThreadSanitizer do not go together.
if(CMAKE_CROSSCOMPILING OR VIDSHOW_SANITIZE MATCHES "thread")
    return()
endif()
find_package(Java QUIET COMPONENTS Development)
if(Java_FOUND AND NOT DEFINED JAVA_HOME)  # the virtual machine of the compiler's own JDK
    file(REAL_PATH ${Java_JAVAC_EXECUTABLE} javac)
    cmake_path(GET javac PARENT_PATH javac_folder)
    cmake_path(GET javac_folder PARENT_PATH JAVA_HOME)
endif()
find_package(JNI QUIET COMPONENTS JVM)
if(NOT JNI_FOUND OR NOT Java_FOUND)
    message(STATUS "No JDK found: the surface glue is tested with function tables only")
    return()
endif()

set(classes ${CMAKE_CURRENT_BINARY_DIR}/java)
set(source ${CMAKE_CURRENT_SOURCE_DIR}/java/android/view/Surface.java)
add_custom_command(OUTPUT ${classes}/android/view/Surface.class
    COMMAND ${Java_JAVAC_EXECUTABLE} --release 11 -d ${classes} ${source}
    DEPENDS ${source} VERBATIM)

vidshow_test(surface_jvm_test LIBRARIES presenter_support JNI::JVM SOURCES
    surface_jvm_test.cpp
    ${classes}/android/view/Surface.class)
target_compile_definitions(surface_jvm_test PRIVATE VIDSHOW_TEST_CLASSES="${classes}")
