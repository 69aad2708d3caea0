#include "platform/ui/ViewHandle.h"

#include <QVariant>

namespace platform::ViewHandles {

namespace {
constexpr const char* kCount = "tamsel.viewHandles";
}

int count(const QWidget* view) {
    return view ? view->property(kCount).toInt() : 0;
}

void retain(QWidget* view) {
    if (view)
        view->setProperty(kCount, count(view) + 1);
}

void release(QWidget* view) {
    if (!view)
        return;
    const int left = std::max(0, count(view) - 1);
    view->setProperty(kCount, left);
    if (left == 0 && !view->parentWidget())
        view->deleteLater();
}

} // namespace platform::ViewHandles
