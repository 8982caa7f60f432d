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
    A mistake, or a possible one, in a line of a definition file.
*/
struct Finding {
    enum class Severity { Error, Warning, Note };

    QString file;
    int line; // From 1; findings about the whole file have 1, too.
    Severity severity;
    QString rule; // Names the kind of the finding.
    QString text;
};

// The findings about one file.
class Findings
{
public:
    explicit Findings(QString file) : m_file(std::move(file)) { }

    // Keeps a limited number of findings of each severity. One more then says that others are left
    // out.
    void add(int line, Finding::Severity severity, QLatin1String rule, const QString &text);
    // Returns them in the order of lines.
    std::vector<Finding> take();

private:
    QString m_file;
    std::vector<Finding> m_findings;
    std::array<int, 3> m_counts = {};
};

// FILE:LINE: error|warning|note: text [rule], without a line break.
QString toText(const Finding &finding);
// A JSON array with one object for each finding.
QByteArray toJson(const std::vector<Finding> &findings);

// Returns the text in double quotes and on one line, and shortens long texts.
QString quoted(const QString &text);

#endif
