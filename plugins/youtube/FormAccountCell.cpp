#include "FormAccountCell.h"

#include "PluginStrings.h"

#include <QHBoxLayout>
#include <QLabel>
#include <QPushButton>

namespace youtube_publishing {

FormAccountCell::FormAccountCell(QWidget* parent)
    : QWidget(parent), status_(new QLabel(this)), button_(new QPushButton(this)) {
    auto* layout = new QHBoxLayout(this);
    layout->setContentsMargins(14, 8, 14, 8);
    layout->setSpacing(10);
    status_->setWordWrap(true);
    status_->setObjectName(QStringLiteral("accountStatus"));
    button_->setObjectName(QStringLiteral("accountButton"));
    layout->addWidget(status_, 1);
    layout->addWidget(button_);
    connect(button_, &QPushButton::clicked, this, [this] {
        if (state_ == State::SignedIn)
            emit signOutRequested();
        else
            emit signInRequested();
    });
    setState(State::Unknown);
}

void FormAccountCell::setState(State state) {
    state_ = state;
    switch (state) {
    case State::Unknown:
        status_->setText(localized("ACCOUNT_CHECKING", "Looking for your YouTube account…"));
        button_->setText(localized("SIGN_IN", "Sign In…"));
        button_->setEnabled(false);
        break;
    case State::Unavailable:
        status_->setText(localized("ACCOUNT_UNAVAILABLE",
                                   "Publishing to YouTube is not set up on this computer: it "
                                   "needs an OAuth client (see Tamsel's README)."));
        button_->setText(localized("SIGN_IN", "Sign In…"));
        button_->setEnabled(false);
        break;
    case State::SignedOut:
        status_->setText(localized("ACCOUNT_SIGNED_OUT",
                                   "Not signed in. Publishing asks you to sign in to your "
                                   "Google account in your browser."));
        button_->setText(localized("SIGN_IN", "Sign In…"));
        button_->setEnabled(true);
        break;
    case State::SigningIn:
        status_->setText(localized("ACCOUNT_SIGNING_IN", "Continue in your browser to sign in…"));
        button_->setText(localized("SIGN_IN", "Sign In…"));
        button_->setEnabled(false);
        break;
    case State::SignedIn:
        status_->setText(localized("ACCOUNT_SIGNED_IN", "Signed in to YouTube."));
        button_->setText(localized("SIGN_OUT", "Sign Out"));
        button_->setEnabled(true);
        break;
    }
}

void FormAccountCell::setEditable(bool editable) {
    button_->setEnabled(editable && (state_ == State::SignedOut || state_ == State::SignedIn));
}

} // namespace youtube_publishing
