# Installation: the GNU layout (bin/, share/doc/tarn/, share/man/man1/, share/applications/,
# share/icons/hicolor/, share/metainfo/, share/bash-completion/) for `cmake --install`, and a
# Debian package from `cpack -G DEB`.
# The programs find their read-me and tell an installed copy from a portable one by paths
# relative to their own folder, so a prefix moved after installation still works.

include(GNUInstallDirs)
# Debian names documentation folders after the package, in lower case; GNUInstallDirs (brought
# in early by Qt's package files) names it after the project unless told otherwise.
if(CMAKE_INSTALL_DOCDIR STREQUAL "${CMAKE_INSTALL_DATAROOTDIR}/doc/${PROJECT_NAME}")
    set(CMAKE_INSTALL_DOCDIR "${CMAKE_INSTALL_DATAROOTDIR}/doc/tarn")
    GNUInstallDirs_get_absolute_install_dir(CMAKE_INSTALL_FULL_DOCDIR CMAKE_INSTALL_DOCDIR DOCDIR)
endif()

file(RELATIVE_PATH TARN_DOC_FROM_BIN "${CMAKE_INSTALL_FULL_BINDIR}" "${CMAKE_INSTALL_FULL_DOCDIR}")
file(RELATIVE_PATH TARN_DATAROOT_FROM_BIN
    "${CMAKE_INSTALL_FULL_BINDIR}" "${CMAKE_INSTALL_FULL_DATAROOTDIR}")
set_property(SOURCE src/core/data_folder.cpp APPEND PROPERTY COMPILE_DEFINITIONS
    TARN_DOC_FROM_BIN="${TARN_DOC_FROM_BIN}" TARN_DATAROOT_FROM_BIN="${TARN_DATAROOT_FROM_BIN}")

if(WIN32)
    # A portable copy: the programs and README.txt side by side, the files kept beside them.
    install(TARGETS tarn-cli RUNTIME DESTINATION .)
    install(FILES README.md DESTINATION . RENAME README.txt)
else()
    install(TARGETS tarn-cli RUNTIME DESTINATION ${CMAKE_INSTALL_BINDIR})
    install(FILES README.md DESTINATION ${CMAKE_INSTALL_DOCDIR} RENAME README.txt)
    # Where bash-completion looks for a command's completion when it is first used.
    install(FILES data/tarn-cli.bash-completion
        DESTINATION ${CMAKE_INSTALL_DATADIR}/bash-completion/completions RENAME tarn-cli)
endif()

set(TARN_APP_ID example.brindle.tarn)
if(TARGET tarn AND WIN32)
    install(TARGETS tarn RUNTIME DESTINATION .)
elseif(TARGET tarn)
    install(TARGETS tarn RUNTIME DESTINATION ${CMAKE_INSTALL_BINDIR})
    install(FILES data/tarn.desktop DESTINATION ${CMAKE_INSTALL_DATADIR}/applications)
    install(FILES data/${TARN_APP_ID}.metainfo.xml DESTINATION ${CMAKE_INSTALL_DATADIR}/metainfo)
    install(FILES src/ui/tarn.svg DESTINATION ${CMAKE_INSTALL_DATADIR}/icons/hicolor/scalable/apps)
    install(FILES src/ui/tarn.png DESTINATION ${CMAKE_INSTALL_DATADIR}/icons/hicolor/32x32/apps)
endif()

set(CPACK_PACKAGE_NAME tarn)
set(CPACK_PACKAGE_VENDOR Brindle)
set(CPACK_PACKAGE_CONTACT "Brindle <tarn@brindle.example>")
set(CPACK_PACKAGE_DESCRIPTION_SUMMARY "generate, test, factorize and split prime numbers")
# The extended description as the control file shows it, below the summary: lines of at most
# 80 characters, "." for an empty one.
set(CPACK_PACKAGE_DESCRIPTION [[
Tarn is a desktop tool for prime numbers. It generates every prime up to a
limit into a text file, stops a long job and resumes it later (also after
a crash), tests one number for primality, factorizes one number into prime
powers and splits the results file into smaller files.
.
The command-line program tarn-cli does the same from a terminal or a script.]])
set(CPACK_PACKAGE_HOMEPAGE_URL "https://brindle.example")
set(CPACK_STRIP_FILES ON)
set(CPACK_DEBIAN_FILE_NAME DEB-DEFAULT)
set(CPACK_DEBIAN_PACKAGE_SECTION math)
# Depends: from the libraries the programs link (Qt 6, GLib, the C++ runtime).
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS ON)
if(WIN32)
    # `cpack -G ZIP`: tarn-cli-<version>-win64.zip.
    set(CPACK_GENERATOR ZIP)
    set(CPACK_PACKAGE_FILE_NAME tarn-cli-${PROJECT_VERSION}-win64)
else()
    set(CPACK_GENERATOR DEB)
endif()

include(cmake/TarnPackageDocs.cmake)
include(cmake/TarnManPages.cmake)
include(CPack)
