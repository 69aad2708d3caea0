#pragma once

#include <QWidget>

class QLabel;

namespace youtube_publishing {

class CategoryPicker;

// The upload form's category row: a caption and the category picker, which
// shows the category string. setCategoryString can be called by name.
//
// Main thread only.
class FormCategoryCell : public QWidget {
    Q_OBJECT
    Q_PROPERTY(QString categoryString READ categoryString WRITE setCategoryString)
  public:
    FormCategoryCell(const QString& caption, CategoryPicker* picker, QWidget* parent = nullptr);

    // Shows `title` as the category: the picker's row of that title when it
    // has one, otherwise the text alone until a row is picked.
    Q_INVOKABLE void setCategoryString(const QString& title);
    QString categoryString() const;

  private:
    CategoryPicker* picker_;
};

} // namespace youtube_publishing
