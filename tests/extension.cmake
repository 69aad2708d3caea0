tamsel_add_tests(tamsel_extension_tests unit
  SOURCES extension/ExtensionContextTest.cpp
  LIBS tamsel_extension)
