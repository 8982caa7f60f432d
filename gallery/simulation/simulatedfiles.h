// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef SIMULATEDFILES_H
#define SIMULATEDFILES_H

#include <QByteArray>
#include <QFileInfoList>
#include <QObject>
#include <QString>

/*
    Sample files that can be hidden and shown again, as if a package was removed and installed.
*/
class SimulatedFiles : public QObject
{
    Q_OBJECT
    // A file or a directory. Wildcards in its name select several.
    Q_PROPERTY(QString path MEMBER m_path NOTIFY presentChanged)
    // If set, the file is not a sample: it is created with this content, and removed.
    Q_PROPERTY(QString content MEMBER m_content)
    Q_PROPERTY(bool present READ isPresent WRITE setPresent NOTIFY presentChanged)

public:
    using QObject::QObject;

    bool isPresent() const;
    void setPresent(bool present);

Q_SIGNALS:
    void presentChanged();

private:
    void make(bool present) const;
    QFileInfoList find(const QString &prefix) const;

    QString m_path;
    QString m_content;
};

#endif
