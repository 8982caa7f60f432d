// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// The reference tells of everything that the module has, and of nothing else. What it has is read
// from plugins.qmltypes, which another test holds against the module; that file lacks the signals
// of properties and the roles of models, which are asked of objects.

#include "files.h"
#include "messagelog.h"

#include <QAbstractItemModel>
#include <QFile>
#include <QMap>
#include <QMetaProperty>
#include <QQmlComponent>
#include <QQmlEngine>
#include <QRegularExpression>
#include <QSet>
#include <QXmlStreamReader>
#include <QtTest>

#include <memory>

namespace {

// What a type has: "property name type", "method name" and so on.
using Members = QSet<QString>;

struct Component {
    QString prototype;
    QString exportedName; // empty if QML does not see it
    bool isSingleton = false;
    Members members;
    QStringList keys;
};

QString contentOf(const QString &path)
{
    QFile file(path);
    if (!file.open(QIODevice::ReadOnly)) {
        qFatal("cannot open %s", qPrintable(path));
    }
    return QString::fromUtf8(file.readAll());
}

QString captured(const QString &text, const QString &pattern)
{
    return QRegularExpression(pattern).match(text).captured(1);
}

// The reference names types as QML does.
QString documentedType(const QString &type)
{
    static const QMap<QString, QString> names = {
        {QStringLiteral("QStringList"), QStringLiteral("list<string>")},
        {QStringLiteral("QVariant"), QStringLiteral("var")},
        {QStringLiteral("QObject"), QStringLiteral("object")},
    };
    return names.value(type, type);
}

QString propertyMember(const QString &name, const QString &type, bool isWritable)
{
    return QStringLiteral("property ") + name + QLatin1Char(' ') + type
        + (isWritable ? QString() : QStringLiteral(" read only"));
}

Component readComponent(const QString &text)
{
    Component component;
    component.prototype = captured(text, QStringLiteral("prototype: \"(\\w+)\""));
    component.exportedName =
        captured(text, QStringLiteral("exports: \\[\"[\\w.]+/(\\w+) 1\\.0\"\\]"));
    component.isSingleton = text.contains(QLatin1String("isSingleton: true"));

    QSet<QString> enumerations;
    static const QRegularExpression enumeration(
        QStringLiteral("Enum \\{\\s*name: \"(\\w+)\"\\s*values: \\{([^}]*)\\}"));
    auto enums = enumeration.globalMatch(text);
    while (enums.hasNext()) {
        const QRegularExpressionMatch match = enums.next();
        enumerations.insert(match.captured(1));
        static const QRegularExpression key(QStringLiteral("\"(\\w+)\": \\d+"));
        auto keys = key.globalMatch(match.captured(2));
        while (keys.hasNext()) {
            component.keys.append(keys.next().captured(1));
        }
    }

    static const QRegularExpression member(QStringLiteral(
        "(Property|Signal|Method) \\{\\s*name: \"(\\w+)\"(?:; type: \"(\\w+)\")?([^}\\n]*)"));
    auto members = member.globalMatch(text);
    while (members.hasNext()) {
        const QRegularExpressionMatch match = members.next();
        const QString name = match.captured(2);
        if (match.captured(1) == QLatin1String("Property")) {
            const QString type = enumerations.contains(match.captured(3))
                ? QStringLiteral("enumeration")
                : documentedType(match.captured(3));
            component.members.insert(propertyMember(
                name, type, !match.captured(4).contains(QLatin1String("isReadonly"))));
        } else {
            component.members.insert(match.captured(1).toLower() + QLatin1Char(' ') + name);
        }
    }
    return component;
}

QMap<QString, Component> readTypes()
{
    const QString file = contentOf(QStringLiteral(QML_BUILD_DIR "/" QML_MODULE_PATH)
                                   + QStringLiteral("/plugins.qmltypes"));
    QMap<QString, Component> components;
    const QStringList texts = file.split(QStringLiteral("\n    Component {"));
    for (const QString &text : texts.mid(1)) {
        components.insert(captured(text, QStringLiteral("name: \"(\\w+)\"")), readComponent(text));
    }

    QMap<QString, Component> types;
    for (Component component : qAsConst(components)) {
        if (component.exportedName.isEmpty()) {
            continue;
        }
        // What is inherited is the type's own for its users, up to what is Qt's.
        QString base = component.prototype;
        while (!base.startsWith(QLatin1Char('Q'))) {
            component.members += components.value(base).members;
            component.keys += components.value(base).keys;
            base = components.value(base).prototype;
        }
        types.insert(component.exportedName, component);
    }
    return types;
}

QMap<QString, Members> readIndex()
{
    const QString index = contentOf(QStringLiteral(REFERENCE_DIR "/marlo-settings-system.index"));
    QMap<QString, Members> types;
    QString type;
    QXmlStreamReader xml(index);
    while (!xml.atEnd()) {
        xml.readNext();
        if (!xml.isStartElement()) {
            continue;
        }
        const QXmlStreamAttributes attributes = xml.attributes();
        const QString name = attributes.value(QLatin1String("name")).toString();
        if (xml.name() == QLatin1String("qmlclass")) {
            type = name;
            types.insert(type, {});
        } else if (xml.name() == QLatin1String("qmlproperty")) {
            types[type].insert(propertyMember(
                name, attributes.value(QLatin1String("type")).toString(),
                attributes.value(QLatin1String("writable")) == QLatin1String("true")));
        } else if (xml.name() == QLatin1String("function")) {
            types[type].insert(attributes.value(QLatin1String("meta")).mid(3).toString()
                               + QLatin1Char(' ') + name);
        }
    }
    if (xml.hasError()) {
        qFatal("the index of the reference is broken: %s", qPrintable(xml.errorString()));
    }
    return types;
}

QString pageOf(const QString &type)
{
    return contentOf(QStringLiteral(REFERENCE_DIR "/qml-com-marlo-settings-system-")
                     + type.toLower() + QStringLiteral(".html"));
}

QStringList sorted(const QSet<QString> &set)
{
    QStringList list = set.values();
    list.sort();
    return list;
}

} // namespace

class TestReference : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void init() { m_log = std::make_unique<MessageLog>(); }
    void cleanup()
    {
        QCOMPARE(m_log->takeReport(), QString());
        m_log.reset();
    }

    void tellsOfTheTypes();
    void tellsOfTheirMembers_data() { eachType(); }
    void tellsOfTheirMembers();
    void tellsOfTheirKeys_data() { eachType(); }
    void tellsOfTheirKeys();
    void tellsOfTheirRoles_data();
    void tellsOfTheirRoles();
    void hasAnExampleOfEach_data() { eachType(); }
    void hasAnExampleOfEach();

private:
    void eachType();
    std::unique_ptr<QObject> create(const QString &type);

    QMap<QString, Component> m_types;
    QMap<QString, Members> m_documented;
    QQmlEngine m_engine;
    std::unique_ptr<MessageLog> m_log;
};

void TestReference::initTestCase()
{
    // So that nothing is said of its absence.
    Files::write(QStringLiteral("/var/lib/bluetooth/board-address"), "00:1A:7D:DA:71:13\n");
    m_engine.addImportPath(QStringLiteral(QML_BUILD_DIR));
    m_types = readTypes();
    m_documented = readIndex();
}

void TestReference::eachType()
{
    QTest::addColumn<QString>("type");
    for (auto it = m_types.cbegin(); it != m_types.cend(); ++it) {
        QTest::newRow(qPrintable(it.key())) << it.key();
    }
}

std::unique_ptr<QObject> TestReference::create(const QString &type)
{
    QQmlComponent component(&m_engine);
    component.setData("import com.marlo.settings.system 1.0\n" + type.toUtf8() + " {}", QUrl());
    return std::unique_ptr<QObject>(component.create());
}

void TestReference::tellsOfTheTypes()
{
    QCOMPARE(m_types.size(), 11);
    QCOMPARE(m_documented.keys(), m_types.keys());
}

void TestReference::tellsOfTheirMembers()
{
    QFETCH(const QString, type);
    Members expected = m_types.value(type).members;
    if (!m_types.value(type).isSingleton) {
        const std::unique_ptr<QObject> object = create(type);
        QVERIFY(object != nullptr);
        const QMetaObject *meta = object->metaObject();
        for (int i = QObject::staticMetaObject.propertyCount(); i < meta->propertyCount(); ++i) {
            if (meta->property(i).hasNotifySignal()) {
                expected.insert(QStringLiteral("signal ")
                                + QString::fromLatin1(meta->property(i).notifySignal().name()));
            }
        }
    }
    QCOMPARE(sorted(m_documented.value(type)), sorted(expected));
}

void TestReference::tellsOfTheirKeys()
{
    QFETCH(const QString, type);
    QStringList documented;
    const QRegularExpression key(QStringLiteral("<td class=\"topAlign\"><code>") + type
                                 + QStringLiteral("\\.(\\w+)</code>"));
    auto keys = key.globalMatch(pageOf(type));
    while (keys.hasNext()) {
        documented.append(keys.next().captured(1));
    }
    documented.sort();
    QStringList expected = m_types.value(type).keys;
    expected.sort();
    QCOMPARE(documented, expected);
}

void TestReference::tellsOfTheirRoles_data()
{
    QTest::addColumn<QString>("type");
    for (auto it = m_types.cbegin(); it != m_types.cend(); ++it) {
        if (it->prototype == QLatin1String("QAbstractListModel")) {
            QTest::newRow(qPrintable(it.key())) << it.key();
        }
    }
}

void TestReference::tellsOfTheirRoles()
{
    QFETCH(const QString, type);
    const std::unique_ptr<QObject> object = create(type);
    const auto *model = qobject_cast<QAbstractItemModel *>(object.get());
    QVERIFY(model != nullptr);

    QStringList documented;
    // The table of roles is headed so; each row of it begins with a role.
    const QString table = captured(pageOf(type), QStringLiteral("(?s)<th >Role</th>(.*?)</table>"));
    static const QRegularExpression row(
        QStringLiteral("<tr[^>]*><td *>(?:<p>)?<code>(\\w+)</code>"));
    auto rows = row.globalMatch(table);
    while (rows.hasNext()) {
        documented.append(rows.next().captured(1));
    }
    documented.sort();
    QStringList expected;
    const QHash<int, QByteArray> names = model->roleNames();
    for (const QByteArray &name : names) {
        expected.append(QString::fromLatin1(name));
    }
    expected.sort();
    QCOMPARE(documented, expected);
}

void TestReference::hasAnExampleOfEach()
{
    QFETCH(const QString, type);
    const QString example =
        captured(pageOf(type), QStringLiteral("(?s)<pre class=\"qml\">(.*?)</pre>"));
    QVERIFY(
        example.contains(QRegularExpression(QStringLiteral("\\b") + type + QStringLiteral("\\b"))));
}

QTEST_GUILESS_MAIN(TestReference)

#include "tst_reference.moc"
