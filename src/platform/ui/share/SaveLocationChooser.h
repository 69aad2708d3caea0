#pragma once

#include "platform/runtime/Implementation.h"

#include <QString>

#include <functional>
#include <memory>

class QWidget;

namespace platform {

// Asks the user where to save a file: the desktop's save dialog. Main thread
// only; `done` runs once on the main thread with the chosen host path, or ""
// when the user cancelled.
class SaveLocationChooser {
  public:
    virtual ~SaveLocationChooser() = default;
    virtual void chooseSaveLocation(QWidget* parent, const QString& suggestedPath,
                                    std::function<void(const QString& path)> done) = 0;

    static std::shared_ptr<SaveLocationChooser> sharedChooser();
    using Maker = std::shared_ptr<SaveLocationChooser>();
    static Implementation<Maker>& implementation();
};

} // namespace platform
