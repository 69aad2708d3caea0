#pragma once

#include "platform/ui/UrlOpener.h"

#include <QList>
#include <QUrl>
#include <memory>

// Records the addresses it is asked to open, for its lifetime in the
// desktop's opener's place.
class RecordingUrlOpener {
  public:
    RecordingUrlOpener()
        : opener_(std::make_shared<Opener>()),
          replacement_(platform::UrlOpener::implementation().replace([opener = opener_] {
              return std::static_pointer_cast<platform::UrlOpener>(opener);
          })) {}

    QList<QUrl> opened() const { return opener_->opened; }

  private:
    struct Opener : platform::UrlOpener {
        bool openURL(const QUrl& url) override {
            opened.append(url);
            return true;
        }
        QList<QUrl> opened;
    };
    std::shared_ptr<Opener> opener_;
    platform::Implementation<platform::UrlOpener::Maker>::Replacement replacement_;
};
