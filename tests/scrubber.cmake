# The movie-scrubber control's tests: a real widget on the offscreen platform,
# driven by synthetic mouse, touch and key events.
find_package(Qt6 REQUIRED COMPONENTS Test)

add_library(tamsel_scrubber_test_main STATIC scrubber/ScrubberTestMain.cpp)
target_link_libraries(tamsel_scrubber_test_main PUBLIC tamsel_test_support Qt6::Widgets)

tamsel_add_tests(tamsel_scrubber_tests unit
  SOURCES
    scrubber/RecordingScrubberClient.cpp
    scrubber/ScrubberFixture.cpp
    scrubber/MovieScrubberPointerTest.cpp
    scrubber/MovieScrubberThumbnailTest.cpp
    scrubber/MovieScrubberKeyboardTest.cpp
    scrubber/MovieScrubberRenderTest.cpp
  LIBS tamsel_platform_scrubber Qt6::Test
  MAIN tamsel_scrubber_test_main)
