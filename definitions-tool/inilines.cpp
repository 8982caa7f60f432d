// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "inilines.h"

#include "files/characters.h"

#include <QByteArray>

#include <algorithm>

namespace {

// QString::fromLatin1(text) would stop at the first NUL.
QString fromLatin1(const QByteArray &text)
{
    return QString::fromLatin1(text.constData(), text.size());
}

// Names are escaped as in a URL, and a backslash separates groups.
QString unescaped(const QByteArray &name)
{
    return fromLatin1(QByteArray::fromPercentEncoding(name).replace('\\', '/'));
}

QString sectionName(const QByteArray &text, const IniLine &line)
{
    const QByteArray name = text.mid(line.start + 1, line.nameEnd - line.start - 1).trimmed();
    if (name.compare("general", Qt::CaseInsensitive) == 0) {
        return {};
    }
    const bool isEscapedGeneral = name.compare("%general", Qt::CaseInsensitive) == 0;
    return (isEscapedGeneral ? fromLatin1(name.mid(1)) : unescaped(name)) + QLatin1Char('/');
}

// QSettings removes only blanks and tabs.
QByteArray withoutTrailingBlanks(QByteArray name)
{
    while (name.endsWith(' ') || name.endsWith('\t')) {
        name.chop(1);
    }
    return name;
}

} // namespace

std::vector<NamedIniLine> readIniLines(const QByteArray &text)
{
    std::vector<NamedIniLine> lines;
    QString section;
    int number = 1;
    int counted = 0;
    for (IniLine span = nextIniLine(text, 0); span.kind != IniLine::Kind::None;
         span = nextIniLine(text, span.end)) {
        number += int(std::count(text.cbegin() + counted, text.cbegin() + span.start, '\n'));
        counted = span.start;

        NamedIniLine line;
        static_cast<IniLine &>(line) = span;
        line.number = number;
        line.isAscii =
            std::all_of(text.cbegin() + span.start, text.cbegin() + span.end,
                        [](char character) { return static_cast<signed char>(character) >= 0; });
        switch (span.kind) {
        case IniLine::Kind::Section:
            section = sectionName(text, span);
            line.name = section;
            break;
        case IniLine::Kind::Key: {
            const auto before = text.cbegin() + span.start;
            line.isMarked = text.startsWith(byteOrderMark)
                && std::none_of(text.cbegin(), before, [](char character) {
                                return character == '\n' || character == '\r';
                            });
            const int start = line.isMarked ? 0 : span.start;
            line.name =
                section + unescaped(withoutTrailingBlanks(text.mid(start, span.nameEnd - start)));
            line.isCut = span.end < text.size() && text.at(span.end) == ';'
                && !isSpace(text.at(span.end - 1));
            break;
        }
        default:
            line.name = fromLatin1(text.mid(span.start, span.end - span.start));
            break;
        }
        lines.push_back(line);
    }
    return lines;
}
