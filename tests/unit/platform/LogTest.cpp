#include "platform/runtime/Log.h"
#include "platform/runtime/Error.h"
#include "support/LogCapture.h"

#include <gtest/gtest.h>

using namespace platform;
using testing_support::LogCapture;
using testing_support::LogLine;

TEST(Log, LinesReachTheInstalledSinkWithTheirLevelObserversSeeThemAndCapturesNest) {
    QList<LogLine> observed;
    LogCapture capture;
    const int token = addLogObserver([&](LogLevel level, const QString& text) {
        observed.append({level, text});
    });
    logDefault("one");
    logError("two: 5");
    logConsole("error = three");
    removeLogObserver(token);
    {
        LogCapture inner;
        logDefault("inner");
        EXPECT_EQ(inner.texts(), QStringList{"inner"});
    }
    logDefault("four");
    const QList<LogLine> expected{{LogLevel::Default, "one"},
                                  {LogLevel::Error, "two: 5"},
                                  {LogLevel::Console, "error = three"}};
    EXPECT_EQ(capture.lines(), expected + QList<LogLine>({{LogLevel::Default, "four"}}));
    EXPECT_EQ(observed, expected);
}

TEST(Error, CarriesCodeAndDescribesItselfAndEachErrorHasItsOwnIdentity) {
    const ErrorPtr a = posixError(2, "/private/var/mobile/x");
    const ErrorPtr b = posixError(2, "/private/var/mobile/x");
    EXPECT_EQ(a->code(), 2);
    EXPECT_EQ(a->description(),
              "Error Domain=POSIX Code=2 \"/private/var/mobile/x: No such file or directory\"");
    EXPECT_NE(a->identity(), b->identity());
    EXPECT_EQ(a->identity(), a->identity());
    EXPECT_EQ(makeError(-541478725, "Media", "End of file")->code(), -541478725);
}
