// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// usage: soak [--seed NUMBER] SECONDS

#include "soak.h"
#include "texts.h"

#include <QCommandLineParser>
#include <QCoreApplication>

#include <cstdio>

namespace {

// Much of what happens here makes the module log warnings.
void keepQuiet(QtMsgType type, const QMessageLogContext &context, const QString &text)
{
    Q_UNUSED(context)
    if (type == QtFatalMsg) {
        std::fprintf(stderr, "%s\n", qPrintable(text));
    }
}

} // namespace

int main(int argc, char *argv[])
{
    if (!qEnvironmentVariableIsSet("MARLO_THROW_AWAY_ROOT")) {
        qFatal("this program runs only in the throw-away root of simulator");
    }
    const QCoreApplication application(argc, argv);
    QCommandLineParser parser;
    const QCommandLineOption seedOption("seed"_s, "of all chance"_s, "number"_s);
    parser.addOption(seedOption);
    parser.addPositionalArgument("seconds"_s, "how long to run"_s);
    parser.process(application);

    bool isNumber = false;
    const int seconds = parser.positionalArguments().value(0).toInt(&isNumber);
    const quint32 seed = parser.isSet(seedOption) ? parser.value(seedOption).toUInt()
                                                  : QRandomGenerator::global()->generate();
    if (!isNumber || seconds <= 0) {
        parser.showHelp(2);
    }
    std::printf("seed: %u\n", seed);
    std::fflush(stdout);
    qInstallMessageHandler(keepQuiet);
    if (!Soak(seed).run(seconds)) {
        std::fprintf(stderr, "more is held at the end than at the start\n");
        return 1;
    }
    return 0;
}
