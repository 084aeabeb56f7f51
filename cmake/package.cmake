# What is installed, and the package for Debian that script/package makes of it. `vexa` looks for its service from where
# it lies itself, so the tree works wherever it is unpacked.
include(GNUInstallDirs)

set(maintainer "Korvane <maintainers@korvane.example>")
set(notes ${CMAKE_BINARY_DIR}/package-notes)

# Its changelog in Debian's form, and what the programs are made of. Both are dated by SOURCE_DATE_EPOCH, and tell of
# installed packages, so they are made anew each time.
add_custom_target(vexa_package_notes
    COMMAND packaging/debian/changelog.py ${maintainer} CHANGELOG.md ${notes}/changelog.gz
    COMMAND packaging/bill.py linux ${PROJECT_VERSION} ${notes}/vexa.cdx.json
    WORKING_DIRECTORY ${PROJECT_SOURCE_DIR}
    VERBATIM)

# Completion scripts and manual pages, these compressed, as they lie below /usr/share.
add_custom_target(vexa_package_share
    COMMAND ${CMAKE_COMMAND} -E rm -rf ${notes}/share
    COMMAND ${CMAKE_COMMAND} -E copy_directory ${CMAKE_BINARY_DIR}/share ${notes}/share
    COMMAND gzip -9nr ${notes}/share/man
    VERBATIM)
add_dependencies(vexa_package_share vexa_shell_files)
add_dependencies(vexa_package_notes vexa_package_share)
# PowerShell has no folder of its own for them here.
install(DIRECTORY ${notes}/share/ DESTINATION ${CMAKE_INSTALL_DATADIR} PATTERN vexa.ps1 EXCLUDE)

install(TARGETS vexa RUNTIME DESTINATION ${CMAKE_INSTALL_BINDIR})
install(TARGETS vexa-service RUNTIME DESTINATION ${CMAKE_INSTALL_LIBEXECDIR}/vexa)
install(FILES packaging/debian/copyright ${notes}/changelog.gz ${notes}/vexa.cdx.json DESTINATION ${CMAKE_INSTALL_DOCDIR})
install(DIRECTORY examples DESTINATION ${CMAKE_INSTALL_DOCDIR})

set(CPACK_GENERATOR DEB)
set(CPACK_STRIP_FILES ON)
set(CPACK_PACKAGE_DESCRIPTION_SUMMARY "wireless service on a simulated machine, and its command line")
set(CPACK_DEBIAN_PACKAGE_DESCRIPTION
"For those who write programs that talk to Vexa's wireless service: it keeps
Hotspot 2.0 credentials, joins networks that accept one of them, and tells how
busy the channels are. Programs reach it through two WebSocket ports on the
same computer.
.
Here it runs on a simulated Windows machine whose adapter and surroundings a
scenario tells; nothing of this computer's own wireless is touched. The command
vexa starts it, asks it, follows it and stops it.")
set(CPACK_DEBIAN_FILE_NAME DEB-DEFAULT)
set(CPACK_DEBIAN_PACKAGE_MAINTAINER ${maintainer})
set(CPACK_DEBIAN_PACKAGE_SECTION net)
set(CPACK_DEBIAN_PACKAGE_PRIORITY optional)
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS ON)
set(CPACK_DEBIAN_PACKAGE_CONTROL_STRICT_PERMISSION ON)
include(CPack)
