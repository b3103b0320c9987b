tessella_test(NAME assert_test LABEL unit SOURCES assert.cpp)
# The names of the test's own functions must stand in the stack reports it looks at.
set_target_properties(assert_test PROPERTIES ENABLE_EXPORTS ON)

add_executable(assert_path_probe assert_path_probe.cpp)
target_link_libraries(assert_path_probe PRIVATE tessella_internal)
add_dependencies(assert_test assert_path_probe)
target_compile_definitions(assert_test PRIVATE ASSERT_PATH_PROBE="$<TARGET_FILE:assert_path_probe>")
