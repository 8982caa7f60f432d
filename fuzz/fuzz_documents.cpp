// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// The input is the name of a locale, on the first line, and the text of terms of use.

#include "documents/termsofusemanager.h"
#include "documents/textfilereader.h"
#include "fuzzing.h"

#include <QDir>
#include <QUrl>

namespace {

// A text ends at its first NUL.
QString text(const QByteArray &data)
{
    return QString::fromUtf8(data.constData()).trimmed();
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t *data, std::size_t size)
{
    static const QString home = qEnvironmentVariable("HOME");
    static const bool made = QDir(home).mkpath(QStringLiteral("full"));
    Fuzzing::require(made, "the directory can be made");

    Bytes input(data, size);
    const QString localeName = QString::fromUtf8(input.takeUntil('\n'));
    const QByteArray content = input.rest();
    const QString path = Fuzzing::writeFile("full/en_GB.txt", content);

    const TextFileReader reader;
    const QString read = reader.readContent(path);
    Fuzzing::require(!read.isNull(), "the file is read");
    Fuzzing::require(!read.contains(QLatin1Char('\n')), "lines follow each other");
    Fuzzing::require(read.size() <= content.size(), "nothing is added");
    const QString collated =
        reader.collate(QUrl::fromLocalFile(home + QStringLiteral("/full")), localeName, localeName);
    Fuzzing::require(collated == (read.isEmpty() ? QString() : localeName + read),
                     "a directory of one file is that file");
    reader.collate(QUrl(localeName), localeName, localeName);
    reader.readContent(home + QLatin1Char('/') + localeName);

    TermsOfUseManager terms;
    terms.setVendorPath(home);
    terms.platformTermsOfUse(localeName);
    Fuzzing::require(terms.vendorTermsSummary(localeName).isEmpty(), "there is no summary");
    const QStringList full = terms.vendorTermsOfUse(QStringLiteral("en_GB.UTF-8"));
    // The line ends of every system are read as a newline.
    QByteArray unified = content;
    unified.replace("\r\n", "\n");
    const int end = unified.indexOf('\n');
    const QByteArray first = end < 0 ? unified : unified.left(end);
    const QByteArray rest = end < 0 ? QByteArray() : unified.mid(end + 1);
    if (!content.contains('\r')) {
        Fuzzing::require(full == QStringList({text(first), text(rest)}), "title and body are read");
    }
    Fuzzing::require(full.size() == 2, "there are a title and a body");
    terms.setVendorPath(localeName);
    terms.hasVendorTermsOfUse();
    terms.vendorTermsOfUse(localeName);
    return 0;
}
