// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "files.h"
#include "messagelog.h"
#include "mgconfitem.h"
#include "texts.h"

#include <QQmlContext>
#include <QQmlEngine>
#include <QtQuickTest>

#include <memory>

/*
    The environment of a QML test: files, dconf keys and messages.
*/
class ThrowAwayRoot : public QObject
{
    Q_OBJECT

public:
    using QObject::QObject;

    Q_INVOKABLE void writeFile(const QString &path, const QString &content) const
    {
        Files::write(path, content.toUtf8());
    }
    Q_INVOKABLE void removeFile(const QString &path) const { Files::remove(path); }
    Q_INVOKABLE QVariant key(const QString &key) const { return MGConfItem(key).value(); }

    // Records messages from now on; a test should fail if there is one that it does not expect.
    // Earlier messages, such as QML's about the test itself, are printed.
    Q_INVOKABLE void recordMessages() { m_log = std::make_unique<MessageLog>(); }
    // Returns the messages that were logged since the last call.
    Q_INVOKABLE QStringList takeMessages() { return m_log->takeTexts(); }

private:
    std::unique_ptr<MessageLog> m_log;
};

// Gives every test the object that sets up its environment.
class Setup : public QObject
{
    Q_OBJECT

public Q_SLOTS:
    void qmlEngineAvailable(QQmlEngine *engine)
    {
        engine->rootContext()->setContextProperty("root"_s, new ThrowAwayRoot(engine));
    }
};

QUICK_TEST_MAIN_WITH_SETUP(qml, Setup)

#include "main.moc"
