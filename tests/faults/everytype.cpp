// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "everytype.h"

#include "files.h"
#include "members.h"
#include "moduletypes.h"
#include "texts.h"

#include <QAbstractListModel>
#include <QDebug>
#include <QFile>
#include <QUrl>

namespace {

const QStringList typesOfFiles = {
    "AndroidSupport"_s,    "BluetoothInfo"_s,  "ModemFeatures"_s,
    "TermsOfUseManager"_s, "TextFileReader"_s,
};

const QString textFile = "/usr/share/marlo-settings/texts/text.txt"_s;

QString describe(const QVariant &value)
{
    QString description;
    QDebug(&description).nospace() << value;
    return description;
}

QByteArray document(const ModuleType &type)
{
    const QString &name = type.name;
    QByteArray it = name.toUtf8();
    if (type.isSingleton) {
        // It exists without being declared.
    } else if (name == QLatin1String("QuickActionsModel")) {
        it += " { showPotential: true }";
    } else if (name == QLatin1String("TitlesView")) {
        it += " { model: EventsWidgetsModel { }\nrole: 'title' }";
    } else if (name == QLatin1String("TermsOfUseManager")) {
        it += " { vendorPath: '/usr/share/marlo-settings/vendor' }";
    } else if (name == QLatin1String("MemoryCardFormatter")) {
        it += " { deviceName: 'card' }";
    } else {
        it += " { }";
    }
    return "import QtQml 2.15\nimport com.marlo.settings.system 1.0\n"
           "QtObject { property QtObject it: "
        + it + " }\n";
}

// Some value of the type, to set a property or to call a method. It differs from the current one.
QVariant anyValue(int type, const QVariant &current = {})
{
    const bool hasAny = current.toString() == "any"_s;
    switch (type) {
    case QMetaType::Bool:
        return !current.toBool();
    case QMetaType::Int:
        return current.isValid() ? 1 : 0;
    case QMetaType::QString:
        return hasAny ? "other"_s : "any"_s;
    case QMetaType::QStringList:
        return QStringList{"any"_s, "other"_s};
    case QMetaType::QUrl:
        return QUrl("file:///nonexistent"_s);
    default:
        return {};
    }
}

} // namespace

void EveryType::installFiles()
{
    const auto write = [](const char *path, const QByteArray &content) {
        Files::write(QString::fromLatin1(path), content);
    };
    write("/usr/share/glimmera/quickactions/lamp.conf",
          "title=lamp\nremote-service=org.example.lamp\nremote-path=/lamp\n"
          "remote-interface=org.example.Lamp\nremote-method=toggle\n");
    write(
        "/usr/share/glimmera/eventswidgets/weather.json",
        R"({ "widgets": [ { "path": "weather", "title": "Weather", "default_enabled": true } ] })");
    write("/var/lib/bluetooth/board-address", "00:1A:7D:DA:71:13\n");
    write("/usr/sbin/apkd", "");
    write("/usr/share/modem-software/features.ini", "variant=europe\n");
    write("/usr/share/marlo-settings/platform-eula/tarnwick_termsofuse-en_GB.txt",
          "Terms\nof the platform");
    write("/usr/share/marlo-settings/vendor/full/en_GB.txt", "Terms\nof the vendor");
    write("/usr/share/marlo-settings/vendor/summary/en_GB.txt", "Summary\nof the terms");
    write("/usr/share/geoclue-provider-mlsdb/agreements/mls_consent_en_GB.txt", "mls");
    write("/usr/share/libherepositioning/agreements/here_consent_en_GB.txt", "here");
    Files::write(textFile, "text\n");
    write("/usr/libexec/sdcardhelper", "#!/bin/sh\necho vfat\n");
    if (!QFile::setPermissions("/usr/libexec/sdcardhelper"_s, QFile::ReadOwner | QFile::ExeOwner)) {
        qFatal("cannot make the helper executable");
    }
}

EveryType::EveryType()
{
    m_engine.addImportPath(QLatin1String(QML_BUILD_DIR));
    for (const ModuleType &type : ModuleType::all()) {
        m_names.append(type.name);
        auto component = std::make_unique<QQmlComponent>(&m_engine);
        component->setData(document(type), QUrl("test.qml"_s));
        m_components.emplace(type.name, std::move(component));
        m_objects.emplace(type.name, make(type.name));
    }
}

QStringList EveryType::names()
{
    QStringList names;
    for (const ModuleType &type : ModuleType::all()) {
        names.append(type.name);
    }
    return names;
}

QObject *EveryType::object(const QString &name) const
{
    return m_objects.at(name)->property("it").value<QObject *>();
}

std::unique_ptr<QObject> EveryType::make(const QString &name) const
{
    QQmlComponent &component = *m_components.at(name);
    std::unique_ptr<QObject> created(component.create());
    if (created == nullptr) {
        qFatal("%s", qPrintable(component.errorString()));
    }
    return created;
}

QStringList EveryType::state() const
{
    QStringList lines;
    for (const QString &name : m_names) {
        lines += state(name);
    }
    return lines;
}

QStringList EveryType::state(const QString &name) const
{
    QStringList lines;
    QObject *it = object(name);
    const auto note = [&](const char *what, const QVariant &value) {
        lines.append("%1.%2 %3"_s.arg(name, QLatin1String(what), describe(value)));
    };
    for (const QMetaProperty &property : Members::properties(*it)) {
        // The address of a model differs from run to run.
        if (property.userType() != QMetaType::QObjectStar) {
            note(property.name(), property.read(it));
        }
    }
    if (const auto *model = qobject_cast<QAbstractListModel *>(it)) {
        const auto roles = model->roleNames();
        for (int row = 0; row < model->rowCount(); ++row) {
            for (auto role = roles.cbegin(); role != roles.cend(); ++role) {
                note(role->constData(), model->data(model->index(row), role.key()));
            }
        }
    }
    for (const char *terms : {"platformTermsOfUse", "vendorTermsOfUse", "vendorTermsSummary"}) {
        QStringList text;
        if (it->metaObject()->indexOfMethod(QByteArray(terms) + "(QString)") >= 0) {
            QMetaObject::invokeMethod(it, terms, Q_RETURN_ARG(QStringList, text),
                                      Q_ARG(QString, "en_GB"_s));
            note(terms, text);
        }
    }
    if (name == QLatin1String("TextFileReader")) {
        QString text;
        QMetaObject::invokeMethod(it, "readContent", Q_RETURN_ARG(QString, text),
                                  Q_ARG(QString, textFile));
        note("readContent", text);
        const QUrl directory = QUrl::fromLocalFile(textFile).adjusted(QUrl::RemoveFilename);
        QMetaObject::invokeMethod(it, "collate", Q_RETURN_ARG(QString, text),
                                  Q_ARG(QUrl, directory), Q_ARG(QString, QString()),
                                  Q_ARG(QString, QString()));
        note("collate", text);
    }
    return lines;
}

QStringList EveryType::stateOfFiles() const
{
    QStringList lines;
    for (const QString &name : typesOfFiles) {
        lines += state(name);
    }
    return lines;
}

std::vector<EveryType::Use> EveryType::uses(const QString &name) const
{
    std::vector<Use> uses;
    QObject *it = object(name);
    const auto named = [&name](const char *member) {
        return name + QLatin1Char('.') + QLatin1String(member);
    };
    const auto properties = Members::properties(*it);
    for (const QMetaProperty &property : properties) {
        uses.push_back({named(property.name()), [property, it] { property.read(it); }});
    }
    // Methods come before writes, because writes change the rows and make the formatter busy.
    for (const QMetaMethod &method : Members::methods(*it)) {
        uses.push_back({named(method.methodSignature()), [method, it] {
                            Members::call(it, method, [](int type) { return anyValue(type); });
                        }});
    }
    for (const QMetaProperty &property : properties) {
        const int type = property.isEnumType() ? int(QMetaType::Int) : property.userType();
        if (property.isWritable() && anyValue(type).isValid()) {
            uses.push_back({named(property.name()) + " ="_s, [property, type, it] {
                                property.write(it, anyValue(type, property.read(it)));
                            }});
        }
    }
    return uses;
}

void EveryType::useAll() const
{
    for (const QString &name : m_names) {
        for (const Use &use : uses(name)) {
            use.run();
        }
    }
}
