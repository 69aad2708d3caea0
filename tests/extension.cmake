tamsel_add_tests(tamsel_extension_tests unit
  SOURCES extension/ExtensionContextTest.cpp
  LIBS tamsel_extension)

tamsel_add_tests(tamsel_principal_tests integration
  SOURCES extension/PrincipalControllerTest.cpp
  LIBS tamsel_extension_principal tamsel_media_generator
  MAIN tamsel_ui_test_main)
