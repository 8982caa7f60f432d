// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef CHECKEDTRANSLATOR_H
#define CHECKEDTRANSLATOR_H

#include <QByteArray>
#include <QTranslator>

struct RegularFile;

// The size limit of a catalog file.
constexpr qint64 maximumCatalogSize = qint64(16) * 1024 * 1024;

/*
    A translator that no file can harm: it reads a catalog whole and checks it before QTranslator
    parses it. QTranslator maps the file instead, so that a file that is damaged, or that becomes
    shorter later, ends the process.
*/
class CheckedTranslator : public QTranslator
{
    Q_OBJECT

public:
    using QTranslator::QTranslator;
    ~CheckedTranslator() override;

    // Replaces the loaded catalog. Returns why the file is not used; empty if it is.
    QString loadFile(const QString &path);

    // Like loadFile(), but logs a warning if the file is not used. An empty path stands for a
    // catalog that does not exist, which is not an error. Returns whether the file was read.
    bool loadFileIfFound(const QString &path);

private:
    QString loadContent(RegularFile file);

    // QTranslator reads it, without a copy.
    QByteArray m_content;
};

#endif
