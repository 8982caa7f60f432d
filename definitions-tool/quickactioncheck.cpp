// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "quickactioncheck.h"

#include "commonchecks.h"
#include "files/characters.h"
#include "files/inifile.h"
#include "files/literals.h"
#include "inilines.h"
#include "quickactions/quickaction.h"
#include "rules.h"

#include <QDBusError>
#include <QRegularExpression>
#include <QSet>

#include <algorithm>
#include <array>

using Action = QuickAction;
using Severity = Finding::Severity;

namespace {

constexpr auto catalogKey = "translation-catalog"_L1;
constexpr auto iconKey = "icon"_L1;
constexpr auto packageKey = "requires-package"_L1;
constexpr auto priorityKey = "priority"_L1;
constexpr auto titleKey = "title"_L1;
constexpr auto serviceKey = "remote-service"_L1;
constexpr auto pathKey = "remote-path"_L1;
constexpr auto interfaceKey = "remote-interface"_L1;
constexpr auto methodKey = "remote-method"_L1;
constexpr auto argumentsSection = "remote-arguments/"_L1;
constexpr auto sizeKey = "remote-arguments/size"_L1;

constexpr std::array knownKeys = {
    titleKey,   catalogKey, iconKey,      priorityKey, packageKey,
    serviceKey, pathKey,    interfaceKey, methodKey,
};

constexpr int maximumName = 255;
// D-Bus allows no longer signature. The reader returns at most one argument more.
constexpr int maximumArguments = 255;

// The names that D-Bus allows in a call. QtDBus answers other names with an error.
struct Name {
    QLatin1String key;
    QString (Action::*value)() const;
    QLatin1String pattern;
    QLatin1String what;
};

constexpr std::array names = {
    Name{serviceKey, &Action::service,
         R"(:[\w-]+(\.[\w-]+)*|[a-zA-Z_-][\w-]*(\.[a-zA-Z_-][\w-]*)+)"_L1, "name of a service"_L1},
    Name{pathKey, &Action::objectPath, R"(/|(/\w+)+)"_L1, "path of an object"_L1},
    // The interface is optional.
    Name{interfaceKey, &Action::interface, R"(([a-zA-Z_]\w*(\.[a-zA-Z_]\w*)+)?)"_L1,
         "name of an interface"_L1},
    Name{methodKey, &Action::method, R"([a-zA-Z_]\w*)"_L1, "name of a method"_L1},
};

bool isName(const Name &name, const QString &value)
{
    static const auto expressions = [] {
        std::vector<QRegularExpression> all;
        all.reserve(names.size());
        for (const Name &each : names) {
            all.emplace_back(QRegularExpression::anchoredPattern(QString(each.pattern)));
        }
        return all;
    }();
    const bool isLimited = name.key != pathKey;
    return (!isLimited || value.size() <= maximumName)
        && expressions.at(size_t(&name - names.data())).match(value).hasMatch();
}

// Returns the number of the argument that a key holds, from 1, or 0 for other keys.
int argumentNumber(const QString &key)
{
    // QSettings does not find numbers with leading zeroes.
    static const QRegularExpression element(QRegularExpression::anchoredPattern(
        QStringLiteral("remote-arguments/([1-9][0-9]*)/argument")));
    return element.match(key).captured(1).toInt();
}

QString argumentKey(int number)
{
    return QStringLiteral("remote-arguments/%1/argument").arg(number);
}

bool looksLikeNumberOrBoolean(const QString &text)
{
    static const QRegularExpression expression(
        QRegularExpression::anchoredPattern(
            QStringLiteral("[+-]?(\\d+\\.?\\d*|\\.\\d+)([eE][+-]?\\d+)?|0[xX][0-9a-fA-F]+"
                           "|true|false")),
        QRegularExpression::CaseInsensitiveOption);
    return expression.match(text).hasMatch();
}

class QuickActionCheck
{
public:
    QuickActionCheck(const Action &action, std::vector<NamedIniLine> lines, CheckContext *context,
                     Findings *findings)
        : m_action(action), m_config(action.config()), m_lines(std::move(lines)),
          m_context(context), m_findings(findings)
    {
        for (const NamedIniLine &line : m_lines) {
            if (line.kind == IniLine::Kind::Key) {
                m_lineOf.insert(line.name, line.number);
            }
        }
    }

    void checkLines(bool isLatin1);
    void checkTexts();
    void checkPriority();
    void checkArguments();
    void checkCall();

private:
    // Returns the line of the last such key, or 1 if the file has no such key.
    int lineOf(const QString &key) const { return m_lineOf.value(key, 1); }
    void checkKey(const NamedIniLine &line, const QString &section);
    void checkText(const QString &key, const QVariant &value);
    void checkArgument(int number, const QVariant &value);
    void add(int line, Severity severity, QLatin1String rule, const QString &text)
    {
        m_findings->add(line, severity, rule, text);
    }

    const Action &m_action;
    const QVariantMap m_config;
    const std::vector<NamedIniLine> m_lines;
    CheckContext *const m_context;
    Findings *const m_findings;
    QHash<QString, int> m_lineOf;
    // Keys whose value is not a string.
    QSet<QString> m_misread;
    bool m_argumentsAreWrong = false;
};

void QuickActionCheck::checkLines(bool isLatin1)
{
    QString section;
    for (const NamedIniLine &line : m_lines) {
        switch (line.kind) {
        case IniLine::Kind::Section:
            section = line.name;
            if (!section.isEmpty() && section != argumentsSection) {
                reportUnknownKey(QStringLiteral("section"), section.chopped(1),
                                 {argumentsSection.chopped(1), QStringLiteral("General")},
                                 line.number, m_findings);
            }
            break;
        case IniLine::Kind::Key:
            checkKey(line, section);
            break;
        default:
            add(line.number, Severity::Error, Rule::noKey,
                line.name.startsWith(QLatin1Char('#'))
                    ? QStringLiteral("this line is not a key and is ignored; comments begin with "
                                     "\";\"")
                    : QStringLiteral("this line is not a key and is ignored"));
            break;
        }
        if (!line.isAscii && isLatin1) {
            add(line.number, Severity::Error, Rule::encoding,
                QStringLiteral("bytes outside ASCII are read as Latin-1; write \\x and the "
                               "character's number"));
        }
    }
}

void QuickActionCheck::checkKey(const NamedIniLine &line, const QString &section)
{
    if (line.isMarked) {
        add(line.number, Severity::Error, Rule::encoding,
            QStringLiteral("the byte-order mark becomes a part of the key"));
        return;
    }
    if (m_lineOf.value(line.name) != line.number) {
        add(line.number, Severity::Error, Rule::repeatedKey,
            QStringLiteral("the key %1 is repeated in line %2, and only that one counts")
                .arg(quoted(line.name), QString::number(m_lineOf.value(line.name))));
    }
    if (line.isCut) {
        add(line.number, Severity::Error, Rule::semicolon,
            QStringLiteral("an unquoted semicolon ends the value; put it in double quotes"));
    }
    if (section.isEmpty()) {
        const QStringList known(knownKeys.begin(), knownKeys.end());
        if (!known.contains(line.name) && line.name != sizeKey && argumentNumber(line.name) == 0) {
            reportUnknownKey(QStringLiteral("key"), line.name, known, line.number, m_findings);
        }
    } else if (section == argumentsSection && line.name != sizeKey
               && argumentNumber(line.name) == 0) {
        QString key = line.name.mid(section.size());
        const int number = qMax(1, key.section(QLatin1Char('/'), 0, 0).toInt());
        // In the file, backslashes separate groups.
        key.replace(QLatin1Char('/'), QLatin1Char('\\'));
        reportUnknownKey(QStringLiteral("key"), key,
                         {QStringLiteral("size"), QStringLiteral("%1\\argument").arg(number)},
                         line.number, m_findings);
    }
}

void QuickActionCheck::checkTexts()
{
    for (const QLatin1String key : knownKeys) {
        if (key != priorityKey && m_config.contains(key)) {
            checkText(key, m_config.value(key));
        }
    }
    const QString catalog = m_action.translationCatalog();
    const QString title = m_action.title();
    if (title.isEmpty() && !m_misread.contains(titleKey)) {
        add(lineOf(titleKey), Severity::Warning, Rule::title,
            QStringLiteral("without \"title\" the action shows no text"));
    }
    if (!title.isEmpty() && catalog.isEmpty() && !m_misread.contains(catalogKey)) {
        add(lineOf(titleKey), Severity::Warning, Rule::catalog,
            QStringLiteral("without \"translation-catalog\" the title is only looked up in "
                           "catalogs that happen to be loaded"));
    }
    checkCatalog(catalog, lineOf(catalogKey), m_context, m_findings);
    checkTextIds({{title, lineOf(titleKey)}}, catalog, lineOf(catalogKey), m_context, m_findings);
    checkIcon(m_action.icon().toString(), lineOf(iconKey), m_context, m_findings);
    static const QRegularExpression package(
        QRegularExpression::anchoredPattern(QStringLiteral("[\\w.+-]*")));
    if (!package.match(m_action.requiredPackage()).hasMatch()) {
        add(lineOf(packageKey), Severity::Warning, Rule::package,
            QStringLiteral("%1 is not the name of a package; write it without a version")
                .arg(quoted(m_action.requiredPackage())));
    }
}

void QuickActionCheck::checkText(const QString &key, const QVariant &value)
{
    // Pages get the icon unchanged, and can use it only if it is a string.
    if (value.userType() == QMetaType::QString || (key != iconKey && !value.toString().isEmpty())) {
        return;
    }
    m_misread.insert(key);
    if (value.userType() == QMetaType::QStringList) {
        add(lineOf(key), Severity::Error, Rule::comma,
            QStringLiteral(
                "an unquoted comma makes %1 a list, which is not a text; put it in double "
                "quotes")
                .arg(quoted(key)));
    } else {
        add(lineOf(key), Severity::Error, Rule::type,
            QStringLiteral("%1 is not read as a text; write a leading @ twice").arg(quoted(key)));
    }
}

void QuickActionCheck::checkPriority()
{
    if (!m_config.contains(priorityKey)) {
        add(1, Severity::Warning, Rule::priority,
            QStringLiteral("without \"priority\" the action comes last"));
    } else if (!m_action.priority()) {
        add(lineOf(priorityKey), Severity::Error, Rule::type,
            QStringLiteral("\"priority\" is not an integer: the action comes last"));
    } else if (*m_action.priority() < 0) {
        add(lineOf(priorityKey), Severity::Warning, Rule::priority,
            QStringLiteral("\"priority\" is negative: the action comes last"));
    }
}

void QuickActionCheck::checkArguments()
{
    int highest = 0;
    int highestLine = 1;
    for (const NamedIniLine &line : m_lines) {
        const int number = line.kind == IniLine::Kind::Key ? argumentNumber(line.name) : 0;
        if (number > highest) {
            highest = number;
            highestLine = line.number;
        }
    }
    // The file may have a key "remote-arguments" instead of the array.
    const bool hasArray = m_lineOf.contains(sizeKey) || highest > 0;
    const QVariantList arguments = hasArray ? m_action.arguments() : QVariantList();
    const int size = arguments.size();
    if (highest > size && size <= maximumArguments) {
        const bool hasSize = m_lineOf.contains(sizeKey);
        add(hasSize ? lineOf(sizeKey) : highestLine, Severity::Error, Rule::arguments,
            hasSize ? QStringLiteral("\"size\" leaves out argument %1").arg(highest)
                    : QStringLiteral("without \"size\" the call has no arguments"));
    }
    for (int i = 0; i < size; ++i) {
        if (!arguments.at(i).isValid() && !m_lineOf.contains(argumentKey(i + 1))) {
            m_argumentsAreWrong = true;
            add(lineOf(sizeKey), Severity::Error, Rule::arguments,
                QStringLiteral("\"size\" counts argument %1, which is missing").arg(i + 1));
            break;
        }
    }
    for (int i = 0; i < size; ++i) {
        if (m_lineOf.contains(argumentKey(i + 1))) {
            checkArgument(i + 1, arguments.at(i));
        }
    }
}

void QuickActionCheck::checkArgument(int number, const QVariant &value)
{
    const int line = lineOf(argumentKey(number));
    if (value.userType() == QMetaType::QStringList) {
        add(line, Severity::Note, Rule::argumentType,
            QStringLiteral("argument %1 is sent as a list of %2 texts")
                .arg(number)
                .arg(value.toStringList().size()));
    } else if (value.userType() == QMetaType::QByteArray) {
        add(line, Severity::Note, Rule::argumentType,
            QStringLiteral("argument %1 is sent as bytes").arg(number));
    } else if (value.userType() != QMetaType::QString) {
        m_argumentsAreWrong = true;
        add(line, Severity::Error, Rule::arguments,
            QStringLiteral("argument %1 is not read as a text; write a leading @ twice")
                .arg(number));
    } else if (looksLikeNumberOrBoolean(value.toString())) {
        add(line, Severity::Note, Rule::argumentType,
            QStringLiteral("argument %1 is sent as the text %2")
                .arg(number)
                .arg(quoted(value.toString())));
    }
}

void QuickActionCheck::checkCall()
{
    bool isSendable = !m_argumentsAreWrong;
    for (const Name &name : names) {
        const QString value = (m_action.*name.value)();
        if (isName(name, value)) {
            continue;
        }
        isSendable = false;
        // Another finding may have reported this value already.
        if (!m_misread.contains(name.key)) {
            add(lineOf(name.key), Severity::Error, Rule::call,
                value.isEmpty()
                    ? QStringLiteral("the call cannot be sent without %1").arg(quoted(name.key))
                    : QStringLiteral("the call cannot be sent: %1 is not a valid %2")
                          .arg(quoted(value), name.what));
        }
    }
    if (m_action.service().startsWith("org.freedesktop."_L1)) {
        add(lineOf(serviceKey), Severity::Warning, Rule::systemService,
            QStringLiteral("the service %1 belongs to the system, and executes the call with the "
                           "rights of the user")
                .arg(quoted(m_action.service())));
    }
    const QDBusError error = m_action.whyUnsendable();
    if (isSendable && error.isValid()) {
        const QString key = error.type() == QDBusError::InvalidObjectPath ? pathKey
            : error.type() == QDBusError::InvalidInterface                ? interfaceKey
                                                                          : sizeKey;
        add(lineOf(key), Severity::Error, Rule::call,
            QStringLiteral("the call cannot be sent: %1").arg(error.message()));
    }
}

// Reports why the reader refused a file.
void reportRefused(const QString &path, Findings *findings)
{
    QByteArray content;
    if (reportUnreadable(path, maximumIniSize, &content, findings)) {
        return;
    }
    for (const NamedIniLine &line : readIniLines(content)) {
        if (line.isPacked || !line.isClosed) {
            findings->add(line.number, Severity::Error, Rule::unreadable,
                          line.isPacked
                              ? QStringLiteral(
                                  "the value mentions @Variant( or @DateTime(: nothing of the file "
                                  "is read")
                              : QStringLiteral("the header of a section is not closed: nothing of "
                                               "the file is read"));
            return;
        }
    }
    findings->add(1, Severity::Error, Rule::unreadable,
                  QStringLiteral("QSettings cannot read the file"));
}

} // namespace

void checkQuickAction(const QString &path, CheckContext *context, Findings *findings)
{
    const Action action(path, false);
    if (!action.isRead()) {
        reportRefused(path, findings);
        return;
    }
    QByteArray content;
    if (reportUnreadable(path, maximumIniSize, &content, findings)) {
        return;
    }
    QuickActionCheck check(action, readIniLines(content), context, findings);
    check.checkLines(!content.startsWith(byteOrderMark));
    check.checkTexts();
    check.checkPriority();
    check.checkArguments();
    check.checkCall();
}
