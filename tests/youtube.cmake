# The YouTube activity against fakes of the export session, the plug-in
# loader, the agent and the URL opener; real widgets on the offscreen platform.
find_package(Qt6 REQUIRED COMPONENTS Test Widgets)

tamsel_add_tests(tamsel_youtube_activity_tests unit
  SOURCES
    youtube/FakeUploadForm.cpp
    youtube/FakePublishingAgent.cpp
    youtube/ActivityFixture.cpp
    youtube/YouTubeActivityTest.cpp
    youtube/YouTubeActivityPublishingTest.cpp
    youtube/YouTubeActivityPluginTest.cpp
    youtube/PresentedSnapshotTest.cpp
    media/MediaFixtures.cpp
  LIBS tamsel_youtube tamsel_extension_app tamsel_media_generator Qt6::Test
  MAIN tamsel_ui_test_main)
