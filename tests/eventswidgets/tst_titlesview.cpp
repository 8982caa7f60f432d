// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "eventswidgets/titlesview.h"
#include "interfaceof.h"
#include "loggedtest.h"

#include <QAbstractItemModelTester>
#include <QIdentityProxyModel>
#include <QJSEngine>
#include <QSortFilterProxyModel>
#include <QtTest>

#include <functional>

Q_DECLARE_METATYPE(std::function<QVariant(QVariant)>)

class TestTitlesView : public LoggedTest
{
    Q_OBJECT

private Q_SLOTS:
    void init();

    void interface();
    void isEmptyAtFirst();

    // The model
    void takesListModelsOnly();
    void keepsItsModel();
    void nullBeforeAnyModel();
    void sameModelAgain();
    void anotherModel();
    void destroyedModel();
    void modelDestroyedWhileItIsRead();
    void roleChangedWhileItIsRead();

    // What is collected
    void collectsInRowOrder();
    void emptyTextsAreCollected();
    void convertsToText();
    void unknownRoleReadsDisplay();
    void roleOfDotsReadsDisplay();
    void emptyModel();
    void followsPaths_data();
    void followsPaths();
    void matchesAlongPaths();

    // What matches
    void matches_data();
    void matches();
    void unknownMatchRoleTakesAll();
    void matchRoleOfNumberZeroTakesAll();
    void arraysOfQml();
    void objectsToMatch();
    void destroyedMatch_data();
    void destroyedMatch();

    // Changes
    void followsTheModel();
    void ignoresOtherChanges();
    void equalValuesAreNotAnnounced();
    void settersAnnounceChangesOnly();
    void signalsInOrder();
    void handlersMayCallBack();

    // Sentences
    void joins_data();
    void joins();
    void joinsByTheCurrentLocale();
};

namespace {

enum Role { NameRole = Qt::UserRole, KindRole, ObjectRole };

// Each row has a name, a kind of any type, and an object.
struct Row {
    QString name;
    QVariant kind;
    QVariant object;
};

class ListModel : public QAbstractListModel
{
public:
    explicit ListModel(QVector<Row> rows = {}) : m_rows(std::move(rows)) { }

    int rowCount(const QModelIndex &parent = QModelIndex()) const override
    {
        return parent.isValid() ? 0 : m_rows.size();
    }
    QVariant data(const QModelIndex &index, int role) const override
    {
        ++reads;
        switch (role) {
        case Qt::DisplayRole:
            return QLatin1String("display-") + m_rows.at(index.row()).name;
        case NameRole:
            return m_rows.at(index.row()).name;
        case KindRole:
            return m_rows.at(index.row()).kind;
        case ObjectRole:
            return m_rows.at(index.row()).object;
        default:
            return {};
        }
    }
    QHash<int, QByteArray> roleNames() const override
    {
        return {{Qt::DisplayRole, "shown"},
                {NameRole, "name"},
                {KindRole, "kind"},
                {ObjectRole, "object"}};
    }

    void insert(int row, const Row &value)
    {
        beginInsertRows({}, row, row);
        m_rows.insert(row, value);
        endInsertRows();
    }
    void remove(int row)
    {
        beginRemoveRows({}, row, row);
        m_rows.removeAt(row);
        endRemoveRows();
    }
    void change(int row, const Row &value)
    {
        m_rows[row] = value;
        Q_EMIT dataChanged(index(row), index(row));
    }
    void reset(const QVector<Row> &rows)
    {
        beginResetModel();
        m_rows = rows;
        endResetModel();
    }
    void moveFirstToEnd()
    {
        beginMoveRows({}, 0, 0, {}, m_rows.size());
        m_rows.append(m_rows.takeFirst());
        endMoveRows();
    }
    void reverseLayout()
    {
        Q_EMIT layoutAboutToBeChanged();
        std::reverse(m_rows.begin(), m_rows.end());
        Q_EMIT layoutChanged();
    }

    mutable int reads = 0;

private:
    QVector<Row> m_rows;
    QAbstractItemModelTester m_tester{this, QAbstractItemModelTester::FailureReportingMode::QtTest};
};

// Calls a function when its property is read.
class Answering : public QObject
{
    Q_OBJECT
    Q_PROPERTY(QString text READ text CONSTANT)

public:
    QString text() const
    {
        answer();
        return QStringLiteral("text");
    }
    std::function<void()> answer;
};

Row named(const char *name, const QVariant &kind = {}, const QVariant &object = {})
{
    return {QString::fromLatin1(name), kind, object};
}

QStringList list(std::initializer_list<const char *> texts)
{
    QStringList list;
    for (const char *text : texts) {
        list.append(QString::fromLatin1(text));
    }
    return list;
}

const QString name = QStringLiteral("name");
const QString kind = QStringLiteral("kind");

} // namespace

void TestTitlesView::init()
{
    QLocale::setDefault(QLocale(QStringLiteral("en_US")));
    LoggedTest::init();
}

void TestTitlesView::interface()
{
    const QStringList members =
        list({"QObject* model modelChanged()", "QString matchRole matchRoleChanged()",
              "QVariant match matchChanged()", "QString role roleChanged()",
              "QString value readonly valueChanged()", "QStringList values readonly valueChanged()",
              "signal void modelChanged()", "signal void matchRoleChanged()",
              "signal void matchChanged()", "signal void roleChanged()",
              "signal void valueChanged()", "void update()", "QString joined(QStringList)"});
    QCOMPARE(interfaceOf(TitlesView::staticMetaObject), members);
}

void TestTitlesView::isEmptyAtFirst()
{
    TitlesView view;
    view.update();
    QCOMPARE(view.model(), nullptr);
    QCOMPARE(view.matchRole(), QString());
    QVERIFY(!view.match().isValid());
    QCOMPARE(view.role(), QString());
    QCOMPARE(view.values(), QStringList());
    QCOMPARE(view.value(), QString());
}

void TestTitlesView::takesListModelsOnly()
{
    ListModel model({named("a")});
    TitlesView view;
    view.setRole(name);
    view.setModel(&model);
    QSignalSpy changed(&view, &TitlesView::modelChanged);

    QSortFilterProxyModel proxy;
    proxy.setSourceModel(&model);
    QIdentityProxyModel items;
    QObject object;
    for (QObject *other :
         {static_cast<QObject *>(&proxy), static_cast<QObject *>(&items), &object}) {
        view.setModel(other);
        QCOMPARE(view.model(), &model);
        QString shown;
        QDebug(&shown).nospace() << other;
        QCOMPARE(m_log->takeReport(),
                 QStringLiteral("warning [default] Unsupported model type ") + shown);
    }
    QCOMPARE(changed.size(), 0);
    QCOMPARE(view.values(), list({"a"}));
}

void TestTitlesView::keepsItsModel()
{
    ListModel model({named("a")});
    TitlesView view;
    view.setRole(name);
    view.setModel(&model);
    view.setModel(nullptr);
    QCOMPARE(view.model(), &model);
    QCOMPARE(view.values(), list({"a"}));
    QCOMPARE(m_log->takeReport(),
             QStringLiteral("warning [default] Unsupported model type QObject(0x0)"));
}

void TestTitlesView::nullBeforeAnyModel()
{
    TitlesView view;
    QSignalSpy changed(&view, &TitlesView::modelChanged);
    view.setModel(nullptr);
    QCOMPARE(changed.size(), 0);
}

void TestTitlesView::sameModelAgain()
{
    ListModel model({named("a")});
    TitlesView view;
    view.setRole(name);
    view.setModel(&model);
    QSignalSpy changed(&view, &TitlesView::modelChanged);
    model.reads = 0;
    view.setModel(&model);
    QCOMPARE(changed.size(), 0);
    QCOMPARE(model.reads, 0);
}

void TestTitlesView::anotherModel()
{
    ListModel first({named("a")});
    ListModel second({named("b")});
    TitlesView view;
    view.setRole(name);
    view.setModel(&first);
    view.setModel(&second);
    QCOMPARE(view.model(), &second);
    QCOMPARE(view.values(), list({"b"}));

    // The view no longer follows the first model.
    second.reads = 0;
    first.insert(0, named("c"));
    first.change(0, named("d"));
    first.remove(0);
    first.reset({});
    QCOMPARE(second.reads, 0);
    second.insert(1, named("e"));
    QCOMPARE(view.values(), list({"b", "e"}));
}

void TestTitlesView::destroyedModel()
{
    auto model = std::make_unique<ListModel>(QVector<Row>{named("a")});
    ListModel other({named("b")});
    TitlesView view;
    view.setRole(name);
    view.setModel(model.get());
    QSignalSpy modelChanged(&view, &TitlesView::modelChanged);
    QSignalSpy valueChanged(&view, &TitlesView::valueChanged);
    model.reset();
    QCOMPARE(view.model(), nullptr);
    QCOMPARE(view.values(), QStringList());
    QCOMPARE(view.value(), QString());
    QCOMPARE(modelChanged.size(), 1);
    QCOMPARE(valueChanged.size(), 1);

    view.update();
    view.setModel(nullptr);
    QCOMPARE(valueChanged.size(), 1);
    view.setModel(&other);
    QCOMPARE(view.values(), list({"b"}));

    // The destruction of a replaced model changes nothing.
    auto replaced = std::make_unique<ListModel>();
    view.setModel(replaced.get());
    view.setModel(&other);
    modelChanged.clear();
    replaced.reset();
    QCOMPARE(view.model(), &other);
    QCOMPARE(modelChanged.size(), 0);
}

void TestTitlesView::modelDestroyedWhileItIsRead()
{
    class Deleting : public QAbstractListModel
    {
    public:
        explicit Deleting(QObject *object) : m_object(object) { }
        int rowCount(const QModelIndex &) const override { return 3; }
        QVariant data(const QModelIndex &, int) const override
        {
            return QVariant::fromValue(m_object);
        }

    private:
        QObject *m_object;
    };

    for (const bool matching : {false, true}) {
        Answering object;
        auto *deleted = new Deleting(&object);
        TitlesView view;
        view.setModel(deleted);
        object.answer = [&deleted] {
            delete deleted;
            deleted = nullptr;
        };
        view.setRole(QStringLiteral("display"));
        QCOMPARE(view.values().size(), 3);
        if (matching) {
            view.setMatch(QStringLiteral("text"));
            view.setMatchRole(QStringLiteral("toolTip.text"));
        } else {
            view.setRole(QStringLiteral("display.text"));
        }
        QCOMPARE(view.model(), nullptr);
        QCOMPARE(view.values(), QStringList());
    }
}

// Reading a property may call the view: it still shows the values of its last role.
void TestTitlesView::roleChangedWhileItIsRead()
{
    Answering object;
    ListModel model({named("a", {}, QVariant::fromValue<QObject *>(&object))});
    TitlesView view;
    view.setModel(&model);
    QStringList shown;
    connect(&view, &TitlesView::valueChanged, this, [&] { shown.append(view.value()); });
    object.answer = [&view] { view.setRole(name); };
    view.setRole(QStringLiteral("object.text"));
    QCOMPARE(view.role(), name);
    QCOMPARE(view.values(), list({"a"}));
    QCOMPARE(shown, list({"a"}));
}

void TestTitlesView::collectsInRowOrder()
{
    ListModel model({named("c"), named("a"), named("b"), named("a")});
    TitlesView view;
    view.setModel(&model);
    QCOMPARE(view.values(), QStringList());
    view.setRole(name);
    QCOMPARE(view.values(), list({"c", "a", "b", "a"}));
    view.setRole(QString());
    QCOMPARE(view.values(), QStringList());
}

void TestTitlesView::emptyTextsAreCollected()
{
    ListModel model({named("a"), named(""), named("b")});
    TitlesView view;
    view.setModel(&model);
    view.setRole(name);
    QCOMPARE(view.values(), list({"a", "", "b"}));
    view.setRole(kind);
    QCOMPARE(view.values(), list({"", "", ""}));
}

void TestTitlesView::convertsToText()
{
    QObject object;
    ListModel model({named("", 7), named("", true), named("", 1.5),
                     named("", QVariant::fromValue(&object)), named("", list({"x"}))});
    TitlesView view;
    view.setModel(&model);
    view.setRole(kind);
    QCOMPARE(view.values(), list({"7", "true", "1.5", "", "x"}));
}

void TestTitlesView::unknownRoleReadsDisplay()
{
    ListModel model({named("a")});
    TitlesView view;
    view.setModel(&model);
    for (const auto *role : {"missing", "Name", "missing.name", "na\xefve"}) {
        view.setRole(QString::fromLatin1(role));
        QCOMPARE(view.values(), list({"display-a"}));
    }
}

void TestTitlesView::roleOfDotsReadsDisplay()
{
    ListModel model({named("a")});
    TitlesView view;
    view.setModel(&model);
    view.setRole(QStringLiteral("..."));
    QCOMPARE(view.values(), list({"display-a"}));
    view.setRole(QStringLiteral(".name."));
    QCOMPARE(view.values(), list({"a"}));
}

void TestTitlesView::emptyModel()
{
    ListModel model;
    TitlesView view;
    view.setModel(&model);
    view.setRole(name);
    QCOMPARE(view.values(), QStringList());
    QCOMPARE(view.value(), QString());
    model.insert(0, named("a"));
    QCOMPARE(view.values(), list({"a"}));
    model.remove(0);
    QCOMPARE(view.values(), QStringList());
}

void TestTitlesView::followsPaths_data()
{
    QTest::addColumn<QString>("role");
    QTest::addColumn<QString>("text");
    const auto row = [](const char *role, const char *text) {
        QTest::newRow(role) << QString::fromLatin1(role) << QString::fromLatin1(text);
    };
    row("object.objectName", "outer");
    row("object..objectName.", "outer");
    row("object.inner.objectName", "inner");
    row("object.missing", "");
    row("object.missing.objectName", "");
    row("object.nothing.objectName", "");
    // A step from a value that is not an object is skipped.
    row("name.objectName", "a");
    row("name.objectName.objectName", "a");
    row("object.objectName.objectName", "outer");
    row("kind.objectName", "");
}

void TestTitlesView::followsPaths()
{
    QFETCH(QString, role);
    QObject inner;
    inner.setObjectName(QStringLiteral("inner"));
    QObject outer;
    outer.setObjectName(QStringLiteral("outer"));
    outer.setProperty("inner", QVariant::fromValue(&inner));
    outer.setProperty("nothing", QVariant::fromValue<QObject *>(nullptr));
    ListModel model(
        {named("a", QVariant::fromValue<QObject *>(nullptr), QVariant::fromValue(&outer))});
    TitlesView view;
    view.setModel(&model);
    view.setRole(role);
    QCOMPARE(view.values().size(), 1);
    QTEST(view.values().first(), "text");
}

void TestTitlesView::matchesAlongPaths()
{
    QObject first;
    first.setObjectName(QStringLiteral("first"));
    QObject second;
    second.setObjectName(QStringLiteral("second"));
    ListModel model({named("a", {}, QVariant::fromValue(&first)),
                     named("b", {}, QVariant::fromValue(&second)), named("c", {}, 7)});
    TitlesView view;
    view.setModel(&model);
    view.setRole(name);
    view.setMatchRole(QStringLiteral("object.objectName"));
    view.setMatch(QStringLiteral("second"));
    QCOMPARE(view.values(), list({"b"}));
}

void TestTitlesView::matches_data()
{
    QTest::addColumn<QVariant>("match");
    QTest::addColumn<QStringList>("values");
    // Of rows: text "1", text "one", number 1, number 2, true, a list of "one", nothing.
    QTest::newRow("text") << QVariant(QStringLiteral("one")) << list({"one", "list"});
    QTest::newRow("case") << QVariant(QStringLiteral("One")) << QStringList();
    QTest::newRow("number") << QVariant(1) << list({"text 1", "number 1", "true"});
    QTest::newRow("bool") << QVariant(true) << list({"text 1", "one", "number 1", "true"});
    QTest::newRow("texts") << QVariant(list({"one", "2"})) << list({"one", "number 2", "list"});
    QTest::newRow("texts and true") << QVariant(list({"true"})) << list({"true"});
    QTest::newRow("empty text") << QVariant(list({""})) << QStringList();
    QTest::newRow("no texts") << QVariant(QStringList()) << QStringList();
    QTest::newRow("values") << QVariant(QVariantList{QStringLiteral("one"), 2})
                            << list({"one", "number 2", "list"});
    QTest::newRow("no values") << QVariant(QVariantList()) << QStringList();
    QTest::newRow("nothing") << QVariant() << list({"nothing"});
}

void TestTitlesView::matches()
{
    QFETCH(QVariant, match);
    ListModel model({named("text 1", QStringLiteral("1")), named("one", QStringLiteral("one")),
                     named("number 1", 1), named("number 2", 2), named("true", true),
                     named("list", list({"one"})), named("nothing")});
    TitlesView view;
    view.setModel(&model);
    view.setRole(name);
    view.setMatch(match);
    QCOMPARE(view.values().size(), model.rowCount());
    view.setMatchRole(kind);
    QTEST(view.values(), "values");
}

void TestTitlesView::unknownMatchRoleTakesAll()
{
    ListModel model({named("a", 1), named("b", 2)});
    TitlesView view;
    view.setModel(&model);
    view.setRole(name);
    view.setMatch(1);
    for (const auto *role : {"missing", "missing.kind", "."}) {
        view.setMatchRole(QString::fromLatin1(role));
        QCOMPARE(view.values(), list({"a", "b"}));
    }
    view.setMatchRole(kind);
    QCOMPARE(view.values(), list({"a"}));
}

void TestTitlesView::matchRoleOfNumberZeroTakesAll()
{
    ListModel model({named("a"), named("b")});
    TitlesView view;
    view.setModel(&model);
    view.setRole(name);
    view.setMatchRole(QStringLiteral("shown"));
    view.setMatch(QStringLiteral("display-a"));
    QCOMPARE(view.values(), list({"a", "b"}));
}

void TestTitlesView::arraysOfQml()
{
    QJSEngine engine;
    ListModel model({named("a", QStringLiteral("one")), named("b", 2), named("c", 3)});
    TitlesView view;
    view.setModel(&model);
    view.setRole(name);
    view.setMatchRole(kind);
    const auto setMatch = [&](const char *script) {
        view.setProperty("match",
                         QVariant::fromValue(engine.evaluate(QString::fromLatin1(script))));
    };
    setMatch("['one', 3]");
    QCOMPARE(view.values(), list({"a", "c"}));
    QCOMPARE(view.match(), QVariant(QVariantList{QStringLiteral("one"), 3}));
    QSignalSpy changed(&view, &TitlesView::matchChanged);
    setMatch("['one', 3]");
    QCOMPARE(changed.size(), 0);
    setMatch("2");
    QCOMPARE(view.values(), list({"b"}));
    setMatch("undefined");
    QVERIFY(!view.match().isValid());
    QCOMPARE(view.values(), QStringList());
    setMatch("var a = []; a.push(a); a");
    QCOMPARE(view.values(), QStringList());
}

void TestTitlesView::objectsToMatch()
{
    QObject first;
    QObject second;
    const QVariant firstValue = QVariant::fromValue(&first);
    const QVariant secondValue = QVariant::fromValue(&second);
    ListModel model({named("a", firstValue), named("b", secondValue), named("c", 1)});
    TitlesView view;
    view.setModel(&model);
    view.setRole(name);
    view.setMatchRole(kind);
    view.setMatch(secondValue);
    QCOMPARE(view.values(), list({"b"}));
    view.setMatch(QVariantList{firstValue, 1});
    QCOMPARE(view.values(), list({"a", "c"}));
}

void TestTitlesView::destroyedMatch_data()
{
    using Wrap = std::function<QVariant(QVariant)>;
    QTest::addColumn<Wrap>("wrap");
    QTest::newRow("itself") << Wrap([](const QVariant &object) { return object; });
    QTest::newRow("list") << Wrap([](const QVariant &object) {
        return QVariantList{object, 1, object};
    });
    QTest::newRow("map in a list") << Wrap([](const QVariant &object) {
        return QVariantList{QVariantMap{{QStringLiteral("x"), QVariantList{object}}}, 1};
    });
}

void TestTitlesView::destroyedMatch()
{
    QFETCH(std::function<QVariant(QVariant)>, wrap);
    auto object = std::make_unique<QObject>();
    auto replaced = std::make_unique<QObject>();
    ListModel model({named("a", 1)});
    TitlesView view;
    view.setModel(&model);
    view.setRole(name);
    view.setMatchRole(kind);
    view.setMatch(wrap(QVariant::fromValue(replaced.get())));
    view.setMatch(wrap(QVariant::fromValue(object.get())));
    QCOMPARE(view.match(), wrap(QVariant::fromValue(object.get())));

    QSignalSpy changed(&view, &TitlesView::matchChanged);
    replaced.reset();
    QCOMPARE(changed.size(), 0);
    object.reset();
    QCOMPARE(changed.size(), 1);
    QCOMPARE(view.match(), wrap(QVariant::fromValue<QObject *>(nullptr)));
    view.update();
    view.setMatch(1);
    QCOMPARE(view.values(), list({"a"}));
}

void TestTitlesView::followsTheModel()
{
    ListModel model({named("a"), named("b")});
    TitlesView view;
    view.setModel(&model);
    view.setRole(name);
    QSignalSpy changed(&view, &TitlesView::valueChanged);
    model.insert(1, named("c"));
    QCOMPARE(view.values(), list({"a", "c", "b"}));
    model.remove(0);
    QCOMPARE(view.values(), list({"c", "b"}));
    model.change(1, named("d"));
    QCOMPARE(view.values(), list({"c", "d"}));
    model.reset({named("e")});
    QCOMPARE(view.values(), list({"e"}));
    QCOMPARE(changed.size(), 4);
}

void TestTitlesView::ignoresOtherChanges()
{
    ListModel model({named("a"), named("b")});
    TitlesView view;
    view.setModel(&model);
    view.setRole(name);
    QSignalSpy changed(&view, &TitlesView::valueChanged);
    model.moveFirstToEnd();
    model.moveFirstToEnd();
    model.moveFirstToEnd();
    QCOMPARE(view.values(), list({"a", "b"}));
    model.reverseLayout();
    model.reverseLayout();
    QCOMPARE(changed.size(), 0);
    view.update();
    QCOMPARE(view.values(), list({"b", "a"}));
    QCOMPARE(changed.size(), 1);
}

void TestTitlesView::equalValuesAreNotAnnounced()
{
    ListModel model({named("a", 1)});
    TitlesView view;
    view.setModel(&model);
    view.setRole(name);
    QSignalSpy changed(&view, &TitlesView::valueChanged);
    model.change(0, named("a", 2));
    model.reset({named("a", 3)});
    view.update();
    QCOMPARE(changed.size(), 0);
}

void TestTitlesView::settersAnnounceChangesOnly()
{
    ListModel model({named("a", 1)});
    TitlesView view;
    view.setModel(&model);
    view.setRole(name);
    view.setMatchRole(kind);
    view.setMatch(1);
    QSignalSpy role(&view, &TitlesView::roleChanged);
    QSignalSpy matchRole(&view, &TitlesView::matchRoleChanged);
    QSignalSpy match(&view, &TitlesView::matchChanged);
    model.reads = 0;
    view.setRole(name);
    view.setMatchRole(kind);
    view.setMatch(1);
    // Equal values of different types.
    view.setMatch(1.0);
    QCOMPARE(role.size() + matchRole.size() + match.size(), 0);
    QCOMPARE(model.reads, 0);

    view.setRole(kind);
    view.setMatchRole(name);
    view.setMatch(QStringLiteral("a"));
    QCOMPARE(role.size(), 1);
    QCOMPARE(matchRole.size(), 1);
    QCOMPARE(match.size(), 1);
    QCOMPARE(view.values(), list({"1"}));
}

void TestTitlesView::signalsInOrder()
{
    // A property's signal is emitted before the values change.
    ListModel model({named("a", 1)});
    TitlesView view;
    QStringList seen;
    const auto note = [&view, &seen](const char *what) {
        return [&view, &seen, what] {
            seen.append(QLatin1String(what) + QLatin1Char(' ') + view.value());
        };
    };
    connect(&view, &TitlesView::modelChanged, this, note("model"));
    connect(&view, &TitlesView::roleChanged, this, note("role"));
    connect(&view, &TitlesView::matchRoleChanged, this, note("matchRole"));
    connect(&view, &TitlesView::matchChanged, this, note("match"));
    connect(&view, &TitlesView::valueChanged, this, note("value"));
    view.setRole(name);
    view.setModel(&model);
    view.setMatchRole(kind);
    view.setMatch(1);
    view.setRole(QString());
    view.setRole(name);
    QCOMPARE(seen,
             list({"role ", "model ", "value a", "matchRole a", "value ", "match ", "value a",
                   "role a", "value ", "role ", "value a"}));
}

void TestTitlesView::handlersMayCallBack()
{
    ListModel model({named("a", 1)});
    ListModel other({named("b", 2)});
    TitlesView view;
    connect(&view, &TitlesView::modelChanged, this, [&] { view.setModel(&other); });
    connect(&view, &TitlesView::valueChanged, this, [&] {
        view.setRole(kind);
        view.update();
    });
    view.setRole(name);
    view.setModel(&model);
    QCOMPARE(view.model(), &other);
    QCOMPARE(view.values(), list({"2"}));
    model.insert(0, named("c"));
    QCOMPARE(view.values(), list({"2"}));
}

void TestTitlesView::joins_data()
{
    QTest::addColumn<QStringList>("texts");
    QTest::addColumn<QString>("sentence");
    QTest::newRow("none") << QStringList() << QString();
    QTest::newRow("one") << list({"a"}) << QStringLiteral("a");
    QTest::newRow("two") << list({"a", "b"}) << QStringLiteral("a and b");
    QTest::newRow("three") << list({"a", "b", "c"}) << QStringLiteral("a, b, and c");
}

void TestTitlesView::joins()
{
    QFETCH(QStringList, texts);
    QFETCH(QString, sentence);
    ListModel model;
    TitlesView view;
    view.setModel(&model);
    view.setRole(name);
    for (int i = 0; i < texts.size(); ++i) {
        model.insert(i, {texts.at(i), {}, {}});
    }
    QCOMPARE(view.value(), sentence);

    // Any list, independent of the state of the view.
    QSignalSpy changed(&view, &TitlesView::valueChanged);
    const TitlesView another;
    QCOMPARE(another.joined(texts), sentence);
    QCOMPARE(view.joined(list({"x", "y"})), QStringLiteral("x and y"));
    QCOMPARE(view.values(), texts);
    QCOMPARE(changed.size(), 0);
}

void TestTitlesView::joinsByTheCurrentLocale()
{
    ListModel model({named("a"), named("b"), named("c")});
    TitlesView view;
    view.setModel(&model);
    view.setRole(name);
    QCOMPARE(view.value(), QStringLiteral("a, b, and c"));
    QLocale::setDefault(QLocale(QStringLiteral("de_DE")));
    QCOMPARE(view.value(), QStringLiteral("a, b und c"));
    QCOMPARE(view.joined(list({"a", "b"})), QStringLiteral("a und b"));
}

QTEST_GUILESS_MAIN(TestTitlesView)

#include "tst_titlesview.moc"
