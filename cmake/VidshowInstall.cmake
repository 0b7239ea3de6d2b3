# What `cmake --install` lays down: the libraries, the headers, two ways to find them, and the
# examples. The components `runtime`, `host` and `development` become packages of their own; so does
# `tools` (tools/), and `prefab` is there to be asked for (VidshowPrefab.cmake).
include(CMakePackageConfigHelpers)

install(TARGETS vidshow EXPORT vidshow-targets
    LIBRARY DESTINATION ${CMAKE_INSTALL_LIBDIR} COMPONENT runtime
    INCLUDES DESTINATION ${CMAKE_INSTALL_INCLUDEDIR})
install(DIRECTORY ${PROJECT_SOURCE_DIR}/include/vidshow
    DESTINATION ${CMAKE_INSTALL_INCLUDEDIR} COMPONENT development)
if(VIDSHOW_ON_DESKTOP)
    install(TARGETS vidshow-host EXPORT vidshow-targets
        LIBRARY DESTINATION ${CMAKE_INSTALL_LIBDIR}
            COMPONENT host NAMELINK_COMPONENT development
        INCLUDES DESTINATION ${CMAKE_INSTALL_INCLUDEDIR})
    install(DIRECTORY ${PROJECT_SOURCE_DIR}/host/include/vidshow-host
        DESTINATION ${CMAKE_INSTALL_INCLUDEDIR} COMPONENT development)
endif()

set(package_dir ${CMAKE_INSTALL_LIBDIR}/cmake/vidshow)
set(VIDSHOW_HOST_LIBS "")
if(VIDSHOW_ON_DESKTOP)
    set(VIDSHOW_HOST_LIBS "-lvidshow-host")
endif()
install(EXPORT vidshow-targets NAMESPACE vidshow:: DESTINATION ${package_dir}
    COMPONENT development)
configure_package_config_file(${PROJECT_SOURCE_DIR}/cmake/vidshow-config.cmake.in
    ${PROJECT_BINARY_DIR}/vidshow-config.cmake INSTALL_DESTINATION ${package_dir})
write_basic_package_version_file(${PROJECT_BINARY_DIR}/vidshow-config-version.cmake
    COMPATIBILITY SameMajorVersion)
install(FILES
    ${PROJECT_BINARY_DIR}/vidshow-config.cmake
    ${PROJECT_BINARY_DIR}/vidshow-config-version.cmake
    DESTINATION ${package_dir} COMPONENT development)

# The prefix follows the .pc file, so that an installed tree can be moved.
file(RELATIVE_PATH VIDSHOW_PC_PREFIX
    /prefix/${CMAKE_INSTALL_LIBDIR}/pkgconfig /prefix)
string(REGEX REPLACE "/$" "" VIDSHOW_PC_PREFIX "${VIDSHOW_PC_PREFIX}")
configure_file(${PROJECT_SOURCE_DIR}/cmake/vidshow.pc.in
    ${PROJECT_BINARY_DIR}/vidshow.pc @ONLY)
install(FILES ${PROJECT_BINARY_DIR}/vidshow.pc
    DESTINATION ${CMAKE_INSTALL_LIBDIR}/pkgconfig COMPONENT development)

if(VIDSHOW_ON_DESKTOP)
    install(DIRECTORY ${PROJECT_SOURCE_DIR}/examples
        DESTINATION ${CMAKE_INSTALL_DATADIR}/doc/libvidshow-dev COMPONENT development)
else()
    include(VidshowPrefab)
endif()
