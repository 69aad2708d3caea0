#include "FormTextCell.h"

#include <QHBoxLayout>
#include <QLabel>
#include <QLineEdit>
#include <QPlainTextEdit>

namespace youtube_publishing {

namespace {
constexpr int kCaptionWidth = 96;
}

FormTextCell::FormTextCell(const QString& caption, Lines lines, QWidget* parent)
    : QWidget(parent), caption_(new QLabel(caption, this)) {
    auto* layout = new QHBoxLayout(this);
    layout->setContentsMargins(14, 8, 14, 8);
    layout->setSpacing(10);
    caption_->setFixedWidth(kCaptionWidth);
    caption_->setAlignment(Qt::AlignLeft | (lines == Lines::One ? Qt::AlignVCenter : Qt::AlignTop));
    layout->addWidget(caption_, 0, lines == Lines::One ? Qt::AlignVCenter : Qt::AlignTop);
    const QString flat = QStringLiteral("border:none;background:transparent;");
    if (lines == Lines::One) {
        line_ = new QLineEdit(this);
        line_->setFrame(false);
        line_->setStyleSheet(flat);
        line_->setMinimumHeight(26);
        connect(line_, &QLineEdit::textChanged, this, &FormTextCell::valueChanged);
        layout->addWidget(line_, 1);
    } else {
        box_ = new QPlainTextEdit(this);
        box_->setFrameShape(QFrame::NoFrame);
        box_->setStyleSheet(flat);
        box_->setTabChangesFocus(true);
        box_->setFixedHeight(110);
        connect(box_, &QPlainTextEdit::textChanged, this,
                [this] { emit valueChanged(box_->toPlainText()); });
        layout->addWidget(box_, 1);
    }
    caption_->setBuddy(editor());
}

QString FormTextCell::value() const {
    return line_ ? line_->text() : box_->toPlainText();
}

void FormTextCell::setValue(const QString& value) {
    if (value == this->value())
        return;
    if (line_)
        line_->setText(value);
    else
        box_->setPlainText(value);
}

QString FormTextCell::placeholder() const {
    return line_ ? line_->placeholderText() : box_->placeholderText();
}

void FormTextCell::setPlaceholder(const QString& placeholder) {
    if (line_)
        line_->setPlaceholderText(placeholder);
    else
        box_->setPlaceholderText(placeholder);
}

QString FormTextCell::caption() const {
    return caption_->text();
}

void FormTextCell::setEditable(bool editable) {
    if (line_)
        line_->setReadOnly(!editable);
    else
        box_->setReadOnly(!editable);
}

QWidget* FormTextCell::editor() const {
    return line_ ? static_cast<QWidget*>(line_) : static_cast<QWidget*>(box_);
}

} // namespace youtube_publishing
