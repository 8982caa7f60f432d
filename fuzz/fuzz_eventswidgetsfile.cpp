// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// A definition file of events widgets, against what QJsonDocument makes of it.

#include "eventswidgets/eventswidgetsfile.h"
#include "eventswidgets/jsonreader.h"
#include "fuzzing.h"

#include <QJsonArray>
#include <QJsonDocument>
#include <QJsonObject>

// The leak sanitizer's own.
extern "C" {
__attribute__((weak)) void __lsan_disable();
__attribute__((weak)) void __lsan_enable();
}

namespace {

// QJsonDocument loses memory over repeated keys.
QJsonDocument readDocument(const QByteArray &text)
{
    if (__lsan_disable != nullptr) {
        __lsan_disable();
    }
    const QJsonDocument document = QJsonDocument::fromJson(text);
    if (__lsan_enable != nullptr) {
        __lsan_enable();
    }
    return document;
}

const QByteArray byteOrderMark = QByteArrayLiteral("\xef\xbb\xbf");

// Where the reader is to differ from QJsonDocument.
bool mayDiffer(const QByteArray &text)
{
    for (int i = 0; i + 1 < text.size(); ++i) {
        if (text.at(i) == '\\' && (text.at(i + 1) & 0x80) != 0) {
            return true;
        }
    }
    return text.lastIndexOf(byteOrderMark) > 0;
}

bool isSame(const EventsWidget &widget, const QJsonObject &object)
{
    const auto text = [&object](const char *key) {
        return object.value(QLatin1String(key)).toString();
    };
    return widget.path == text("path") && widget.title == text("title")
        && widget.translationId == text("translation_id")
        && widget.descriptionId == text("description_id") && widget.icon == text("icon")
        && widget.availablePath == text("available_path")
        && widget.order == object.value(QLatin1String("order")).toInt(-1)
        && widget.defaultEnabled == object.value(QLatin1String("default_enabled")).toBool();
}

bool isSame(const EventsWidgetsFile &file, const QJsonObject &object)
{
    if (file.translationCatalog != object.value(QLatin1String("translation_catalog")).toString()) {
        return false;
    }
    auto widget = file.widgets.cbegin();
    const QJsonArray elements = object.value(QLatin1String("widgets")).toArray();
    for (const QJsonValue &element : elements) {
        const QJsonObject expected = element.toObject();
        if (expected.value(QLatin1String("path")).toString().isEmpty()) {
            continue;
        }
        if (widget == file.widgets.cend() || !isSame(*widget++, expected)) {
            return false;
        }
    }
    return widget == file.widgets.cend();
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t *data, std::size_t size)
{
    const QByteArray text(reinterpret_cast<const char *>(data), int(size));
    const QString path = Fuzzing::writeFile("widgets.json", text);
    const std::optional<EventsWidgetsFile> file = readEventsWidgetsFile(path);

    JsonReader reader(text);
    reader.skip();
    const bool isJson = reader.atEnd();
    Fuzzing::require(reader.position() >= 0 && reader.position() <= text.size(),
                     "the reader stands in the text");
    Fuzzing::require(isJson || !file, "a definition is JSON");

    if (!mayDiffer(text)) {
        const QJsonDocument document = readDocument(text);
        Fuzzing::require(file.has_value() == document.isObject(), "both take it for a definition");
        Fuzzing::require(!file || isSame(*file, document.object()), "both read the same");
    }
    return 0;
}
