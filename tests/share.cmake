# Sharing: the store lookup with its two catalogues, the activity sheet and
# the built-in activities, the editor's share facet, and sharing end to end.
find_package(Qt6 REQUIRED COMPONENTS Network Test Widgets)

# Doubles of the share services; never linked into the product.
add_library(tamsel_share_test_support STATIC share/ShareFakes.cpp)
target_include_directories(tamsel_share_test_support PUBLIC ${CMAKE_CURRENT_SOURCE_DIR}/share)
target_link_libraries(tamsel_share_test_support
  PUBLIC tamsel_test_support tamsel_platform_store tamsel_platform_share Qt6::Network
  PRIVATE tamsel_warnings)

tamsel_add_tests(tamsel_store_tests unit
  SOURCES share/StoreLookupTest.cpp share/StoreInfoTest.cpp share/StringFormatTest.cpp
  LIBS tamsel_share_test_support tamsel_youtube)

tamsel_add_tests(tamsel_share_sheet_tests unit
  SOURCES share/ActivitySheetTest.cpp share/BuiltInActivitiesTest.cpp
    share/DesktopServiceFakesTest.cpp
  LIBS tamsel_share_test_support Qt6::Test
  MAIN tamsel_ui_test_main)

tamsel_add_tests(tamsel_editor_share_tests unit
  SOURCES share/EditorShareTest.cpp unit/editor/EditorOnFakes.cpp
  LIBS tamsel_share_test_support tamsel_editor tamsel_test_fakes
  MAIN tamsel_ui_test_main)

tamsel_add_tests(tamsel_share_end_to_end_tests integration
  SOURCES share/ShareEndToEndTest.cpp share/ShareDesktop.cpp editor/EndToEndFixture.cpp
  LIBS tamsel_share_test_support tamsel_platform_media tamsel_media_generator)
add_dependencies(tamsel_share_end_to_end_tests tamsel-edit tamsel-video-editor)
