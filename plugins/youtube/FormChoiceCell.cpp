#include "FormChoiceCell.h"

#include <QComboBox>
#include <QHBoxLayout>
#include <QLabel>

namespace youtube_publishing {

FormChoiceCell::FormChoiceCell(const QString& caption,
                               const QList<QPair<QString, QString>>& choices, QWidget* parent)
    : QWidget(parent), box_(new QComboBox(this)) {
    auto* layout = new QHBoxLayout(this);
    layout->setContentsMargins(14, 8, 14, 8);
    layout->setSpacing(10);
    auto* label = new QLabel(caption, this);
    label->setFixedWidth(96);
    label->setBuddy(box_);
    layout->addWidget(label);
    for (const auto& [value, title] : choices)
        box_->addItem(title, value);
    layout->addWidget(box_);
    layout->addStretch(1);
    connect(box_, &QComboBox::currentIndexChanged, this, [this] { emit valueChanged(value()); });
}

QString FormChoiceCell::value() const {
    return box_->currentData().toString();
}

void FormChoiceCell::setValue(const QString& value) {
    const int row = box_->findData(value);
    if (row >= 0)
        box_->setCurrentIndex(row);
}

void FormChoiceCell::setEditable(bool editable) {
    box_->setEnabled(editable);
}

} // namespace youtube_publishing
