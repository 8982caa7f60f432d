// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "simulatedfiles.h"

#include <QDir>
#include <QFile>
#include <QQmlInfo>

namespace {

// The prefix of files that are hidden. The module does not read hidden files.
const QString hidden = QStringLiteral(".away-");

} // namespace

bool SimulatedFiles::isPresent() const
{
    return !find(QString()).isEmpty();
}

void SimulatedFiles::setPresent(bool present)
{
    if (present == isPresent()) {
        return;
    }
    if (!m_content.isEmpty()) {
        make(present);
        Q_EMIT presentChanged();
        return;
    }
    const QFileInfoList entries = find(present ? hidden : QString());
    for (const QFileInfo &entry : entries) {
        const QString name =
            present ? entry.fileName().mid(hidden.size()) : hidden + entry.fileName();
        if (!entry.dir().rename(entry.fileName(), name)) {
            qmlWarning(this) << "cannot rename " << entry.filePath();
        }
    }
    Q_EMIT presentChanged();
}

void SimulatedFiles::make(bool present) const
{
    QFile file(m_path);
    const bool done = present
        ? file.open(QIODevice::WriteOnly) && file.write(m_content.toUtf8()) > 0
        : file.remove();
    if (!done) {
        qmlWarning(this) << m_path << ": " << file.errorString();
    }
}

QFileInfoList SimulatedFiles::find(const QString &prefix) const
{
    const QFileInfo info(m_path);
    QDir::Filters filters = QDir::AllEntries | QDir::NoDotAndDotDot;
    if (!prefix.isEmpty()) {
        filters |= QDir::Hidden;
    }
    return info.dir().entryInfoList({prefix + info.fileName()}, filters);
}
