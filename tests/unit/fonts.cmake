find_package(PNG REQUIRED)
tessella_test(NAME glyphset_test LABEL unit SOURCES
    cgf_writer_test.cpp
    cgf_views_test.cpp
    LIBRARIES tessella_glyphset tessella_cgf_views PNG::PNG)
add_dependencies(glyphset_test tessella_glyphset_file tessella-cgf)
target_compile_definitions(glyphset_test PRIVATE
    CGF_TOOL="$<TARGET_FILE:tessella-cgf>"
    GLYPHSET="${PROJECT_BINARY_DIR}/resources/fonts/glyphset.cgf"
    BITMAPS="${TESSELLA_FONT_BITMAPS}"
    OUTLINES="${TESSELLA_FONT_OUTLINES}"
    CELLS="${TESSELLA_FONT_CELLS}"
    OFFSETS="${TESSELLA_FONT_OFFSETS}")
