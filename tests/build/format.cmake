# Every C++ file is laid out by .clang-format.
cmake_minimum_required(VERSION 3.25)
if(NOT CLANG_FORMAT)
    message(FATAL_ERROR "clang-format is missing: install Debian's package clang-format")
endif()
execute_process(COMMAND git ls-files -- *.h *.cpp WORKING_DIRECTORY ${SOURCE}
    OUTPUT_VARIABLE files COMMAND_ERROR_IS_FATAL ANY)
string(STRIP "${files}" files)
string(REPLACE "\n" ";" files "${files}")
execute_process(COMMAND ${CLANG_FORMAT} --dry-run --Werror ${files}
    WORKING_DIRECTORY ${SOURCE} COMMAND_ERROR_IS_FATAL ANY)
