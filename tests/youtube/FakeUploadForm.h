#pragma once

#include "platform/ui/ViewController.h"

#include <QList>
#include <QObject>
#include <QString>
#include <QVariantList>

#include <tuple>

// The members of a publishing agent's upload form that an activity reads and
// writes by name, recording what was done to them.

class FakeFormCell : public QObject {
    Q_OBJECT
    Q_PROPERTY(QString value MEMBER value)
    Q_PROPERTY(QString placeholder MEMBER placeholder)
  public:
    QString value;
    QString placeholder;
};

// Section 0: row 0 the title, row 1 the description.
class FakeFormTable : public QObject {
    Q_OBJECT
  public:
    FakeFormTable();
    Q_INVOKABLE QObject* cellForRowAtIndexPath(int section, int row);
    FakeFormCell titleCell;
    FakeFormCell descriptionCell;
};

class FakeCategoryPicker : public QObject {
    Q_OBJECT
  public:
    Q_INVOKABLE void selectRow_inComponent_animated(int row, int component, bool animated);
    QList<std::tuple<int, int, bool>> selections;
};

class FakeCategoryCell : public QObject {
    Q_OBJECT
  public:
    Q_INVOKABLE void setCategoryString(const QString& category);
    QStringList categoryStrings;
};

// The upload form. Its own "_selectComedyPickerRow" (in MethodTable, under
// this class) only counts its runs; categoriesDidArrive runs whatever the
// class's entry holds, as the real form does when the categories come in.
// A form made with `members` false has none of the members.
class FakeUploadForm : public platform::ViewController {
    Q_OBJECT
    Q_PROPERTY(QObject* _table READ table)
    Q_PROPERTY(QVariantList _categories MEMBER categories)
    Q_PROPERTY(QObject* _picker READ picker)
    Q_PROPERTY(QString _defaultCategory MEMBER defaultCategory)
  public:
    explicit FakeUploadForm(bool members = true);

    Q_INVOKABLE QObject* _categoryCell();
    void categoriesDidArrive(const QVariantList& list);

    QObject* table() { return members_ ? &table_ : nullptr; }
    QObject* picker() { return members_ ? &picker_ : nullptr; }

    FakeFormTable table_;
    FakeCategoryPicker picker_;
    FakeCategoryCell categoryCell_;
    QVariantList categories;
    QString defaultCategory = QStringLiteral("22");
    int ownSelections = 0;

  private:
    bool members_;
};

// A category record as the form keeps it.
QVariantMap category(const QString& id, const QString& label);
