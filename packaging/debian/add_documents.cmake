# cpack runs this when the components' files lie in their folders, before they become packages.
foreach(component IN LISTS CPACK_COMPONENTS_ALL)
    string(TOUPPER ${component} upper)
    set(package ${CPACK_DEBIAN_${upper}_PACKAGE_NAME})
    file(COPY ${CPACK_VIDSHOW_PACKAGE_DOCUMENTS}
        DESTINATION ${CPACK_TEMPORARY_DIRECTORY}/${component}/usr/share/doc/${package})

    # Debian has its manual pages compressed.
    file(GLOB manuals ${CPACK_TEMPORARY_DIRECTORY}/${component}/usr/share/man/man?/*.[1-8])
    foreach(manual IN LISTS manuals)
        file(ARCHIVE_CREATE OUTPUT ${manual}.gz PATHS ${manual} FORMAT raw COMPRESSION GZip
            COMPRESSION_LEVEL 9)
        file(REMOVE ${manual})
    endforeach()
endforeach()
