# Builds the preset `android` with a toolchain file that stands where an NDK has its own, and looks
# at the library that comes out.
cmake_minimum_required(VERSION 3.25)
set(run COMMAND_ERROR_IS_FATAL ANY)
file(REMOVE_RECURSE ${WORK})
set(platform ${WORK}/platform)
file(MAKE_DIRECTORY ${platform}/include/android)

# The platform's own libraries and headers, as an NDK offers them.
file(WRITE ${platform}/android.c "
void ANativeWindow_acquire(void) {}
void ANativeWindow_release(void) {}
int ANativeWindow_setBuffersGeometry(void) { return 0; }
int ANativeWindow_lock(void) { return 0; }
int ANativeWindow_unlockAndPost(void) { return 0; }
")
file(WRITE ${platform}/log.c "int __android_log_print(void) { return 0; }\n")
foreach(name IN ITEMS android log)
    execute_process(COMMAND arm-linux-gnueabihf-gcc -shared -fPIC -nostdlib
        -Wl,-soname,lib${name}.so ${platform}/${name}.c -o ${platform}/lib${name}.so ${run})
endforeach()
file(COPY ${SOURCE}/host/include/android DESTINATION ${platform}/include)
file(COPY ${SOURCE}/host/jni/jni.h DESTINATION ${platform}/include)

set(ENV{ANDROID_NDK_ROOT} ${CMAKE_CURRENT_LIST_DIR}/ndk)
set(ENV{ANDROID_NDK_STANDIN_LIBRARIES} ${platform})
set(ENV{ANDROID_NDK_STANDIN_INCLUDES} ${platform}/include)
execute_process(COMMAND ${CMAKE_COMMAND} --preset android -B ${WORK}/build
    WORKING_DIRECTORY ${SOURCE} OUTPUT_QUIET ${run})
execute_process(COMMAND ${CMAKE_COMMAND} --build ${WORK}/build OUTPUT_QUIET ${run})
set(library ${WORK}/build/libvidshowhw2-19.so)

execute_process(COMMAND ${CMAKE_COMMAND} -DNM=${NM} -DREADELF=${READELF}
    -DLIBRARY=${library} -DLISTS=${SOURCE}/exports -P ${CMAKE_CURRENT_LIST_DIR}/exports.cmake ${run})

# The stand-in's C++ library keeps thread-local storage of its own, so only its absence of
# text relocations and the symbol table are asked for here.
execute_process(COMMAND ${CMAKE_COMMAND} -DNM=${NM} -DREADELF=${READELF} -DLIBRARY=${library}
    -DSANITIZE=standin -P ${CMAKE_CURRENT_LIST_DIR}/device_rules.cmake ${run})

# The C++ run-time library is inside ours, where our single-byte names are the only ones of their
# kind: nothing of it that classifies or converts wide characters may have come in.
execute_process(COMMAND ${NM} -C ${library} OUTPUT_VARIABLE symbols ${run})
if(NOT symbols MATCHES " T wctob")
    message(FATAL_ERROR "the library's symbols could not be read")
endif()
if(symbols MATCHES "std::(__[a-z0-9]+::)?(ctype|codecvt|numpunct|locale|ios_base)[<: ]")
    message(FATAL_ERROR "the C++ library's own wide characters would be ours: ${CMAKE_MATCH_0}")
endif()

execute_process(COMMAND ${READELF} -dW ${library} OUTPUT_VARIABLE dynamic ${run})
foreach(name IN ITEMS android log stagefright ui utils)
    if(NOT dynamic MATCHES "Shared library: \\[lib${name}\\.so\\]")
        message(FATAL_ERROR "the library does not name lib${name}.so")
    endif()
endforeach()
foreach(name IN ITEMS "libstdc\\+\\+" "libgcc_s" "libvidshow-host")
    if(dynamic MATCHES "${name}")
        message(FATAL_ERROR "the library depends on ${name}")
    endif()
endforeach()
if(dynamic MATCHES "RUNPATH|RPATH")
    message(FATAL_ERROR "the library carries a search path of the machine that built it")
endif()

execute_process(COMMAND ${CMAKE_COMMAND} --install ${WORK}/build --prefix ${WORK}/installed
    OUTPUT_QUIET ${run})
file(GLOB_RECURSE shipped ${WORK}/installed/*.so)
list(LENGTH shipped count)
if(NOT count EQUAL 1)
    message(FATAL_ERROR "libraries installed: ${shipped}")
endif()

# The package that Android's build takes native libraries from, and nothing beside it.
set(prefab ${WORK}/prefab)
execute_process(COMMAND ${CMAKE_COMMAND} --install ${WORK}/build --component prefab
    --prefix ${prefab} OUTPUT_QUIET ${run})
file(STRINGS ${WORK}/build/CMakeCache.txt version REGEX "^CMAKE_PROJECT_VERSION:")
string(REGEX REPLACE "^[^=]*=" "" version "${version}")

# expect(FILE KEY... VALUE): what a JSON file of the package says.
function(expect file)
    list(POP_BACK ARGN value)
    file(READ ${prefab}/${file} text)
    string(JSON found GET "${text}" ${ARGN})
    if(NOT found STREQUAL value)
        message(FATAL_ERROR "${file}: ${ARGN} is ${found}, not ${value}")
    endif()
endfunction()
set(module prefab/modules/vidshow)
set(abi ${module}/libs/android.armeabi-v7a)
expect(prefab/prefab.json name vidshow)
expect(prefab/prefab.json version ${version})
expect(prefab/prefab.json schema_version 2)
expect(${module}/module.json library_name libvidshowhw2-19)
expect(${abi}/abi.json abi armeabi-v7a)
expect(${abi}/abi.json api 19)
expect(${abi}/abi.json stl none)
file(READ ${prefab}/AndroidManifest.xml manifest)
if(NOT manifest MATCHES "versionName=\"${version}\"" OR NOT manifest MATCHES "minSdkVersion=\"19\"")
    message(FATAL_ERROR "the manifest says ${manifest}")
endif()

file(GLOB_RECURSE headers RELATIVE ${SOURCE}/include ${SOURCE}/include/vidshow/*.h)
set(laid_out ${module}/module.json ${abi}/abi.json ${abi}/libvidshowhw2-19.so
    prefab/prefab.json AndroidManifest.xml)
foreach(header IN LISTS headers)
    list(APPEND laid_out ${module}/include/${header})
endforeach()
file(GLOB_RECURSE there RELATIVE ${prefab} ${prefab}/*)
list(SORT there)
list(SORT laid_out)
if(NOT there STREQUAL laid_out)
    message(FATAL_ERROR "the package holds\n  ${there}\nand not\n  ${laid_out}")
endif()

# A player's module links with what the package holds, as Android's build makes it do.
file(WRITE ${WORK}/module.cpp "
#include <vidshow/presenter.h>
extern \"C\" void* open_screen(void) { return CreateVideoPresenterAdv(); }
")
execute_process(COMMAND arm-linux-gnueabihf-g++ -march=armv7-a -mfpu=neon -std=c++17 -shared -fPIC
    -I${prefab}/${module}/include ${WORK}/module.cpp ${prefab}/${abi}/libvidshowhw2-19.so
    -o ${WORK}/module.so ${run})
execute_process(COMMAND ${READELF} -dW ${WORK}/module.so OUTPUT_VARIABLE dynamic ${run})
if(NOT dynamic MATCHES "Shared library: \\[libvidshowhw2-19\\.so\\]")
    message(FATAL_ERROR "the module does not name the plug-in: ${dynamic}")
endif()
