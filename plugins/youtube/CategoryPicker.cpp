#include "CategoryPicker.h"

namespace youtube_publishing {

CategoryPicker::CategoryPicker(QWidget* parent) : QComboBox(parent) {
    setObjectName(QStringLiteral("categoryPicker"));
    setSizeAdjustPolicy(QComboBox::AdjustToContents);
    connect(this, &QComboBox::currentIndexChanged, this, [this](int row) {
        if (!filling_ && row >= 0)
            emit rowSelected(row);
    });
}

void CategoryPicker::setRows(const QStringList& titles) {
    filling_ = true;
    clear();
    addItems(titles);
    setCurrentIndex(-1);
    filling_ = false;
}

void CategoryPicker::selectRow_inComponent_animated(int row, int component, bool) {
    if (component != 0 || row < 0 || row >= count())
        return;
    if (row == currentIndex())
        emit rowSelected(row);
    else
        setCurrentIndex(row);
}

} // namespace youtube_publishing
