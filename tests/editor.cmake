tamsel_add_tests(tamsel_end_to_end_tests integration
  SOURCES editor/EndToEndFixture.cpp editor/EndToEndTest.cpp editor/DrawingTest.cpp
  LIBS tamsel_platform_media tamsel_media_generator)
add_dependencies(tamsel_end_to_end_tests tamsel-edit tamsel-video-editor)

tamsel_add_tests(tamsel_editor_tests integration
  SOURCES editor/EditorFixture.cpp editor/EditorTest.cpp
  LIBS tamsel_editor tamsel_media_generator
  MAIN tamsel_ui_test_main)

tamsel_add_tests(tamsel_automation_tests unit
  SOURCES editor/AutomationScriptTest.cpp
  LIBS tamsel_extension_app)

tamsel_add_tests(tamsel_editor_keyboard_tests integration
  SOURCES editor/EditorFixture.cpp editor/EditorKeyboardTest.cpp
  LIBS tamsel_extension_app tamsel_media_generator
  MAIN tamsel_ui_test_main)
