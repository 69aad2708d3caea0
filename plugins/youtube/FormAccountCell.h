#pragma once

#include <QWidget>

class QLabel;
class QPushButton;

namespace youtube_publishing {

// The upload form's account row: whether the user is signed in to YouTube,
// and the button that signs in or out.
//
// Main thread only.
class FormAccountCell : public QWidget {
    Q_OBJECT
  public:
    enum class State { Unknown, Unavailable, SignedOut, SigningIn, SignedIn };

    explicit FormAccountCell(QWidget* parent = nullptr);

    State state() const { return state_; }
    void setState(State state);
    void setEditable(bool editable);
    QPushButton* button() const { return button_; }

  signals:
    void signInRequested();
    void signOutRequested();

  private:
    State state_ = State::Unknown;
    QLabel* status_;
    QPushButton* button_;
};

} // namespace youtube_publishing
