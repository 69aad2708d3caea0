#pragma once

#include <QString>
#include <functional>
#include <memory>

namespace platform {

// One button of an alert. The handler (may be empty) runs after the alert has
// been dismissed, on the main thread.
class AlertAction {
  public:
    enum class Style { Default = 0, Cancel = 1, Destructive = 2 };
    using Handler = std::function<void(AlertAction& action)>;

    static std::shared_ptr<AlertAction> make(const QString& title, Style style,
                                             Handler handler = {}) {
        return std::shared_ptr<AlertAction>(new AlertAction(title, style, std::move(handler)));
    }

    QString title() const { return title_; }
    Style style() const { return style_; }
    bool isEnabled() const { return enabled_; }
    void setEnabled(bool enabled) { enabled_ = enabled; }
    void run() {
        if (handler_)
            handler_(*this);
    }

  private:
    AlertAction(QString title, Style style, Handler handler)
        : title_(std::move(title)), style_(style), handler_(std::move(handler)) {}
    QString title_;
    Style style_;
    bool enabled_ = true;
    Handler handler_;
};

} // namespace platform
