#include "FormCategoryCell.h"

#include "CategoryPicker.h"

#include <QHBoxLayout>
#include <QLabel>

namespace youtube_publishing {

FormCategoryCell::FormCategoryCell(const QString& caption, CategoryPicker* picker, QWidget* parent)
    : QWidget(parent), picker_(picker) {
    auto* layout = new QHBoxLayout(this);
    layout->setContentsMargins(14, 8, 14, 8);
    layout->setSpacing(10);
    auto* label = new QLabel(caption, this);
    label->setFixedWidth(96);
    label->setBuddy(picker);
    layout->addWidget(label);
    picker->setParent(this);
    layout->addWidget(picker);
    layout->addStretch(1);
}

void FormCategoryCell::setCategoryString(const QString& title) {
    const int row = picker_->findText(title);
    if (row >= 0) {
        picker_->setCurrentIndex(row);
    } else {
        picker_->setCurrentIndex(-1);
        picker_->setPlaceholderText(title);
    }
}

QString FormCategoryCell::categoryString() const {
    return picker_->currentIndex() >= 0 ? picker_->currentText() : picker_->placeholderText();
}

} // namespace youtube_publishing
