// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "commonchecks.h"

#include "files/literals.h"
#include "files/regularfile.h"
#include "rules.h"
#include "translations/catalogfiles.h"

#include <QFileInfo>
#include <QRegularExpression>
#include <QUrl>

#include <algorithm>
#include <numeric>
#include <set>

using Severity = Finding::Severity;

namespace {

constexpr auto fileScheme = "file"_L1;
constexpr auto imageScheme = "image"_L1;

// The number of texts that one finding names.
constexpr int maximumListed = 2;

// Longer names are not typing errors, and the time of a comparison grows with the square.
constexpr int longestName = 64;

// Returns how many letters must be added, removed or replaced to turn one name into the other.
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

// Ignores case and the difference between dashes and underscores.
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
    findings->add(1, Severity::Error, Rule::unreadable, text);
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
    findings->add(line, Severity::Warning, Rule::unknownKey, text);
}

void checkCatalog(const QString &catalog, int line, CheckContext *context, Findings *findings)
{
    const QLatin1String suffix = CatalogFiles::engineeringEnglishSuffix;
    if (catalog.endsWith(suffix)) {
        findings->add(line, Severity::Warning, Rule::catalog,
                      QStringLiteral("the catalog %1 is named with the suffix of its engineering "
                                     "English; only with %2 are other languages shown")
                          .arg(quoted(catalog), quoted(catalog.chopped(suffix.size()))));
        return;
    }
    if (!catalog.isEmpty() && !CatalogFiles::isCatalogName(catalog)) {
        findings->add(line, Severity::Error, Rule::catalog,
                      QStringLiteral("the catalog %1 is not used: its name must not have a \"/\"")
                          .arg(quoted(catalog)));
        return;
    }
    if (catalog.isEmpty() || context->ignoresCatalogs) {
        return;
    }
    const InstalledCatalogs::Catalog &installed = context->catalogs.find(catalog);
    const QString directory = context->catalogs.directory();
    if (!installed.isInstalled()) {
        findings->add(line, Severity::Warning, Rule::catalog,
                      QStringLiteral("the catalog %1 is not installed in %2")
                          .arg(quoted(catalog), directory));
    } else if (!installed.hasEngineeringEnglish) {
        findings->add(line, Severity::Warning, Rule::catalog,
                      QStringLiteral("%1 is not installed in %2: languages without a catalog of "
                                     "their own show identifiers")
                          .arg(quoted(catalog + suffix + CatalogFiles::suffix), directory));
    }
}

void checkTextIds(const std::vector<TextId> &ids, const QString &catalog, int line,
                  CheckContext *context, Findings *findings)
{
    if (!CatalogFiles::isCatalogName(catalog) || context->ignoresCatalogs
        || !context->catalogs.find(catalog).isInstalled()) {
        return;
    }
    const InstalledCatalogs::Catalog &installed = context->catalogs.find(catalog);
    std::set<QString> held;
    for (const TextId &text : ids) {
        if (text.id.isEmpty() || held.count(text.id) > 0) {
            continue;
        }
        if (installed.holds(text.id)) {
            held.insert(text.id);
        } else {
            findings->add(text.line, Severity::Warning, Rule::textId,
                          QStringLiteral("the catalog %1 does not hold the text %2")
                              .arg(quoted(catalog), quoted(text.id)));
        }
    }
    for (const InstalledCatalogs::Language &language : installed.languages) {
        QStringList missing;
        for (const QString &id : held) {
            const QString text = language.text(id);
            // lrelease compiles an unfinished translation to its source text, which is engineering
            // English, or to nothing.
            const bool isUnfinished = installed.hasEngineeringEnglish && !language.name.isEmpty()
                && !language.name.startsWith("en"_L1)
                && text == installed.languages.front().text(id);
            if (text.isEmpty() || isUnfinished) {
                missing.append(quoted(id));
            }
        }
        if (!missing.isEmpty()) {
            const int more = missing.size() - maximumListed;
            QString list = QStringList(missing.mid(0, maximumListed)).join(", "_L1);
            if (more > 0) {
                list += QStringLiteral(" and %1 more").arg(more);
            }
            findings->add(
                line, Severity::Note, Rule::translation,
                QStringLiteral("not translated in %1: %2").arg(quoted(language.fileName), list));
        }
    }
}

QString schemeOf(const QString &text)
{
    static const QRegularExpression scheme(QStringLiteral("^([a-zA-Z][a-zA-Z0-9+.-]*):"));
    return scheme.match(text).captured(1).toLower();
}

void checkLocation(const QString &what, const QString &location, const QStringList &schemes,
                   int line, CheckContext *context, Findings *findings)
{
    const auto add = [&](Severity severity, QLatin1String rule, const QString &text) {
        findings->add(line, severity, rule,
                      QStringLiteral("the %1 %2 %3").arg(what, quoted(location), text));
    };
    if (location != location.trimmed()) {
        add(Severity::Warning, Rule::blank, QStringLiteral("begins or ends with a blank"));
        return;
    }
    const QString scheme = schemeOf(location);
    if (!scheme.isEmpty() && !schemes.contains(scheme)) {
        const QString meant = nearest(scheme, schemes);
        add(Severity::Warning, Rule::scheme,
            meant.isEmpty() ? QStringLiteral("is a URL that cannot be loaded")
                            : QStringLiteral("is a URL that cannot be loaded; is %1 meant?")
                                  .arg(quoted(meant + location.mid(scheme.size()))));
        return;
    }
    const QUrl url(scheme.isEmpty() ? QString() : location);
    if ((scheme == imageScheme && url.host().isEmpty())
        || (scheme == fileScheme && !url.host().isEmpty())) {
        add(Severity::Warning, Rule::scheme,
            QStringLiteral("must begin with %1")
                .arg(quoted(scheme == imageScheme ? QStringLiteral("image://PROVIDER/")
                                                  : QStringLiteral("file:///"))));
        return;
    }
    const QString path = scheme.isEmpty() ? location : url.toLocalFile();
    if (!context->isInstalled || !path.startsWith(QLatin1Char('/'))) {
        return;
    }
    QFileInfo file(context->root + path);
    if (file.isSymLink() && !file.exists()) {
        // In an image, the target of an absolute link is below the root.
        file.setFile(context->root + file.symLinkTarget());
    }
    if (!file.exists()) {
        add(Severity::Warning, Rule::missingFile, QStringLiteral("does not exist"));
    } else if (file.isDir()) {
        add(Severity::Warning, Rule::missingFile, QStringLiteral("is a directory"));
    } else if (!file.permission(QFile::ReadOther)) {
        add(Severity::Error, Rule::permissions,
            QStringLiteral("is a file that not every user can read"));
    }
}

void checkIcon(const QString &icon, int line, CheckContext *context, Findings *findings)
{
    static const QStringList schemes = {imageScheme,
                                        fileScheme,
                                        QStringLiteral("qrc"),
                                        QStringLiteral("data"),
                                        QStringLiteral("http"),
                                        QStringLiteral("https")};
    static const QRegularExpression path(QStringLiteral("/|\\.(png|svg|svgz|jpg|jpeg|webp|gif)$"),
                                         QRegularExpression::CaseInsensitiveOption);
    if (icon.startsWith(QLatin1Char('/')) || !schemeOf(icon).isEmpty()) {
        checkLocation(QStringLiteral("icon"), icon, schemes, line, context, findings);
    } else if (path.match(icon).hasMatch()) {
        findings->add(line, Severity::Warning, Rule::relativePath,
                      QStringLiteral("the icon %1 is a relative path").arg(quoted(icon)));
    }
}
