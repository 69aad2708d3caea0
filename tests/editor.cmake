tamsel_add_tests(tamsel_end_to_end_tests integration
  SOURCES editor/EndToEndFixture.cpp editor/EndToEndTest.cpp editor/DrawingTest.cpp
  LIBS tamsel_platform_media tamsel_media_generator)
add_dependencies(tamsel_end_to_end_tests tamsel-edit tamsel-video-editor)

tamsel_add_tests(tamsel_automation_tests unit
  SOURCES editor/AutomationScriptTest.cpp
  LIBS tamsel_extension_app)

# The editor's logic on fake media: quick, no files, no libmpv at run time.
tamsel_add_tests(tamsel_editor_unit_tests unit
  SOURCES
    unit/editor/EditorOnFakes.cpp
    unit/editor/EditorModelTest.cpp
    unit/editor/EditorPlaybackTest.cpp
    unit/editor/EditorTrimmingTest.cpp
    unit/editor/EditorThumbnailsTest.cpp
    unit/editor/EditorExportTest.cpp
    unit/editor/EditorLayoutTest.cpp
  LIBS tamsel_editor tamsel_test_fakes
  MAIN tamsel_ui_test_main)

tamsel_add_tests(tamsel_editor_keyboard_tests unit
  SOURCES unit/editor/EditorOnFakes.cpp editor/EditorKeyboardTest.cpp
  LIBS tamsel_extension_app tamsel_test_fakes
  MAIN tamsel_ui_test_main)

# Hostile input, faults and the way out, through the whole product.
tamsel_add_tests(tamsel_hardening_tests integration
  SOURCES editor/EndToEndFixture.cpp editor/HostileInputTest.cpp editor/FaultsEndToEndTest.cpp
    editor/RepeatedUseTest.cpp
  LIBS tamsel_platform_media tamsel_media_generator)
add_dependencies(tamsel_hardening_tests tamsel-edit tamsel-video-editor)
