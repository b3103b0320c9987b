# tessella_add_console_test(NAME name PROGRAM target-or-path SCRIPT file [MODE WIDTHxHEIGHTxDEPTH] [ARGUMENTS words...])
#
# A test that runs a program on a virtual console with a script as its user, and fails if the script does, or if
# the screen is not as the script expects, or if the program ends with a status other than 0. The expected pictures
# lie beside the script; what a miss leaves is put into the current build folder. Building the target NAME-bless
# writes the pictures anew: look at them before you keep them.
function(tessella_add_console_test)
    cmake_parse_arguments(PARSE_ARGV 0 arg "" "NAME;PROGRAM;SCRIPT;MODE" "ARGUMENTS")
    foreach(needed NAME PROGRAM SCRIPT)
        if(NOT arg_${needed})
            message(FATAL_ERROR "tessella_add_console_test needs ${needed}")
        endif()
    endforeach()
    if(arg_UNPARSED_ARGUMENTS)
        message(FATAL_ERROR "tessella_add_console_test doesn't know ${arg_UNPARSED_ARGUMENTS}")
    endif()
    set(mode)
    if(arg_MODE)
        set(mode --mode ${arg_MODE})
    endif()
    set(program ${arg_PROGRAM})
    if(TARGET ${program})
        set(program $<TARGET_FILE:${program}>)
    endif()
    cmake_path(ABSOLUTE_PATH arg_SCRIPT BASE_DIRECTORY ${CMAKE_CURRENT_SOURCE_DIR})
    set(console $<TARGET_FILE:tessella::tessella-console> ${mode} --script ${arg_SCRIPT})
    add_test(NAME ${arg_NAME} COMMAND ${console} -- ${program} ${arg_ARGUMENTS})
    add_custom_target(${arg_NAME}-bless
        COMMAND ${console} --bless -- ${program} ${arg_ARGUMENTS}
        COMMENT "Writing the pictures that ${arg_NAME} expects"
        VERBATIM)
endfunction()
