// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "showing.h"

#include "definitionfiles.h"
#include "eventswidgets/eventswidgetsfile.h"
#include "files/literals.h"
#include "quickactions/quickaction.h"
#include "translations/catalogtable.h"

#include <QDBusError>
#include <QFileInfo>
#include <QObject>
#include <QRegularExpression>
#include <QStringList>

namespace {

QString line(const char *name, const QString &value)
{
    return QStringLiteral("%1: %2\n").arg(QLatin1String(name), value);
}

QString word(bool value)
{
    return value ? QStringLiteral("true") : QStringLiteral("false");
}

QString shellWord(QString text)
{
    static const QRegularExpression plain(
        QRegularExpression::anchoredPattern(QStringLiteral("[\\w.:/,@%+=-]+")));
    if (plain.match(text).hasMatch()) {
        return text;
    }
    text.replace(QLatin1Char('\''), R"('\'')"_L1);
    return QLatin1Char('\'') + text + QLatin1Char('\'');
}

// QtDBus sends a text only up to its first NUL.
QString sentText(const QString &text)
{
    return text.section(QChar(), 0, 0);
}

QString callLine(const QuickAction &action)
{
    const QDBusError error = action.whyUnsendable();
    if (error.isValid()) {
        return QStringLiteral("# cannot be sent: %1\n").arg(error.message());
    }
    if (action.interface().isEmpty()) {
        return QStringLiteral("# is sent without an interface, which busctl cannot do\n");
    }
    // "--", because a value may begin with a dash.
    QStringList words = {QStringLiteral("busctl"), QStringLiteral("--user"), QStringLiteral("--"),
                         QStringLiteral("call"),   action.service(),         action.objectPath(),
                         action.interface(),       action.method()};
    QString signature;
    QStringList values;
    const QVariantList arguments = action.arguments();
    for (const QVariant &argument : arguments) {
        if (argument.userType() == QMetaType::QStringList) {
            const QStringList list = argument.toStringList();
            signature += QStringLiteral("as");
            values.append(QString::number(list.size()));
            for (const QString &text : list) {
                values.append(sentText(text));
            }
        } else if (argument.userType() == QMetaType::QString) {
            signature += QLatin1Char('s');
            values.append(sentText(argument.toString()));
        } else if (argument.userType() == QMetaType::QByteArray) {
            const QByteArray bytes = argument.toByteArray();
            signature += QStringLiteral("ay");
            values.append(QString::number(bytes.size()));
            for (const char byte : bytes) {
                values.append(QString::number(uchar(byte)));
            }
        } else {
            return QStringLiteral("# is sent with an argument that is not a text\n");
        }
    }
    if (!signature.isEmpty()) {
        words += signature;
        words += values;
    }
    for (QString &each : words) {
        each = shellWord(each);
    }
    return words.join(QLatin1Char(' ')) + QLatin1Char('\n');
}

QString valueText(const QVariant &value)
{
    return value.userType() == QMetaType::QStringList
        ? QStringLiteral("a list, which is not a text: ") + value.toStringList().join(", "_L1)
        : value.toString();
}

std::optional<QString> showQuickAction(const QString &path)
{
    const QuickAction action(path, false);
    if (!action.isRead()) {
        return {};
    }
    QObject owner;
    CatalogTable catalogs(&owner);
    catalogs.addDefinition(path, action.translationCatalog());
    const QString title = action.title();
    QString text = line("title", title.isEmpty() ? title : CatalogTable::text(title))
        + line("title's identifier", title)
        + line("translation catalog", action.translationCatalog())
        + line("icon", valueText(action.icon()))
        + line("priority",
               action.priority() ? QString::number(*action.priority()) : QStringLiteral("none"))
        + line("required package", action.requiredPackage());
    return text + callLine(action);
}

std::optional<QString> showEventsWidgets(const QString &path)
{
    const std::optional<EventsWidgetsFile> file = readEventsWidgetsFile(path);
    if (!file) {
        return {};
    }
    QObject owner;
    CatalogTable catalogs(&owner);
    catalogs.addDefinition(path, file->translationCatalog);
    QString text = line("translation catalog", file->translationCatalog);
    for (const EventsWidget &widget : file->widgets) {
        text += QLatin1Char('\n') + line("path", widget.path)
            + line("title", widget.translatedTitle())
            + line("title's identifier", widget.translationId)
            + line("untranslated title", widget.title)
            + line("description", widget.translatedDescription())
            + line("description's identifier", widget.descriptionId) + line("icon", widget.icon)
            + line("order", QString::number(widget.order))
            + line("enabled by default", word(widget.defaultEnabled))
            + line("available path", widget.availablePath)
            + line("available", word(widget.available));
    }
    return text;
}

} // namespace

std::optional<QString> showDefinition(const QString &path)
{
    if (!QFileInfo::exists(path)) {
        return {};
    }
    if (DefinitionFiles::isQuickAction(path)) {
        return showQuickAction(path);
    }
    if (DefinitionFiles::isEventsWidgets(path)) {
        return showEventsWidgets(path);
    }
    return {};
}
