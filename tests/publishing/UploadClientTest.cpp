// The resumable upload client against the local fake of the service: the
// protocol, the faults it survives and those it reports.

#include "ServerFixture.h"
#include "YouTubeResumableUploadClient.h"
#include "support/LogCapture.h"
#include "support/TempDir.h"
#include "support/Wait.h"

#include "platform/publishing/PublishingError.h"

#include <QFile>
#include <QRegularExpression>
#include <QtEndian>

#include <optional>

using namespace testing_support;
using platform::ErrorPtr;
namespace PublishingError = platform::PublishingError;
using Faults = FakeYouTubeServer::Faults;
using Policy = YouTubeResumableUploadClient::Policy;

namespace {

constexpr qint64 kUnit = 256 * 1024;

struct Outcome {
    platform::YouTubeUploadResult result;
    ErrorPtr error;
    QList<qint64> progress; // bytes sent as reported, in order, until the handler ran
};

class UploadClientTest : public ServerFixture {
  protected:
    // A file of `size` bytes whose every 8-byte word holds its own offset:
    // bytes that arrive in the wrong place, twice or not at all show.
    QString file(qint64 size) {
        QFile file(storage_.filePath(QStringLiteral("upload.mp4")));
        file.open(QIODevice::WriteOnly);
        QByteArray block(1 << 20, Qt::Uninitialized);
        for (qint64 at = 0; at < size; at += block.size()) {
            for (qint64 word = 0; word < block.size() / 8; ++word)
                qToLittleEndian<quint64>(quint64(at + word * 8), block.data() + word * 8);
            file.write(block.constData(), std::min<qint64>(block.size(), size - at));
        }
        return file.fileName();
    }

    platform::YouTubeUpload details(const QString& path) const {
        return {path,
                QStringLiteral("video/mp4"),
                QStringLiteral("Racer run"),
                QStringLiteral("T L"),
                QStringLiteral("20"),
                QStringLiteral("private")};
    }

    // Uploads `path` with retries a few milliseconds apart and `policy`'s
    // other settings.
    Outcome run(const QString& path, Policy policy = {}, int timeoutMs = 60000) {
        policy.firstRetryDelayMs = 5;
        policy.maxRetryDelayMs = 40;
        client_->setPolicy(policy);
        auto outcome = std::make_shared<Outcome>();
        auto done = std::make_shared<bool>(false);
        client_->upload(
            details(path), [outcome](qint64 sent, qint64) { outcome->progress << sent; },
            [done, outcome](const platform::YouTubeUploadResult& result, ErrorPtr error) {
                outcome->result = result;
                outcome->error = error;
                *done = true;
            });
        EXPECT_TRUE(waitUntil([&] { return *done; }, timeoutMs)) << "the upload never finished";
        return *outcome;
    }

    // Where each chunk sent began, from its Content-Range.
    QList<qint64> chunkStarts() const {
        static const QRegularExpression range(QStringLiteral("^PUT .* bytes (\\d+)-\\d+/\\d+$"));
        QList<qint64> starts;
        for (const QString& line : server_.record().log)
            if (const auto m = range.match(line); m.hasMatch())
                starts << m.captured(1).toLongLong();
        return starts;
    }

    std::optional<FakeYouTubeServer::Upload> completeUpload() const {
        for (const auto& upload : server_.record().uploads)
            if (upload.complete)
                return upload;
        return std::nullopt;
    }

    void SetUp() override {
        ServerFixture::SetUp();
        client_->setSignIn(makeSignIn());
    }
    std::shared_ptr<YouTubeResumableUploadClient> client_ =
        std::make_shared<YouTubeResumableUploadClient>();
};

} // namespace

// The promise the issue makes: a large upload survives three dropped
// connections and arrives byte for byte, described as the snippet says;
// the progress is full only with the server's answer.
TEST_F(UploadClientTest, HundredMegabytesArriveIdenticalThroughThreeDroppedConnections) {
    signInQuietly();
    const qint64 size = 100 * 1000 * 1000;
    const QString path = file(size);
    server_.setFaults({.dropConnectionMidChunk = 3});
    const Outcome outcome = run(path, {}, 120000);
    ASSERT_EQ(outcome.error, nullptr) << outcome.error->description().toStdString();

    const auto record = server_.record();
    EXPECT_EQ(record.dropped, 3);
    EXPECT_EQ(record.sessionsStarted, 1) << "resumes, never starts over";
    const QList<qint64> starts = chunkStarts();
    EXPECT_TRUE(std::any_of(starts.begin(), starts.end(), [](qint64 first) {
        return first % (16 << 20) != 0;
    })) << "resumed from the range the server said it held, mid-chunk";
    const auto done = completeUpload();
    ASSERT_TRUE(done);
    EXPECT_EQ(hashOf(done->filePath), hashOf(path));
    EXPECT_EQ(QStringList({done->title, done->description, done->categoryId, done->privacyStatus}),
              QStringList({"Racer run", "T L", "20", "private"}));
    EXPECT_EQ(QStringList({outcome.result.videoId, outcome.result.watchURL.toString()}),
              QStringList({done->videoId, "https://www.youtube.com/watch?v=" + done->videoId}));
    EXPECT_EQ(outcome.progress.count(size), 1);
    EXPECT_EQ(outcome.progress.value(outcome.progress.size() - 1), size);
}

namespace {

// A fault on an upload of three units and a bit, and what must follow: the file arrives
// whole, or the upload fails with `error` whose message holds `message`; and
// the server counted what it expects (-1: any number).
struct Case {
    const char* name;
    Faults faults{};
    Policy policy{};
    std::optional<PublishingError::Code> error{};
    const char* message = "";
    int statusQueries = -1, unauthorized = -1, refreshes = -1, chunks = -1, sessions = -1;
};
void PrintTo(const Case& c, std::ostream* out) {
    *out << c.name;
}

class UploadFault : public UploadClientTest, public ::testing::WithParamInterface<Case> {};

} // namespace

TEST_P(UploadFault, IsRecoveredOrReportedClearly) {
    const Case& c = GetParam();
    signInQuietly();
    const QString path = file(3 * kUnit + 12345);
    server_.setFaults(c.faults);
    const Outcome outcome = run(path, c.policy);
    if (c.error) {
        ASSERT_TRUE(PublishingError::is(outcome.error, *c.error))
            << (outcome.error ? outcome.error->description().toStdString() : "no error");
        EXPECT_TRUE(outcome.error->message().contains(QLatin1String(c.message)));
        EXPECT_FALSE(completeUpload());
    } else {
        ASSERT_EQ(outcome.error, nullptr) << outcome.error->description().toStdString();
        ASSERT_TRUE(completeUpload());
        EXPECT_EQ(hashOf(completeUpload()->filePath), hashOf(path));
    }
    const auto record = server_.record();
    for (const auto& [expected, counted] : {std::pair{c.statusQueries, record.statusQueries},
                                            {c.unauthorized, record.unauthorized},
                                            {c.refreshes, record.refreshes},
                                            {c.chunks, record.chunks},
                                            {c.sessions, record.sessionsStarted}})
        if (expected >= 0) {
            EXPECT_EQ(counted, expected);
        }
}

// Retried after asking what arrived; renewed once; waited for; not retried;
// given up after the attempts allowed.
INSTANTIATE_TEST_SUITE_P(
    Upload, UploadFault,
    ::testing::Values(Case{.name = "ServiceUnavailableOnceWithChunksRoundedToWholeUnits",
                           .faults = {.serviceUnavailable = 1},
                           .policy = {.chunkSize = 300 * 1024},
                           .statusQueries = 1,
                           .chunks = 5},
                      Case{.name = "TokenExpiresMidUpload",
                           .faults = {.expireTokenMidUpload = 1},
                           .policy = {.chunkSize = kUnit},
                           .unauthorized = 1,
                           .refreshes = 2},
                      Case{.name = "SlowServerWithinTheTimeout",
                           .faults = {.responseDelayMs = 150},
                           .policy = {.chunkSize = kUnit, .transferTimeoutMs = 2000},
                           .statusQueries = 0},
                      Case{.name = "QuotaExceeded",
                           .faults = {.quotaExceeded = 1},
                           .error = PublishingError::QuotaExceeded,
                           .message = "quota",
                           .sessions = 0},
                      Case{.name = "SilentPastTheTimeout",
                           .faults = {.responseDelayMs = 1500},
                           .policy = {.maxAttempts = 3, .transferTimeoutMs = 100},
                           .error = PublishingError::ServerUnavailable,
                           .message = "could not be reached"},
                      Case{.name = "Persistent5xx",
                           .faults = {.serviceUnavailable = 1000},
                           .policy = {.chunkSize = kUnit, .maxAttempts = 4},
                           .error = PublishingError::ServerUnavailable,
                           .chunks = 4}),
    [](const auto& info) { return std::string(info.param.name); });

TEST_F(UploadClientTest, ARevokedAccountIsForgottenAndAForgottenSessionStartsAgainAtZero) {
    signInQuietly();
    server_.setFaults({.revokeRefreshTokens = true});
    auto signIn = makeSignIn();
    client_->setSignIn(signIn);
    EXPECT_TRUE(PublishingError::is(run(file(kUnit)).error, PublishingError::Unauthorized));
    EXPECT_FALSE(signIn->isSignedIn());
    EXPECT_TRUE(server_.record().log.filter("/upload").isEmpty());

    signInQuietly();
    server_.setFaults({.forgetSession = 1});
    LogCapture log;
    const QString path = file(3 * kUnit);
    const Outcome outcome = run(path, {.chunkSize = kUnit});
    ASSERT_EQ(outcome.error, nullptr) << outcome.error->description().toStdString();
    EXPECT_EQ(hashOf(completeUpload()->filePath), hashOf(path));
    EXPECT_EQ(server_.record().sessionsStarted, 2);
    EXPECT_EQ(chunkStarts().value(1, -1), 0) << "the new session's first chunk";
    EXPECT_TRUE(outcome.progress.contains(0)) << "the progress went back with it";
    EXPECT_EQ(
        log.count(QStringLiteral("YouTube upload: the session was forgotten; starting again")), 1);
}

TEST_F(UploadClientTest, WithoutAnAccountOrAReadableFileNothingIsSent) {
    EXPECT_TRUE(PublishingError::is(run(file(kUnit)).error, PublishingError::NotSignedIn));
    signInQuietly();
    EXPECT_TRUE(PublishingError::is(run(storage_.filePath("none.mp4")).error,
                                    PublishingError::MediaUnreadable));
    EXPECT_TRUE(PublishingError::is(run(file(0)).error, PublishingError::MediaUnreadable));
    EXPECT_EQ(server_.record().sessionsStarted, 0);
}

TEST_F(UploadClientTest, CancelStopsTheUploadAndItsHandlerHearsCancelledOnce) {
    signInQuietly();
    server_.setFaults({.responseDelayMs = 50});
    client_->setPolicy({.chunkSize = kUnit});
    std::optional<ErrorPtr> error;
    int handlerCalls = 0;
    client_->upload(
        details(file(40 * kUnit)), [&](qint64, qint64) {},
        [&](const platform::YouTubeUploadResult&, ErrorPtr e) {
            error = e;
            ++handlerCalls;
        });
    ASSERT_TRUE(waitUntil([&] { return server_.record().chunks >= 2; }));
    client_->cancel();
    EXPECT_FALSE(error.has_value()) << "never inside cancel()";
    ASSERT_TRUE(waitUntil([&] { return error.has_value(); }));
    EXPECT_TRUE(PublishingError::is(*error, PublishingError::Cancelled));
    const int chunks = server_.record().chunks;
    waitUntil([] { return false; }, 300);
    EXPECT_LE(server_.record().chunks, chunks + 1) << "nothing is sent after the cancel";
    EXPECT_EQ(handlerCalls, 1);
    EXPECT_FALSE(completeUpload());
}

TEST_F(UploadClientTest, CategoriesAreTheAssignableOnesInTheServicesOrder) {
    signInQuietly();
    std::optional<QList<platform::YouTubeVideoCategory>> categories;
    client_->fetchCategories(QStringLiteral("DE"), QStringLiteral("de"),
                             [&](const QList<platform::YouTubeVideoCategory>& list, ErrorPtr e) {
                                 EXPECT_EQ(e, nullptr);
                                 categories = list;
                             });
    ASSERT_TRUE(waitUntil([&] { return categories.has_value(); }));
    EXPECT_EQ(*categories, (QList<platform::YouTubeVideoCategory>{{"1", "Film & Animation"},
                                                                  {"10", "Music"},
                                                                  {"20", "Gaming"},
                                                                  {"22", "People & Blogs"},
                                                                  {"23", "Comedy"}}));
    EXPECT_TRUE(server_.record().log.last().contains(QStringLiteral("regionCode=DE")));
}
