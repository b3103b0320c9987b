# The target `docs`: HTML from the public headers and the guides, in docs/html of the build folder. Its pictures are those
# that the guides' tests expect, and what the examples show on the virtual console now.
find_program(TESSELLA_DOXYGEN doxygen)
if(NOT TESSELLA_DOXYGEN)
    return()
endif()
configure_file(cmake/Doxyfile.in ${PROJECT_BINARY_DIR}/docs/Doxyfile @ONLY)

set(pictures ${PROJECT_BINARY_DIR}/docs/pictures)
file(MAKE_DIRECTORY ${pictures})
add_custom_command(OUTPUT ${pictures}/made
    COMMAND tessella-console --mode 640x480x32 --script ${PROJECT_SOURCE_DIR}/examples/gallery.script --
        $<TARGET_FILE:gallery>
    COMMAND ${CMAKE_COMMAND} -E touch made
    DEPENDS gallery tessella-console tessella ${PROJECT_SOURCE_DIR}/examples/gallery.script
    WORKING_DIRECTORY ${pictures}
    COMMENT "Taking the pictures of the documentation"
    VERBATIM)
add_custom_target(docs
    COMMAND ${TESSELLA_DOXYGEN} ${PROJECT_BINARY_DIR}/docs/Doxyfile
    DEPENDS ${pictures}/made
    COMMENT "Writing docs/html/index.html"
    VERBATIM)
