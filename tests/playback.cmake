# Playback: the notification centre and the choice of audio output as unit
# tests; the player, its items and the video widget on libmpv with generated
# clips as integration tests.
tamsel_add_tests(tamsel_playback_unit_tests unit
  SOURCES
    playback/NotificationCenterTest.cpp
    playback/AudioOutputTest.cpp
  LIBS tamsel_platform_playback)

tamsel_add_tests(tamsel_playback_integration_tests integration
  SOURCES
    playback/PlaybackFixture.cpp
    playback/PlayerItemTest.cpp
    playback/PlayerTest.cpp
    playback/PlayerLayerTest.cpp
    playback/RecordingKindsPlaybackTest.cpp
  LIBS tamsel_platform_playback tamsel_media_generator
  MAIN tamsel_ui_test_main)

# The OpenGL path of the video widget, on a virtual X server with Mesa's
# software GL, when the machine has one.
find_program(TAMSEL_XVFB_RUN xvfb-run)
if(TAMSEL_XVFB_RUN)
  add_test(NAME PlaybackPlayerLayer.OpenGLUnderXvfb
    COMMAND ${TAMSEL_XVFB_RUN} -a -s "-screen 0 1280x800x24"
            ${CMAKE_COMMAND} -E env QT_QPA_PLATFORM=xcb TAMSEL_VIDEO_RENDERER=opengl
            $<TARGET_FILE:tamsel_playback_integration_tests> --gtest_filter=PlaybackPlayerLayer.*)
  set_tests_properties(PlaybackPlayerLayer.OpenGLUnderXvfb PROPERTIES LABELS integration TIMEOUT 120)
endif()
