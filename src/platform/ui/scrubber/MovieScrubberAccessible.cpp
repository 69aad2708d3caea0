#include "platform/ui/scrubber/MovieScrubberAccessible.h"

#include "platform/ui/scrubber/MovieScrubber.h"

#include <mutex>

namespace platform {

MovieScrubberAccessible::MovieScrubberAccessible(MovieScrubber* scrubber)
    : QAccessibleWidget(scrubber, QAccessible::Slider) {}

MovieScrubber* MovieScrubberAccessible::scrubber() const {
    return static_cast<MovieScrubber*>(widget());
}

QString MovieScrubberAccessible::text(QAccessible::Text t) const {
    if (t == QAccessible::Value)
        return scrubber()->accessibleValueText();
    return QAccessibleWidget::text(t);
}

void* MovieScrubberAccessible::interface_cast(QAccessible::InterfaceType type) {
    if (type == QAccessible::ValueInterface)
        return static_cast<QAccessibleValueInterface*>(this);
    return QAccessibleWidget::interface_cast(type);
}

QVariant MovieScrubberAccessible::currentValue() const {
    const MovieScrubber* s = scrubber();
    switch (s->focusedPart()) {
    case MovieScrubberHandle::Start:
        return s->startValue();
    case MovieScrubberHandle::End:
        return s->endValue();
    case MovieScrubberHandle::Playhead:
        break;
    }
    return s->value();
}

void MovieScrubberAccessible::setCurrentValue(const QVariant& value) {
    bool ok = false;
    const double seconds = value.toDouble(&ok);
    if (ok)
        scrubber()->moveFocusedPartTo(seconds);
}

QVariant MovieScrubberAccessible::maximumValue() const {
    return scrubber()->duration();
}

QVariant MovieScrubberAccessible::minimumValue() const {
    return 0.0;
}

QVariant MovieScrubberAccessible::minimumStepSize() const {
    return scrubber()->frameDuration();
}

namespace {

QAccessibleInterface* makeInterface(const QString& className, QObject* object) {
    if (className == QLatin1String(MovieScrubber::staticMetaObject.className()) && object &&
        object->isWidgetType())
        return new MovieScrubberAccessible(static_cast<MovieScrubber*>(object));
    return nullptr;
}

} // namespace

void installMovieScrubberAccessibility() {
    static std::once_flag once;
    std::call_once(once, [] { QAccessible::installFactory(makeInterface); });
}

} // namespace platform
