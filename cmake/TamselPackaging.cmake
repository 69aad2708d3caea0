# The Debian package, made in the build tree with `cpack -G DEB`. It holds
# everything the install rules put under the prefix: the programs, the
# tamsel-host library with its headers, CMake package and pkg-config file,
# the resources with the sample recording, the desktop entry, icon and
# metainfo, and whatever plug-ins install themselves (plugins/ brings its own
# install rules; they need nothing here). The package's dependencies are
# read from the installed programs, libraries and plug-ins by dpkg-shlibdeps.
set(CPACK_PACKAGE_NAME tamsel)
set(CPACK_PACKAGE_VENDOR "The Tamsel developers")
set(CPACK_PACKAGE_CONTACT "The Tamsel developers <tamsel@tamsel.invalid>")
set(CPACK_PACKAGE_VERSION ${PROJECT_VERSION})
set(CPACK_PACKAGE_DESCRIPTION_SUMMARY "Video editor for screen recordings")
set(CPACK_PACKAGE_DESCRIPTION
  "An application that has just recorded its screen opens the editor on the\n\
recording: the user previews it, trims it on a thumbnail strip, saves the\n\
clip to their Videos, shares or publishes it. Includes tamsel-edit, the\n\
tamsel-host library for recorders, and the desktop entry for file managers.")
set(CPACK_PACKAGING_INSTALL_PREFIX /usr)
set(CPACK_STRIP_FILES ON)

set(CPACK_DEBIAN_FILE_NAME DEB-DEFAULT)
set(CPACK_DEBIAN_PACKAGE_SECTION video)
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS ON)
# tamsel-edit links the package's own libtamsel-host.
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS_PRIVATE_DIRS ${CMAKE_INSTALL_LIBDIR})
# Opening links and mail from the share sheet.
set(CPACK_DEBIAN_PACKAGE_RECOMMENDS "xdg-utils")

set(CPACK_GENERATOR DEB)
set(CPACK_SOURCE_GENERATOR "")
include(CPack)
