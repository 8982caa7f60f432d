// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "finding.h"

#include "rules.h"

#include <QJsonArray>
#include <QJsonDocument>
#include <QJsonObject>

#include <algorithm>

namespace {

constexpr int maximumFindings = 1000;
constexpr int maximumQuote = 80;

QString nameOf(Finding::Severity severity)
{
    switch (severity) {
    case Finding::Severity::Error:
        return QStringLiteral("error");
    case Finding::Severity::Warning:
        return QStringLiteral("warning");
    case Finding::Severity::Note:
        break;
    }
    return QStringLiteral("note");
}

// File names and contents are untrusted, and are printed to terminals.
QString onOneLine(const QString &text)
{
    QString line;
    for (const QChar character : text) {
        if (character.isPrint() || character.isSurrogate()) {
            line += character;
        } else {
            line += QStringLiteral("\\u%1").arg(character.unicode(), 4, 16, QLatin1Char('0'));
        }
    }
    return line;
}

} // namespace

void Findings::add(int line, Finding::Severity severity, QLatin1String rule, const QString &text)
{
    int &count = m_counts.at(size_t(severity));
    ++count;
    if (count <= maximumFindings) {
        m_findings.push_back({m_file, line, severity, rule, text});
    } else if (count == maximumFindings + 1) {
        m_findings.push_back({m_file, line, severity, Rule::tooMany,
                              QStringLiteral("further findings of this severity are left out")});
    }
}

std::vector<Finding> Findings::take()
{
    std::stable_sort(
        m_findings.begin(), m_findings.end(),
        [](const Finding &left, const Finding &right) { return left.line < right.line; });
    return std::move(m_findings);
}

QString toText(const Finding &finding)
{
    return QStringLiteral("%1:%2: %3: %4 [%5]")
        .arg(onOneLine(finding.file), QString::number(finding.line), nameOf(finding.severity),
             finding.text, finding.rule);
}

QByteArray toJson(const std::vector<Finding> &findings)
{
    QJsonArray array;
    for (const Finding &finding : findings) {
        array.append(QJsonObject{
            {QStringLiteral("file"), finding.file},
            {QStringLiteral("line"), finding.line},
            {QStringLiteral("severity"), nameOf(finding.severity)},
            {QStringLiteral("rule"), finding.rule},
            {QStringLiteral("text"), finding.text},
        });
    }
    return QJsonDocument(array).toJson();
}

QString quoted(const QString &text)
{
    QString shown = onOneLine(text.left(maximumQuote));
    if (text.size() > maximumQuote) {
        shown += QStringLiteral("…");
    }
    return QLatin1Char('"') + shown + QLatin1Char('"');
}
