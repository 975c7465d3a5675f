# Manual pages tarn(1) and tarn-cli(1), made by help2man at build time from the programs' own
# --help (tarn-cli's with every subcommand), with what --help does not say from man/*.h2m, so
# that a page cannot drift from its program. Installed gzipped, as Debian Policy asks.
if(WIN32 OR CMAKE_CROSSCOMPILING)
    return()
endif()
find_program(TARN_HELP2MAN help2man)
find_program(TARN_GZIP gzip REQUIRED)
if(NOT TARN_HELP2MAN)
    message(WARNING "help2man is missing, so the manual pages are not built (scripts/setup "
                    "installs it)")
    return()
endif()

# program: the command help2man runs with --help and --version.
function(tarn_man_page name program)
    set(page ${CMAKE_CURRENT_BINARY_DIR}/man/${name}.1)
    add_custom_command(OUTPUT ${page}.gz
        COMMAND ${CMAKE_COMMAND} -E make_directory ${CMAKE_CURRENT_BINARY_DIR}/man
        COMMAND ${TARN_HELP2MAN} --no-info --include=${CMAKE_CURRENT_SOURCE_DIR}/man/${name}.h2m
            --output=${page} ${program}
        COMMAND ${TARN_GZIP} -9nf ${page}
        DEPENDS ${name} man/${name}.h2m man/help_for_man.sh
        COMMENT "Manual page ${name}(1)"
        VERBATIM)
    add_custom_target(${name}_man_page ALL DEPENDS ${page}.gz)
    install(FILES ${page}.gz DESTINATION ${CMAKE_INSTALL_MANDIR}/man1)
endfunction()

tarn_man_page(tarn-cli "sh ${CMAKE_CURRENT_SOURCE_DIR}/man/help_for_man.sh $<TARGET_FILE:tarn-cli>")
if(TARGET tarn)
    tarn_man_page(tarn $<TARGET_FILE:tarn>)
endif()
