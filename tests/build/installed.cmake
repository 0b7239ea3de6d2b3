# Installs the build, moves the copy, and builds what its users build against it in both usual ways:
# one program over every header, and the installed examples, whose output is compared.
cmake_minimum_required(VERSION 3.25)
include(${CMAKE_CURRENT_LIST_DIR}/consumers.cmake)
file(REMOVE_RECURSE ${WORK})
execute_process(COMMAND ${CMAKE_COMMAND} --install ${BUILD} --prefix ${WORK}/first
    OUTPUT_QUIET ${run})
file(RENAME ${WORK}/first ${WORK}/moved)
build_consumers(${WORK}/moved EXAMPLES)
