// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "quickaction.h"

#include "files/inifile.h"

#include <QDBusConnection>
#include <QDBusMessage>
#include <QQmlInfo>
#include <QSettings>

#include <algorithm>

namespace {

const QLatin1String argumentsKey("remote-arguments");
// The keys of a QSettings array, whose elements are numbered from 1.
const QLatin1String argumentsSizeKey("remote-arguments/size");
const QLatin1String argumentKey("remote-arguments/%1/argument");

// The longest signature that D-Bus allows.
constexpr int maximumSignature = 255;
// More arguments than a call can have. A file may claim to have any number of them.
constexpr int enoughArguments = 256;

// Reserved for D-Bus libraries: the bus disconnects a client that sends a message with one of them.
const QLatin1String reservedPath("/org/freedesktop/DBus/Local");
const QLatin1String reservedInterface("org.freedesktop.DBus.Local");

// QSettings gives a list of variants, not of strings, if an element begins with "@".
QVariant withStringList(const QVariant &value)
{
    if (value.userType() != QMetaType::QVariantList) {
        return value;
    }
    const QVariantList list = value.toList();
    const bool isStringList = std::all_of(list.cbegin(), list.cend(), [](const QVariant &element) {
        return element.userType() == QMetaType::QString;
    });
    return isStringList ? value.toStringList() : value;
}

} // namespace

QuickAction::QuickAction(const QString &path, bool enabled)
    : m_path(path), m_config(readActionConfig(path)), m_enabled(enabled)
{
    // Read as text: as a variant, a number that is too large for an integer would wrap around.
    bool isInteger = false;
    const int priority = text("priority").toInt(&isInteger);
    if (isInteger) {
        m_priority = priority;
    }
}

QVariantList QuickAction::arguments() const
{
    return m_config.value(argumentsKey).toList();
}

QDBusError QuickAction::whyUnsendable() const
{
    // QtDBus sends a call without a service to the bus itself. It ends the process if the service
    // is a single word or the signature is too long.
    if (service().isEmpty()) {
        return {QDBusError::InvalidService, QStringLiteral("The call names no service")};
    }
    if (!service().startsWith(QLatin1Char(':')) && !service().contains(QLatin1Char('.'))) {
        return {QDBusError::InvalidService, QStringLiteral("The service is not a bus name")};
    }
    if (method().isEmpty()) {
        return {QDBusError::InvalidMember, QStringLiteral("The call names no method")};
    }
    if (objectPath() == reservedPath) {
        return {QDBusError::InvalidObjectPath, QStringLiteral("The path is reserved")};
    }
    if (interface() == reservedInterface) {
        return {QDBusError::InvalidInterface, QStringLiteral("The interface is reserved")};
    }
    int signature = 0;
    const QVariantList arguments = this->arguments();
    for (const QVariant &argument : arguments) {
        if (argument.userType() == QMetaType::QString) {
            signature += 1; // s
        } else if (argument.userType() == QMetaType::QStringList) {
            signature += 2; // as
        } else {
            return {QDBusError::InvalidArgs, QStringLiteral("An argument is not text")};
        }
    }
    if (signature > maximumSignature) {
        return {QDBusError::InvalidArgs, QStringLiteral("The call has too many arguments")};
    }
    return {};
}

bool QuickAction::trigger(QObject *receiver, const char *returnMethod,
                          const char *errorMethod) const
{
    QDBusConnection bus = QDBusConnection::sessionBus();
    QDBusError error = whyUnsendable();
    if (!error.isValid()) {
        QDBusMessage call =
            QDBusMessage::createMethodCall(service(), objectPath(), interface(), method());
        call.setArguments(arguments());
        if (bus.callWithCallback(call, receiver, returnMethod, errorMethod)) {
            return true;
        }
        error = bus.lastError();
    }

    // Intended: the error's name and message fill one placeholder, and the last one stays unfilled.
    // Programs that read the log expect exactly this line.
    const QString text = QStringLiteral("Failed to initialize dbus call to: service=%1 path=%2 "
                                        "interface=%3 method=%4. Error was: %5 %6")
                             .arg(service(), objectPath(), interface(), method(),
                                  error.name() + QLatin1Char(' ') + error.message());
    qmlInfo(receiver).noquote() << text;
    return false;
}

bool QuickAction::operator==(const QuickAction &other) const
{
    return m_path == other.m_path && m_config == other.m_config && m_enabled == other.m_enabled;
}

QVariantMap QuickAction::readActionConfig(const QString &path) const
{
    if (findIniFault(path) != IniFault::None) {
        qWarning("Unable to open action file");
        return {};
    }
    QSettings settings(path, QSettings::IniFormat);
    if (settings.status() != QSettings::NoError) {
        qWarning("Unable to open action file");
        return {};
    }

    QVariantMap config;
    bool hasArguments = false;
    const QStringList keys = settings.allKeys(); // sorted
    for (const QString &key : keys) {
        const int groupLength = key.indexOf(QLatin1Char('/'));
        if (groupLength < 0) {
            config.insert(config.cend(), key, withStringList(settings.value(key)));
        } else if (key.leftRef(groupLength) == argumentsKey) {
            hasArguments = true;
        }
    }
    // An empty array becomes an entry, too. All other groups are ignored.
    if (hasArguments) {
        QVariantList arguments;
        const int size = qMin(settings.value(argumentsSizeKey).toInt(), enoughArguments);
        for (int i = 1; i <= size; ++i) {
            arguments.append(withStringList(settings.value(QString(argumentKey).arg(i))));
        }
        config.insert(argumentsKey, arguments);
    }
    return config;
}

QString QuickAction::text(const char *key) const
{
    return m_config.value(QLatin1String(key)).toString();
}
