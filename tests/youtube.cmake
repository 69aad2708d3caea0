# The YouTube activity against fakes of the export session, the plug-in
# loader, the agent and the browser; real widgets on the offscreen platform.
find_package(Qt6 REQUIRED COMPONENTS Test Widgets)

tamsel_add_tests(tamsel_youtube_activity_tests unit
  SOURCES
    youtube/YouTubeFakes.cpp
    youtube/YouTubeActivityTest.cpp
    media/MediaFixtures.cpp
  LIBS tamsel_youtube tamsel_extension_app tamsel_media_generator tamsel_share_test_support
    Qt6::Test
  MAIN tamsel_ui_test_main)

# Publishing end to end through tamsel-edit on Xvfb: the share sheet, the
# real plug-in against the local fake of the service (the publishing tests
# bring it, so their area comes before this one).
find_program(TAMSEL_XVFB_RUN xvfb-run)
if(TAMSEL_XVFB_RUN AND TARGET tamsel_fake_youtube AND TARGET tamsel-youtube-publishing
   AND TARGET tamsel_platform_share)
  tamsel_add_tests(tamsel_publish_end_to_end_tests integration
    SOURCES youtube/PublishEndToEndTest.cpp share/ShareDesktop.cpp editor/EndToEndFixture.cpp
    LIBS tamsel_fake_youtube tamsel_share_test_support tamsel_platform_media
      tamsel_media_generator)
  add_dependencies(tamsel_publish_end_to_end_tests tamsel-edit tamsel-video-editor
    tamsel-youtube-publishing)
endif()
