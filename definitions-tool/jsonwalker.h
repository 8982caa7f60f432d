// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef JSONWALKER_H
#define JSONWALKER_H

#include <QByteArray>
#include <QJsonValue>
#include <QString>

/*
    Visits the members of an object or the elements of an array, one after the other, in a text that
    QJsonDocument has accepted. QJsonDocument itself does not keep their positions.
*/
class JsonWalker
{
public:
    // The object or array begins at the position.
    JsonWalker(QByteArray text, int position);

    // Goes to the first item, and with each further call to the next item. Returns false at the end.
    bool next();

    QString key() const; // Only for members of an object.
    int position() const { return m_position; } // Of its value.
    // As QJsonDocument reads it, except that objects and arrays are empty.
    QJsonValue value() const;

private:
    int skipSpace(int position) const;
    int endOfString(int position) const;
    int endOfValue(int position) const;
    QJsonValue valueAt(int position, int end) const;

    const QByteArray m_text;
    const bool m_isObject;
    int m_key = 0;
    int m_position = 0;
    int m_end; // Where the item ends.
};

#endif
