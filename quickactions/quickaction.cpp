// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "quickaction.h"

#include "files/inifile.h"

#include <QDBusConnection>
#include <QDBusMessage>
#include <QDBusMetaType>
#include <QFile>
#include <QQmlInfo>
#include <QSettings>

#include <algorithm>
#include <cstring>

#include <sys/stat.h>

namespace {

constexpr auto argumentsKey = "remote-arguments"_L1;
constexpr auto argumentKey = "argument"_L1; // of an element of the array

// The longest signature that D-Bus allows.
constexpr std::size_t maximumSignature = 255;
// More arguments than a call can have. A file may claim to have any number of them.
constexpr int enoughArguments = 256;

// Reserved for D-Bus libraries: the bus disconnects a client that sends a message whose path or interface
// begins with one of these. It does not compare the rest.
constexpr auto reservedPath = "/org/freedesktop/DBus/Local"_L1;
constexpr auto reservedInterface = "org.freedesktop.DBus.Local"_L1;

std::optional<QVariantMap> unreadable()
{
    qWarning("Unable to open action file");
    return {};
}

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

// Empty if the file cannot be read.
std::optional<QVariantMap> readConfig(const QString &path)
{
    if (findIniFault(path) != IniFault::None) {
        return unreadable();
    }
    QSettings settings(path, QSettings::IniFormat);
    if (settings.status() != QSettings::NoError) {
        return unreadable();
    }

    QVariantMap config;
    const QStringList keys = settings.childKeys(); // sorted
    for (const QString &key : keys) {
        config.insert(config.cend(), key, withStringList(settings.value(key)));
    }
    // An empty array becomes an entry, too. All other groups are ignored.
    if (settings.childGroups().contains(argumentsKey)) {
        QVariantList arguments;
        const int size = std::min(settings.beginReadArray(argumentsKey), enoughArguments);
        for (int i = 0; i < size; ++i) {
            settings.setArrayIndex(i);
            arguments.append(withStringList(settings.value(argumentKey)));
        }
        settings.endArray();
        config.insert(argumentsKey, arguments);
    }
    return config;
}

// The signature of a value as QSettings returns it, or null if D-Bus cannot carry the value.
const char *signatureOf(const QVariant &value)
{
    if (value.userType() == QMetaType::QVariantList) {
        const QVariantList list = value.toList();
        if (!std::all_of(list.cbegin(), list.cend(), signatureOf)) {
            return nullptr;
        }
    }
    return QDBusMetaType::typeToSignature(value.userType());
}

} // namespace

QuickAction::QuickAction(const QString &path, bool enabled)
    : m_path(path), m_stamp(stampOf(path)), m_enabled(enabled)
{
    const std::optional<QVariantMap> config = readConfig(path);
    m_isRead = config.has_value();
    m_config = config.value_or(QVariantMap());
    // Read as text: as a variant, a number that is too large for an integer would wrap around.
    bool isInteger = false;
    const int priority = text("priority"_L1).toInt(&isInteger);
    if (isInteger) {
        m_priority = priority;
    }
}

QuickAction QuickAction::reread(bool enabled) const
{
    if (!m_isRead || !m_stamp || m_stamp != stampOf(m_path)) {
        return {m_path, enabled};
    }
    QuickAction action(*this);
    action.m_enabled = enabled;
    return action;
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
    if (objectPath().startsWith(reservedPath)) {
        return {QDBusError::InvalidObjectPath, QStringLiteral("The path is reserved")};
    }
    if (interface().startsWith(reservedInterface)) {
        return {QDBusError::InvalidInterface, QStringLiteral("The interface is reserved")};
    }
    std::size_t signature = 0;
    const QVariantList arguments = this->arguments();
    for (const QVariant &argument : arguments) {
        const char *type = signatureOf(argument);
        if (type == nullptr) {
            return {QDBusError::InvalidArgs, QStringLiteral("An argument has no D-Bus type")};
        }
        signature += std::strlen(type);
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
    return readConfig(path).value_or(QVariantMap());
}

std::optional<QuickAction::Stamp> QuickAction::stampOf(const QString &path)
{
    struct stat file = {};
    if (stat(QFile::encodeName(path).constData(), &file) != 0) {
        return {};
    }
    return Stamp{qint64(file.st_dev), qint64(file.st_ino),  file.st_size,
                 file.st_ctim.tv_sec, file.st_ctim.tv_nsec, file.st_mtim.tv_sec,
                 file.st_mtim.tv_nsec};
}
