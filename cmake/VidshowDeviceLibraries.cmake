# The device's media framework is not part of an NDK. These small libraries carry its names, so that
# the linker records where they come from; on the device the system's own libraries take their
# place. They are never installed.
find_library(VIDSHOW_LIBANDROID android REQUIRED)
find_library(VIDSHOW_LIBLOG log REQUIRED)

foreach(name IN ITEMS utils ui stagefright)
    add_library(vidshow-device-${name} SHARED
        ${PROJECT_SOURCE_DIR}/presenter/android/device/${name}.cpp)
    set_target_properties(vidshow-device-${name} PROPERTIES
        OUTPUT_NAME ${name}
        LIBRARY_OUTPUT_DIRECTORY ${PROJECT_BINARY_DIR}/device
        CXX_VISIBILITY_PRESET default)
    # Each names only what its own sources define; the rest is for the system's libraries to know.
    target_link_options(vidshow-device-${name} PRIVATE -Wl,-z,undefs)
    target_include_directories(vidshow-device-${name} PRIVATE ${PROJECT_SOURCE_DIR})
    target_compile_options(vidshow-device-${name} PRIVATE -fno-rtti -fno-exceptions)
endforeach()

function(vidshow_link_device_libraries target)
    # By file, not as targets: an installed package must not ask for them.
    foreach(name IN ITEMS stagefright ui utils)
        target_link_libraries(${target} PRIVATE $<TARGET_FILE:vidshow-device-${name}>)
        add_dependencies(${target} vidshow-device-${name})
    endforeach()
    target_link_libraries(${target} PRIVATE ${VIDSHOW_LIBANDROID} ${VIDSHOW_LIBLOG}
        ${CMAKE_DL_LIBS})
    # The C++ run-time library is inside ours; none of its names may be seen by other modules.
    target_link_options(${target} PRIVATE -Wl,--exclude-libs,ALL)
endfunction()
