# The exported names stand in exports/*.list: one C name a line, and classes in classes.list. From
# them the linker gets a version script; everything that is not listed stays inside the library.

file(GLOB VIDSHOW_EXPORT_LISTS CONFIGURE_DEPENDS ${PROJECT_SOURCE_DIR}/exports/*.list)

function(vidshow_read_list file out)
    file(STRINGS ${file} lines)
    list(FILTER lines EXCLUDE REGEX "^(#|$)")
    set(${out} ${lines} PARENT_SCOPE)
endfunction()

function(vidshow_exports target)
    set(c_names "")
    set(cxx_names "        \"operator==(GUID const&, GUID const&)\";\n")
    string(APPEND cxx_names "        \"operator!=(GUID const&, GUID const&)\";\n")
    foreach(list IN LISTS VIDSHOW_EXPORT_LISTS)
        set_property(DIRECTORY APPEND PROPERTY CMAKE_CONFIGURE_DEPENDS ${list})
        vidshow_read_list(${list} names)
        foreach(name IN LISTS names)
            if(list MATCHES "/classes\\.list$")
                string(APPEND cxx_names "        ${name}::*;\n")
                foreach(what IN ITEMS "vtable" "typeinfo" "typeinfo name")
                    string(APPEND cxx_names "        \"${what} for ${name}\";\n")
                endforeach()
            else()
                string(APPEND c_names "        ${name};\n")
            endif()
        endforeach()
    endforeach()
    set(script ${PROJECT_BINARY_DIR}/vidshow.map)
    file(CONFIGURE OUTPUT ${script} @ONLY CONTENT
"VIDSHOW_1 {
    global:
@c_names@
    extern \"C++\" {
@cxx_names@    };
    local: *;
};
")
    target_link_options(${target} PRIVATE
        -Wl,--version-script=${script} -Wl,-z,text -Wl,--hash-style=both -Wl,-Bsymbolic-functions)
    if(NOT VIDSHOW_SANITIZE)  # a sanitizer's run-time library is found in the program, not in ours
        target_link_options(${target} PRIVATE -Wl,-z,defs)
    endif()
    set_property(TARGET ${target} APPEND PROPERTY LINK_DEPENDS ${script})
endfunction()
