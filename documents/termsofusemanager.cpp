// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "termsofusemanager.h"

#include "files/literals.h"
#include "files/regularfile.h"

#include <QBuffer>
#include <QtDebug>

namespace {

constexpr QLatin1String platformPath = "/usr/share/marlo-settings/platform-eula"_L1;
constexpr QLatin1String platformTerms = "/tarnwick_termsofuse-"_L1;
constexpr QLatin1String vendorTerms = "/full/"_L1;
constexpr QLatin1String vendorSummary = "/summary/"_L1;
constexpr QLatin1String suffix = ".txt"_L1;

constexpr QLatin1String english = "en_GB"_L1;
constexpr int languageLength = 2;

// The path of the best file; empty if there is neither one for the locale nor one in English.
QString findTerms(const QString &base, const QString &localeName)
{
    // Intended: after the full name comes the language alone, and only then the name without its
    // encoding. Terms are installed by language, and vendors rely on this order.
    QStringList candidates = {localeName, localeName.left(languageLength)};
    const int encoding = localeName.indexOf(QLatin1Char('.'));
    if (encoding > 0) {
        candidates.append(localeName.left(encoding));
    }
    for (const QString &candidate : qAsConst(candidates)) {
        QString path = base + candidate + suffix;
        if (fileExists(path)) {
            return path;
        }
    }

    if (localeName == english) {
        return {};
    }
    qWarning() << "TermsOfUseManager: unable to load locale-specific terms for locale"
               << localeName;
    return findTerms(base, english);
}

QStringList readTerms(const QString &base, const QString &localeName)
{
    const QString path = findTerms(base, localeName);
    if (path.isEmpty()) {
        qWarning() << "TermsOfUseManager: unable to load either the specified locale or the "
                      "English terms";
        return {};
    }
    RegularFile file = readRegularFile(path, maximumTextSize);
    if (file.state != RegularFile::State::Read) {
        qWarning() << "TermsOfUseManager: unable to load terms from file" << path;
        qWarning() << file.error;
        return {};
    }
    QBuffer text(&file.content);
    text.open(QIODevice::ReadOnly | QIODevice::Text);
    const QString title = textUpToNul(text.readLine()).trimmed();
    const QString body = textUpToNul(text.readAll()).trimmed();
    return {title, body};
}

} // namespace

/*!
    \qmltype TermsOfUseManager
    \inqmlmodule com.marlo.settings.system
    \brief Finds and reads the terms of use in the user's language.

    Terms are UTF-8 text files named by locale. For the locale name \c fi_FI.UTF-8 the type reads
    the first of \c fi_FI.UTF-8.txt, \c fi.txt and \c fi_FI.txt that exists; for \c fi_FI, which has
    no encoding, \c fi_FI.txt or \c{fi.txt}. Otherwise it warns and reads British English,
    \c{en_GB.txt} or \c{en.txt}.

    The first line of a file is the title, and everything after it is the body. White space around
    both is removed. A file of more than 16 MiB counts as unreadable.

    \qml
    Label {
        readonly property var terms: manager.platformTermsOfUse(Qt.locale().name)

        text: terms.length > 0 ? terms[1] : "There are no terms"
        wrapMode: Text.Wrap

        TermsOfUseManager { id: manager }
    }
    \endqml

    \image gallery-terms.png The gallery's page for this type

    \section1 What may surprise
    \section2 The language alone goes before the name without its encoding
    Terms are installed by language, and vendors rely on the order of the files.

    \section2 Vendor terms without a path
    The vendor methods do not check \l vendorPath. Without one they search below the root of the
    file system and return an empty list after warnings. Check \l hasVendorTermsOfUse first.
*/

/*!
    \qmlproperty bool TermsOfUseManager::hasVendorTermsOfUse
    \readonly

    Whether \l vendorPath is set and exists in the file system. Every read checks it again, but the change signal is
    emitted only when \l vendorPath changes.
*/
bool TermsOfUseManager::hasVendorTermsOfUse() const
{
    return fileExists(m_vendorPath);
}

/*!
    \qmlproperty string TermsOfUseManager::vendorPath

    The directory of the vendor's terms. Empty by default.
*/
void TermsOfUseManager::setVendorPath(const QString &path)
{
    if (m_vendorPath != path) {
        m_vendorPath = path;
        Q_EMIT vendorPathChanged();
    }
}

/*!
    \qmlmethod list<string> TermsOfUseManager::platformTermsOfUse(string localeName)
    \qmlmethod list<string> TermsOfUseManager::vendorTermsOfUse(string localeName)
    \qmlmethod list<string> TermsOfUseManager::vendorTermsSummary(string localeName)

    Return the title and the body of the terms for \a localeName. The list is empty, with warnings
    in the log, if there are no terms or they cannot be read. The platform's terms are in
    \c{/usr/share/marlo-settings/platform-eula/tarnwick_termsofuse-<locale>.txt}, the vendor's full
    terms and their summary in the directories \c full and \c summary below \l vendorPath.
*/
QStringList TermsOfUseManager::platformTermsOfUse(const QString &localeName) const
{
    return readTerms(platformPath + platformTerms, localeName);
}

QStringList TermsOfUseManager::vendorTermsOfUse(const QString &localeName) const
{
    return readTerms(m_vendorPath + vendorTerms, localeName);
}

QStringList TermsOfUseManager::vendorTermsSummary(const QString &localeName) const
{
    return readTerms(m_vendorPath + vendorSummary, localeName);
}

/*!
    \qmlsignal TermsOfUseManager::vendorPathChanged()

    Emitted after \l vendorPath has changed.
*/
