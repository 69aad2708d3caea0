#pragma once

#include <QList>
#include <QWidget>

class QVBoxLayout;

namespace youtube_publishing {

// The upload form's table: sections of cells under small headings, each
// section a rounded card, the way a desktop settings page groups its rows.
// Cells are widgets the table owns; the table is readable by name (the
// form's "_table") and gives its cells by index path.
//
// Main thread only.
class FormTable : public QWidget {
    Q_OBJECT
  public:
    explicit FormTable(QWidget* parent = nullptr);

    // A new section under `header` ("" for none); returns its index.
    int addSection(const QString& header);
    // Appends `cell` to `section`; the table owns it.
    void addCell(int section, QWidget* cell);

    int numberOfSections() const { return int(sections_.size()); }
    int numberOfRowsInSection(int section) const;
    // The cell at row `row` of section `section`, or null.
    Q_INVOKABLE QObject* cellForRowAtIndexPath(int section, int row) const;

    // A widget above the first section (a status line, say).
    void addBanner(QWidget* banner);
    // A widget below the last section (a note, say).
    void addFooter(QWidget* footer);

  private:
    struct Section {
        QWidget* card = nullptr;
        QVBoxLayout* rows = nullptr;
        QList<QWidget*> cells;
    };
    QVBoxLayout* layout_;
    QList<Section> sections_;
};

} // namespace youtube_publishing
