# What the loader and the C library of the oldest device ask of the library file.
cmake_minimum_required(VERSION 3.25)
set(wrong "")

execute_process(COMMAND ${READELF} -dW ${LIBRARY} OUTPUT_VARIABLE dynamic
    COMMAND_ERROR_IS_FATAL ANY)
if(NOT dynamic MATCHES "\\(HASH\\)")
    list(APPEND wrong "no DT_HASH: that loader finds no symbol without it")
endif()
if(dynamic MATCHES "TEXTREL")
    list(APPEND wrong "text relocations: that loader refuses them")
endif()

if(NOT SANITIZE AND NOT COVERAGE)
    execute_process(COMMAND ${READELF} -lW ${LIBRARY} OUTPUT_VARIABLE segments
        COMMAND_ERROR_IS_FATAL ANY)
    if(segments MATCHES " TLS ")
        list(APPEND wrong "a thread-local storage segment: that loader knows none")
    endif()

    set(missing_there pthread_cancel pthread_condattr_setclock pthread_mutex_timedlock
        pthread_barrier_init pthread_barrier_wait statfs64 open64 aligned_alloc posix_spawn
        getrandom epoll_create1)
    execute_process(COMMAND ${NM} -D --undefined-only ${LIBRARY} OUTPUT_VARIABLE undefined
        COMMAND_ERROR_IS_FATAL ANY)
    foreach(name IN LISTS missing_there)
        if(undefined MATCHES " ${name}(@|\n)")
            list(APPEND wrong "uses ${name}, which the device's C library has not")
        endif()
    endforeach()

    string(REGEX MATCHALL "Shared library: \\[[^]]*\\]" needed "${dynamic}")
    set(allowed "lib(stdc\\+\\+|gcc_s|c|m|dl|pthread|vidshow-host|android|log|utils|ui|stagefright)")
    foreach(entry IN LISTS needed)
        if(NOT entry MATCHES "\\[(${allowed}\\.so[.0-9]*|ld-linux[^]]*)\\]")
            list(APPEND wrong "depends on ${entry}")
        endif()
    endforeach()
endif()

if(wrong)
    list(JOIN wrong "\n  " text)
    message(FATAL_ERROR "\n  ${text}")
endif()
