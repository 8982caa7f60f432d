// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef JSONREADER_H
#define JSONREADER_H

#include <QByteArray>
#include <QString>

#include <string_view>

/*
    Reads a JSON text from its first byte to its last and takes along what its user asks for:

        if (reader.beginObject()) {
            while (reader.nextMember(&key)) {
                if (key == "title") title = reader.readString(); else reader.skip();
            }
        }
        if (!reader.atEnd()) ... // it was no JSON

    QJsonDocument makes a tree of everything first, which takes several times as long, and looking
    values up in it half of that again. Both agree on what is JSON and on every value; of a repeated
    key the last one is to be taken. (Only a byte outside ASCII behind a backslash is an error here,
    and a byte-order mark at the start of a string stays.)
*/
class JsonReader
{
public:
    // The text has to outlive the reader.
    explicit JsonReader(const QByteArray &text);

    // If the next value is an object or an array: enters it. Else passes it and returns false.
    bool beginObject();
    bool beginArray();
    // The key of the next member, valid until the next call, or whether there is another element.
    // Its value has to be read or skipped. False behind the last one: the value is passed then.
    bool nextMember(std::string_view *key);
    bool nextElement();

    // Each passes the next value, whatever it is, and returns it if it is of the type.
    QString readString();
    bool readBool();
    int readInt(int defaultValue); // Only a whole number that fits counts.
    void skip();

    // Whether the whole text has been passed and was JSON.
    bool atEnd();

    // How many bytes stand before what is read next or, once the text has proved to be no JSON,
    // before the place where it did.
    int position();

private:
    // A string as it is written, without its quotes; plain if it stands for itself in ASCII.
    struct Literal {
        std::string_view text;
        bool isPlain;
    };

    bool begin(char token);
    bool next(char end);
    char peek();
    bool take(char token);
    void fail();
    Literal takeLiteral();
    QString decode(std::string_view text);
    QString decodeEscape(const char **at, const char *end);
    double takeNumber();
    bool takeWord(std::string_view word);

    const char *const m_start;
    const char *m_at;
    const char *const m_end;
    const char *m_failedAt = nullptr;
    QByteArray m_key;
    int m_depth = 0;
    bool m_isFirst = false;
    bool m_failed = false;
};

#endif
