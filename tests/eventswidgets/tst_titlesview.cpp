// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "eventswidgets/titlesview.h"
#include "loggedtest.h"
#include "texts.h"
#include "words.h"

#include <QAbstractItemModelTester>
#include <QJSEngine>
#include <QSortFilterProxyModel>
#include <QtTest>

#include <functional>

class TestTitlesView : public LoggedTest
{
    Q_OBJECT

private Q_SLOTS:
    void init();

    // The model
    void takesListModelsOnly();
    void anotherModel();
    void destroyedModel();
    void modelDestroyedWhileItIsRead();
    void roleChangedWhileItIsRead();

    // Collected values
    void collects();
    void followsPaths_data();
    void followsPaths();

    // Matching
    void matches_data();
    void matches();
    void objectsToMatch();
    void arraysOfQml();
    void destroyedMatch();

    // Changes
    void followsTheModel();
    void ignoresOtherChanges();
    void settersAnnounceChangesOnly();
    void signalsInOrder();

    // Sentences
    void joins();
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
        return "text"_s;
    }
    std::function<void()> answer;
};

Row named(const char *name, const QVariant &kind = {}, const QVariant &object = {})
{
    return {QString::fromLatin1(name), kind, object};
}

const QString name = "name"_s;
const QString kind = "kind"_s;

// A view of the names of a model's rows.
class NamesView : public TitlesView
{
public:
    explicit NamesView(QObject *model, const QString &matchRole = {})
    {
        setModel(model);
        setRole(name);
        setMatchRole(matchRole);
    }
};

} // namespace

void TestTitlesView::init()
{
    QLocale::setDefault(QLocale("en_US"_s));
    LoggedTest::init();
}

void TestTitlesView::takesListModelsOnly()
{
    ListModel model({named("a")});
    NamesView view(&model);
    QSignalSpy changed(&view, &TitlesView::modelChanged);
    QSortFilterProxyModel proxy;
    proxy.setSourceModel(&model);
    QObject object;
    // A model cannot be cleared.
    for (QObject *other :
         {static_cast<QObject *>(&proxy), &object, static_cast<QObject *>(nullptr)}) {
        view.setModel(other);
        QCOMPARE(view.model(), &model);
        QString shown;
        QDebug(&shown).nospace() << other;
        QCOMPARE(m_log->takeReport(), "warning [default] Unsupported model type "_s + shown);
    }
    QCOMPARE(changed.size(), 0);
    QCOMPARE(view.values(), words("a"));
}

void TestTitlesView::anotherModel()
{
    ListModel first({named("a")});
    ListModel second({named("b")});
    NamesView view(&first);
    view.setModel(&second);
    QCOMPARE(view.model(), &second);
    QCOMPARE(view.values(), words("b"));

    // The view no longer follows the first model.
    second.reads = 0;
    first.insert(0, named("c"));
    first.change(0, named("d"));
    first.remove(0);
    first.reset({});
    QCOMPARE(second.reads, 0);
    second.insert(1, named("e"));
    QCOMPARE(view.values(), words("b e"));
}

void TestTitlesView::destroyedModel()
{
    auto model = std::make_unique<ListModel>(QVector<Row>{named("a")});
    ListModel other({named("b")});
    NamesView view(model.get());
    QSignalSpy modelChanged(&view, &TitlesView::modelChanged);
    QSignalSpy valueChanged(&view, &TitlesView::valueChanged);
    model.reset();
    QCOMPARE(view.model(), nullptr);
    QCOMPARE(view.values(), QStringList());
    QCOMPARE(modelChanged.size(), 1);
    QCOMPARE(valueChanged.size(), 1);

    // Null is no change, so it gives no warning.
    view.setModel(nullptr);
    QCOMPARE(valueChanged.size(), 1);
    view.setModel(&other);
    QCOMPARE(view.values(), words("b"));

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
        view.setRole("display"_s);
        QCOMPARE(view.values().size(), 3);
        if (matching) {
            view.setMatch("text"_s);
            view.setMatchRole("toolTip.text"_s);
        } else {
            view.setRole("display.text"_s);
        }
        QCOMPARE(view.model(), nullptr);
        QCOMPARE(view.values(), QStringList());
    }
}

// Reading a property may change the view's role. The view then shows the values of the latest role.
void TestTitlesView::roleChangedWhileItIsRead()
{
    Answering object;
    ListModel model({named("a", {}, QVariant::fromValue<QObject *>(&object))});
    TitlesView view;
    view.setModel(&model);
    QStringList shown;
    connect(&view, &TitlesView::valueChanged, this, [&] { shown.append(view.value()); });
    object.answer = [&view] { view.setRole(name); };
    view.setRole("object.text"_s);
    QCOMPARE(view.role(), name);
    QCOMPARE(view.values(), words("a"));
    QCOMPARE(shown, words("a"));
}

void TestTitlesView::collects()
{
    QObject object;
    ListModel model({named("c", 7, QVariant::fromValue(&object)), named("a", true), named("", 1.5),
                     named("a", words("x"))});
    TitlesView view;
    view.update();
    view.setModel(&model);
    QCOMPARE(view.values(), QStringList());
    view.setRole(name);
    QCOMPARE(view.values(), (QStringList{"c"_s, "a"_s, QString(), "a"_s}));
    view.setRole(kind);
    QCOMPARE(view.values(), words("7 true 1.5 x"));
    view.setRole("object"_s);
    QCOMPARE(view.values(), QStringList({QString(), QString(), QString(), QString()}));
    view.setRole(QString());
    QCOMPARE(view.values(), QStringList());
}

void TestTitlesView::followsPaths_data()
{
    QTest::addColumn<QString>("role");
    QTest::addColumn<QString>("text");
    const auto row = [](const char *role, const char *text) {
        QTest::newRow(role) << QString::fromLatin1(role) << text;
    };
    row("object.objectName", "outer");
    row("object..objectName.", "outer");
    row(".name.", "a");
    row("object.inner.objectName", "inner");
    row("object.missing", "");
    row("object.missing.objectName", "");
    row("object.nothing.objectName", "");
    // A step from a value that is not an object is skipped.
    row("name.objectName", "a");
    row("name.objectName.objectName", "a");
    row("object.objectName.objectName", "outer");
    row("kind.objectName", "");
    // An unknown role reads the display role.
    for (const char *role : {"missing", "Name", "missing.name", "na\xefve", "..."}) {
        row(role, "display-a");
    }
}

void TestTitlesView::followsPaths()
{
    QFETCH(QString, role);
    QObject inner;
    inner.setObjectName("inner"_s);
    QObject outer;
    outer.setObjectName("outer"_s);
    outer.setProperty("inner", QVariant::fromValue(&inner));
    const QVariant null = QVariant::fromValue<QObject *>(nullptr);
    outer.setProperty("nothing", null);
    ListModel model({named("a", null, QVariant::fromValue(&outer))});
    TitlesView view;
    view.setModel(&model);
    view.setRole(role);
    QCOMPARE(view.values().size(), 1);
    QTEST(view.values().first(), "text");
}

void TestTitlesView::matches_data()
{
    QTest::addColumn<QVariant>("match");
    QTest::addColumn<QStringList>("values");
    // The rows: text "1", text "one", number 1, number 2, true, a list of "one", nothing.
    const auto row = [](const char *name, const QVariant &match, const QStringList &values) {
        QTest::newRow(name) << match << values;
    };
    row("text", "one"_s, words("one list"));
    row("case", "One"_s, {});
    row("number", 1, {"text 1"_s, "number 1"_s, "true"_s});
    row("bool", true, {"text 1"_s, "one"_s, "number 1"_s, "true"_s});
    row("texts", words("one 2"), {"one"_s, "number 2"_s, "list"_s});
    row("texts in another case", words("One LIST"), {});
    row("texts and true", words("true"), words("true"));
    row("empty text", QStringList{QString()}, {});
    row("no texts", QStringList(), {});
    row("values", QVariantList{"one"_s, 2}, {"one"_s, "number 2"_s, "list"_s});
    row("no values", QVariantList(), {});
    row("nothing", QVariant(), words("nothing"));
}

void TestTitlesView::matches()
{
    QFETCH(QVariant, match);
    ListModel model({named("text 1", "1"_s), named("one", "one"_s), named("number 1", 1),
                     named("number 2", 2), named("true", true), named("list", words("one")),
                     named("nothing")});
    NamesView view(&model);
    view.setMatch(match);
    QCOMPARE(view.values().size(), model.rowCount());
    view.setMatchRole(kind);
    QTEST(view.values(), "values");
}

void TestTitlesView::objectsToMatch()
{
    QObject first;
    QObject second;
    second.setObjectName("second"_s);
    const QVariant firstValue = QVariant::fromValue(&first);
    const QVariant secondValue = QVariant::fromValue(&second);
    ListModel model({named("a", firstValue), named("b", secondValue), named("c", 1)});
    NamesView view(&model, kind);
    view.setMatch(secondValue);
    QCOMPARE(view.values(), words("b"));
    view.setMatch(QVariantList{firstValue, 1});
    QCOMPARE(view.values(), words("a c"));
    // An unknown role takes all rows. The view treats the role with the number 0 as unknown.
    for (const char *role : {"missing", "missing.kind", ".", "shown"}) {
        view.setMatchRole(QString::fromLatin1(role));
        QCOMPARE(view.values(), words("a b c"));
    }
    view.setMatchRole("kind.objectName"_s);
    view.setMatch("second"_s);
    QCOMPARE(view.values(), words("b"));
}

// Their values are tested in QML.
void TestTitlesView::arraysOfQml()
{
    QJSEngine engine;
    TitlesView view;
    QSignalSpy changed(&view, &TitlesView::matchChanged);
    for (const char *script : {"['one', 3]", "['one', 3]", "undefined"}) {
        view.setMatch(QVariant::fromValue(engine.evaluate(QString::fromLatin1(script))));
    }
    QCOMPARE(changed.size(), 2);
    QVERIFY(!view.match().isValid());
    // An array that contains itself.
    view.setMatch(QVariant::fromValue(engine.evaluate("var a = []; a.push(a); a"_s)));
    QCOMPARE(changed.size(), 3);
}

void TestTitlesView::destroyedMatch()
{
    using Wrap = std::function<QVariant(QVariant)>;
    const std::vector<Wrap> wraps = {
        [](auto object) { return object; },
        [](auto object) {
            return QVariantList{object, 1, object};
        },
        [](auto object) {
            return QVariantList{QVariantMap{{"x"_s, QVariantList{object}}}, 1};
        },
    };
    for (const Wrap &wrap : wraps) {
        auto object = std::make_unique<QObject>();
        auto replaced = std::make_unique<QObject>();
        ListModel model({named("a", 1)});
        NamesView view(&model, kind);
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
        QCOMPARE(view.values(), words("a"));
    }
}

void TestTitlesView::followsTheModel()
{
    ListModel model;
    NamesView view(&model);
    QSignalSpy changed(&view, &TitlesView::valueChanged);
    QCOMPARE(view.values(), QStringList());
    QCOMPARE(view.value(), QString());
    model.insert(0, named("a"));
    model.insert(0, named("b"));
    QCOMPARE(view.values(), words("b a"));
    model.change(1, named("c"));
    QCOMPARE(view.values(), words("b c"));
    model.remove(0);
    QCOMPARE(view.values(), words("c"));
    model.reset({named("d")});
    QCOMPARE(view.values(), words("d"));
    QCOMPARE(changed.size(), 5);
    // Equal values are not announced.
    model.change(0, named("d", 2));
    model.reset({named("d", 3)});
    view.update();
    QCOMPARE(changed.size(), 5);
    model.remove(0);
    QCOMPARE(view.values(), QStringList());
}

void TestTitlesView::ignoresOtherChanges()
{
    ListModel model({named("a"), named("b")});
    NamesView view(&model);
    QSignalSpy changed(&view, &TitlesView::valueChanged);
    model.moveFirstToEnd();
    model.moveFirstToEnd();
    model.moveFirstToEnd();
    QCOMPARE(view.values(), words("a b"));
    model.reverseLayout();
    model.reverseLayout();
    QCOMPARE(changed.size(), 0);
    view.update();
    QCOMPARE(view.values(), words("b a"));
    QCOMPARE(changed.size(), 1);
}

void TestTitlesView::settersAnnounceChangesOnly()
{
    ListModel model({named("a", 1)});
    NamesView view(&model, kind);
    view.setMatch(1);
    QSignalSpy modelChanged(&view, &TitlesView::modelChanged);
    QSignalSpy role(&view, &TitlesView::roleChanged);
    QSignalSpy matchRole(&view, &TitlesView::matchRoleChanged);
    QSignalSpy match(&view, &TitlesView::matchChanged);
    model.reads = 0;
    view.setModel(&model);
    view.setRole(name);
    view.setMatchRole(kind);
    view.setMatch(1);
    // Equal values of different types.
    view.setMatch(1.0);
    QCOMPARE(modelChanged.size() + role.size() + matchRole.size() + match.size(), 0);
    QCOMPARE(model.reads, 0);

    view.setRole(kind);
    view.setMatchRole(name);
    view.setMatch("a"_s);
    QCOMPARE(role.size(), 1);
    QCOMPARE(matchRole.size(), 1);
    QCOMPARE(match.size(), 1);
    QCOMPARE(view.values(), words("1"));
}

void TestTitlesView::signalsInOrder()
{
    // A property's signal is emitted before the values change.
    ListModel model({named("a", 1)});
    TitlesView view;
    QStringList seen;
    const auto note = [&view, &seen](const char *what) {
        return [&view, &seen, what] {
            seen.append(QLatin1String(what) + QLatin1Char(':') + view.value());
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
    QCOMPARE(seen.join(", "_s),
             "role:, model:, value:a, matchRole:a, value:, match:, value:a, "
             "role:a, value:, role:, value:a"_s);
}

void TestTitlesView::joins()
{
    ListModel model;
    NamesView view(&model);
    QCOMPARE(view.value(), QString());
    QStringList texts;
    for (const QString &sentence : {"a"_s, "a and b"_s, "a, b, and c"_s}) {
        texts.append(words("a b c").at(texts.size()));
        model.insert(texts.size() - 1, {texts.last(), {}, {}});
        QCOMPARE(view.value(), sentence);
        // joined() takes any list and does not depend on the state of the view.
        QCOMPARE(TitlesView().joined(texts), sentence);
    }
    QCOMPARE(view.joined(words("x y")), "x and y"_s);
    // The locale at the time of reading counts.
    QLocale::setDefault(QLocale("de_DE"_s));
    QCOMPARE(view.value(), "a, b und c"_s);
    QCOMPARE(view.joined(words("x y")), "x und y"_s);
}

QTEST_GUILESS_MAIN(TestTitlesView)

#include "tst_titlesview.moc"
