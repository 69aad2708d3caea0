#include "ServerFixture.h"
#include "YouTubeResumableUploadClient.h"
#include "support/LogCapture.h"
#include "support/Wait.h"

#include "platform/publishing/PublishingError.h"

#include <QCryptographicHash>
#include <QFile>
#include <QRegularExpression>
#include <QtEndian>

#include <optional>

using namespace testing_support;
using platform::ErrorPtr;
namespace PublishingError = platform::PublishingError;

namespace {

constexpr qint64 kUnit = 256 * 1024;

// A file whose every 8-byte word holds its own offset: bytes that arrive in
// the wrong place, twice or not at all cannot go unnoticed.
QString patternedFile(const QString& dir, qint64 size) {
    const QString path = dir + QStringLiteral("/upload.mp4");
    QFile file(path);
    if (!file.open(QIODevice::WriteOnly))
        return {};
    QByteArray block(1 << 20, Qt::Uninitialized);
    for (qint64 at = 0; at < size; at += block.size()) {
        for (qint64 word = 0; word < block.size() / 8; ++word)
            qToLittleEndian<quint64>(quint64(at + word * 8), block.data() + word * 8);
        file.write(block.constData(), std::min<qint64>(block.size(), size - at));
    }
    return path;
}

QByteArray sha256(const QString& path) {
    QFile file(path);
    QCryptographicHash hash(QCryptographicHash::Sha256);
    if (file.open(QIODevice::ReadOnly))
        hash.addData(&file);
    return hash.result().toHex();
}

struct Outcome {
    platform::YouTubeUploadResult result;
    ErrorPtr error;
    QList<std::pair<qint64, qint64>> progress; // as reported, in order
    int progressAtCompletion = 0;
};

class UploadClientTest : public ServerFixture {
  protected:
    void SetUp() override {
        ServerFixture::SetUp();
        client_ = std::make_shared<YouTubeResumableUploadClient>();
        client_->setSignIn(makeSignIn());
        auto policy = client_->policy();
        policy.firstRetryDelayMs = 5;
        policy.maxRetryDelayMs = 40;
        client_->setPolicy(policy);
    }

    void setChunkSize(qint64 bytes) {
        auto policy = client_->policy();
        policy.chunkSize = bytes;
        client_->setPolicy(policy);
    }

    platform::YouTubeUpload details(const QString& path) const {
        platform::YouTubeUpload upload;
        upload.filePath = path;
        upload.title = QStringLiteral("Racer run");
        upload.description = QStringLiteral("Look at this https://store.example/racer");
        upload.categoryId = QStringLiteral("20");
        upload.privacyStatus = QStringLiteral("private");
        return upload;
    }

    Outcome run(const platform::YouTubeUpload& upload, int timeoutMs = 60000) {
        auto outcome = std::make_shared<Outcome>();
        auto done = std::make_shared<bool>(false);
        client_->upload(
            upload,
            [outcome](qint64 sent, qint64 total) {
                outcome->progress << std::pair{sent, total};
            },
            [outcome, done](const platform::YouTubeUploadResult& result, ErrorPtr error) {
                outcome->result = result;
                outcome->error = error;
                outcome->progressAtCompletion = int(outcome->progress.size());
                *done = true;
            });
        EXPECT_TRUE(waitUntil([&] { return *done; }, timeoutMs)) << "the upload never finished";
        return *outcome;
    }

    // Content-Range headers of chunk PUTs with a body, as (first, last, total).
    QList<std::tuple<qint64, qint64, qint64>> chunkRanges() const {
        static const QRegularExpression range(QStringLiteral("bytes (\\d+)-(\\d+)/(\\d+)$"));
        QList<std::tuple<qint64, qint64, qint64>> ranges;
        for (const QString& line : server_.requestLog())
            if (auto m = range.match(line); line.startsWith(QLatin1String("PUT")) && m.hasMatch())
                ranges << std::tuple{m.captured(1).toLongLong(), m.captured(2).toLongLong(),
                                     m.captured(3).toLongLong()};
        return ranges;
    }

    const FakeYouTubeServer::Upload* completeUpload() const {
        uploads_ = server_.uploads();
        for (const auto& upload : uploads_)
            if (upload.complete)
                return &upload;
        return nullptr;
    }

    std::shared_ptr<YouTubeResumableUploadClient> client_;
    mutable QList<FakeYouTubeServer::Upload> uploads_;
};

} // namespace

TEST_F(UploadClientTest, SendsWholeUnitChunksAndReachesFullProgressOnlyWithTheVideo) {
    signInQuietly();
    setChunkSize(300 * 1024); // rounded down to one unit
    const qint64 size = 5 * kUnit + 12345;
    const QString path = patternedFile(storage_.path(), size);
    const Outcome outcome = run(details(path));
    ASSERT_EQ(outcome.error, nullptr) << outcome.error->description().toStdString();

    const auto* upload = completeUpload();
    ASSERT_NE(upload, nullptr);
    EXPECT_EQ(sha256(upload->filePath), sha256(path));
    EXPECT_EQ(upload->title, "Racer run");
    EXPECT_EQ(upload->categoryId, "20");
    EXPECT_EQ(upload->privacyStatus, "private");
    EXPECT_EQ(outcome.result.videoId, upload->videoId);
    EXPECT_EQ(outcome.result.watchURL.toString(),
              QStringLiteral("https://www.youtube.com/watch?v=") + upload->videoId);

    const auto ranges = chunkRanges();
    ASSERT_EQ(ranges.size(), 6);
    for (qsizetype i = 0; i < ranges.size(); ++i) {
        const auto [first, last, total] = ranges[i];
        EXPECT_EQ(first, i * kUnit);
        EXPECT_EQ(total, size);
        if (i + 1 < ranges.size()) {
            EXPECT_EQ((last - first + 1) % kUnit, 0) << "chunk " << i;
        }
    }
    ASSERT_FALSE(outcome.progress.isEmpty());
    for (qsizetype i = 0; i + 1 < outcome.progress.size(); ++i)
        EXPECT_LT(outcome.progress[i].first, size) << "full before the server's answer";
    EXPECT_EQ(outcome.progress.last(), (std::pair<qint64, qint64>{size, size}));
    EXPECT_EQ(outcome.progressAtCompletion, outcome.progress.size());
}

// The promise the issue makes: a large upload survives three dropped
// connections and arrives byte for byte, described as the snippet says.
TEST_F(UploadClientTest, HundredMegabytesArriveIdenticalThroughThreeDroppedConnections) {
    signInQuietly();
    const qint64 size = 100 * 1000 * 1000;
    const QString path = patternedFile(storage_.path(), size);
    FakeYouTubeServer::Faults faults;
    faults.dropConnectionMidChunk = 3;
    server_.setFaults(faults);
    auto upload = details(path);
    upload.description = QStringLiteral("T L");
    const Outcome outcome = run(upload, 120000);
    ASSERT_EQ(outcome.error, nullptr) << outcome.error->description().toStdString();

    // After each drop the client asks what arrived, or the network stack sends
    // the chunk again by itself; either way the session goes on.
    EXPECT_EQ(server_.counters().dropped, 3);
    const auto ranges = chunkRanges();
    EXPECT_TRUE(std::any_of(ranges.begin(), ranges.end(), [](const auto& r) {
        return std::get<0>(r) % (16 << 20) != 0;
    })) << "resumed from the range the server said it held, mid-chunk";
    EXPECT_EQ(server_.counters().sessionsStarted, 1) << "resumes, never starts over";
    const auto* done = completeUpload();
    ASSERT_NE(done, nullptr);
    EXPECT_EQ(done->receivedSize, size);
    EXPECT_EQ(sha256(done->filePath), sha256(path));
    EXPECT_EQ(done->description, "T L");
    EXPECT_EQ(done->categoryId, "20");
}

TEST_F(UploadClientTest, AServiceUnavailableAnswerIsRetriedAfterAskingWhatArrived) {
    signInQuietly();
    setChunkSize(kUnit);
    const QString path = patternedFile(storage_.path(), 3 * kUnit);
    FakeYouTubeServer::Faults faults;
    faults.serviceUnavailable = 1;
    server_.setFaults(faults);
    const Outcome outcome = run(details(path));
    ASSERT_EQ(outcome.error, nullptr);
    ASSERT_NE(completeUpload(), nullptr);
    EXPECT_EQ(sha256(completeUpload()->filePath), sha256(path));
    EXPECT_EQ(server_.counters().statusQueries, 1);
    const QStringList log = server_.requestLog();
    const auto query = std::find_if(log.begin(), log.end(), [](const QString& line) {
        return line.endsWith(QLatin1String("bytes */") + QString::number(3 * kUnit));
    });
    ASSERT_NE(query, log.end());
    EXPECT_TRUE(std::prev(query)->startsWith(QLatin1String("PUT"))) << "the query follows the 503";
}

TEST_F(UploadClientTest, ATokenThatExpiresMidUploadIsRenewedOnceAndTheUploadGoesOn) {
    signInQuietly();
    setChunkSize(kUnit);
    const QString path = patternedFile(storage_.path(), 4 * kUnit);
    FakeYouTubeServer::Faults faults;
    faults.expireTokenMidUpload = 1;
    server_.setFaults(faults);
    const Outcome outcome = run(details(path));
    ASSERT_EQ(outcome.error, nullptr) << outcome.error->description().toStdString();
    EXPECT_EQ(server_.counters().unauthorized, 1);
    EXPECT_EQ(server_.counters().refreshes, 2) << "the first token, then its renewal";
    EXPECT_EQ(sha256(completeUpload()->filePath), sha256(path));
}

TEST_F(UploadClientTest, ASessionTheServerForgotStartsAgainFromByteZero) {
    signInQuietly();
    setChunkSize(kUnit);
    const QString path = patternedFile(storage_.path(), 4 * kUnit);
    FakeYouTubeServer::Faults faults;
    faults.forgetSession = 1;
    server_.setFaults(faults);
    testing_support::LogCapture log;
    const Outcome outcome = run(details(path));
    ASSERT_EQ(outcome.error, nullptr);
    EXPECT_EQ(server_.counters().sessionsStarted, 2);
    EXPECT_EQ(std::get<0>(chunkRanges().value(1)), 0) << "the new session's first chunk";
    EXPECT_EQ(sha256(completeUpload()->filePath), sha256(path));
    EXPECT_EQ(
        log.count(QStringLiteral("YouTube upload: the session was forgotten; starting again")), 1);
    // The progress went back with it.
    EXPECT_TRUE(std::any_of(outcome.progress.begin(), outcome.progress.end(),
                            [](const auto& p) { return p.first == 0; }));
}

TEST_F(UploadClientTest, QuotaExceededFailsAtOnceWithoutRetrying) {
    signInQuietly();
    const QString path = patternedFile(storage_.path(), kUnit);
    FakeYouTubeServer::Faults faults;
    faults.quotaExceeded = 1;
    server_.setFaults(faults);
    const Outcome outcome = run(details(path));
    ASSERT_TRUE(PublishingError::is(outcome.error, PublishingError::QuotaExceeded));
    EXPECT_TRUE(outcome.error->message().contains(QStringLiteral("quota")));
    EXPECT_EQ(server_.requestLog().filter(QStringLiteral("POST /upload")).size(), 1);
}

TEST_F(UploadClientTest, AnAccountGoogleNoLongerAcceptsFailsUnauthorizedAndIsForgotten) {
    signInQuietly();
    const QString path = patternedFile(storage_.path(), kUnit);
    FakeYouTubeServer::Faults faults;
    faults.revokeRefreshTokens = true;
    server_.setFaults(faults);
    auto signIn = makeSignIn();
    client_->setSignIn(signIn);
    const Outcome outcome = run(details(path));
    ASSERT_TRUE(PublishingError::is(outcome.error, PublishingError::Unauthorized));
    EXPECT_FALSE(signIn->isSignedIn());
    EXPECT_TRUE(server_.requestLog().filter(QStringLiteral("/upload")).isEmpty());
}

TEST_F(UploadClientTest, WithoutAnAccountTheUploadFailsNotSignedIn) {
    const QString path = patternedFile(storage_.path(), kUnit);
    const Outcome outcome = run(details(path));
    EXPECT_TRUE(PublishingError::is(outcome.error, PublishingError::NotSignedIn));
}

TEST_F(UploadClientTest, ASlowServerWithinTheTimeoutIsWaitedFor) {
    signInQuietly();
    setChunkSize(kUnit);
    const QString path = patternedFile(storage_.path(), 2 * kUnit + 1);
    FakeYouTubeServer::Faults faults;
    faults.responseDelayMs = 150;
    server_.setFaults(faults);
    auto policy = client_->policy();
    policy.transferTimeoutMs = 2000;
    client_->setPolicy(policy);
    const Outcome outcome = run(details(path));
    ASSERT_EQ(outcome.error, nullptr);
    EXPECT_EQ(server_.counters().statusQueries, 0);
}

// A server that stays silent past the timeout is a dropped connection:
// retried with a status query each time, then given up with a clear error.
TEST_F(UploadClientTest, AServerSilentPastTheTimeoutIsRetriedThenGivenUp) {
    signInQuietly();
    const QString path = patternedFile(storage_.path(), kUnit);
    FakeYouTubeServer::Faults faults;
    faults.responseDelayMs = 1500;
    server_.setFaults(faults);
    auto policy = client_->policy();
    policy.transferTimeoutMs = 100;
    policy.maxAttempts = 3;
    client_->setPolicy(policy);
    const Outcome outcome = run(details(path));
    ASSERT_TRUE(PublishingError::is(outcome.error, PublishingError::ServerUnavailable));
    EXPECT_TRUE(outcome.error->message().contains(QStringLiteral("could not be reached")))
        << outcome.error->message().toStdString();
}

TEST_F(UploadClientTest, Persistent5xxAnswersAreGivenUpAfterTheAttemptsAllowed) {
    signInQuietly();
    setChunkSize(kUnit);
    const QString path = patternedFile(storage_.path(), 2 * kUnit);
    FakeYouTubeServer::Faults faults;
    faults.serviceUnavailable = 1000;
    server_.setFaults(faults);
    auto policy = client_->policy();
    policy.maxAttempts = 4;
    client_->setPolicy(policy);
    const Outcome outcome = run(details(path));
    ASSERT_TRUE(PublishingError::is(outcome.error, PublishingError::ServerUnavailable));
    EXPECT_EQ(server_.counters().chunks, 4);
}

TEST_F(UploadClientTest, CancelStopsTheUploadAndItsHandlerHearsCancelled) {
    signInQuietly();
    setChunkSize(kUnit);
    const QString path = patternedFile(storage_.path(), 40 * kUnit);
    FakeYouTubeServer::Faults faults;
    faults.responseDelayMs = 50;
    server_.setFaults(faults);
    std::optional<ErrorPtr> error;
    int handlerCalls = 0;
    client_->upload(
        details(path), [&](qint64, qint64) {},
        [&](const platform::YouTubeUploadResult&, ErrorPtr e) {
            error = e;
            ++handlerCalls;
        });
    ASSERT_TRUE(waitUntil([&] { return server_.counters().chunks >= 2; }));
    client_->cancel();
    EXPECT_FALSE(error.has_value()) << "never inside cancel()";
    ASSERT_TRUE(waitUntil([&] { return error.has_value(); }));
    EXPECT_TRUE(PublishingError::is(*error, PublishingError::Cancelled));
    const int chunks = server_.counters().chunks;
    waitUntil([] { return false; }, 300);
    EXPECT_LE(server_.counters().chunks, chunks + 1) << "nothing is sent after the cancel";
    EXPECT_EQ(handlerCalls, 1);
    EXPECT_EQ(completeUpload(), nullptr);
}

TEST_F(UploadClientTest, AFileThatCannotBeReadFailsMediaUnreadable) {
    signInQuietly();
    const Outcome missing = run(details(storage_.path() + QStringLiteral("/none.mp4")));
    EXPECT_TRUE(PublishingError::is(missing.error, PublishingError::MediaUnreadable));
    QFile(storage_.path() + QStringLiteral("/empty.mp4")).open(QIODevice::WriteOnly);
    const Outcome empty = run(details(storage_.path() + QStringLiteral("/empty.mp4")));
    EXPECT_TRUE(PublishingError::is(empty.error, PublishingError::MediaUnreadable));
    EXPECT_EQ(server_.counters().sessionsStarted, 0);
}

TEST_F(UploadClientTest, CategoriesAreTheAssignableOnesInTheServicesOrder) {
    signInQuietly();
    server_.setCategories({{"1", "Film & Animation"},
                           {"18", "Short Movies", false},
                           {"20", "Gaming"},
                           {"22", "People & Blogs"}});
    std::optional<QList<platform::YouTubeVideoCategory>> categories;
    client_->fetchCategories(QStringLiteral("DE"), QStringLiteral("de"),
                             [&](const QList<platform::YouTubeVideoCategory>& list, ErrorPtr e) {
                                 EXPECT_EQ(e, nullptr);
                                 categories = list;
                             });
    ASSERT_TRUE(waitUntil([&] { return categories.has_value(); }));
    const QList<platform::YouTubeVideoCategory> expected{
        {"1", "Film & Animation"}, {"20", "Gaming"}, {"22", "People & Blogs"}};
    EXPECT_EQ(*categories, expected);
    EXPECT_TRUE(server_.requestLog().last().contains(QStringLiteral("regionCode=DE")));
}
