# tessella_man_page(tool "what it does"): the manual page of a tool, from what the tool says of itself.
find_program(TESSELLA_HELP2MAN help2man)

function(tessella_man_page tool purpose)
    if(NOT TESSELLA_HELP2MAN)
        return()
    endif()
    set(page ${PROJECT_BINARY_DIR}/man/${tool}.1)
    add_custom_command(OUTPUT ${page}
        COMMAND ${CMAKE_COMMAND} -E make_directory ${PROJECT_BINARY_DIR}/man
        COMMAND ${TESSELLA_HELP2MAN} --no-info --name ${purpose} --source "Tessella ${PROJECT_VERSION}"
            --output ${page} $<TARGET_FILE:${tool}>
        DEPENDS ${tool}
        COMMENT "Writing ${tool}.1"
        VERBATIM)
    add_custom_target(${tool}-man ALL DEPENDS ${page})
    install(FILES ${page} DESTINATION ${CMAKE_INSTALL_MANDIR}/man1 COMPONENT tools)
endfunction()
