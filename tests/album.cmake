tamsel_add_tests(tamsel_album_tests integration
  SOURCES album/PhotoAlbumTest.cpp
  LIBS tamsel_platform_album tamsel_media_generator)
