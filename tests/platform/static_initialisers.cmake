# cmake -DNM=... -DLIBRARY=... -P static_initialisers.cmake
# Loading the library runs one constructor of ours, that of the counters' lock. The compiler names
# the function that does so after its file.
execute_process(COMMAND ${NM} ${LIBRARY} OUTPUT_VARIABLE symbols COMMAND_ERROR_IS_FATAL ANY)
string(REGEX MATCHALL "_GLOBAL__sub_I_[A-Za-z0-9_.]*" found "${symbols}")
if(NOT found STREQUAL "_GLOBAL__sub_I_counters.cpp")
    message(FATAL_ERROR "static initialisers: ${found}")
endif()
