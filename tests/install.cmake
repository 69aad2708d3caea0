# What a user installs: the desktop entry and metainfo pass their
# validators (offline), the example host builds against the installed
# tamsel-host, and the Debian package runs the demo from a scratch root.
find_program(TAMSEL_DESKTOP_FILE_VALIDATE desktop-file-validate REQUIRED)
find_program(TAMSEL_APPSTREAMCLI appstreamcli REQUIRED)
set(_desktop ${PROJECT_SOURCE_DIR}/resources/desktop)

add_test(NAME install_desktop_entry_validates
  COMMAND ${TAMSEL_DESKTOP_FILE_VALIDATE} ${_desktop}/org.tamsel.Tamsel.desktop)
add_test(NAME install_metainfo_validates
  COMMAND ${TAMSEL_APPSTREAMCLI} validate --no-net ${_desktop}/org.tamsel.Tamsel.metainfo.xml)
set_tests_properties(install_desktop_entry_validates install_metainfo_validates
  PROPERTIES LABELS unit)

add_test(NAME install_example_host_builds_against_the_installed_package
  COMMAND bash ${CMAKE_CURRENT_SOURCE_DIR}/install/example-host.sh ${CMAKE_BINARY_DIR}
          ${PROJECT_SOURCE_DIR})
# Both take the build tree as it is: nothing is built again.
add_test(NAME install_debian_package_runs_the_demo_from_a_scratch_root
  COMMAND bash ${CMAKE_CURRENT_SOURCE_DIR}/install/deb-package.sh ${CMAKE_BINARY_DIR})
set_tests_properties(install_example_host_builds_against_the_installed_package
  install_debian_package_runs_the_demo_from_a_scratch_root
  PROPERTIES LABELS integration TIMEOUT 300)
