// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "eventswidgetsfile.h"

#include <QFile>
#include <QJsonArray>
#include <QJsonDocument>
#include <QJsonObject>
#include <QtDebug>

#include <fcntl.h>
#include <sys/stat.h>

namespace {

constexpr QStringView translationCatalogKey(u"translation_catalog");
constexpr QStringView widgetsKey(u"widgets");

constexpr QStringView pathKey(u"path");
constexpr QStringView titleKey(u"title");
constexpr QStringView translationIdKey(u"translation_id");
constexpr QStringView descriptionIdKey(u"description_id");
constexpr QStringView iconKey(u"icon");
constexpr QStringView orderKey(u"order");
constexpr QStringView defaultEnabledKey(u"default_enabled");
constexpr QStringView availablePathKey(u"available_path");

constexpr int noOrder = -1;

// A definition takes a few hundred bytes a widget. The main thread reads it, and parsed it takes up
// to thirty times its size: whatever is larger than this is none.
constexpr qint64 maximumSize = 32 * 1024 * 1024;
// The log is written while the main thread waits: no more lines than anybody reads.
constexpr int maximumWarnings = 1000;

// What a regular file holds, or nothing if it is too large; false if it cannot be opened.
bool readFile(const QString &path, QByteArray *content)
{
    // Whatever has taken the place of a file since it was listed, opening it waits for nobody.
    const int descriptor =
        open(QFile::encodeName(path).constData(), O_RDONLY | O_NONBLOCK | O_NOCTTY | O_CLOEXEC);
    QFile file;
    if (descriptor < 0
        || !file.open(descriptor, QIODevice::ReadOnly | QIODevice::Unbuffered,
                      QFileDevice::AutoCloseHandle)) {
        return false;
    }
    struct stat entry = {};
    if (fstat(descriptor, &entry) != 0 || !S_ISREG(entry.st_mode)) {
        return false;
    }
    if (entry.st_size <= maximumSize) {
        *content = file.read(entry.st_size);
    }
    return true;
}

} // namespace

std::optional<EventsWidgetsFile> readEventsWidgetsFile(const QString &path)
{
    QByteArray content;
    if (!readFile(path, &content)) {
        qWarning() << "Failed to open" << path;
        return {};
    }
    const QJsonDocument document = QJsonDocument::fromJson(content);
    if (!document.isObject()) {
        qWarning() << "Invalid Events Widget" << path;
        return {};
    }

    EventsWidgetsFile file;
    const QJsonObject object = document.object();
    file.translationCatalog = object.value(translationCatalogKey).toString();

    int warnings = 0;
    const QJsonArray entries = object.value(widgetsKey).toArray();
    file.widgets.reserve(size_t(entries.size()));
    for (const QJsonValue &value : entries) {
        const QJsonObject entry = value.toObject();
        EventsWidgetsModel::Widget widget;
        widget.path = entry.value(pathKey).toString();
        if (widget.path.isEmpty()) {
            if (++warnings <= maximumWarnings) {
                qWarning() << "Invalid widget defined in" << path;
            }
            continue;
        }
        widget.file = path;
        widget.availablePath = entry.value(availablePathKey).toString();
        widget.title = entry.value(titleKey).toString();
        widget.translationId = entry.value(translationIdKey).toString();
        widget.descriptionId = entry.value(descriptionIdKey).toString();
        widget.translationCatalog = file.translationCatalog;
        widget.icon = entry.value(iconKey).toString();
        widget.order = entry.value(orderKey).toInt(noOrder);
        widget.defaultEnabled = entry.value(defaultEnabledKey).toBool();
        widget.available = widget.isAvailable();
        file.widgets.push_back(std::move(widget));
    }
    return file;
}
