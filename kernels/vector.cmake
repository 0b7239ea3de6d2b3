# The vector kernels are an object library: the library takes its objects in, and so do the tests
# and benchmarks that choose a back end by name, which no exported function does.
add_library(vidshow-vector OBJECT
    ${CMAKE_CURRENT_LIST_DIR}/vec_blend.cpp
    ${CMAKE_CURRENT_LIST_DIR}/vec_choose.cpp
    ${CMAKE_CURRENT_LIST_DIR}/vec_entry.cpp
    ${CMAKE_CURRENT_LIST_DIR}/vec_scalar.cpp)
target_include_directories(vidshow-vector
    PUBLIC ${PROJECT_SOURCE_DIR}/include PRIVATE ${PROJECT_SOURCE_DIR})
target_compile_options(vidshow-vector PRIVATE -fno-exceptions)
vidshow_warnings(vidshow-vector)
target_sources(vidshow PRIVATE $<TARGET_OBJECTS:vidshow-vector>)
