# Stands where an NDK has its toolchain file, and does what that file does as far as the build can
# tell: names the system, the compilers, the C++ run-time library that is linked in, and the folder
# of the platform's libraries. The compiler is the desktop's cross compiler.
set(CMAKE_SYSTEM_NAME Android)
set(CMAKE_SYSTEM_VERSION 1)  # as the NDK's file: CMake is not to look for an NDK itself
set(CMAKE_SYSTEM_PROCESSOR armv7-a)
foreach(setting IN ITEMS ANDROID_ABI=armeabi-v7a ANDROID_PLATFORM=android-19 ANDROID_ARM_NEON=ON
        ANDROID_STL=c++_static)
    string(REGEX MATCH "^([^=]*)=(.*)$" unused ${setting})
    if(DEFINED ${CMAKE_MATCH_1} AND NOT "${${CMAKE_MATCH_1}}" STREQUAL "${CMAKE_MATCH_2}")
        message(FATAL_ERROR "expected ${setting}, not ${${CMAKE_MATCH_1}}")
    endif()
endforeach()
set(CMAKE_C_COMPILER arm-linux-gnueabihf-gcc)
set(CMAKE_CXX_COMPILER arm-linux-gnueabihf-g++)
set(CMAKE_C_FLAGS_INIT "-march=armv7-a -mfpu=neon -mthumb")
set(CMAKE_CXX_FLAGS_INIT "${CMAKE_C_FLAGS_INIT}")
set(CMAKE_SHARED_LINKER_FLAGS_INIT "-static-libstdc++ -static-libgcc")
set(CMAKE_LIBRARY_PATH $ENV{ANDROID_NDK_STANDIN_LIBRARIES})
set(CMAKE_CXX_STANDARD_INCLUDE_DIRECTORIES $ENV{ANDROID_NDK_STANDIN_INCLUDES})
set(CMAKE_TRY_COMPILE_PLATFORM_VARIABLES CMAKE_LIBRARY_PATH)
