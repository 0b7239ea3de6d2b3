# The component `prefab`: what Android's build takes native libraries from, one folder a library with
# its headers and one folder an ABI. It is not part of a plain installation:
#     cmake --install build/android --component prefab --prefix vidshow-aar
# makes the folder that, zipped, is an AAR.
set(module prefab/modules/vidshow)
set(abi_dir ${module}/libs/android.${ANDROID_ABI})
string(REGEX REPLACE "^android-" "" VIDSHOW_ANDROID_API "${ANDROID_PLATFORM}")

# The package wants to know its NDK's major number. A toolchain that stands in for one may not tell.
set(VIDSHOW_NDK_MAJOR 0)
if(ANDROID_NDK_REVISION MATCHES "^([0-9]+)")
    set(VIDSHOW_NDK_MAJOR ${CMAKE_MATCH_1})
endif()

foreach(file IN ITEMS AndroidManifest.xml prefab.json module.json abi.json)
    configure_file(${PROJECT_SOURCE_DIR}/packaging/android/${file}.in
        ${PROJECT_BINARY_DIR}/prefab/${file} @ONLY)
endforeach()

macro(vidshow_prefab what destination)
    install(${what} ${ARGN} DESTINATION ${destination} COMPONENT prefab EXCLUDE_FROM_ALL)
endmacro()
vidshow_prefab(FILES . ${PROJECT_BINARY_DIR}/prefab/AndroidManifest.xml)
vidshow_prefab(FILES prefab ${PROJECT_BINARY_DIR}/prefab/prefab.json)
vidshow_prefab(FILES ${module} ${PROJECT_BINARY_DIR}/prefab/module.json)
vidshow_prefab(FILES ${abi_dir} ${PROJECT_BINARY_DIR}/prefab/abi.json)
vidshow_prefab(FILES ${abi_dir} $<TARGET_FILE:vidshow>)
vidshow_prefab(DIRECTORY ${module}/include ${PROJECT_SOURCE_DIR}/include/vidshow)
