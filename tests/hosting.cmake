add_executable(tamsel_echo_extension hosting/EchoExtension.cpp)
target_link_libraries(tamsel_echo_extension PRIVATE tamsel_platform_hosting tamsel_warnings)

tamsel_add_tests(tamsel_hosting_tests unit
  SOURCES hosting/MessageChannelTest.cpp hosting/ConnectionTest.cpp hosting/EndpointTest.cpp
  LIBS tamsel_platform_hosting)

tamsel_add_tests(tamsel_launcher_tests integration
  SOURCES hosting/LauncherTest.cpp hosting/TamselEditTest.cpp
  LIBS tamsel_platform_host)
add_dependencies(tamsel_launcher_tests tamsel_echo_extension tamsel-edit)
