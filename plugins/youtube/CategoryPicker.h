#pragma once

#include <QComboBox>

namespace youtube_publishing {

// The upload form's category picker: one component whose rows are the
// categories' titles, in the form's order. Rows are selected by the user or
// by selectRow_inComponent_animated, which can be called by name.
//
// Main thread only.
class CategoryPicker : public QComboBox {
    Q_OBJECT
    Q_PROPERTY(int selectedRow READ selectedRow NOTIFY rowSelected)
  public:
    explicit CategoryPicker(QWidget* parent = nullptr);

    // Replaces the rows; none is selected afterwards, and rowSelected is not
    // sent for the change.
    void setRows(const QStringList& titles);

    // Selects `row` of `component` (only component 0 exists); out of range
    // changes nothing. The flag is accepted; a desktop picker does not
    // animate.
    Q_INVOKABLE void selectRow_inComponent_animated(int row, int component, bool animated);

    // -1 when no row is selected.
    int selectedRow() const { return currentIndex(); }

  signals:
    // A row was selected, by the user or by selectRow_inComponent_animated.
    void rowSelected(int row);

  private:
    bool filling_ = false;
};

} // namespace youtube_publishing
