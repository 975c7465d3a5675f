# What a Debian user looks for in share/doc/tarn beside README.txt: the licence as a
# machine-readable copyright file, made from LICENSE, and CHANGELOG.md as a Debian changelog,
# compressed the way Debian Policy asks (gzip -9n, no name or time stamp inside).

# The Windows zip carries the licence as it stands, beside the program and its read-me.
if(WIN32)
    install(FILES LICENSE DESTINATION . RENAME LICENSE.txt)
    return()
endif()

# LICENSE: a title, the copyright line, then the licence's text.
file(READ LICENSE license)
set_property(DIRECTORY APPEND PROPERTY CMAKE_CONFIGURE_DEPENDS LICENSE)
if(NOT license MATCHES "\nCopyright \\(c\\) ([^\n]+)\n\n(.*[^\n])\n*$")
    message(FATAL_ERROR "LICENSE: no \"Copyright (c) ...\" line followed by the licence's text")
endif()
set(TARN_COPYRIGHT "${CMAKE_MATCH_1}")
# Each line of the text one blank in, an empty line as " ." (the copyright format's rule).
string(REGEX REPLACE "\n" "\n " TARN_LICENSE_TEXT " ${CMAKE_MATCH_2}")
string(REGEX REPLACE "\n \n" "\n .\n" TARN_LICENSE_TEXT "${TARN_LICENSE_TEXT}")
configure_file(data/copyright.in copyright @ONLY)
install(FILES ${CMAKE_CURRENT_BINARY_DIR}/copyright DESTINATION ${CMAKE_INSTALL_DOCDIR})

find_program(TARN_GZIP gzip REQUIRED)
set(changelog ${CMAKE_CURRENT_BINARY_DIR}/changelog)
add_custom_command(OUTPUT ${changelog}.gz
    COMMAND ${CMAKE_COMMAND} -DIN=${CMAKE_CURRENT_SOURCE_DIR}/CHANGELOG.md -DOUT=${changelog}
        -DPACKAGE=${CPACK_PACKAGE_NAME} "-DMAINTAINER=${CPACK_PACKAGE_CONTACT}"
        -P ${CMAKE_CURRENT_SOURCE_DIR}/cmake/DebianChangelog.cmake
    COMMAND ${TARN_GZIP} -9nf ${changelog}
    DEPENDS CHANGELOG.md cmake/DebianChangelog.cmake
    COMMENT "Debian changelog from CHANGELOG.md"
    VERBATIM)
add_custom_target(tarn_changelog ALL DEPENDS ${changelog}.gz)
install(FILES ${changelog}.gz DESTINATION ${CMAKE_INSTALL_DOCDIR})
