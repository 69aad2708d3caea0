#include "EndToEndFixture.h"

#include "MediaGenerator.h"
#include "platform/media/Asset.h"

#include <QCoreApplication>
#include <QDir>
#include <QDirIterator>
#include <QFile>
#include <QJsonDocument>
#include <QProcess>
#include <QStandardPaths>

QTemporaryDir* EndToEnd::dir = nullptr;

void EndToEnd::SetUpTestSuite() {
    dir = new QTemporaryDir;
    testmedia::MovieSpec movieSpec;
    movieSpec.seconds = 10;
    movieSpec.keyframeInterval = 30;
    QString error;
    ASSERT_TRUE(testmedia::writeMovie(recording(), movieSpec, &error)) << error.toStdString();
}

void EndToEnd::TearDownTestSuite() {
    delete dir;
    dir = nullptr;
}

namespace {

// "program arguments..." that start tamsel-edit, under xvfb-run when given.
QStringList command(const QString& xvfbRun, const QSize& screen) {
    const QString edit = QCoreApplication::applicationDirPath() + "/tamsel-edit";
    if (xvfbRun.isEmpty())
        return {edit};
    return {xvfbRun, "-a", "-s",
            QString("-screen 0 %1x%2x24").arg(screen.width()).arg(screen.height()), edit};
}

} // namespace

EndToEnd::Run EndToEnd::editUnderXvfb(const QString& script, const QSize& screen,
                                      const QStringList& extra, const QProcessEnvironment& env,
                                      bool* skipped) {
    const QString xvfbRun = QStandardPaths::findExecutable("xvfb-run");
    if (skipped)
        *skipped = xvfbRun.isEmpty();
    if (xvfbRun.isEmpty())
        return {};
    xvfbCommand_ = command(xvfbRun, screen);
    Run run = edit(script, QString(), extra, env);
    xvfbCommand_.clear();
    return run;
}

void EndToEnd::start(QProcess& host, const QString& script, const QString& movie,
                     const QStringList& extra, const QProcessEnvironment& env) {
    const QString scriptPath = mobile.filePath("script.txt");
    QFile file(scriptPath);
    if (file.open(QIODevice::WriteOnly))
        file.write(script.toUtf8());
    file.close();

    QProcessEnvironment environment = QProcessEnvironment::systemEnvironment();
    environment.insert("TAMSEL_MOBILE_ROOT", mobile.path());
    environment.insert("TAMSEL_ALBUM_DIR", album.path());
    environment.insert("TAMSEL_AUDIO", "null");
    if (!xvfbCommand_.isEmpty())
        environment.remove("QT_QPA_PLATFORM");
    else if (!environment.contains("DISPLAY"))
        environment.insert("QT_QPA_PLATFORM", "offscreen");
    for (const QString& key : env.keys())
        environment.insert(key, env.value(key));
    host.setProcessEnvironment(environment);
    const QStringList program =
        launchPrefix + (xvfbCommand_.isEmpty() ? command(QString(), QSize()) : xvfbCommand_);
    host.start(program.first(),
               program.mid(1) +
                   QStringList{movie.isEmpty() ? recording() : movie, "--app-name", "Racer",
                               "--bundle-id", "org.example.Racer", "--automation", scriptPath} +
                   extra);
}

EndToEnd::Run EndToEnd::edit(const QString& script, const QString& movie, const QStringList& extra,
                             const QProcessEnvironment& env) {
    QProcess process;
    start(process, script, movie, extra, env);
    if (!process.waitForFinished(180000))
        process.kill();
    Run run{process.exitCode(),
            process.readAllStandardOutput(),
            process.readAllStandardError(),
            {},
            {}};
    for (const QByteArray& line : run.out.split('\n')) {
        const QJsonDocument json = QJsonDocument::fromJson(line);
        if (json.isObject())
            run.dumps.append(json.object());
        else if (json.isArray())
            run.hostReport = line;
    }
    return run;
}

QStringList EndToEnd::albumFiles() const {
    return QDir(album.path()).entryList(QDir::Files | QDir::Hidden | QDir::NoDotAndDotDot);
}

QStringList EndToEnd::tempFiles() const {
    QStringList out;
    QDirIterator it(mobile.filePath("Library/Tamsel"),
                    QDir::AllEntries | QDir::Hidden | QDir::System | QDir::NoDotAndDotDot,
                    QDirIterator::Subdirectories);
    while (it.hasNext())
        out.append(it.next());
    return out;
}

void EndToEnd::expectWholeClipsOnly(double seconds) const {
    for (const QString& name : albumFiles()) {
        EXPECT_FALSE(name.startsWith('.')) << "a partial import: " << name.toStdString();
        const auto clip = platform::Asset::assetWithURL(QUrl::fromLocalFile(album.filePath(name)));
        EXPECT_TRUE(clip->isPlayable()) << name.toStdString();
        EXPECT_NEAR(clip->duration().seconds(), seconds, 0.2) << name.toStdString();
    }
}
