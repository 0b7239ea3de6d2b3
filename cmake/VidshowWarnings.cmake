# One list of warnings for everything of ours.
function(vidshow_warnings target)
    target_compile_options(${target} PRIVATE
        $<$<COMPILE_LANGUAGE:CXX>:
            -Wall -Wextra -Wpedantic -Wshadow -Wconversion -Wsign-conversion -Wcast-align
            -Wformat=2 -Wnull-dereference -Wold-style-cast -Wnon-virtual-dtor -Woverloaded-virtual
            -Wundef>)
    if(VIDSHOW_WARNINGS_AS_ERRORS)
        target_compile_options(${target} PRIVATE -Werror)
    endif()
endfunction()
