// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef SOAK_H
#define SOAK_H

#include "world.h"

#include <QElapsedTimer>
#include <QPointer>
#include <QQmlEngine>
#include <QRandomGenerator>

#include <vector>

/*
    At random, makes objects of all the module's types, sets their properties and calls their
    methods, while their environment changes. From time to time it deletes all objects. The process
    must then use no more memory and files than before.
*/
class Soak
{
public:
    explicit Soak(quint32 seed);
    ~Soak();
    Q_DISABLE_COPY_MOVE(Soak)

    // Prints a line for each measurement. Returns whether nothing has grown.
    bool run(int seconds);

private:
    struct Measurement {
        qint64 memory; // KiB
        int files;
    };

    int random(int bound) { return int(m_random.bounded(bound)); }
    template<typename List> auto anyOf(const List &list)
    {
        return *(list.begin() + random(int(list.size())));
    }
    void step();
    void makeObject();
    void changeLanguage();
    void useProperty(QObject *object);
    void callMethod(QObject *object);
    void readModel(QObject *object);
    QVariant argumentFor(int type);
    void settle();
    Measurement measure();

    QRandomGenerator m_random;
    World m_world;
    QQmlEngine m_engine;
    QStringList m_creatable;
    QStringList m_singletons;
    std::vector<QPointer<QObject>> m_objects;
    QElapsedTimer m_time;
    qint64 m_steps = 0;
};

#endif
