# Media engine tests: the pure cut planner and media time as unit tests, the
# real FFmpeg services on generated clips as integration tests.
pkg_check_modules(TAMSEL_TEST_FFMPEG REQUIRED IMPORTED_TARGET libavformat libavcodec libavutil)

add_library(tamsel_media_test_support STATIC
  media/ClipProbe.cpp
  media/ExportChecks.cpp
  media/MediaFixtures.cpp
)
target_link_libraries(tamsel_media_test_support
  PUBLIC tamsel_media_generator tamsel_test_support GTest::gtest tamsel_platform_media
  PRIVATE PkgConfig::TAMSEL_TEST_FFMPEG tamsel_warnings)

tamsel_add_tests(tamsel_media_unit_tests unit
  SOURCES
    media/CutPlannerTest.cpp
    media/DecodeTimesTest.cpp
    media/ExportRulesTest.cpp
    media/MediaTimeTest.cpp
    media/Mp4BoxTest.cpp
  LIBS tamsel_platform_media PkgConfig::TAMSEL_TEST_FFMPEG)
target_include_directories(tamsel_media_unit_tests PRIVATE ${PROJECT_SOURCE_DIR}/src/platform/media)

# One export in a process of its own, for the tests that measure its memory.
add_executable(tamsel-test-export media/ExportToolMain.cpp)
target_link_libraries(tamsel-test-export PRIVATE tamsel_platform_media tamsel_warnings)

tamsel_add_tests(tamsel_media_integration_tests integration
  SOURCES
    media/AssetTest.cpp
    media/ImageGeneratorTest.cpp
    media/MediaOpeningTest.cpp
    media/ExportSessionTest.cpp
    media/RecordingKindsTest.cpp
    media/UploadPresetTest.cpp
  LIBS tamsel_platform_media tamsel_media_test_support)
add_dependencies(tamsel_media_integration_tests tamsel-test-export)
target_include_directories(tamsel_media_integration_tests PRIVATE ${PROJECT_SOURCE_DIR}/src/platform/media)
target_compile_definitions(tamsel_media_integration_tests PRIVATE
  TAMSEL_TEST_EXPORT_TOOL="$<TARGET_FILE:tamsel-test-export>")

