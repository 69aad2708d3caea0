#pragma once

#include <QAccessibleWidget>

namespace platform {

class MovieScrubber;

// How assistive technology sees a MovieScrubber: a slider whose value is the
// time of the part the keyboard works on (playhead or a trim handle). Setting
// the value moves that part as the user would, delegate calls included. Main
// thread only; made by the factory that installMovieScrubberAccessibility
// registers.
class MovieScrubberAccessible : public QAccessibleWidget, public QAccessibleValueInterface {
  public:
    explicit MovieScrubberAccessible(MovieScrubber* scrubber);

    QString text(QAccessible::Text t) const override;
    void* interface_cast(QAccessible::InterfaceType type) override;

    QVariant currentValue() const override;
    void setCurrentValue(const QVariant& value) override;
    QVariant maximumValue() const override;
    QVariant minimumValue() const override;
    QVariant minimumStepSize() const override;

  private:
    MovieScrubber* scrubber() const;
};

// Registers the factory once per process; safe to call again.
void installMovieScrubberAccessibility();

} // namespace platform
