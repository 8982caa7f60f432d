// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef EVERYTYPE_H
#define EVERYTYPE_H

#include <QObject>
#include <QQmlComponent>
#include <QQmlEngine>
#include <QString>
#include <QStringList>

#include <functional>
#include <map>
#include <memory>
#include <vector>

/*
    One object of each type of the built module, as a page has it, in a root that has everything
    that the types read.
*/
class EveryType
{
public:
    // Installs definition files, texts and all other files that the types read.
    static void installFiles();

    // Ends the test program if the module or one of its types is missing.
    EveryType();
    Q_DISABLE_COPY_MOVE(EveryType)

    static QStringList names();
    QObject *object(const QString &name) const;
    // An object whose property "it" is a new object of the type, or the singleton.
    std::unique_ptr<QObject> make(const QString &name) const;

    // The state of all types: each property, row and text that a method returns, one per line.
    QStringList state() const;
    // The state of one type, and the state of the types that depend only on files.
    QStringList state(const QString &name) const;
    QStringList stateOfFiles() const;

    // Reads or writes one of a type's own properties, or calls one of its methods.
    struct Use {
        QString name;
        std::function<void()> run;
    };
    std::vector<Use> uses(const QString &name) const;
    void useAll() const;

private:
    QStringList m_names;
    QQmlEngine m_engine;
    std::map<QString, std::unique_ptr<QQmlComponent>> m_components;
    std::map<QString, std::unique_ptr<QObject>> m_objects;
};

#endif
