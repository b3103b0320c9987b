# The target `docs`: HTML from the public headers and the guides, in docs/html of the build folder.
find_program(TESSELLA_DOXYGEN doxygen)
if(NOT TESSELLA_DOXYGEN)
    return()
endif()
configure_file(cmake/Doxyfile.in ${PROJECT_BINARY_DIR}/docs/Doxyfile @ONLY)
add_custom_target(docs
    COMMAND ${TESSELLA_DOXYGEN} ${PROJECT_BINARY_DIR}/docs/Doxyfile
    COMMENT "Writing docs/html/index.html"
    VERBATIM)
