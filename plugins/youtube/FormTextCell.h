#pragma once

#include <QWidget>

class QLabel;
class QLineEdit;
class QPlainTextEdit;

namespace youtube_publishing {

// A row of the upload form holding text the user types: a caption on the
// left, a one-line field or a text box on the right. Its "value" and
// "placeholder" can be read and written by name (the YouTube activity fills
// the description this way); writing "placeholder" with no value clears it.
//
// Main thread only.
class FormTextCell : public QWidget {
    Q_OBJECT
    Q_PROPERTY(QString value READ value WRITE setValue NOTIFY valueChanged)
    Q_PROPERTY(QString placeholder READ placeholder WRITE setPlaceholder RESET resetPlaceholder)
    Q_PROPERTY(QString caption READ caption CONSTANT)
  public:
    enum class Lines { One, Many };
    FormTextCell(const QString& caption, Lines lines, QWidget* parent = nullptr);

    QString value() const;
    void setValue(const QString& value);
    QString placeholder() const;
    void setPlaceholder(const QString& placeholder);
    void resetPlaceholder() { setPlaceholder(QString()); }
    QString caption() const;

    void setEditable(bool editable);
    // The field or text box.
    QWidget* editor() const;

  signals:
    void valueChanged(const QString& value);

  private:
    QLabel* caption_;
    QLineEdit* line_ = nullptr;
    QPlainTextEdit* box_ = nullptr;
};

} // namespace youtube_publishing
