// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "eventswidgetscheck.h"

#include "commonchecks.h"
#include "eventswidgets/eventswidgetsfile.h"
#include "eventswidgets/jsonreader.h"
#include "readerlog.h"

#include <QStringList>

#include <algorithm>
#include <array>
#include <optional>
#include <utility>

using Severity = Finding::Severity;
using Widget = EventsWidget;

namespace {

const QLatin1String jsonRule("json");
const QLatin1String repeatedKeyRule("repeated-key");
const QLatin1String typeRule("type");
const QLatin1String widgetRule("widget");
const QLatin1String pathRule("path");
const QLatin1String orderRule("order");
const QLatin1String duplicatePathRule("duplicate-path");
const QLatin1String relativePathRule("relative-path");

enum class Type { Text, Integer, Boolean, Array, Any };

struct Key {
    std::string_view name;
    Type type;
};

enum FileKey { CatalogKey, WidgetsKey, SchemaKey, FileKeyCount };
constexpr std::array<Key, FileKeyCount> fileKeys = {{
    {"translation_catalog", Type::Text},
    {"widgets", Type::Array},
    // For editors.
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
    {"path", Type::Any}, // Without a text there, there is no widget.
    {"title", Type::Text},
    {"translation_id", Type::Text},
    {"description_id", Type::Text},
    {"icon", Type::Text},
    {"order", Type::Integer},
    {"default_enabled", Type::Boolean},
    {"available_path", Type::Text},
}};

QString toString(std::string_view text)
{
    return QString::fromUtf8(text.data(), int(text.size()));
}

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
    // The lines of the known keys of an object, 0 for those that it lacks.
    template<size_t count> using Lines = std::array<int, count>;

    template<size_t count, typename Visit>
    Lines<count> checkMembers(const std::array<Key, count> &keys, JsonReader *reader,
                              const Visit &visit);
    bool isOf(Type type, const JsonReader &reader) const;
    void checkEntry(JsonReader *reader);
    void checkWidget(const Widget &widget, const Lines<WidgetKeyCount> &lines, int line);
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
    // The next of the widgets that the reader has found.
    size_t m_next = 0;
    // The lines are counted while the text is passed.
    int m_counted = 0;
    int m_line = 1;
};

void EventsWidgetsCheck::check()
{
    JsonReader reader(m_content);
    if (!reader.beginObject()) {
        return;
    }
    std::optional<JsonReader> widgets;
    const auto lines =
        checkMembers(fileKeys, &reader, [&widgets](size_t key, const JsonReader &value) {
            if (key == WidgetsKey) {
                // Of several the last one counts.
                widgets.emplace(value);
            }
        });
    checkCatalog(m_file.translationCatalog, lines[CatalogKey], m_context, m_findings);
    if (widgets && widgets->beginArray()) {
        while (widgets->nextElement()) {
            checkEntry(&*widgets);
        }
    }
}

template<size_t count, typename Visit>
EventsWidgetsCheck::Lines<count>
EventsWidgetsCheck::checkMembers(const std::array<Key, count> &keys, JsonReader *reader,
                                 const Visit &visit)
{
    Lines<count> lines = {};
    std::string_view name;
    while (reader->nextMember(&name)) {
        const int line = lineOf(reader->position());
        const auto key = std::find_if(keys.cbegin(), keys.cend(),
                                      [name](const Key &k) { return k.name == name; });
        if (key == keys.cend()) {
            QStringList known;
            for (const Key &k : keys) {
                known.append(toString(k.name));
            }
            reportUnknownKey(QStringLiteral("key"), toString(name), known, line, m_findings);
        } else {
            const auto index = size_t(key - keys.cbegin());
            if (lines.at(index) > 0) {
                add(lines.at(index), Severity::Error, repeatedKeyRule,
                    QStringLiteral("the key %1 stands again in line %2, and only that counts")
                        .arg(quoted(toString(name)), QString::number(line)));
            }
            lines.at(index) = line;
            if (!isOf(key->type, *reader)) {
                add(line, Severity::Error, typeRule,
                    QStringLiteral("the value of %1 is not %2 and is passed over")
                        .arg(quoted(toString(name)), nameOf(key->type)));
            }
            visit(index, *reader);
        }
        reader->skip();
    }
    return lines;
}

// The reader judges: of another type, it gives what it was told to give instead.
bool EventsWidgetsCheck::isOf(Type type, const JsonReader &reader) const
{
    JsonReader copy(reader);
    const char first = *(m_content.constData() + copy.position()); // Zero at the end.
    switch (type) {
    case Type::Text:
        return first == '"';
    case Type::Integer: {
        JsonReader another(reader);
        return copy.readInt(0) == another.readInt(-1);
    }
    case Type::Boolean:
        return first == 't' || first == 'f';
    case Type::Array:
        return first == '[';
    case Type::Any:
        break;
    }
    return true;
}

void EventsWidgetsCheck::checkEntry(JsonReader *reader)
{
    const int line = lineOf(reader->position());
    if (!reader->beginObject()) {
        add(line, Severity::Error, widgetRule, QStringLiteral("this is no object and passed over"));
        return;
    }
    QString path;
    bool isText = false;
    const auto lines =
        checkMembers(widgetKeys, reader, [this, &path, &isText](size_t key, JsonReader value) {
            if (key == PathKey) {
                isText = isOf(Type::Text, value);
                path = value.readString();
            }
        });
    // What the reader has rejected is not among what it gave.
    if (m_next < m_file.widgets.size() && m_file.widgets.at(m_next).path == path) {
        checkWidget(m_file.widgets.at(m_next), lines, line);
        ++m_next;
    } else {
        add(lines[PathKey] > 0 ? lines[PathKey] : line, Severity::Error, pathRule,
            lines[PathKey] == 0 ? QStringLiteral("there is no \"path\": the widget is passed over")
                : isText        ? QStringLiteral("\"path\" is empty: the widget is passed over")
                         : QStringLiteral("\"path\" is not a text: the widget is passed over"));
    }
}

void EventsWidgetsCheck::checkWidget(const Widget &widget, const Lines<WidgetKeyCount> &lines,
                                     int line)
{
    const auto known = m_context->widgets.constFind(widget.path);
    if (known == m_context->widgets.constEnd()) {
        m_context->widgets.insert(widget.path, {m_path, lines[PathKey]});
    } else {
        add(lines[PathKey], Severity::Warning, duplicatePathRule,
            QStringLiteral("the path %1 stands in %2:%3 too, and one of the two widgets is lost")
                .arg(quoted(widget.path), known->file, QString::number(known->line)));
    }
    if (lines[OrderKey] == 0) {
        add(line, Severity::Warning, orderRule,
            QStringLiteral("without \"order\" the widget comes last"));
    }
    checkTextId(widget.translationId, widget.translationCatalog, lines[TranslationIdKey], m_context,
                m_findings);
    checkTextId(widget.descriptionId, widget.translationCatalog, lines[DescriptionIdKey], m_context,
                m_findings);
    checkIcon(widget.icon, lines[IconKey], m_findings);
    if (!widget.availablePath.isEmpty() && !widget.availablePath.startsWith(QLatin1Char('/'))) {
        add(lines[AvailablePathKey], Severity::Warning, relativePathRule,
            QStringLiteral("the available path %1 is a relative path")
                .arg(quoted(widget.availablePath)));
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

// A file that the reader has refused.
void reportRefused(const QByteArray &content, Findings *findings)
{
    JsonReader reader(content);
    const int start = reader.position();
    reader.skip();
    const bool isJson = reader.atEnd();
    const int position = isJson ? start : reader.position();
    // What ends too early does so where it ends, not in an empty line behind that.
    const QByteArray before =
        position < content.size() ? content.left(position) : content.trimmed();
    findings->add(int(before.count('\n')) + 1, Severity::Error, jsonRule,
                  isJson ? QStringLiteral("this is no object: nothing of the file is read")
                         : QStringLiteral("from here on this is no JSON: nothing of the file is "
                                          "read"));
}

} // namespace

void checkEventsWidgets(const QString &path, CheckContext *context, Findings *findings)
{
    const ReaderLog log;
    const std::optional<EventsWidgetsFile> file = readEventsWidgetsFile(path);
    QByteArray content;
    if (reportUnreadable(path, maximumEventsWidgetsSize, &content, findings)) {
        return;
    }
    if (file) {
        EventsWidgetsCheck(path, std::move(content), *file, context, findings).check();
    } else {
        reportRefused(content, findings);
    }
}
