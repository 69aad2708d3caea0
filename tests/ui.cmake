# The toolkit layer, the overlay play buttons and the progress overlay: real
# widgets on the offscreen platform, driven by synthetic input; and the
# gallery's screenshot under Xvfb.
find_package(Qt6 REQUIRED COMPONENTS Test Widgets)

add_library(tamsel_ui_test_main STATIC ui/UiTestMain.cpp ui/UiInput.cpp)
target_include_directories(tamsel_ui_test_main PUBLIC ${CMAKE_CURRENT_SOURCE_DIR})
target_link_libraries(tamsel_ui_test_main PUBLIC tamsel_test_support Qt6::Widgets)

tamsel_add_tests(tamsel_ui_tests unit
  SOURCES
    ui/AnimationTest.cpp
    ui/LayoutTest.cpp
    ui/ToolbarTest.cpp
    ui/ViewControllerTest.cpp
    ui/ImagesTest.cpp
    ui/DeviceAndInputTest.cpp
    ui/ViewsTest.cpp
    ui/ShortcutMapTest.cpp
  LIBS tamsel_platform_ui Qt6::Test
  MAIN tamsel_ui_test_main)

tamsel_add_tests(tamsel_overlay_tests unit
  SOURCES
    ui/OverlayButtonTest.cpp
    ui/FlatOverlayImageTest.cpp
    ui/ProgressOverlayTest.cpp
  LIBS tamsel_overlay tamsel_youtube Qt6::Test
  MAIN tamsel_ui_test_main)
