# The twin of the resource service brings fonts of any kind.
tessella_test(NAME font_test LABEL unit SOURCES
    cgf_test.cpp
    font_ft_test.cpp
    font_substitution_test.cpp
    font_test.cpp
    ../support/memory_bundle.cpp)
target_compile_definitions(font_test PRIVATE RESOURCES="${PROJECT_SOURCE_DIR}/resources/"
    FACE="${PROJECT_BINARY_DIR}/resources/Nimbus_Sans.afm" METRICS="/usr/share/fonts/type1/urw-base35/NimbusSans-Regular.afm")
add_dependencies(font_test tessella_archive)
