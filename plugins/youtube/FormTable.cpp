#include "FormTable.h"

#include <QFrame>
#include <QLabel>
#include <QVBoxLayout>

namespace youtube_publishing {

FormTable::FormTable(QWidget* parent) : QWidget(parent), layout_(new QVBoxLayout(this)) {
    setObjectName(QStringLiteral("formTable"));
    layout_->setContentsMargins(20, 16, 20, 20);
    layout_->setSpacing(6);
    layout_->addStretch(1);
}

int FormTable::addSection(const QString& header) {
    // New sections go above the stretch that keeps the table at the top.
    const int at = layout_->count() - 1;
    int inserted = 0;
    if (!sections_.isEmpty()) {
        layout_->insertSpacing(at, 14);
        ++inserted;
    }
    if (!header.isEmpty()) {
        auto* label = new QLabel(header.toUpper(), this);
        label->setObjectName(QStringLiteral("sectionHeader"));
        label->setStyleSheet(QStringLiteral("color:#6d6d72;font-size:11px;padding-left:12px;"));
        layout_->insertWidget(at + inserted, label);
        ++inserted;
    }
    Section section;
    section.card = new QFrame(this);
    section.card->setObjectName(QStringLiteral("sectionCard"));
    section.card->setStyleSheet(QStringLiteral(
        "QFrame#sectionCard{background:white;border:1px solid #d8d8dc;border-radius:10px;}"));
    section.rows = new QVBoxLayout(section.card);
    section.rows->setContentsMargins(0, 0, 0, 0);
    section.rows->setSpacing(0);
    layout_->insertWidget(at + inserted, section.card);
    sections_.append(section);
    return int(sections_.size()) - 1;
}

void FormTable::addCell(int section, QWidget* cell) {
    if (section < 0 || section >= sections_.size() || !cell)
        return;
    Section& s = sections_[section];
    if (!s.cells.isEmpty()) {
        auto* line = new QFrame(s.card);
        line->setFixedHeight(1);
        line->setStyleSheet(QStringLiteral("background:#e5e5ea;margin-left:14px;"));
        s.rows->addWidget(line);
    }
    cell->setParent(s.card);
    s.rows->addWidget(cell);
    s.cells.append(cell);
}

int FormTable::numberOfRowsInSection(int section) const {
    return section >= 0 && section < sections_.size() ? int(sections_[section].cells.size()) : 0;
}

QObject* FormTable::cellForRowAtIndexPath(int section, int row) const {
    if (section < 0 || section >= sections_.size())
        return nullptr;
    return sections_[section].cells.value(row, nullptr);
}

void FormTable::addBanner(QWidget* banner) {
    banner->setParent(this);
    layout_->insertWidget(0, banner);
}

void FormTable::addFooter(QWidget* footer) {
    footer->setParent(this);
    layout_->insertWidget(layout_->count() - 1, footer);
}

} // namespace youtube_publishing
