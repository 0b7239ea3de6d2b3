# The target `docs`: the reference of the public headers, as pages in docs/html of the build folder. A
# warning of Doxygen's is an error, so that nothing public stays without its comment.
find_program(DOXYGEN doxygen)
if(DOXYGEN)
    set(VIDSHOW_DOCS_DIR ${PROJECT_BINARY_DIR}/docs)
    configure_file(${PROJECT_SOURCE_DIR}/cmake/Doxyfile.in ${VIDSHOW_DOCS_DIR}/Doxyfile @ONLY)
    add_custom_target(docs COMMAND ${DOXYGEN} ${VIDSHOW_DOCS_DIR}/Doxyfile
        COMMENT "Writing the reference into ${VIDSHOW_DOCS_DIR}/html" VERBATIM)
endif()
