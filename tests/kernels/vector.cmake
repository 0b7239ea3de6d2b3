# Tests of the vector kernels. They hold the kernels' objects themselves, so that they can choose a
# back end, and export their symbols, so that they can look entries up by name.
foreach(name IN ITEMS backends lines rgb table yuv)
    vidshow_test(kernels_vec_${name}_test SOURCES vec_${name}_test.cpp
        LIBRARIES vidshow-vector ${CMAKE_DL_LIBS})
    set_target_properties(kernels_vec_${name}_test PROPERTIES ENABLE_EXPORTS ON)
endforeach()

# The arithmetic written out is held against every back end, not only the one that would be chosen.
foreach(backend IN LISTS VIDSHOW_VECTOR_BACKENDS)
    foreach(name IN ITEMS lines rgb yuv)
        add_test(NAME kernels_vec_${name}.${backend} COMMAND kernels_vec_${name}_test)
        set_tests_properties(kernels_vec_${name}.${backend} PROPERTIES
            TIMEOUT 240 ENVIRONMENT VIDSHOW_VECTOR_BACKEND=${backend})
    endforeach()
endforeach()

# Deinterlacing likewise: its line operations have a form for every back end.
foreach(name IN ITEMS lines modes x)
    vidshow_test(kernels_deinterlace_${name}_test SOURCES deinterlace_${name}_test.cpp
        LIBRARIES vidshow-vector)
    foreach(backend IN LISTS VIDSHOW_VECTOR_BACKENDS)
        add_test(NAME kernels_deinterlace_${name}.${backend}
            COMMAND kernels_deinterlace_${name}_test)
        set_tests_properties(kernels_deinterlace_${name}.${backend} PROPERTIES
            TIMEOUT 240 ENVIRONMENT VIDSHOW_VECTOR_BACKEND=${backend})
    endforeach()
endforeach()

# The kernels that move rows, and those that convert, scale and turn in one pass, which have a form for
# every back end, too.
foreach(name IN ITEMS row_moves fused table_lines)
    vidshow_test(kernels_${name}_test SOURCES ${name}_test.cpp LIBRARIES vidshow-vector)
endforeach()
foreach(name IN ITEMS nv12 plane_resize rgb_sources rotate_blocks convert_lines lines ycbcr420_rgb
        ycbcr420_rgb_case ycbcr420_rgb_nearest ycbcr420_rgb_rsz ycbcr420_rgb_rszup)
    vidshow_test(kernels_${name}_test SOURCES ${name}_test.cpp chosen_backend.cpp
        LIBRARIES vidshow-vector)
    foreach(backend IN LISTS VIDSHOW_VECTOR_BACKENDS)
        add_test(NAME kernels_${name}.${backend} COMMAND kernels_${name}_test)
        set_tests_properties(kernels_${name}.${backend} PROPERTIES
            TIMEOUT 240 ENVIRONMENT VIDSHOW_VECTOR_BACKEND=${backend})
    endforeach()
endforeach()

# Every lane operation alone. A back end's file is built once more, with a table of its operations
# behind it; that object calls nothing of the test framework, whose templates would otherwise be
# compiled for an instruction set that this processor may lack.
vidshow_test(kernels_vec_ops_test SOURCES vec_ops_test.cpp vec_ops_scalar.cpp)
foreach(backend IN LISTS VIDSHOW_VECTOR_BACKENDS)
    if(NOT backend STREQUAL "scalar")
        string(TOUPPER ${backend} macro_name)
        target_sources(kernels_vec_ops_test PRIVATE vec_ops_${backend}.cpp)
        set_source_files_properties(vec_ops_${backend}.cpp PROPERTIES
            COMPILE_OPTIONS "${VIDSHOW_VECTOR_FLAGS_${backend}}")
        target_compile_definitions(kernels_vec_ops_test PRIVATE VIDSHOW_VECTOR_${macro_name})
    endif()
endforeach()

# AVX-512 is proved on every processor: its source is built once more over SIMDe, which computes the
# instructions with whatever there is: sums of lanes that wrap among it, so that they have to wrap.
find_path(VIDSHOW_SIMDE_INCLUDE simde/x86/avx512.h)
if(VIDSHOW_FOR_X86_64 AND VIDSHOW_SIMDE_INCLUDE)
    set_source_files_properties(vec_avx512_portable.cpp PROPERTIES
        INCLUDE_DIRECTORIES ${CMAKE_CURRENT_SOURCE_DIR}/portable COMPILE_OPTIONS "-O2;-fwrapv;-Wno-psabi")
    foreach(test IN ITEMS kernels_vec_ops_test kernels_vec_backends_test)
        target_sources(${test} PRIVATE vec_avx512_portable.cpp)
        target_compile_definitions(${test} PRIVATE VIDSHOW_PORTABLE_AVX512)
    endforeach()
endif()

# A weak symbol in a back end's object could be the copy that the linker keeps for everybody.
if(NOT VIDSHOW_SANITIZE AND NOT VIDSHOW_COVERAGE)
    add_test(NAME VecObjects.NoWeakSymbols COMMAND ${CMAKE_COMMAND}
        -DNM=${CMAKE_NM} "-DOBJECTS=$<TARGET_OBJECTS:vidshow-vector>"
        -P ${CMAKE_CURRENT_SOURCE_DIR}/no_weak_symbols.cmake)
endif()

# What the compiler makes of the NEON loops; other options than those of a build for users say nothing.
list(FIND VIDSHOW_VECTOR_BACKENDS neon has_neon)
if(has_neon GREATER_EQUAL 0 AND CMAKE_CXX_COMPILER_ID STREQUAL GNU
        AND NOT VIDSHOW_SANITIZE AND NOT VIDSHOW_COVERAGE AND NOT CMAKE_BUILD_TYPE STREQUAL Debug)
    find_program(VIDSHOW_MCA llvm-mca)
    add_test(NAME VecObjects.NeonLoopsStayInRegisters COMMAND ${CMAKE_COMMAND}
        -DOBJDUMP=${CMAKE_OBJDUMP} "-DOBJECTS=$<TARGET_OBJECTS:vidshow-vector>"
        "-DMCA=$<$<BOOL:${VIDSHOW_MCA}>:${VIDSHOW_MCA}>"
        -P ${CMAKE_CURRENT_SOURCE_DIR}/neon_loops.cmake)
endif()

# The device's compiler is Clang, whose arm_neon.h is made of macros, where GCC's has functions.
find_program(VIDSHOW_CLANG clang++)
if(has_neon GREATER_EQUAL 0 AND CMAKE_CXX_COMPILER_ID STREQUAL GNU AND VIDSHOW_CLANG)
    foreach(family IN ITEMS vec deint row fused resample)
        add_test(NAME VecObjects.ClangTakesNeon.${family} COMMAND ${VIDSHOW_CLANG}
            --target=arm-linux-gnueabihf -march=armv7-a -mfpu=neon -mthumb -std=c++17 -O2
            -Wall -Wextra -Werror -I${PROJECT_SOURCE_DIR} -I${PROJECT_SOURCE_DIR}/include
            -c ${PROJECT_SOURCE_DIR}/kernels/neon/${family}_neon.cpp
            -o ${CMAKE_CURRENT_BINARY_DIR}/${family}_neon_clang.o)
    endforeach()
endif()
