# What every command line tool gets: its place in the component Tools, a completion for bash, and a man page where help2man
# is installed.

cmake_path(RELATIVE_PATH CMAKE_INSTALL_FULL_LIBDIR BASE_DIRECTORY ${CMAKE_INSTALL_FULL_BINDIR}
           OUTPUT_VARIABLE KPLIB_BIN_TO_LIB)
if(NOT CMAKE_CROSSCOMPILING)  # the page is what the program prints
    find_program(KPLIB_HELP2MAN help2man)
endif()

# Installs the program `tool`, of which `purpose` is the line in the list of man pages. The folder of the caller holds its
# completion, `tool`.bash.
function(kplib_install_tool tool purpose)
    if(NOT KPLIB_INSTALL)
        return()
    endif()
    set_target_properties(${tool} PROPERTIES INSTALL_RPATH "$ORIGIN/${KPLIB_BIN_TO_LIB}")
    install(TARGETS ${tool} RUNTIME COMPONENT Tools)
    install(FILES ${tool}.bash DESTINATION ${CMAKE_INSTALL_DATADIR}/bash-completion/completions RENAME ${tool}
            COMPONENT Tools)
    if(NOT KPLIB_HELP2MAN)
        return()
    endif()
    set(page ${CMAKE_CURRENT_BINARY_DIR}/${tool}.1)
    add_custom_command(OUTPUT ${page} DEPENDS ${tool} VERBATIM
                       COMMAND ${KPLIB_HELP2MAN} --no-info --section=1 --name=${purpose} --help-option=--help-all
                               --output=${page} $<TARGET_FILE:${tool}>)
    add_custom_target(${tool}_man ALL DEPENDS ${page})
    install(FILES ${page} DESTINATION ${CMAKE_INSTALL_MANDIR}/man1 COMPONENT Tools)
endfunction()
