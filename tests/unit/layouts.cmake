find_package(PkgConfig REQUIRED)
pkg_check_modules(XKBCOMMON REQUIRED IMPORTED_TARGET xkbcommon)
tessella_test(NAME layouts_test LABEL unit SOURCES
    key_layout_test.cpp
    layout_compiler_test.cpp
    national_layouts_test.cpp
    LIBRARIES PkgConfig::XKBCOMMON)
add_dependencies(layouts_test tessella_key_layouts)
target_compile_definitions(layouts_test PRIVATE
    LAYOUT_COMPILER="$<TARGET_FILE:compile_key_layouts>"
    RESOURCES="${PROJECT_BINARY_DIR}/resources/layouts/")
