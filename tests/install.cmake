# What a user installs: the desktop entry and metainfo pass their
# validators (offline), the example host builds against the installed
# tamsel-host.
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
set_tests_properties(install_example_host_builds_against_the_installed_package
  PROPERTIES LABELS integration TIMEOUT 300)
