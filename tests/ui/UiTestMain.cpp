#include <QApplication>
#include <gtest/gtest.h>

// Widget tests need a QApplication; they run on the offscreen platform, also
// when the build lists the tests without the test environment, and silent:
// they must not depend on, or disturb, a sound server.
int main(int argc, char** argv) {
    if (qEnvironmentVariableIsEmpty("QT_QPA_PLATFORM"))
        qputenv("QT_QPA_PLATFORM", "offscreen");
    if (qEnvironmentVariableIsEmpty("TAMSEL_AUDIO"))
        qputenv("TAMSEL_AUDIO", "null");
    QApplication app(argc, argv);
    ::testing::InitGoogleTest(&argc, argv);
    return RUN_ALL_TESTS();
}
