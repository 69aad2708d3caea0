# The YouTube publishing plug-in: loaded as the editor loads it; its upload
# client and sign-in against the local fake of the service; its form; the
# refresh token in a real keyring.
if(NOT TARGET tamsel_fake_youtube)
  add_subdirectory(${CMAKE_CURRENT_SOURCE_DIR}/publishing/server
                   ${CMAKE_CURRENT_BINARY_DIR}/publishing-server)
endif()

# A plug-in built for another ABI version, for the loader to refuse.
add_library(tamsel-wrong-abi-plugin MODULE publishing/WrongAbiPlugin.cpp)
target_include_directories(tamsel-wrong-abi-plugin PRIVATE ${PROJECT_SOURCE_DIR}/src)
target_link_libraries(tamsel-wrong-abi-plugin PRIVATE Qt6::Core tamsel_warnings)
set_target_properties(tamsel-wrong-abi-plugin PROPERTIES CXX_VISIBILITY_PRESET hidden)

# The loader, as the editor uses it, refuses what it cannot use.
tamsel_add_tests(tamsel_publishing_plugin_tests integration
  SOURCES publishing/PluginLoadTest.cpp
  LIBS tamsel_platform_publishing)
tamsel_host_publishing_plugins(tamsel_publishing_plugin_tests)
add_dependencies(tamsel_publishing_plugin_tests tamsel-youtube-publishing tamsel-wrong-abi-plugin)
target_compile_definitions(tamsel_publishing_plugin_tests PRIVATE
  TAMSEL_WRONG_ABI_PLUGIN="$<TARGET_FILE:tamsel-wrong-abi-plugin>")

# The plug-in's sign-in and upload client against the local fake service.
add_library(tamsel_publishing_test_support STATIC
  publishing/FakePublishingServices.cpp
  publishing/ServerFixture.cpp)
target_include_directories(tamsel_publishing_test_support PUBLIC ${CMAKE_CURRENT_SOURCE_DIR}/publishing)
target_link_libraries(tamsel_publishing_test_support
  PUBLIC tamsel_fake_youtube tamsel_youtube_publishing_objects tamsel_platform_publishing
         tamsel_share_test_support tamsel_test_support Qt6::Network
  PRIVATE tamsel_warnings)

tamsel_add_tests(tamsel_publishing_service_tests integration
  SOURCES
    publishing/UploadClientTest.cpp
    publishing/SignInTest.cpp
  LIBS tamsel_publishing_test_support)

# The refresh token in a real Secret Service: a GNOME keyring in a private
# session bus, started by with-keyring.sh around the test.
find_program(TAMSEL_DBUS_RUN_SESSION dbus-run-session)
find_program(TAMSEL_GNOME_KEYRING_DAEMON gnome-keyring-daemon)
if(TAMSEL_DBUS_RUN_SESSION AND TAMSEL_GNOME_KEYRING_DAEMON)
  add_executable(tamsel_publishing_keyring_tests publishing/KeyringTest.cpp)
  target_link_libraries(tamsel_publishing_keyring_tests PRIVATE
    tamsel_test_main tamsel_publishing_test_support tamsel_warnings)
  add_test(NAME publishing_keyring
    COMMAND ${CMAKE_CURRENT_SOURCE_DIR}/publishing/with-keyring.sh
            $<TARGET_FILE:tamsel_publishing_keyring_tests>)
  set_tests_properties(publishing_keyring PROPERTIES LABELS integration TIMEOUT 120)
endif()

# The agent and its form against fakes of the sign-in and the upload client;
# the limits on a video's text.
tamsel_add_tests(tamsel_publishing_unit_tests unit
  SOURCES
    publishing/AgentTest.cpp
    publishing/VideoMetadataTest.cpp
  LIBS tamsel_publishing_test_support Qt6::Widgets Qt6::Test
  MAIN tamsel_ui_test_main)
