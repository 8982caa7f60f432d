// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef FINDING_H
#define FINDING_H

#include <QByteArray>
#include <QString>

#include <array>
#include <utility>
#include <vector>

/*
    Something that is to be said about a line of a definition file.
*/
struct Finding {
    enum class Severity { Error, Warning, Note };

    QString file;
    int line; // From 1; that too for what concerns the whole file.
    Severity severity;
    QString rule; // A word by which findings of the same kind are known.
    QString text;
};

// The findings about one file.
class Findings
{
public:
    explicit Findings(QString file) : m_file(std::move(file)) { }

    // Of each severity, keeps no more than anybody reads, and says so.
    void add(int line, Finding::Severity severity, QLatin1String rule, const QString &text);
    // In the order of lines.
    std::vector<Finding> take();

private:
    QString m_file;
    std::vector<Finding> m_findings;
    std::array<int, 3> m_counts = {};
};

// FILE:LINE: error|warning|note: text [rule], without the end of the line.
QString toText(const Finding &finding);
// An array with an object for each.
QByteArray toJson(const std::vector<Finding> &findings);

// In double quotes and, whatever it holds, on one line of reasonable length.
QString quoted(const QString &text);

#endif
