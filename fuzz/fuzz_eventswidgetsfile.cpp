// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// The input is a definition file of events widgets, which the model reads and marlo-definitions
// checks.

#include "definitions-tool/definitionschecker.h"
#include "eventswidgets/eventswidgetsfile.h"
#include "fuzzing.h"

#include <algorithm>

// Functions of the leak sanitizer.
extern "C" {
__attribute__((weak)) void __lsan_disable();
__attribute__((weak)) void __lsan_enable();
}

namespace {

// QJsonDocument leaks an object or array whose key is repeated.
class LeaksAreIgnored
{
public:
    LeaksAreIgnored()
    {
        if (__lsan_disable != nullptr) {
            __lsan_disable();
        }
    }
    ~LeaksAreIgnored()
    {
        if (__lsan_enable != nullptr) {
            __lsan_enable();
        }
    }
    Q_DISABLE_COPY_MOVE(LeaksAreIgnored)
};

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t *data, std::size_t size)
{
    const LeaksAreIgnored leaksAreIgnored;
    const QByteArray text(reinterpret_cast<const char *>(data), int(size));
    const QString path = Fuzzing::writeFile("widgets.json", text);
    const std::optional<EventsWidgetsFile> file = readEventsWidgetsFile(path);
    if (file) {
        for (const auto &widget : file->widgets) {
            Fuzzing::require(!widget.path.isEmpty(), "a widget has a path");
            Fuzzing::require(widget.translationCatalog == file->translationCatalog,
                             "a widget has the catalog of its file");
        }
    }

    DefinitionsChecker checker(QStringLiteral("/nowhere"));
    Fuzzing::require(checker.check(path), "the file is checked");
    const std::vector<Finding> &findings = checker.findings();
    const bool isRefused =
        std::any_of(findings.cbegin(), findings.cend(), [](const Finding &finding) {
            return finding.rule == QLatin1String("json")
                || finding.rule == QLatin1String("unreadable");
        });
    Fuzzing::require(isRefused != file.has_value(), "the check refuses what the model refuses");
    const int lines = text.count('\n') + 1;
    Fuzzing::require(std::all_of(findings.cbegin(), findings.cend(),
                                 [lines](const Finding &finding) {
                                     return finding.line >= 1 && finding.line <= lines;
                                 }),
                     "each finding is in a line of the file");
    return 0;
}
