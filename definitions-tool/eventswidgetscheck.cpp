// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "eventswidgetscheck.h"

#include "commonchecks.h"
#include "eventswidgets/eventswidgetsfile.h"
#include "files/characters.h"
#include "files/literals.h"
#include "jsonwalker.h"
#include "rules.h"

#include <QJsonArray>
#include <QJsonDocument>
#include <QStringList>

#include <algorithm>
#include <array>
#include <optional>
#include <utility>

using Severity = Finding::Severity;
using Widget = EventsWidget;

namespace {

enum class Type { Text, Integer, Boolean, Array, Any };

struct Key {
    const char *name;
    Type type;
};

enum FileKey { CatalogKey, WidgetsKey, SchemaKey, FileKeyCount };
constexpr std::array<Key, FileKeyCount> fileKeys = {{
    {"translation_catalog", Type::Text},
    {"widgets", Type::Array},
    // Names the JSON Schema for editors.
    {"$schema", Type::Any},
}};

enum WidgetKey {
    PathKey,
    TitleKey,
    TranslationIdKey,
    DescriptionIdKey,
    IconKey,
    OrderKey,
    DefaultEnabledKey,
    AvailablePathKey,
    WidgetKeyCount
};
constexpr std::array<Key, WidgetKeyCount> widgetKeys = {{
    {"path", Type::Any}, // checkEntry() reports the type.
    {"title", Type::Text},
    {"translation_id", Type::Text},
    {"description_id", Type::Text},
    {"icon", Type::Text},
    {"order", Type::Integer},
    {"default_enabled", Type::Boolean},
    {"available_path", Type::Text},
}};

QString nameOf(Type type)
{
    switch (type) {
    case Type::Text:
        return QStringLiteral("a text");
    case Type::Integer:
        return QStringLiteral("an integer of 32 bits");
    case Type::Boolean:
        return QStringLiteral("true or false");
    case Type::Array:
        return QStringLiteral("an array");
    case Type::Any:
        break;
    }
    return QStringLiteral("anything");
}

bool isOf(Type type, const QJsonValue &value)
{
    switch (type) {
    case Type::Text:
        return value.isString();
    case Type::Integer:
        // If the value is not an integer, toInt() returns its argument.
        return value.toInt(0) == value.toInt(-1);
    case Type::Boolean:
        return value.isBool();
    case Type::Array:
        return value.isArray();
    case Type::Any:
        break;
    }
    return true;
}

class EventsWidgetsCheck
{
public:
    EventsWidgetsCheck(QString path, QByteArray content, const EventsWidgetsFile &file,
                       CheckContext *context, Findings *findings)
        : m_path(std::move(path)), m_content(std::move(content)), m_file(file), m_context(context),
          m_findings(findings)
    {
    }

    void check();

private:
    // The last member with a known key. The line is 0 if there is no such member.
    struct Member {
        int line = 0;
        int position = 0; // Where the value begins.
        QJsonValue value = QJsonValue::Undefined;
    };
    template<size_t count> using Members = std::array<Member, count>;

    template<size_t count>
    Members<count> checkMembers(const std::array<Key, count> &keys, int position);
    void checkEntry(int position);
    void checkWidget(const Widget &widget, const Members<WidgetKeyCount> &members, int line);
    void checkPath(const QString &path, int line);
    void checkTexts(const Widget &widget, const Members<WidgetKeyCount> &members);
    int lineOf(int position);
    void add(int line, Severity severity, QLatin1String rule, const QString &text)
    {
        m_findings->add(line, severity, rule, text);
    }

    const QString m_path;
    const QByteArray m_content;
    const EventsWidgetsFile &m_file;
    CheckContext *const m_context;
    Findings *const m_findings;
    // The index of the next widget in m_file.
    size_t m_next = 0;
    // The identifiers that the widgets name.
    std::vector<TextId> m_textIds;
    // The last position that was passed to lineOf(), and its line.
    int m_counted = 0;
    int m_line = 1;
};

void EventsWidgetsCheck::check()
{
    const int start = m_content.indexOf('{');
    const auto members = checkMembers(fileKeys, start);
    const int catalogLine = members[CatalogKey].line;
    checkCatalog(m_file.translationCatalog, catalogLine, m_context, m_findings);
    const Member &widgets = members[WidgetsKey];
    if (widgets.line == 0) {
        add(lineOf(start), Severity::Error, Rule::noWidget,
            QStringLiteral("there is no \"widgets\": no widget is listed"));
    } else if (widgets.value.isArray()) {
        JsonWalker entries(m_content, widgets.position);
        bool isEmpty = true;
        while (entries.next()) {
            isEmpty = false;
            checkEntry(entries.position());
        }
        if (isEmpty) {
            add(widgets.line, Severity::Warning, Rule::noWidget,
                QStringLiteral("\"widgets\" is empty: no widget is listed"));
        }
    }
    checkTextIds(m_textIds, m_file.translationCatalog, catalogLine, m_context, m_findings);
}

template<size_t count>
EventsWidgetsCheck::Members<count>
EventsWidgetsCheck::checkMembers(const std::array<Key, count> &keys, int position)
{
    Members<count> members;
    JsonWalker walker(m_content, position);
    while (walker.next()) {
        const QString name = walker.key();
        const int line = lineOf(walker.position());
        const auto key = std::find_if(keys.cbegin(), keys.cend(), [&name](const Key &k) {
            return name == QLatin1String(k.name);
        });
        if (key == keys.cend()) {
            QStringList known;
            for (const Key &k : keys) {
                known.append(QLatin1String(k.name));
            }
            reportUnknownKey(QStringLiteral("key"), name, known, line, m_findings);
            continue;
        }
        Member &member = members.at(size_t(key - keys.cbegin()));
        if (member.line > 0) {
            add(member.line, Severity::Error, Rule::repeatedKey,
                QStringLiteral("the key %1 is repeated in line %2, and only that one counts")
                    .arg(quoted(name), QString::number(line)));
        }
        member = {line, walker.position(), walker.value()};
        if (!isOf(key->type, member.value)) {
            add(line, Severity::Error, Rule::type,
                QStringLiteral("the value of %1 is not %2 and is ignored")
                    .arg(quoted(name), nameOf(key->type)));
        }
    }
    return members;
}

void EventsWidgetsCheck::checkEntry(int position)
{
    const int line = lineOf(position);
    if (m_content.at(position) != '{') {
        add(line, Severity::Error, Rule::widget,
            QStringLiteral("this is not an object and is ignored"));
        return;
    }
    const auto members = checkMembers(widgetKeys, position);
    const Member &path = members[PathKey];
    // The reader leaves out the widgets that it rejects.
    if (m_next < m_file.widgets.size() && m_file.widgets.at(m_next).path == path.value.toString()) {
        checkWidget(m_file.widgets.at(m_next), members, line);
        ++m_next;
    } else {
        add(path.line > 0 ? path.line : line, Severity::Error, Rule::path,
            path.line == 0 ? QStringLiteral("there is no \"path\": the widget is ignored")
                : path.value.isString()
                ? QStringLiteral("\"path\" is empty: the widget is ignored")
                : QStringLiteral("\"path\" is not a text: the widget is ignored"));
    }
}

void EventsWidgetsCheck::checkWidget(const Widget &widget, const Members<WidgetKeyCount> &members,
                                     int line)
{
    const auto known = m_context->widgets.constFind(widget.path);
    if (known == m_context->widgets.constEnd()) {
        m_context->widgets.insert(widget.path, {m_path, members[PathKey].line});
    } else {
        add(members[PathKey].line, Severity::Warning, Rule::duplicatePath,
            QStringLiteral("the path %1 is also in %2:%3; only one of the two widgets is listed")
                .arg(quoted(widget.path), known->file, QString::number(known->line)));
    }
    checkPath(widget.path, members[PathKey].line);
    if (members[OrderKey].line == 0) {
        add(line, Severity::Warning, Rule::order,
            QStringLiteral("without \"order\" the widget comes last"));
    } else if (members[OrderKey].value.toInt() < 0) {
        add(members[OrderKey].line, Severity::Warning, Rule::order,
            QStringLiteral("with a negative \"order\" the widget comes last"));
    }
    if (widget.title.isEmpty() && widget.translationId.isEmpty()) {
        add(line, Severity::Warning, Rule::title,
            QStringLiteral("without \"title\" and \"translation_id\" the widget has no title"));
    }
    checkTexts(widget, members);
    checkIcon(widget.icon, members[IconKey].line, m_context, m_findings);
    if (!widget.availablePath.isEmpty() && !widget.availablePath.startsWith(QLatin1Char('/'))) {
        add(members[AvailablePathKey].line, Severity::Warning, Rule::relativePath,
            QStringLiteral("the available path %1 is a relative path")
                .arg(quoted(widget.availablePath)));
    }
}

void EventsWidgetsCheck::checkPath(const QString &path, int line)
{
    static const QStringList remote = {QStringLiteral("http"), QStringLiteral("https"),
                                       QStringLiteral("ftp")};
    const QString scheme = schemeOf(path);
    if (scheme.isEmpty() && !path.startsWith(QLatin1Char('/'))) {
        add(line, Severity::Warning, Rule::relativePath,
            QStringLiteral("the path %1 is a relative path").arg(quoted(path)));
    } else if (remote.contains(scheme)) {
        add(line, Severity::Warning, Rule::remoteUrl,
            QStringLiteral("the path %1 makes the home screen run code from the network")
                .arg(quoted(path)));
    } else {
        checkLocation(QStringLiteral("path"), path, {QStringLiteral("file"), QStringLiteral("qrc")},
                      line, m_context, m_findings);
    }
}

// Checks the title and the description.
void EventsWidgetsCheck::checkTexts(const Widget &widget, const Members<WidgetKeyCount> &members)
{
    m_textIds.push_back({widget.translationId, members[TranslationIdKey].line});
    m_textIds.push_back({widget.descriptionId, members[DescriptionIdKey].line});
    if (widget.translationCatalog.isEmpty()) {
        for (const WidgetKey key : {TitleKey, TranslationIdKey, DescriptionIdKey}) {
            if (!members.at(key).value.toString().isEmpty()) {
                add(members.at(key).line, Severity::Warning, Rule::catalog,
                    QStringLiteral("without \"translation_catalog\" this text is not translated"));
                break;
            }
        }
    }
}

int EventsWidgetsCheck::lineOf(int position)
{
    if (position < m_counted) {
        m_counted = 0;
        m_line = 1;
    }
    m_line += int(std::count(m_content.cbegin() + m_counted, m_content.cbegin() + position, '\n'));
    m_counted = position;
    return m_line;
}

// Whether a text is a JSON value that QJsonDocument refuses: neither an object nor an array.
bool isScalar(const QByteArray &text)
{
    return QJsonDocument::fromJson('[' + text + ']').array().size() == 1;
}

// If QJsonDocument stopped at a bracket that follows a comma, returns the position of the comma,
// otherwise -1.
int trailingComma(const QByteArray &text, const QJsonParseError &error)
{
    if (error.error != QJsonParseError::MissingObject) {
        return -1;
    }
    const QByteArray before = text.left(error.offset - 1).trimmed();
    return before.endsWith(',') ? text.lastIndexOf(',', error.offset - 1) : -1;
}

// Reports why the reader refused a file.
void reportRefused(const QByteArray &content, Findings *findings)
{
    const auto report = [&content, findings](int position, QLatin1String rule, const char *text) {
        findings->add(int(content.left(position).count('\n')) + 1, Severity::Error, rule,
                      QStringLiteral("%1: nothing of the file is read").arg(QLatin1String(text)));
    };
    if (isTooComplex(content)) {
        report(0, Rule::unreadable, "there are more than a million objects and arrays");
        return;
    }
    QJsonParseError error = {};
    const QJsonDocument document = QJsonDocument::fromJson(content, &error);
    int start = content.startsWith(byteOrderMark) ? int(qstrlen(byteOrderMark)) : 0;
    while (start < content.size() && isSpace(content.at(start))) {
        ++start;
    }
    if (document.isArray() || isScalar(content.mid(start))) {
        report(start, Rule::json, "this is not an object");
        return;
    }
    const int comma = trailingComma(content, error);
    if (comma >= 0) {
        report(comma, Rule::json, "no value follows this comma");
        return;
    }
    // If a file ends too early, reports its last line with text, not an empty line after it.
    int end = content.size();
    while (end > 0 && isSpace(content.at(end - 1))) {
        --end;
    }
    report(std::min(error.offset, end), Rule::json, "from here on this is not JSON");
}

} // namespace

void checkEventsWidgets(const QString &path, CheckContext *context, Findings *findings)
{
    const std::optional<EventsWidgetsFile> file = readEventsWidgetsFile(path);
    QByteArray content;
    if (reportUnreadable(path, maximumEventsWidgetsSize, &content, findings)) {
        return;
    }
    // The walker needs a text that QJsonDocument accepts, and the file may have changed since the
    // reader read it.
    if (file && !isTooComplex(content) && QJsonDocument::fromJson(content).isObject()) {
        EventsWidgetsCheck(path, std::move(content), *file, context, findings).check();
    } else {
        reportRefused(content, findings);
    }
}
