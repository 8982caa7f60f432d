// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef QUICKACTION_H
#define QUICKACTION_H

#include "files/literals.h"

#include <QDBusError>
#include <QString>
#include <QVariant>

#include <array>
#include <optional>

// A quick action as its definition file describes it. The path of the file is its identity.
class QuickAction
{
public:
    // Packages install definition files here, under names that match the filter.
    static constexpr QLatin1String directory = "/usr/share/glimmera/quickactions"_L1;
    static constexpr QLatin1String nameFilter = "*.conf"_L1;

    QuickAction(const QString &path, bool enabled);
    // The action as its file describes it now. An unchanged file is not read again, unless it could
    // not be read.
    QuickAction reread(bool enabled) const;

    QString path() const { return m_path; }
    // Whether the user has enabled the action.
    bool enabled() const { return m_enabled; }
    // If not, a warning was logged. A file that does not exist counts as read and empty.
    bool isRead() const { return m_isRead; }

    // The keys of the file with their values as QSettings returns them. A value with a comma is a
    // list of strings, whose text is empty.
    QVariantMap config() const { return m_config; }
    QString title() const { return text("title"_L1); }
    QVariant icon() const { return m_config.value("icon"_L1); }
    QString translationCatalog() const { return text("translation-catalog"_L1); }
    QString requiredPackage() const { return text("requires-package"_L1); }
    // Sorts the actions that the user has not placed; unset if absent or not an integer.
    std::optional<int> priority() const { return m_priority; }

    // The D-Bus call.
    QString service() const { return text("remote-service"_L1); }
    QString objectPath() const { return text("remote-path"_L1); }
    QString interface() const { return text("remote-interface"_L1); }
    QString method() const { return text("remote-method"_L1); }
    QVariantList arguments() const;
    // Why the call cannot be sent; an invalid error if it can. QtDBus itself refuses names and
    // paths that D-Bus does not allow.
    QDBusError whyUnsendable() const;

    // Sends the call on the session bus without waiting. The receiver's slots, which may be null,
    // get the reply, or the error and the sent message. Returns false, with a QML warning of the
    // receiver, if the call cannot be sent.
    bool trigger(QObject *receiver, const char *returnMethod, const char *errorMethod) const;

    bool operator==(const QuickAction &other) const;
    bool operator!=(const QuickAction &other) const { return !(*this == other); }

    // An empty map if the file cannot be read.
    QVariantMap readActionConfig(const QString &path) const;

private:
    // The device, the inode, the size and the times of a file. Equal stamps mean equal content.
    using Stamp = std::array<qint64, 7>;
    static std::optional<Stamp> stampOf(const QString &path);

    QString text(QLatin1String key) const { return m_config.value(key).toString(); }

    QString m_path;
    std::optional<Stamp> m_stamp; // before the file was read; unset without a file
    QVariantMap m_config;
    std::optional<int> m_priority;
    bool m_enabled;
    bool m_isRead;
};

#endif
