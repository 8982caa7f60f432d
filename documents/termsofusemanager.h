// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef TERMSOFUSEMANAGER_H
#define TERMSOFUSEMANAGER_H

#include <QObject>
#include <QStringList>

// The terms of use of the platform and of the device's vendor in the user's language.
class TermsOfUseManager : public QObject
{
    Q_OBJECT
    Q_PROPERTY(bool hasVendorTermsOfUse READ hasVendorTermsOfUse NOTIFY vendorPathChanged)
    Q_PROPERTY(QString vendorPath READ vendorPath WRITE setVendorPath NOTIFY vendorPathChanged)

public:
    using QObject::QObject;

    bool hasVendorTermsOfUse() const;
    QString vendorPath() const { return m_vendorPath; }
    void setVendorPath(const QString &path);

    // Title and body; empty if there are no terms that can be read.
    Q_INVOKABLE QStringList platformTermsOfUse(const QString &localeName) const;
    Q_INVOKABLE QStringList vendorTermsOfUse(const QString &localeName) const;
    Q_INVOKABLE QStringList vendorTermsSummary(const QString &localeName) const;

Q_SIGNALS:
    void vendorPathChanged();

private:
    QString m_vendorPath;
};

#endif
