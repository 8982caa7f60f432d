// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "commonchecks.h"

#include "files/regularfile.h"
#include "translations/catalogfiles.h"

#include <QRegularExpression>

#include <algorithm>
#include <numeric>

using Severity = Finding::Severity;

namespace {

const QLatin1String unreadableRule("unreadable");
const QLatin1String unknownKeyRule("unknown-key");
const QLatin1String catalogRule("catalog");
const QLatin1String textIdRule("text-id");
const QLatin1String relativePathRule("relative-path");

// Longer names are not typing errors, and comparing them would take long.
constexpr int longestName = 64;

// The number of letters to add, remove or replace.
int distance(const QString &left, const QString &right)
{
    std::vector<int> row(size_t(right.size()) + 1);
    std::iota(row.begin(), row.end(), 0);
    for (int i = 1; i <= left.size(); ++i) {
        int diagonal = row[0];
        row[0] = i;
        for (int j = 1; j <= right.size(); ++j) {
            const int replaced = diagonal + (left.at(i - 1) == right.at(j - 1) ? 0 : 1);
            diagonal = row[size_t(j)];
            row[size_t(j)] = std::min({replaced, diagonal + 1, row[size_t(j) - 1] + 1});
        }
    }
    return row.back();
}

// Keys that differ only in case, or in dashes and underscores, are most similar.
QString normalised(const QString &name)
{
    return name.toLower().replace(QLatin1Char('_'), QLatin1Char('-'));
}

QString nearest(const QString &name, const QStringList &known)
{
    if (name.size() > longestName) {
        return {};
    }
    QString best;
    int bestDistance = 0;
    for (const QString &candidate : known) {
        const int candidateDistance = distance(normalised(name), normalised(candidate));
        if (candidateDistance <= (candidate.size() + 1) / 3
            && (best.isEmpty() || candidateDistance < bestDistance)) {
            best = candidate;
            bestDistance = candidateDistance;
        }
    }
    return best;
}

} // namespace

bool reportUnreadable(const QString &path, qint64 maximumSize, QByteArray *content,
                      Findings *findings)
{
    RegularFile file = readRegularFile(path, maximumSize);
    QString text;
    switch (file.state) {
    case RegularFile::State::Read:
        *content = file.content;
        return false;
    case RegularFile::State::NotOpened:
    case RegularFile::State::Failed:
        text = QStringLiteral("the file cannot be opened");
        break;
    case RegularFile::State::NotRegular:
        text = QStringLiteral("this is not a regular file");
        break;
    case RegularFile::State::TooLarge:
        text = QStringLiteral("the file is larger than %1 MiB and is not read")
                   .arg(maximumSize / 1024 / 1024);
        break;
    }
    findings->add(1, Severity::Error, unreadableRule, text);
    return true;
}

void reportUnknownKey(const QString &what, const QString &name, const QStringList &known, int line,
                      Findings *findings)
{
    QString text = QStringLiteral("unknown %1 %2").arg(what, quoted(name));
    const QString meant = nearest(name, known);
    if (!meant.isEmpty()) {
        text += QStringLiteral("; is %1 meant?").arg(quoted(meant));
    }
    findings->add(line, Severity::Warning, unknownKeyRule, text);
}

void checkCatalog(const QString &catalog, int line, CheckContext *context, Findings *findings)
{
    const QLatin1String suffix = CatalogFiles::engineeringEnglishSuffix;
    if (catalog.endsWith(suffix)) {
        findings->add(line, Severity::Warning, catalogRule,
                      QStringLiteral("the catalog %1 is named with the suffix of its engineering "
                                     "English; only with %2 are other languages shown")
                          .arg(quoted(catalog), quoted(catalog.chopped(suffix.size()))));
        return;
    }
    InstalledCatalogs &catalogs = context->catalogs;
    if (catalog.isEmpty() || context->ignoresCatalogs || catalogs.hasEngineeringEnglish(catalog)) {
        return;
    }
    const QString file =
        quoted(catalog + CatalogFiles::engineeringEnglishSuffix + QStringLiteral(".qm"));
    findings->add(line, Severity::Warning, catalogRule,
                  catalogs.languages(catalog).isEmpty()
                      ? QStringLiteral("the catalog %1 is not installed in %2")
                            .arg(quoted(catalog), catalogs.directory())
                      : QStringLiteral("%1 is not installed in %2: languages without a catalog of "
                                       "their own show identifiers")
                            .arg(file, catalogs.directory()));
}

void checkTextId(const QString &id, const QString &catalog, int line, CheckContext *context,
                 Findings *findings)
{
    InstalledCatalogs &catalogs = context->catalogs;
    const bool isInstalled = !catalog.isEmpty() && !context->ignoresCatalogs
        && (catalogs.hasEngineeringEnglish(catalog) || !catalogs.languages(catalog).isEmpty());
    if (!id.isEmpty() && isInstalled && !catalogs.holds(catalog, id)) {
        findings->add(line, Severity::Warning, textIdRule,
                      QStringLiteral("the catalog %1 does not hold the text %2")
                          .arg(quoted(catalog), quoted(id)));
    }
}

void checkIcon(const QString &icon, int line, Findings *findings)
{
    static const QRegularExpression anywhere(QStringLiteral("^(/|[a-zA-Z][a-zA-Z0-9+.-]*:)"));
    static const QRegularExpression path(QStringLiteral("/|\\.(png|svg|svgz|jpg|jpeg|webp|gif)$"),
                                         QRegularExpression::CaseInsensitiveOption);
    if (!anywhere.match(icon).hasMatch() && path.match(icon).hasMatch()) {
        findings->add(line, Severity::Warning, relativePathRule,
                      QStringLiteral("the icon %1 is a relative path").arg(quoted(icon)));
    }
}
