// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef REGULARFILE_H
#define REGULARFILE_H

#include <QByteArray>

class QString;

/*
    What a file that somebody else put there holds, if it is one to be read: whatever has taken its
    place, opening it waits for nobody, and no more than a given size is taken into memory.
*/
struct RegularFile {
    enum class State {
        Read,
        NotOpened, // There is nothing, or nothing that may be opened.
        NotRegular, // A folder, a pipe, a device.
        TooLarge,
    };

    State state = State::NotOpened;
    QByteArray content; // Once read.
};

RegularFile readRegularFile(const QString &path, qint64 maximumSize);

#endif
