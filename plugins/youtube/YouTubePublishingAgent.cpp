#include "YouTubePublishingAgent.h"

#include "BuiltInCategories.h"
#include "MediaFileWaiter.h"
#include "PluginStrings.h"
#include "YouTubeUploadForm.h"

#include "platform/publishing/PublishingError.h"
#include "platform/runtime/DevicePaths.h"
#include "platform/runtime/Log.h"
#include "platform/ui/NavigationController.h"

#include <QDir>
#include <QLocale>

using platform::ErrorPtr;
using youtube_publishing::FormAccountCell;
using youtube_publishing::localized;
namespace PublishingError = platform::PublishingError;

namespace {

QString megabytes(qint64 bytes) {
    return QLocale().toString(double(bytes) / 1e6, 'f', 1);
}

// The user's region and language, as the service names them ("DE", "de").
QString regionCode() {
    const QLocale locale = QLocale::system();
    return locale.territory() == QLocale::AnyTerritory
               ? QStringLiteral("US")
               : QLocale::territoryToCode(locale.territory());
}

QString languageCode() {
    const QLocale locale = QLocale::system();
    return locale.language() == QLocale::C ? QStringLiteral("en")
                                           : QLocale::languageToCode(locale.language());
}

} // namespace

YouTubePublishingAgent::YouTubePublishingAgent()
    : signIn_(platform::YouTubeSignIn::make()), client_(platform::YouTubeUploadClient::make()),
      form_(std::make_shared<YouTubeUploadForm>()),
      waiter_(new youtube_publishing::MediaFileWaiter(this)) {
    if (client_)
        client_->setSignIn(signIn_);
    navigation_ = platform::NavigationController::initWithRootViewController(form_);
    navigation_->setPreferredContentSize(QSizeF(540, 620));
    connect(form_.get(), &YouTubeUploadForm::aboutToShow, this,
            &YouTubePublishingAgent::formAboutToShow);
    connect(form_.get(), &YouTubeUploadForm::publishRequested, this,
            &YouTubePublishingAgent::publish);
    connect(form_.get(), &YouTubeUploadForm::cancelRequested, this, [this] {
        if (auto d = delegate())
            d->publishingAgentCancelButtonClicked(this);
    });
    connect(form_.get(), &YouTubeUploadForm::signInRequested, this,
            &YouTubePublishingAgent::signInFromForm);
    connect(form_.get(), &YouTubeUploadForm::signOutRequested, this,
            &YouTubePublishingAgent::signOutFromForm);
    if (signIn_)
        connect(signIn_.get(), &platform::YouTubeSignIn::signedInChanged, this,
                [this] { refreshAccount(); });
}

YouTubePublishingAgent::~YouTubePublishingAgent() {
    if (client_ && publishing_)
        client_->cancel();
}

void YouTubePublishingAgent::setDelegate(
    std::weak_ptr<platform::PublishingAgentDelegate> delegate) {
    delegate_ = std::move(delegate);
}

void YouTubePublishingAgent::setMediaPath(const QString& path) {
    mediaPath_ = path;
}

std::shared_ptr<platform::NavigationController> YouTubePublishingAgent::navigationController() {
    return navigation_;
}

QString YouTubePublishingAgent::mediaHostPath() const {
    // The temporary store's names hold a double slash; the file is the same.
    const QString host = platform::DevicePaths::toHost(mediaPath_);
    return host.isEmpty() ? host : QDir::cleanPath(host);
}

void YouTubePublishingAgent::formAboutToShow() {
    if (auto d = delegate())
        d->publishingAgentWillBeDisplayed(this);
    // What the form offers until the service's own list for the region comes.
    form_->setCategories(youtube_publishing::builtInCategories());
    if (!signIn_ || !client_) {
        form_->setAccountState(FormAccountCell::State::Unavailable);
        return;
    }
    if (!signIn_->isConfigured()) {
        form_->setAccountState(FormAccountCell::State::Unavailable);
        return;
    }
    QPointer<YouTubePublishingAgent> self(this);
    signIn_->restore([self](ErrorPtr error) {
        if (!self)
            return;
        self->refreshAccount();
        if (!error)
            self->loadCategories();
    });
}

void YouTubePublishingAgent::refreshAccount() {
    if (!signIn_ || !signIn_->isConfigured())
        return;
    form_->setAccountState(signIn_->isSignedIn() ? FormAccountCell::State::SignedIn
                                                 : FormAccountCell::State::SignedOut);
}

void YouTubePublishingAgent::loadCategories() {
    if (categoriesFromService_ || !client_)
        return;
    QPointer<YouTubePublishingAgent> self(this);
    client_->fetchCategories(
        regionCode(), languageCode(),
        [self](const QList<platform::YouTubeVideoCategory>& categories, ErrorPtr error) {
            if (!self || self->categoriesFromService_)
                return;
            if (error) {
                // The built-in list stays; it serves as well.
                platform::logDefault(
                    QStringLiteral("YouTube publishing: categories: %1").arg(error->message()));
                return;
            }
            if (categories.isEmpty() || self->publishing_)
                return;
            self->categoriesFromService_ = true;
            self->form_->setCategories(categories);
        });
}

void YouTubePublishingAgent::signInFromForm() {
    if (!signIn_)
        return;
    form_->setAccountState(FormAccountCell::State::SigningIn);
    form_->setStatus(QString());
    QPointer<YouTubePublishingAgent> self(this);
    signIn_->signIn([self](ErrorPtr error) {
        if (!self)
            return;
        self->refreshAccount();
        if (error) {
            if (!PublishingError::is(error, PublishingError::SignInCancelled))
                self->form_->setStatus(error->message(), true);
            return;
        }
        self->loadCategories();
    });
}

void YouTubePublishingAgent::signOutFromForm() {
    if (signIn_)
        signIn_->signOut();
    refreshAccount();
}

void YouTubePublishingAgent::publish() {
    if (publishing_ || !form_->canPublish())
        return;
    upload_ = form_->takeDetails();
    publishing_ = true;
    form_->setPhase(YouTubeUploadForm::Phase::Publishing);
    if (auto d = delegate())
        d->publishingAgentDoneButtonClicked(this);
    if (auto d = delegate())
        d->publishingAgentDidBeginPublishing(this);
    if (!signIn_ || !client_) {
        endPublishing(PublishingError::make(PublishingError::NotConfigured,
                                            QStringLiteral("YouTube publishing is not available")));
        return;
    }
    ensureSignedIn();
}

void YouTubePublishingAgent::ensureSignedIn() {
    QPointer<YouTubePublishingAgent> self(this);
    signIn_->accessToken(false, [self](const QString&, ErrorPtr error) {
        if (!self)
            return;
        if (!error) {
            self->waitForMedia();
            return;
        }
        if (!PublishingError::is(error, PublishingError::NotSignedIn) &&
            !PublishingError::is(error, PublishingError::Unauthorized)) {
            self->endPublishing(error);
            return;
        }
        self->form_->setAccountState(FormAccountCell::State::SigningIn);
        self->form_->setStatus(
            localized("STATUS_SIGN_IN", "Sign in to your Google account in your browser…"));
        self->form_->setProgress(0, -1);
        self->signIn_->signIn([self](ErrorPtr error) {
            if (!self)
                return;
            self->refreshAccount();
            if (error)
                self->endPublishing(error);
            else
                self->waitForMedia();
        });
    });
}

void YouTubePublishingAgent::waitForMedia() {
    form_->setStatus(localized("STATUS_WAITING", "Getting the video ready…"));
    form_->setProgress(0, -1);
    const QString hostPath = mediaHostPath();
    if (hostPath.isEmpty()) {
        endPublishing(PublishingError::make(PublishingError::MediaUnreadable,
                                            QStringLiteral("There is no video to publish")));
        return;
    }
    QPointer<YouTubePublishingAgent> self(this);
    waiter_->wait(hostPath, [self](ErrorPtr error) {
        if (!self)
            return;
        if (error)
            self->endPublishing(error);
        else
            self->startUpload();
    });
}

void YouTubePublishingAgent::startUpload() {
    upload_.filePath = mediaHostPath();
    platform::logDefault(QStringLiteral("YouTube publishing: uploading %1").arg(mediaPath_));
    form_->setStatus(localized("STATUS_UPLOADING_START", "Uploading…"));
    form_->setProgress(0, 1);
    QPointer<YouTubePublishingAgent> self(this);
    client_->upload(
        upload_,
        [self](qint64 sent, qint64 total) {
            if (!self)
                return;
            self->form_->setProgress(sent, total);
            const int percent = total > 0 ? int(sent * 100 / total) : 0;
            self->form_->setStatus(localized("STATUS_UPLOADING", "Uploading… %1% (%2 of %3 MB)")
                                       .arg(percent)
                                       .arg(megabytes(sent), megabytes(total)));
        },
        [self](const platform::YouTubeUploadResult& result, ErrorPtr error) {
            if (!self)
                return;
            if (!error)
                self->mediaURL_ = result.watchURL.toString();
            self->endPublishing(error);
        });
}

void YouTubePublishingAgent::endPublishing(const ErrorPtr& error) {
    if (!publishing_)
        return;
    publishing_ = false;
    if (error) {
        platform::logError(
            QStringLiteral("YouTube publishing failed: %1").arg(error->description()));
        form_->setPhase(YouTubeUploadForm::Phase::Failed);
        form_->setStatus(localized("STATUS_FAILED", "Not published: %1").arg(error->message()),
                         true);
    } else {
        platform::logDefault(QStringLiteral("YouTube publishing: published %1").arg(mediaURL_));
        form_->setPhase(YouTubeUploadForm::Phase::Published);
        form_->setStatus(localized("STATUS_PUBLISHED", "Published."));
    }
    if (auto d = delegate())
        d->publishingAgentDidEndPublishing_error(this, error);
}
