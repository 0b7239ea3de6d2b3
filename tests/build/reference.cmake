# Writes the reference of the public headers, with Doxygen's warnings as errors, and looks every name
# that the library exports up in it. The wide-character names are the C library's, declared there.
cmake_minimum_required(VERSION 3.25)
file(REMOVE_RECURSE ${WORK})
file(MAKE_DIRECTORY ${WORK})
file(READ ${DOXYFILE} settings)
file(WRITE ${WORK}/Doxyfile "${settings}
OUTPUT_DIRECTORY = ${WORK}
GENERATE_TAGFILE = ${WORK}/vidshow.tag
")
execute_process(COMMAND ${DOXYGEN} ${WORK}/Doxyfile COMMAND_ERROR_IS_FATAL ANY)
if(NOT EXISTS ${WORK}/html/index.html)
    message(FATAL_ERROR "there are no pages")
endif()

file(STRINGS ${WORK}/vidshow.tag documented REGEX "<name>")
list(TRANSFORM documented REPLACE ".*<name>([^<]*)</name>.*" "\\1")
file(GLOB lists ${LISTS}/*.list)
list(FILTER lists EXCLUDE REGEX "/wide\\.list$")
set(missing "")
set(count 0)
foreach(list IN LISTS lists)
    file(STRINGS ${list} names REGEX "^[^#]")
    foreach(name IN LISTS names)
        math(EXPR count "${count} + 1")
        if(NOT name IN_LIST documented)
            list(APPEND missing ${name})
        endif()
    endforeach()
endforeach()
if(missing OR count EQUAL 0)
    message(FATAL_ERROR "of ${count} exported names these are in no public header: ${missing}")
endif()
message(STATUS "${count} names, all in the reference")
