# The Debian package: tools/package.sh. Built with the prefix /usr, since the widget process finds its lock-state library
# there.
set(CPACK_GENERATOR DEB)
set(CPACK_PACKAGING_INSTALL_PREFIX ${CMAKE_INSTALL_PREFIX})
set(CPACK_PACKAGE_CONTACT "Nimbo Transit maintainers <maintainers@nimbo.example>")
set(CPACK_STRIP_FILES ON)
set(CPACK_DEBIAN_FILE_NAME DEB-DEFAULT)
set(CPACK_DEBIAN_PACKAGE_SECTION utils)
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS ON)
set(CPACK_PACKAGE_DESCRIPTION "Tells at a glance whether the transit lines that you keep as favorites run
normally or are hit by incidents, from the GTFS and GTFS-Realtime feeds that
agencies publish: on the command line, in a status bar, in a window, or in
any program that hosts the widget.")

# Text needs a font; https needs certificates.
set(CPACK_DEBIAN_PACKAGE_DEPENDS fonts-dejavu-core)
set(CPACK_DEBIAN_PACKAGE_RECOMMENDS ca-certificates)

include(CPack)
