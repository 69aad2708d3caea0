#pragma once

#include <QList>
#include <QPair>
#include <QWidget>

class QComboBox;

namespace youtube_publishing {

// A row of the upload form that offers a few fixed choices (the privacy of
// the video): a caption and a drop-down list. Each choice has a value the
// form sends and a title the user reads.
//
// Main thread only.
class FormChoiceCell : public QWidget {
    Q_OBJECT
    Q_PROPERTY(QString value READ value WRITE setValue NOTIFY valueChanged)
  public:
    // `choices` as (value, title); the first is chosen at first.
    FormChoiceCell(const QString& caption, const QList<QPair<QString, QString>>& choices,
                   QWidget* parent = nullptr);

    QString value() const;
    // A value that is not among the choices changes nothing.
    void setValue(const QString& value);
    void setEditable(bool editable);
    QComboBox* comboBox() const { return box_; }

  signals:
    void valueChanged(const QString& value);

  private:
    QComboBox* box_;
};

} // namespace youtube_publishing
