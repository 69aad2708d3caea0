# Media engine tests: the pure cut planner and media time as unit tests, the
# real FFmpeg services on generated clips as integration tests.
pkg_check_modules(TAMSEL_TEST_FFMPEG REQUIRED IMPORTED_TARGET libavformat libavcodec libavutil)

add_library(tamsel_media_test_support STATIC
  media/ClipProbe.cpp
  media/MediaFixtures.cpp
)
target_link_libraries(tamsel_media_test_support
  PUBLIC tamsel_media_generator tamsel_test_support GTest::gtest
  PRIVATE PkgConfig::TAMSEL_TEST_FFMPEG tamsel_warnings)

tamsel_add_tests(tamsel_media_unit_tests unit
  SOURCES
    media/CutPlannerTest.cpp
    media/MediaTimeTest.cpp
    media/Mp4BoxTest.cpp
  LIBS tamsel_platform_media)
target_include_directories(tamsel_media_unit_tests PRIVATE ${PROJECT_SOURCE_DIR}/src/platform/media)

tamsel_add_tests(tamsel_media_integration_tests integration
  SOURCES
    media/GeneratedMovieTest.cpp
    media/ImageGeneratorTest.cpp
    media/ExportSessionTest.cpp
  LIBS tamsel_platform_media tamsel_media_test_support)
