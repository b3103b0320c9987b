tessella_test(NAME error_test LABEL unit SOURCES error_test.cpp)
tessella_test(NAME file_test LABEL unit SOURCES file_test.cpp)
# The twin of the resource service stands in for libbundle.so.
tessella_test(NAME zipopen_test LABEL unit SOURCES zipopen_test.cpp ../support/memory_bundle.cpp)
tessella_test(NAME message_test LABEL unit SOURCES message_test.cpp ../support/memory_bundle.cpp)
target_compile_definitions(message_test PRIVATE SOURCES="${PROJECT_SOURCE_DIR}/resources/"
    CATALOGUES="${PROJECT_BINARY_DIR}/resources/messages/"
    MESSAGE_COMPILER="$<TARGET_FILE:compile_messages>")
add_dependencies(message_test tessella_messages)

# An archive of files that are there anyway, in an ELF file that is nothing else.
set(root_file ${PROJECT_SOURCE_DIR}/README.md)
set(de_file ${PROJECT_SOURCE_DIR}/docs/architecture.md)
set(pt_file ${PROJECT_SOURCE_DIR}/CMakePresets.json)
set(test_archive ${CMAKE_CURRENT_BINARY_DIR}/archive.elf)
add_custom_command(OUTPUT ${test_archive}
    COMMAND pack_archive archive.zip locales=${PROJECT_SOURCE_DIR}/resources/locales
        empty=${PROJECT_SOURCE_DIR}/resources/tessella.msg
        text=${root_file} de/text=${de_file} pt/text=${pt_file}
        de/tessella.msg=${PROJECT_BINARY_DIR}/resources/messages/de/tessella.msg
    COMMAND ${CMAKE_OBJCOPY} -I binary -O elf64-x86-64 --rename-section .data=.zip,contents,readonly
        archive.zip ${test_archive}
    DEPENDS pack_archive tessella_messages ${root_file} ${de_file} ${pt_file}
    VERBATIM)
tessella_test(NAME bundle_test LABEL unit SOURCES bundle_test.cpp ${test_archive})
target_compile_definitions(bundle_test PRIVATE ARCHIVE="${test_archive}" ROOT_FILE="${root_file}"
    DE_FILE="${de_file}" PT_FILE="${pt_file}")
