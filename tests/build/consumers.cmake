# Programs over an installed copy. Wants WORK, CXX, GENERATOR, and VERSION, the version that every way
# to the library has to tell.
set(run COMMAND_ERROR_IS_FATAL ANY)

function(build_with_cmake source prefix)
    get_filename_component(name ${source} NAME)
    set(tree ${WORK}/by-cmake/${name})
    execute_process(COMMAND ${CMAKE_COMMAND} -S ${source} -B ${tree} -G ${GENERATOR}
        -DCMAKE_CXX_COMPILER=${CXX} -DCMAKE_PREFIX_PATH=${prefix} OUTPUT_QUIET ${run})
    execute_process(COMMAND ${CMAKE_COMMAND} --build ${tree} OUTPUT_QUIET ${run})
    execute_process(COMMAND ${CMAKE_CTEST_COMMAND} --test-dir ${tree} --output-on-failure
        --no-tests=error ${run})
endfunction()

function(build_with_pkg_config source libdir)
    get_filename_component(name ${source} NAME_WE)
    set(program ${WORK}/by-pkg-config-${name})
    execute_process(COMMAND pkg-config --cflags --libs vidshow OUTPUT_VARIABLE flags ${run})
    separate_arguments(flags UNIX_COMMAND "${flags}")
    execute_process(COMMAND ${CXX} -std=c++17 ${source} -o ${program} ${flags}
        -Wl,-rpath,${libdir} ${run})
    set(argument "")
    if(name STREQUAL "android_player")
        set(argument ${libdir}/libvidshowhw2-19.so)
    endif()
    execute_process(COMMAND ${program} ${argument} WORKING_DIRECTORY ${WORK}
        OUTPUT_VARIABLE printed ${run})
    string(REGEX REPLACE "\\.cpp$" ".expected" expected_file ${source})
    if(EXISTS ${expected_file})
        file(READ ${expected_file} expected)
        if(NOT printed STREQUAL expected)
            message(FATAL_ERROR "${name} prints\n${printed}instead of\n${expected}")
        endif()
    endif()
endfunction()

# build_consumers(PREFIX [EXAMPLES]): through CMake and through pkg-config, one program over every
# header, and with EXAMPLES also the installed examples.
function(build_consumers prefix)
    file(GLOB_RECURSE libraries ${prefix}/lib/libvidshowhw2-19.so)
    list(LENGTH libraries count)
    if(NOT count EQUAL 1)
        message(FATAL_ERROR "the library is installed ${count} times: ${libraries}")
    endif()
    get_filename_component(libdir ${libraries} DIRECTORY)
    set(consumer ${CMAKE_CURRENT_FUNCTION_LIST_DIR}/consumer)
    set(examples ${prefix}/share/doc/libvidshow-dev/examples)
    file(GLOB sources ${examples}/*.cpp)
    if(NOT sources)
        message(FATAL_ERROR "no examples are installed")
    endif()

    set(ENV{PKG_CONFIG_PATH} ${libdir}/pkgconfig)
    execute_process(COMMAND pkg-config --modversion vidshow OUTPUT_VARIABLE version
        OUTPUT_STRIP_TRAILING_WHITESPACE ${run})
    if(NOT version STREQUAL VERSION)
        message(FATAL_ERROR "pkg-config tells version ${version}, not ${VERSION}")
    endif()

    build_with_cmake(${consumer} ${prefix})
    build_with_pkg_config(${consumer}/main.cpp ${libdir})
    if("EXAMPLES" IN_LIST ARGN)
        build_with_cmake(${examples} ${prefix})
        foreach(source IN LISTS sources)
            build_with_pkg_config(${source} ${libdir})
        endforeach()
    endif()
endfunction()
