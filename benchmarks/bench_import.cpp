// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

/*
    Importing the module, and creating one object of each of its types, compared with importing an
    empty module. Each runs in a process of its own.
*/

#include "moduletypes.h"
#include "rounds.h"

#include <QCoreApplication>
#include <QProcess>
#include <QQmlComponent>
#include <QQmlEngine>

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
    return 0;
}

void evaluateInProcess(const QByteArray &text)
{
    if (QProcess::execute(QCoreApplication::applicationFilePath(),
                          {evaluateOption, QString::fromLatin1(text)})
        != 0) {
        qFatal("the process failed");
    }
}

} // namespace

int main(int argc, char *argv[])
{
    const QCoreApplication application(argc, argv);
    const QStringList arguments = QCoreApplication::arguments();
    if (arguments.size() == 3 && arguments.at(1) == evaluateOption) {
        return evaluate(arguments.at(2).toLatin1());
    }

    const auto work = [](const QByteArray &text) {
        return Rounds::Work{[text] { evaluateInProcess(text); }};
    };
    const auto times = Rounds::times({work(nothing), work(import), work(everyType())});
    bool kept = Rounds::report("import the module", "import of an empty one", times[1], times[0]);
    kept &= Rounds::report("import it and create every type", "import of an empty one", times[2],
                           times[0]);
    return kept ? 0 : 1;
}
