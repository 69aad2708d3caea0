#include "FakeUploadForm.h"

#include "platform/runtime/MethodTable.h"

#include <mutex>

FakeFormTable::FakeFormTable() {
    titleCell.placeholder = QStringLiteral("Title");
    descriptionCell.placeholder = QStringLiteral("Description");
}

QObject* FakeFormTable::cellForRowAtIndexPath(int section, int row) {
    if (section != 0)
        return nullptr;
    return row == 0 ? &titleCell : row == 1 ? &descriptionCell : nullptr;
}

void FakeCategoryPicker::selectRow_inComponent_animated(int row, int component, bool animated) {
    selections.append({row, component, animated});
}

void FakeCategoryCell::setCategoryString(const QString& category) {
    categoryStrings.append(category);
}

FakeUploadForm::FakeUploadForm(bool members) : members_(members) {
    static std::once_flag registered;
    std::call_once(registered, [] {
        platform::MethodTable::addMethod(&staticMetaObject, "_selectComedyPickerRow",
                                         [](QObject* receiver, const QVariantList&) {
                                             if (auto* form =
                                                     qobject_cast<FakeUploadForm*>(receiver))
                                                 ++form->ownSelections;
                                             return QVariant();
                                         });
    });
}

QObject* FakeUploadForm::_categoryCell() {
    return members_ ? &categoryCell_ : nullptr;
}

void FakeUploadForm::categoriesDidArrive(const QVariantList& list) {
    categories = list;
    platform::MethodTable::invoke(this, "_selectComedyPickerRow");
}

QVariantMap category(const QString& id, const QString& label) {
    return {{QStringLiteral("id"), id}, {QStringLiteral("label"), label}};
}
