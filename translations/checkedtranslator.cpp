// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "checkedtranslator.h"

#include "catalogcheck.h"
#include "files/regularfile.h"

#include <QCoreApplication>
#include <QtDebug>

CheckedTranslator::~CheckedTranslator()
{
    // QTranslator would do this only after the content is freed, and another thread may look a text
    // up until then.
    if (QCoreApplication::instance() != nullptr) {
        QCoreApplication::removeTranslator(this);
    }
}

QString CheckedTranslator::loadFile(const QString &path)
{
    return loadContent(readRegularFile(path, maximumCatalogSize));
}

bool CheckedTranslator::loadFileIfFound(const QString &path)
{
    const RegularFile file = readRegularFile(path, maximumCatalogSize);
    const QString refusal = loadContent(file);
    if (!path.isEmpty() && !refusal.isEmpty()) {
        qWarning() << "The translation catalog" << path << "is not used:" << qPrintable(refusal);
    }
    return file.state == RegularFile::State::Read;
}

QString CheckedTranslator::loadContent(RegularFile file)
{
    QString refusal =
        file.state == RegularFile::State::Read ? whyUnusableCatalog(file.content) : file.error;
    if (!refusal.isEmpty() && isEmpty()) {
        return refusal; // To empty it again would post another language change.
    }
    const int size = refusal.isEmpty() ? file.content.size() : 0;
    file.content.append(catalogPadding, '\0');
    // Without content this empties the translator.
    if (!load(reinterpret_cast<const uchar *>(file.content.constData()), size)
        && refusal.isEmpty()) {
        refusal = QStringLiteral("its plural rules are damaged");
    }
    // Only now, because the translator has used the content of the last file until here.
    m_content = file.content;
    return refusal;
}
