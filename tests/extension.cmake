tamsel_add_tests(tamsel_extension_tests unit
  SOURCES extension/ExtensionContextTest.cpp
  LIBS tamsel_extension)

# The principal controller over fake media: no files, no libmpv at run time.
tamsel_add_tests(tamsel_principal_tests unit
  SOURCES extension/PrincipalControllerTest.cpp
  LIBS tamsel_extension_principal tamsel_test_fakes
  MAIN tamsel_ui_test_main)
