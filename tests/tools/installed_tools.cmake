# Installs the build and runs the installed tools, which must find their library; looks for their
# manual pages and completions.
cmake_minimum_required(VERSION 3.25)
file(REMOVE_RECURSE ${WORK})
set(run COMMAND_ERROR_IS_FATAL ANY)
execute_process(COMMAND ${CMAKE_COMMAND} --install ${BUILD} --prefix ${WORK} OUTPUT_QUIET ${run})
# As Debian packages they find it where every program looks, which this folder is not.
if(DEBIAN_PACKAGES)
    set(libraries LD_LIBRARY_PATH=${WORK}/${LIBDIR})
endif()
foreach(tool IN LISTS TOOLS)
    execute_process(COMMAND ${CMAKE_COMMAND} -E env ${libraries} ${WORK}/bin/${tool} --version
        OUTPUT_QUIET ${run})
    foreach(file IN ITEMS share/man/man1/${tool}.1 share/bash-completion/completions/${tool})
        if(NOT EXISTS ${WORK}/${file})
            message(FATAL_ERROR "${file} is not installed")
        endif()
    endforeach()
endforeach()

# The component alone holds the tools and nothing else.
execute_process(COMMAND ${CMAKE_COMMAND} --install ${BUILD} --prefix ${WORK}/alone --component tools
    OUTPUT_QUIET ${run})
file(GLOB_RECURSE files RELATIVE ${WORK}/alone ${WORK}/alone/*)
list(LENGTH files count)
list(LENGTH TOOLS tools)
math(EXPR wanted "3 * ${tools}")
if(NOT count EQUAL wanted)
    message(FATAL_ERROR "the component holds ${files}")
endif()
