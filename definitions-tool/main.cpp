// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// Shows authors of definition files how the models read them.

#include "definitionschecker.h"
#include "files/literals.h"
#include "listing.h"
#include "showing.h"
#include "translations/apptranslator.h"

#include <QCommandLineParser>
#include <QCoreApplication>
#include <QFileInfo>
#include <QHash>
#include <QLocale>
#include <QLoggingCategory>

#include <algorithm>
#include <cstdio>

namespace {

enum Status { Clean = 0, HasFindings = 1, CouldNotRun = 2 };

const char *const description =
    "Checks, lists and shows the definition files of quick actions (*.conf) and\n"
    "events widgets (*.json), with the readers of the models.\n"
    "\n"
    "  check [--strict] [--no-catalogs] [--format json] [--root DIR] [FILE|DIRECTORY...]\n"
    "  list [--catalogs]\n"
    "  show [--locale NAME] FILE";

int fail(const QString &text)
{
    std::fputs(qPrintable(QStringLiteral("marlo-definitions: %1\n").arg(text)), stderr);
    return CouldNotRun;
}

// The findings say more than the readers' warnings.
void silenceReaders()
{
    QLoggingCategory::setFilterRules(QStringLiteral("default.warning=false"));
}

// Returns the status, or a failure if the text cannot be written.
int print(const QByteArray &text, int status)
{
    const bool isWritten =
        std::fwrite(text.constData(), 1, size_t(text.size()), stdout) == size_t(text.size())
        && std::fflush(stdout) == 0;
    return isWritten ? status : fail(QStringLiteral("cannot write the result"));
}

// As in the plugin, the catalog of the settings pages is installed before those of definitions, which
// take precedence.
class SettingsCatalog
{
public:
    SettingsCatalog()
    {
        m_engineeringEnglish.loadEngineeringEnglish();
        QCoreApplication::installTranslator(&m_engineeringEnglish);
        m_language.loadDefaultLocale();
        QCoreApplication::installTranslator(&m_language);
    }

private:
    AppTranslator m_engineeringEnglish;
    AppTranslator m_language;
};

class Command
{
public:
    int run(const QStringList &arguments);

private:
    int check(const QStringList &paths);
    int list() const;
    int show(const QString &path) const;
    // Returns the first option on the command line that the command does not have, or an empty text.
    QString misplacedOption(const QStringList &allowed) const;

    QCommandLineParser m_parser;
};

int Command::run(const QStringList &arguments)
{
    m_parser.setApplicationDescription(QLatin1String(description));
    const QCommandLineOption help = m_parser.addHelpOption();
    const QCommandLineOption version = m_parser.addVersionOption();
    m_parser.addOptions({
        {QStringLiteral("strict"), QStringLiteral("check: warnings count as errors.")},
        {QStringLiteral("no-catalogs"),
         QStringLiteral("check: ignore which catalogs are installed, and what they hold.")},
        {QStringLiteral("format"), QStringLiteral("check: text, the default, or json."),
         QStringLiteral("format"), QStringLiteral("text")},
        {QStringLiteral("root"),
         QStringLiteral("check: the root of an image or of a package's staging directory, in which "
                        "catalogs are looked for and, unless files are named, definitions."),
         QStringLiteral("dir"), QStringLiteral("/")},
        {QStringLiteral("catalogs"),
         QStringLiteral("list: the catalogs that the models load, instead of the definitions.")},
        {QStringLiteral("locale"),
         QStringLiteral("show: the language of the texts, such as fi or pt_BR."),
         QStringLiteral("name")},
    });
    m_parser.addPositionalArgument(QStringLiteral("command"),
                                   QStringLiteral("check, list or show."));
    m_parser.addPositionalArgument(QStringLiteral("file"),
                                   QStringLiteral("Definition files, for check also directories."),
                                   QStringLiteral("[file...]"));
    if (!m_parser.parse(arguments)) {
        return fail(m_parser.errorText());
    }
    if (m_parser.isSet(help)) {
        return print(m_parser.helpText().toUtf8(), Clean);
    }
    if (m_parser.isSet(version)) {
        return print(
            QStringLiteral("%1 %2\n")
                .arg(QCoreApplication::applicationName(), QCoreApplication::applicationVersion())
                .toUtf8(),
            Clean);
    }

    QStringList operands = m_parser.positionalArguments();
    const QString command = operands.isEmpty() ? QString() : operands.takeFirst();
    static const QHash<QString, QStringList> options = {
        {QStringLiteral("check"),
         {QStringLiteral("strict"), QStringLiteral("no-catalogs"), QStringLiteral("format"),
          QStringLiteral("root")}},
        {QStringLiteral("list"), {QStringLiteral("catalogs")}},
        {QStringLiteral("show"), {QStringLiteral("locale")}},
    };
    if (!options.contains(command)) {
        return fail(QStringLiteral("the command is check, list or show; see --help"));
    }
    const QString misplaced = misplacedOption(options.value(command));
    if (!misplaced.isEmpty()) {
        return fail(QStringLiteral("%1 has no option --%2").arg(command, misplaced));
    }
    if (command == "check"_L1) {
        return check(operands);
    }
    if (command == "list"_L1) {
        return operands.isEmpty() ? list() : fail(QStringLiteral("list takes no files"));
    }
    return operands.size() == 1 ? show(operands.constFirst())
                                : fail(QStringLiteral("show takes one file"));
}

int Command::check(const QStringList &paths)
{
    silenceReaders();
    const QString format = m_parser.value(QStringLiteral("format"));
    if (format != "text"_L1 && format != "json"_L1) {
        return fail(QStringLiteral("the format is text or json"));
    }
    const QString root = m_parser.value(QStringLiteral("root"));
    if (!QFileInfo(root).isDir()) {
        return fail(QStringLiteral("there is no directory %1").arg(quoted(root)));
    }

    DefinitionsChecker checker(root);
    if (m_parser.isSet(QStringLiteral("no-catalogs"))) {
        checker.ignoreCatalogs();
    }
    int failure = Clean;
    if (paths.isEmpty() && !checker.checkInstalled()) {
        failure =
            fail(QStringLiteral("there are no directories of definitions in %1").arg(quoted(root)));
    }
    for (const QString &path : paths) {
        if (!checker.check(path)) {
            failure = fail(QStringLiteral("there is no %1").arg(quoted(path)));
        }
    }

    const std::vector<Finding> &findings = checker.findings();
    QByteArray text;
    if (format == "json"_L1) {
        text = toJson(findings);
    } else {
        for (const Finding &finding : findings) {
            text += toText(finding).toUtf8() + '\n';
        }
    }
    const bool isStrict = m_parser.isSet(QStringLiteral("strict"));
    const bool isClean =
        std::none_of(findings.cbegin(), findings.cend(), [isStrict](const Finding &finding) {
            return finding.severity == Finding::Severity::Error
                || (isStrict && finding.severity == Finding::Severity::Warning);
        });
    const int status = print(text, isClean ? Clean : HasFindings);
    return failure == Clean ? status : failure;
}

int Command::list() const
{
    const SettingsCatalog settings;
    const bool catalogs = m_parser.isSet(QStringLiteral("catalogs"));
    return print((catalogs ? listCatalogs() : listDefinitions()).toUtf8(), Clean);
}

int Command::show(const QString &path) const
{
    silenceReaders();
    if (m_parser.isSet(QStringLiteral("locale"))) {
        const QString name = m_parser.value(QStringLiteral("locale"));
        const QLocale locale(name);
        if (locale.language() == QLocale::C) {
            return fail(QStringLiteral("there is no locale %1").arg(quoted(name)));
        }
        QLocale::setDefault(locale);
    }
    const SettingsCatalog settings;
    const std::optional<QString> text = showDefinition(path);
    return text ? print(text->toUtf8(), Clean)
                : fail(QStringLiteral("no model reads %1").arg(quoted(path)));
}

QString Command::misplacedOption(const QStringList &allowed) const
{
    const QStringList given = m_parser.optionNames();
    const auto misplaced = std::find_if(given.cbegin(), given.cend(), [&](const QString &option) {
        return !allowed.contains(option);
    });
    return misplaced == given.cend() ? QString() : *misplaced;
}

} // namespace

int main(int argc, char *argv[])
{
    const QCoreApplication application(argc, argv);
    QCoreApplication::setApplicationName(QStringLiteral("marlo-definitions"));
    QCoreApplication::setApplicationVersion(QStringLiteral(VERSION));
    return Command().run(QCoreApplication::arguments());
}
