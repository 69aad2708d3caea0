// The store-lookup service's two catalogues and how their answers combine.

#include "ShareFakes.h"
#include "platform/services/store/AppStreamCatalogue.h"
#include "platform/services/store/CatalogueStoreLookup.h"
#include "platform/services/store/RemoteCatalogue.h"
#include "support/TempDir.h"
#include "support/Wait.h"

#include <QCoreApplication>
#include <QTcpServer>
#include <QTcpSocket>
#include <QTemporaryDir>
#include <QTimer>
#include <gtest/gtest.h>

using namespace platform;
using testing_support::waitUntil;

namespace {

const char* kCollection = R"(<?xml version="1.0" encoding="UTF-8"?>
<components version="0.14" origin="tamsel-test">
  <component type="desktop-application">
    <id>org.example.Racer</id>
    <name>Racer</name>
    <name xml:lang="de">Renner</name>
    <developer_name>Example Games</developer_name>
    <categories><category>Game</category><category>ActionGame</category></categories>
  </component>
  <component type="desktop-application">
    <id>org.example.Notes.desktop</id>
    <name>Notes</name>
  </component>
  <component type="desktop-application">
    <id>com.example.painter</id>
    <name>Painter</name>
    <launchable type="desktop-id">org.example.Painter.desktop</launchable>
  </component>
</components>
)";

const char* kMetainfo = R"(<?xml version="1.0" encoding="UTF-8"?>
<component type="desktop-application">
  <id>org.example.Meta</id>
  <name>Meta App</name>
  <developer_name>Meta Makers</developer_name>
</component>
)";

// HTTP/1.1 on 127.0.0.1 with a scripted answer per path (404 otherwise): a
// status and a body after `delayMs`, or, with a negative delay, never.
class LocalHttpServer {
  public:
    LocalHttpServer() {
        server_.listen(QHostAddress::LocalHost, 0);
        QObject::connect(&server_, &QTcpServer::newConnection, [this] {
            while (QTcpSocket* socket = server_.nextPendingConnection())
                QObject::connect(socket, &QTcpSocket::readyRead, [this, socket] { serve(socket); });
        });
    }
    QUrl baseUrl() const {
        return QUrl(QStringLiteral("http://127.0.0.1:%1").arg(server_.serverPort()));
    }
    void answer(const QString& path, const QByteArray& body, int status = 200, int delayMs = 0) {
        scripts_.insert(path, {status, body, delayMs});
    }
    int answered = 0;

  private:
    struct Script {
        int status = 404;
        QByteArray body;
        int delayMs = 0;
    };
    void serve(QTcpSocket* socket) {
        if (!socket->peek(8192).contains("\r\n\r\n"))
            return;
        const QByteArray head = socket->readAll();
        const Script script = scripts_.value(QString::fromLatin1(head.split(' ').value(1)));
        if (script.delayMs >= 0)
            QTimer::singleShot(script.delayMs, socket, [this, socket, script] {
                socket->write("HTTP/1.1 " + QByteArray::number(script.status) +
                              " X\r\nContent-Type: application/json\r\nConnection: close\r\n"
                              "Content-Length: " +
                              QByteArray::number(script.body.size()) + "\r\n\r\n" + script.body);
                socket->disconnectFromHost();
                ++answered;
            });
    }
    QTcpServer server_;
    QHash<QString, Script> scripts_;
};

// Never answers.
class SilentCatalogue final : public StoreCatalogue {
  public:
    void lookupApplication(const QString&, Done) override {}
};

struct Outcome {
    int calls = 0;
    StoreLookupResponse response;
    ErrorPtr error;
};

// Starts a lookup and waits (on the event loop) for its callback.
std::shared_ptr<Outcome> lookUp(StoreLookup& lookup, const QString& id) {
    auto outcome = std::make_shared<Outcome>();
    StoreLookupRequest request;
    request.parameters.insert(StoreLookupRequest::BundleIdentifiersParameter, QStringList{id});
    lookup.startRequest(request, [outcome](const StoreLookupResponse& r, ErrorPtr e) {
        QMetaObject::invokeMethod(qApp, [outcome, r, e] {
            ++outcome->calls;
            outcome->response = r;
            outcome->error = e;
        });
    });
    waitUntil([&] { return outcome->calls > 0; }, 15000);
    return outcome;
}

class CatalogueTest : public ::testing::Test {
  protected:
    void SetUp() override {
        testing_support::writeText(catalogue.filePath("collection/test.xml"), kCollection);
        testing_support::writeText(catalogue.filePath("metainfo/org.example.Meta.metainfo.xml"),
                                   kMetainfo);
    }
    std::shared_ptr<AppStreamCatalogue> appStream() {
        return std::make_shared<AppStreamCatalogue>(
            QStringList{catalogue.filePath("collection"), catalogue.filePath("metainfo")});
    }
    // The real service, its remote catalogue talking HTTP to the local server.
    std::shared_ptr<CatalogueStoreLookup> service(int deadlineMs) {
        const QUrl base = server.baseUrl();
        return std::make_shared<CatalogueStoreLookup>(
            [this] { return appStream(); },
            [base] { return std::make_shared<RemoteCatalogue>(base); },
            std::chrono::milliseconds(deadlineMs));
    }
    QTemporaryDir catalogue;
    testing_support::ScopedEnv locale{"LANGUAGE", ""};
    testing_support::ScopedEnv lang{"LC_ALL", "C"};
    LocalHttpServer server;
};

} // namespace

// By component id, with ".desktop" added, by a desktop-file launchable, and in
// a folder of metainfo files; in the user's language.
TEST_F(CatalogueTest, AppStreamFindsAnApplicationByIdDesktopIdLaunchableOrMetainfo) {
    const QStringList found[] = {
        {"org.example.Racer", "Racer", "appstream://org.example.Racer"},
        {"org.example.Notes", "Notes", "appstream://org.example.Notes.desktop"},
        {"org.example.Painter", "Painter", "appstream://com.example.painter"},
        {"org.example.Meta", "Meta App", "appstream://org.example.Meta"}};
    auto local = appStream();
    for (const QStringList& expected : found) {
        const auto record = local->lookupNow(expected[0]);
        const QStringList got{expected[0], record ? record->name : "",
                              record ? record->storeLink : ""};
        EXPECT_EQ(got, expected);
    }
    EXPECT_FALSE(local->lookupNow("org.example.Unknown"));
    QTemporaryDir empty;
    EXPECT_FALSE(AppStreamCatalogue({empty.path()}).lookupNow("org.example.Racer"));
    testing_support::ScopedEnv german("LC_ALL", "de_AT.UTF-8");
    EXPECT_EQ(appStream()->lookupNow("org.example.Racer").value_or(StoreRecord{}).name, "Renner");
}

// The remote answer wins when it is sound and in time; otherwise the answer
// comes, once and by the deadline, from what the desktop's catalogue knows.
TEST_F(CatalogueTest, TheRemoteAnswerWinsInTimeElseTheDesktopsCatalogueAnswersOnce) {
    const QString racer = "Racer|Example Games|Game,ActionGame|appstream://org.example.Racer";
    const QString meta = "Meta App|Meta Makers||appstream://org.example.Meta";
    const struct {
        QByteArray body;
        int status, delayMs, deadlineMs;
        QString id, expected; // name|developer|categories|link ("/apps/..." on the server)
    } cases[] = {
        {R"({"name":"Racer Online","developer_name":"Ex Ltd","categories":["Game"]})", 200, 0, 2500,
         "org.example.Racer", "Racer Online|Ex Ltd|Game|/apps/org.example.Racer"},
        {R"({"name":"Racer","developer":{"name":"Ex"}})", 200, 0, 2500, "org.example.Racer",
         "Racer|Ex||/apps/org.example.Racer"},
        {"<html>502 bad gateway</html>", 200, 0, 2500, "org.example.Racer", racer},
        {"[1,2]", 200, 0, 2500, "org.example.Racer", racer},
        {R"({"summary":"no name"})", 200, 0, 2500, "org.example.Meta", meta},
        {"", 404, 0, 2500, "org.example.Meta", meta},
        {"", 200, -1, 300, "org.example.Racer", racer},                    // never answers
        {R"({"name":"Late"})", 200, 800, 200, "org.example.Racer", racer}, // after the deadline
        {"", 404, 0, 2500, "org.example.Nowhere", ""},                     // unknown everywhere
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.body.toStdString());
        server.answer("/api/v2/appstream/" + c.id, c.body, c.status, c.delayMs);
        const int answered = server.answered;
        const auto outcome = lookUp(*service(c.deadlineMs), c.id);
        QStringList got;
        for (const QVariant& result : outcome->response.results) {
            const QVariantMap item = result.toMap();
            got << QStringList{item.value(StoreItemKey::displayName).toString(),
                               item.value(StoreItemKey::artistName).toString(),
                               item.value(StoreItemKey::genreNames).toStringList().join(','),
                               item.value(StoreItemKey::shortProductURL)
                                   .toString()
                                   .remove(server.baseUrl().toString())}
                       .join('|');
        }
        EXPECT_EQ(got.join('\n'), c.expected);
        EXPECT_FALSE(outcome->error);
        if (c.delayMs > 0)
            waitUntil([&] { return server.answered > answered; }, 5000);
        waitUntil([] { return false; }, 100);
        EXPECT_EQ(outcome->calls, 1);
    }
}

TEST(CatalogueStoreLookupRule, TheDeadlineAnswersForCataloguesThatDoNot) {
    auto silent = std::make_shared<SilentCatalogue>();
    CatalogueStoreLookup lookup([silent] { return silent; }, {}, std::chrono::milliseconds(100));
    const auto outcome = lookUp(lookup, "x");
    ASSERT_EQ(outcome->calls, 1);
    EXPECT_TRUE(outcome->response.results.isEmpty());
    EXPECT_TRUE(outcome->error);
}
