# The movie-scrubber control's tests: a real widget on the offscreen platform,
# driven by synthetic mouse, touch and key events.
find_package(Qt6 REQUIRED COMPONENTS Test)

tamsel_add_tests(tamsel_scrubber_tests unit
  SOURCES
    scrubber/MovieScrubberPointerTest.cpp
    scrubber/MovieScrubberThumbnailTest.cpp
    scrubber/MovieScrubberKeyboardTest.cpp
    scrubber/MovieScrubberRenderTest.cpp
  LIBS tamsel_platform_scrubber Qt6::Test
  MAIN tamsel_ui_test_main)
