// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

/*
    Importing the module, and creating one object of each of its types, compared with importing an
    empty module. Each runs in a process of its own, which prints how much private memory it uses.
*/

#include "moduletypes.h"
#include "rounds.h"

#include <QCoreApplication>
#include <QFile>
#include <QProcess>
#include <QQmlComponent>
#include <QQmlEngine>

#include <algorithm>
#include <cstdio>
#include <memory>

namespace {

const QString evaluateOption = QStringLiteral("--evaluate");

const QByteArray nothing = "import QtQml 2.15\nimport benchmarks.empty 1.0\nQtObject {}";
const QByteArray import = "import QtQml 2.15\nimport com.marlo.settings.system 1.0\nQtObject {}";
// One object of each type.
QByteArray everyType()
{
    QByteArray objects;
    QByteArray singletons;
    for (const ModuleType &type : ModuleType::all()) {
        if (type.isSingleton) {
            singletons += "readonly property QtObject s" + type.className + ": "
                + type.name.toLatin1() + '\n';
        } else {
            objects += (objects.isEmpty() ? "" : ", ") + type.name.toLatin1() + " {}";
        }
    }
    return "import QtQml 2.15\nimport com.marlo.settings.system 1.0\nQtObject {\n" + singletons
        + "property list<QtObject> objects: [" + objects + "]\n}";
}

// The private memory, in KiB, that this process has written to.
int ownMemory()
{
    QFile file(QStringLiteral("/proc/self/smaps_rollup"));
    if (!file.open(QIODevice::ReadOnly)) {
        qFatal("cannot read smaps_rollup");
    }
    const QList<QByteArray> lines = file.readAll().split('\n');
    for (const QByteArray &line : lines) {
        if (line.startsWith("Private_Dirty:")) {
            return line.simplified().split(' ').at(1).toInt();
        }
    }
    qFatal("smaps_rollup does not contain the private memory");
}

int evaluate(const QByteArray &text)
{
    QQmlEngine engine;
    engine.addImportPath(QStringLiteral(MODULES));
    engine.addImportPath(QStringLiteral(EMPTY_MODULES));
    QQmlComponent component(&engine);
    component.setData(text, QUrl());
    const std::unique_ptr<QObject> object(component.create());
    if (object == nullptr) {
        qFatal("%s", qPrintable(component.errorString()));
    }
    std::printf("%d\n", ownMemory());
    return 0;
}

int evaluateInProcess(const QByteArray &text)
{
    QProcess process;
    process.start(QCoreApplication::applicationFilePath(),
                  {evaluateOption, QString::fromLatin1(text)});
    process.waitForFinished(-1);
    const int memory = process.readAllStandardOutput().trimmed().toInt();
    if (memory <= 0) {
        qFatal("%s", process.readAllStandardError().constData());
    }
    return memory;
}

int median(std::vector<int> values)
{
    const auto middle = values.begin() + std::ptrdiff_t(values.size() / 2);
    std::nth_element(values.begin(), middle, values.end());
    return *middle;
}

} // namespace

int main(int argc, char *argv[])
{
    const QCoreApplication application(argc, argv);
    const QStringList arguments = QCoreApplication::arguments();
    if (arguments.size() == 3 && arguments.at(1) == evaluateOption) {
        return evaluate(arguments.at(2).toLatin1());
    }

    std::vector<std::vector<int>> memory(3);
    const auto work = [&memory](size_t number, const QByteArray &text) {
        return Rounds::Work{
            [&memory, number, text] { memory[number].push_back(evaluateInProcess(text)); }};
    };
    const auto times = Rounds::times({work(0, nothing), work(1, import), work(2, everyType())});
    Rounds::report("import the module", "import of an empty one", times[1], times[0],
                   Rounds::noBar);
    Rounds::report("import it and create every type", "import of an empty one", times[2], times[0],
                   Rounds::noBar);
    Rounds::report("import the module", "KiB more memory than an empty one",
                   median(memory[1]) - median(memory[0]), Rounds::noBar);
    Rounds::report("import it and create every type", "KiB more memory than an empty one",
                   median(memory[2]) - median(memory[0]), Rounds::noBar);
    return 0;
}
