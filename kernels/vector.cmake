# The vector kernels are an object library: the library takes its objects in, and so do the tests
# and benchmarks that choose a back end by name, which no exported function does.
include(CheckCXXSourceCompiles)

option(VIDSHOW_X86_SSE41 "On x86, build the SSE4.1 vector kernels in; the processor is asked" ON)
option(VIDSHOW_X86_AVX2 "On x86, build the AVX2 vector kernels in; the processor is asked" ON)
option(VIDSHOW_X86_AVX512 "On x86, build the AVX-512BW vector kernels in, beside those of AVX2; the processor is asked" ON)

add_library(vidshow-vector OBJECT
    ${CMAKE_CURRENT_LIST_DIR}/convert_lines.cpp
    ${CMAKE_CURRENT_LIST_DIR}/deint_scalar.cpp
    ${CMAKE_CURRENT_LIST_DIR}/deinterlace.cpp
    ${CMAKE_CURRENT_LIST_DIR}/deinterlace_fast.cpp
    ${CMAKE_CURRENT_LIST_DIR}/deinterlace_lines.cpp
    ${CMAKE_CURRENT_LIST_DIR}/deinterlace_modes.cpp
    ${CMAKE_CURRENT_LIST_DIR}/deinterlace_x.cpp
    ${CMAKE_CURRENT_LIST_DIR}/lines.cpp
    ${CMAKE_CURRENT_LIST_DIR}/table_lines.cpp
    ${CMAKE_CURRENT_LIST_DIR}/nv12.cpp
    ${CMAKE_CURRENT_LIST_DIR}/planar_lines.cpp
    ${CMAKE_CURRENT_LIST_DIR}/plane_resize.cpp
    ${CMAKE_CURRENT_LIST_DIR}/rgb_sources.cpp
    ${CMAKE_CURRENT_LIST_DIR}/rotate_blocks.cpp
    ${CMAKE_CURRENT_LIST_DIR}/row_scalar.cpp
    ${CMAKE_CURRENT_LIST_DIR}/scaled_rows.cpp
    ${CMAKE_CURRENT_LIST_DIR}/strip_rows.cpp
    ${CMAKE_CURRENT_LIST_DIR}/vec_blend.cpp
    ${CMAKE_CURRENT_LIST_DIR}/vec_choose.cpp
    ${CMAKE_CURRENT_LIST_DIR}/vec_entry.cpp
    ${CMAKE_CURRENT_LIST_DIR}/vec_scalar.cpp
    ${CMAKE_CURRENT_LIST_DIR}/ycbcr420_rgb.cpp
    ${CMAKE_CURRENT_LIST_DIR}/ycbcr420_rgb_case.cpp
    ${CMAKE_CURRENT_LIST_DIR}/ycbcr420_rgb_nearest.cpp
    ${CMAKE_CURRENT_LIST_DIR}/ycbcr420_rgb_rsz.cpp
    ${CMAKE_CURRENT_LIST_DIR}/ycbcr420_rgb_rszup.cpp
    ${CMAKE_CURRENT_LIST_DIR}/ycbcr422_rgb565.cpp
    ${CMAKE_CURRENT_LIST_DIR}/ycbcr444_rgb.cpp)
target_include_directories(vidshow-vector
    PUBLIC ${PROJECT_SOURCE_DIR}/include PRIVATE ${PROJECT_SOURCE_DIR})
target_compile_options(vidshow-vector PRIVATE -fno-exceptions)
vidshow_warnings(vidshow-vector)
target_sources(vidshow PRIVATE $<TARGET_OBJECTS:vidshow-vector>)

# vidshow_vector_backend(name folder [flag...]): one more back end, its files with its own flags. Tests
# and benchmarks find the names in VIDSHOW_VECTOR_BACKENDS, the flags in VIDSHOW_VECTOR_FLAGS_name.
set(backends scalar)
macro(vidshow_vector_backend name folder)
    string(TOUPPER ${name} macro_name)
    foreach(family IN ITEMS vec deint row fused resample)
        set(source ${PROJECT_SOURCE_DIR}/kernels/${folder}/${family}_${name}.cpp)
        if(EXISTS ${source})
            target_sources(vidshow-vector PRIVATE ${source})
            set_source_files_properties(${source} PROPERTIES COMPILE_OPTIONS "${ARGN}")
        endif()
    endforeach()
    target_compile_definitions(vidshow-vector PUBLIC VIDSHOW_VECTOR_${macro_name})
    list(APPEND backends ${name})
    set(VIDSHOW_VECTOR_FLAGS_${name} "${ARGN}" CACHE INTERNAL "Compiler flags of that back end")
endmacro()

check_cxx_source_compiles("
    #ifndef __x86_64__
    #error other
    #endif
    int main() {}" VIDSHOW_FOR_X86_64)
check_cxx_source_compiles("
    #include <arm_neon.h>
    int main() { return vgetq_lane_u16(vmull_u8(vdup_n_u8(0), vdup_n_u8(0)), 0); }"
    VIDSHOW_FOR_NEON)
if(VIDSHOW_FOR_X86_64 AND VIDSHOW_X86_SSE41)
    vidshow_vector_backend(sse41 x86 -msse4.1)
endif()
if(VIDSHOW_FOR_X86_64 AND VIDSHOW_X86_AVX2)
    vidshow_vector_backend(avx2 x86 -mavx2)
endif()
if(VIDSHOW_FOR_X86_64 AND VIDSHOW_X86_AVX2 AND VIDSHOW_X86_AVX512)
    # GCC's own header leaves a register undefined on purpose, and GCC 12 warns of it.
    vidshow_vector_backend(avx512 x86 -mavx512bw
        -Wno-uninitialized $<$<CXX_COMPILER_ID:GNU>:-Wno-maybe-uninitialized>)
endif()
if(VIDSHOW_FOR_NEON)
    vidshow_vector_backend(neon neon)
endif()
set(VIDSHOW_VECTOR_BACKENDS ${backends} CACHE INTERNAL "Back ends of the vector kernels")
