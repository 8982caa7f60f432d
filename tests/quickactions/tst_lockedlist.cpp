// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// A device may lock the list of enabled actions with a dconf profile. Then no one can change it.

#include "files.h"
#include "messagelog.h"
#include "mgconfitem.h"
#include "places.h"
#include "quickactions/quickactionsmodel.h"
#include "words.h"

#include <QProcess>
#include <QtTest>

namespace {

QStringList names(const QuickActionsModel &model)
{
    QStringList names;
    for (int row = 0; row < model.count(); ++row) {
        const QString path = model.data(model.index(row), QuickActionsModel::PathRole).toString();
        names.append(QFileInfo(path).completeBaseName());
    }
    return names;
}

} // namespace

class TestLockedList : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void moveChangesNothing();
};

void TestLockedList::initTestCase()
{
    // Before dconf is used for the first time in this process.
    const QString source = "/etc/dconf/db/device.d"_s;
    QByteArray paths;
    for (const char *name : {"a", "b", "c"}) {
        const QString path = "%1/%2.conf"_s.arg(Places::quickActions, QLatin1String(name));
        Files::write(path, "title=x\n");
        paths += (paths.isEmpty() ? "'" : ", '") + path.toUtf8() + '\'';
    }
    Files::write(source + "/actions"_s,
                 "[desktop/glimmera-marlo-home]\nevents_screen_actions=[" + paths + "]\n");
    Files::write(source + "/locks/actions"_s, Places::enabledActions.toUtf8() + '\n');
    Files::write("/etc/dconf/profile/user"_s, "user-db:user\nsystem-db:device\n");
    QCOMPARE(QProcess::execute("dconf"_s, {"compile"_s, "/etc/dconf/db/device"_s, source}), 0);
}

void TestLockedList::moveChangesNothing()
{
    MessageLog log;
    QuickActionsModel model;
    model.componentComplete();
    const QStringList listed = words("a b c");
    QCOMPARE(names(model), listed);

    // Twice: the second call must find the rows and the list as they were.
    for (int i = 0; i < 2; ++i) {
        model.move(0, 2);
        QCOMPARE(names(model), listed);
        QCOMPARE(MGConfItem(Places::enabledActions).value().toStringList().size(), 3);
        const QStringList messages = log.takeTexts();
        QCOMPARE(messages.size(), 1);
        QVERIFY2(messages.first().contains(Places::enabledActions), qPrintable(messages.first()));
        QCoreApplication::processEvents();
        QCOMPARE(names(model), listed);
    }
    QCOMPARE(log.takeReport(), QString());
}

QTEST_GUILESS_MAIN(TestLockedList)

#include "tst_lockedlist.moc"
