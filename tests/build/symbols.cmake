# defined_symbols(FILE OUT): the dynamic symbols that a library defines, as "TYPE name", without
# the version suffix, the version node itself and what a coverage build adds.
function(defined_symbols file out)
    execute_process(COMMAND ${NM} -D --defined-only ${file}
        OUTPUT_VARIABLE text COMMAND_ERROR_IS_FATAL ANY)
    string(REGEX REPLACE "\n$" "" text "${text}")
    string(REPLACE "\n" ";" lines "${text}")
    set(symbols "")
    foreach(line IN LISTS lines)
        if(line MATCHES "^[0-9a-f]+ (.) ([^@]+)" AND NOT CMAKE_MATCH_1 STREQUAL "A")
            list(APPEND symbols "${CMAKE_MATCH_1} ${CMAKE_MATCH_2}")
        endif()
    endforeach()
    set(${out} "${symbols}" PARENT_SCOPE)
endfunction()
