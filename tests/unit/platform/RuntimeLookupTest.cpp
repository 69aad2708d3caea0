#include "platform/runtime/ClassRegistry.h"
#include "platform/runtime/MethodTable.h"

#include <gtest/gtest.h>

namespace {

class Form : public QObject {
    Q_OBJECT
  public:
    Q_INVOKABLE Form() = default;
};

class SpecialForm : public Form {
    Q_OBJECT
  public:
    Q_INVOKABLE SpecialForm() = default;
};

class Borrower : public QObject {
    Q_OBJECT
};

QVariant nameOf(QObject* receiver, const char* who) {
    return QStringLiteral("%1 on %2")
        .arg(QLatin1String(who), QLatin1String(receiver->metaObject()->className()));
}

} // namespace

using namespace platform;

TEST(MethodTable, AnExchangeRunsTheOtherClassesCodeOnOwnReceiversAndASecondSwapsBack) {
    const QByteArray op("_pick");
    MethodTable::addMethod(&Form::staticMetaObject, op,
                           [](QObject* r, const QVariantList&) { return nameOf(r, "form"); });
    MethodTable::addMethod(&Borrower::staticMetaObject, op,
                           [](QObject* r, const QVariantList&) { return nameOf(r, "borrower"); });
    Form form;
    SpecialForm special; // no entry of its own: inherits whatever Form has now
    EXPECT_EQ(MethodTable::invoke(&form, op).toString(), "form on Form");

    ASSERT_TRUE(MethodTable::exchangeImplementations(&Form::staticMetaObject,
                                                     &Borrower::staticMetaObject, op));
    EXPECT_EQ(MethodTable::invoke(&form, op).toString(), "borrower on Form");
    EXPECT_EQ(MethodTable::invoke(&special, op).toString(), "borrower on SpecialForm");

    ASSERT_TRUE(MethodTable::exchangeImplementations(&Form::staticMetaObject,
                                                     &Borrower::staticMetaObject, op));
    EXPECT_EQ(MethodTable::invoke(&form, op).toString(), "form on Form");

    // A class without an entry of its own cannot take part, and nothing moves.
    EXPECT_FALSE(MethodTable::exchangeImplementations(&SpecialForm::staticMetaObject,
                                                      &Borrower::staticMetaObject, op));
    EXPECT_EQ(MethodTable::invoke(&form, op).toString(), "form on Form");
    EXPECT_FALSE(MethodTable::invoke(&form, "_unknown").isValid());
}

TEST(ClassRegistry, FindsRegisteredClassesByNameAndMakesInstancesOfTheRightKind) {
    EXPECT_EQ(ClassRegistry::classNamed(QStringLiteral("SpecialForm")), nullptr);
    ASSERT_TRUE(ClassRegistry::registerClass(&SpecialForm::staticMetaObject));
    EXPECT_FALSE(ClassRegistry::registerClass(&SpecialForm::staticMetaObject));
    const QMetaObject* cls = ClassRegistry::classNamed(QStringLiteral("SpecialForm"));
    ASSERT_EQ(cls, &SpecialForm::staticMetaObject);
    EXPECT_NE(ClassRegistry::makeInstance<Form>(cls), nullptr);
    EXPECT_EQ(ClassRegistry::makeInstance<Borrower>(cls), nullptr); // wrong kind
}

#include "RuntimeLookupTest.moc"
