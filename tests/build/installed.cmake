# Installs the build, moves the copy, and builds one program against it in both usual ways.
cmake_minimum_required(VERSION 3.25)
file(REMOVE_RECURSE ${WORK})
set(run COMMAND_ERROR_IS_FATAL ANY)
execute_process(COMMAND ${CMAKE_COMMAND} --install ${BUILD} --prefix ${WORK}/first
    OUTPUT_QUIET ${run})
file(RENAME ${WORK}/first ${WORK}/moved)
file(GLOB libdirs ${WORK}/moved/lib ${WORK}/moved/lib/*-linux-gnu*)
foreach(dir IN LISTS libdirs)
    if(EXISTS ${dir}/libvidshowhw2-19.so)
        set(libdir ${dir})
    endif()
endforeach()

execute_process(COMMAND ${CMAKE_COMMAND} -S ${SOURCE} -B ${WORK}/by-cmake -G ${GENERATOR}
    -DCMAKE_CXX_COMPILER=${CXX} -DCMAKE_PREFIX_PATH=${WORK}/moved OUTPUT_QUIET ${run})
execute_process(COMMAND ${CMAKE_COMMAND} --build ${WORK}/by-cmake OUTPUT_QUIET ${run})
execute_process(COMMAND ${WORK}/by-cmake/consumer ${run})

set(ENV{PKG_CONFIG_PATH} ${libdir}/pkgconfig)
execute_process(COMMAND pkg-config --cflags --libs vidshow OUTPUT_VARIABLE flags ${run})
separate_arguments(flags UNIX_COMMAND "${flags}")
execute_process(COMMAND ${CXX} -std=c++17 ${SOURCE}/main.cpp -o ${WORK}/by-pkg-config ${flags}
    -Wl,-rpath,${libdir} ${run})
execute_process(COMMAND ${WORK}/by-pkg-config ${run})
