# Debian packages, by cpack: one for each installed component, named as Debian names them. The
# version is the project's; the packages' own revision is counted here.
set(CPACK_GENERATOR DEB)
set(CPACK_PACKAGE_NAME vidshow)
set(CPACK_PACKAGE_VERSION ${PROJECT_VERSION})
set(CPACK_PACKAGE_DESCRIPTION_SUMMARY "")  # every package has its own
set(CPACK_PACKAGE_VENDOR vidshow)
set(CPACK_PACKAGE_CONTACT "vidshow maintainers <maintainers@vidshow.invalid>")
set(CPACK_PACKAGING_INSTALL_PREFIX /usr)
set(CPACK_PACKAGE_DIRECTORY ${PROJECT_BINARY_DIR}/packages)
set(CPACK_STRIP_FILES ON)
set(CPACK_DEB_COMPONENT_INSTALL ON)
set(CPACK_DEBIAN_FILE_NAME DEB-DEFAULT)
set(CPACK_DEBIAN_PACKAGE_RELEASE 1)
set(CPACK_DEBIAN_PACKAGE_SOURCE vidshow)
set(CPACK_DEBIAN_PACKAGE_PRIORITY optional)
set(CPACK_DEBIAN_PACKAGE_CONTROL_STRICT_PERMISSION ON)

# What a program needs is read out of it; what the packages need of each other is named below, for
# the package tools do not know those yet.
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS ON)
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS_PRIVATE_DIRS ${PROJECT_BINARY_DIR} ${PROJECT_BINARY_DIR}/host)
set(CPACK_DEBIAN_ENABLE_COMPONENT_DEPENDS ON)

# vidshow_package(COMPONENT NAME package SECTION section [DEPENDS component...]
#     [LIBRARY name version] SUMMARY line TEXT paragraph): a package of the files that are installed
# as COMPONENT, if any are. LIBRARY: the shared library that it brings, as packages of others that
# link with it have to be told.
macro(vidshow_package component)
    cmake_parse_arguments(arg "" "NAME;SECTION;SUMMARY;TEXT" "DEPENDS;LIBRARY" ${ARGN})
    get_cmake_property(installed COMPONENTS)
    if(${component} IN_LIST installed)
        string(TOUPPER ${component} upper)
        list(APPEND CPACK_COMPONENTS_ALL ${component})
        set(CPACK_COMPONENT_${upper}_DEPENDS ${arg_DEPENDS})
        set(CPACK_DEBIAN_${upper}_DESCRIPTION "${arg_SUMMARY}\n${arg_TEXT}")
        set(CPACK_DEBIAN_${upper}_PACKAGE_NAME ${arg_NAME})
        set(CPACK_DEBIAN_${upper}_PACKAGE_SECTION ${arg_SECTION})
        if(arg_LIBRARY)
            list(JOIN arg_LIBRARY " " library)
            set(control ${PROJECT_BINARY_DIR}/debian/${component}/shlibs)
            file(CONFIGURE OUTPUT ${control} CONTENT
                "@library@ @arg_NAME@ (>= @PROJECT_VERSION@)\n" @ONLY)
            set(CPACK_DEBIAN_${upper}_PACKAGE_CONTROL_EXTRA
                ${control} ${PROJECT_SOURCE_DIR}/packaging/debian/triggers)
        endif()
    endif()
endmacro()

# What every package has to carry beside what is installed.
string(TIMESTAMP VIDSHOW_PACKAGE_DATE "%a, %d %b %Y %H:%M:%S +0000" UTC)
configure_file(${PROJECT_SOURCE_DIR}/packaging/debian/changelog.in
    ${PROJECT_BINARY_DIR}/debian/changelog.Debian @ONLY)
file(ARCHIVE_CREATE OUTPUT ${PROJECT_BINARY_DIR}/debian/changelog.Debian.gz
    PATHS ${PROJECT_BINARY_DIR}/debian/changelog.Debian FORMAT raw COMPRESSION GZip COMPRESSION_LEVEL 9)
set(CPACK_VIDSHOW_PACKAGE_DOCUMENTS
    ${PROJECT_SOURCE_DIR}/packaging/debian/copyright
    ${PROJECT_BINARY_DIR}/debian/changelog.Debian.gz)
set(CPACK_PRE_BUILD_SCRIPTS ${PROJECT_SOURCE_DIR}/packaging/debian/add_documents.cmake)

vidshow_package(runtime NAME libvidshowhw2-19 SECTION libs DEPENDS host
    LIBRARY libvidshowhw2 19
    SUMMARY "video presenter plug-in and exact frame converter"
    TEXT "Shows decoded frames on a native window, converts, scales, turns and adjusts
pictures exactly to the bit, and offers a Win32-style layer over POSIX threads.")
vidshow_package(host NAME libvidshow-host${PROJECT_VERSION_MAJOR} SECTION libs
    LIBRARY libvidshow-host ${PROJECT_VERSION_MAJOR}
    SUMMARY "desktop stand-in for the device's native window"
    TEXT "Carries the names that the presenter plug-in takes from the device's system
libraries, and shows a program every buffer that is posted to a window.")
vidshow_package(development NAME libvidshow-dev SECTION libdevel DEPENDS runtime host
    SUMMARY "video presenter plug-in and exact frame converter (development files)"
    TEXT "Headers, what CMake and pkg-config find the library by, and examples.")
vidshow_package(tools NAME vidshow-tools SECTION video DEPENDS runtime host
    SUMMARY "command-line tools over the vidshow library"
    TEXT "A player that drives the presenter, and a converter over the image engine.")
vidshow_package(gstreamer NAME gstreamer1.0-vidshow SECTION libs DEPENDS runtime host
    SUMMARY "GStreamer element over the vidshow presenter"
    TEXT "The element vidshowsink hands frames to a presenter on a host window.")

include(CPack)
