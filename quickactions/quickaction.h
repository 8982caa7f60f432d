// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef QUICKACTION_H
#define QUICKACTION_H

#include <QDBusError>
#include <QString>
#include <QVariant>

#include <optional>

// A quick action as its definition file describes it. The path of the file is its identity.
class QuickAction
{
public:
    QuickAction(const QString &path, bool enabled);

    QString path() const { return m_path; }
    // Whether the user has enabled the action.
    bool enabled() const { return m_enabled; }

    // The keys of the file with their values as QSettings returns them. A value with a comma is a
    // list of strings, whose text is empty.
    QVariantMap config() const { return m_config; }
    QString title() const { return text("title"); }
    QVariant icon() const { return m_config.value(QStringLiteral("icon")); }
    QString translationCatalog() const { return text("translation-catalog"); }
    QString requiredPackage() const { return text("requires-package"); }
    // The place among the actions that the user has not ordered.
    std::optional<int> priority() const { return m_priority; }

    // The D-Bus call.
    QString service() const { return text("remote-service"); }
    QString objectPath() const { return text("remote-path"); }
    QString interface() const { return text("remote-interface"); }
    QString method() const { return text("remote-method"); }
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
    QString text(const char *key) const;

    QString m_path;
    QVariantMap m_config;
    bool m_enabled;
    std::optional<int> m_priority;
};

#endif
