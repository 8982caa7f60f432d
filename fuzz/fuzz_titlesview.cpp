// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// The input is two role paths and a value to match. The rows hold values of every kind.

#include "eventswidgets/titlesview.h"
#include "fuzzing.h"

#include <QPointer>

#include <memory>

namespace {

// An object of a row, and what reading its properties does.
class Contact : public QObject
{
    Q_OBJECT
    Q_PROPERTY(QString name MEMBER m_name)
    Q_PROPERTY(QObject *next READ next)
    Q_PROPERTY(QObject *self READ self)
    Q_PROPERTY(QObject *nobody READ nobody)
    Q_PROPERTY(QVariantList list READ list)
    Q_PROPERTY(QString ending READ ending)
    Q_PROPERTY(QString renaming READ renaming)

public:
    Contact(QString name, QObject *next, QObject *parent)
        : QObject(parent), m_name(std::move(name)), m_next(next)
    {
    }

    QObject *next() const { return m_next; }
    QObject *self() { return this; }
    QObject *nobody() const { return nullptr; }
    QVariantList list() const { return {m_name, 1}; }
    QString ending() const
    {
        delete model;
        return m_name;
    }
    QString renaming() const
    {
        view->setRole(QStringLiteral("title"));
        return m_name;
    }

    static QPointer<QObject> model;
    static TitlesView *view;

private:
    QString m_name;
    QObject *m_next;
};

QPointer<QObject> Contact::model;
TitlesView *Contact::view = nullptr;

class Rows : public QAbstractListModel
{
    Q_OBJECT

public:
    explicit Rows(QObject *contacts)
        : m_first(new Contact(QStringLiteral("Ada"), nullptr, contacts)),
          m_second(new Contact(QString(), m_first, contacts))
    {
        m_second->setProperty("dynamic", QVariant::fromValue<QObject *>(m_first));
        m_second->setProperty("é", QStringLiteral("e"));
    }

    int rowCount(const QModelIndex &parent = {}) const override
    {
        Q_UNUSED(parent)
        return 4;
    }

    QHash<int, QByteArray> roleNames() const override
    {
        return {{0, "zero"},     {256, "title"}, {257, "contact"}, {258, "dotted.role"},
                {259, "\xe9"},   {260, "list"},  {261, "map"},     {262, ""},
                {263, "number"}, {264, "odd"}};
    }

    QVariant data(const QModelIndex &index, int role) const override
    {
        const int row = index.row();
        switch (role) {
        case 256:
            return row == 3 ? QVariant() : QVariant(QStringLiteral("title %1").arg(row));
        case 257:
            return QVariant::fromValue<QObject *>(row == 0       ? nullptr
                                                      : row == 1 ? m_first
                                                                 : m_second);
        case 260:
            return QVariantList{row, QVariant::fromValue<QObject *>(m_first)};
        case 261:
            return QVariantMap{{QStringLiteral("name"), row}};
        case 263:
            return row / 2.0;
        case 264:
            return row == 2 ? QVariant::fromValue<QObject *>(m_second) : QVariant(row);
        default:
            return QStringLiteral("display");
        }
    }

    QObject *first() const { return m_first; }

private:
    Contact *m_first;
    Contact *m_second;
};

QString takePath(Bytes *input)
{
    const QByteArray path = input->takeUntil('\n');
    // May contain half a surrogate pair, as texts from QML may.
    return path.startsWith('!')
        ? QString(reinterpret_cast<const QChar *>(path.constData() + 1), (path.size() - 1) / 2)
        : QString::fromUtf8(path);
}

QVariant takeMatch(Bytes *input, QObject *object, int nesting)
{
    const int type = input->takeByte() % 9;
    const int count = nesting < 20 ? type % 3 + 1 : 0;
    switch (type) {
    case 0:
        return {};
    case 1:
        return bool(input->takeByte() % 2);
    case 2:
        return input->takeByte() / 2.0;
    case 3:
        return QVariant::fromValue<QObject *>(object);
    case 4: {
        QStringList list;
        for (int i = 0; i < count; ++i) {
            list.append(QString::fromUtf8(input->takeUntil(';')));
        }
        return list;
    }
    case 5:
    case 6: {
        QVariantList list;
        for (int i = 0; i < count && !input->atEnd(); ++i) {
            list.append(takeMatch(input, object, nesting + 1));
        }
        return list;
    }
    case 7:
        return QVariantMap{{QStringLiteral("name"), takeMatch(input, object, nesting + 1)}};
    default:
        return QString::fromUtf8(input->takeUntil(';'));
    }
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t *data, std::size_t size)
{
    Bytes input(data, size);
    QObject contacts;
    auto *const rows = new Rows(&contacts);
    const QPointer<QObject> model = rows;
    QObject *const contact = rows->first();
    TitlesView view;
    Contact::model = rows;
    Contact::view = &view;

    int changes = 0;
    QObject::connect(&view, &TitlesView::valueChanged, [&changes] { ++changes; });
    const auto changesAreTold = [&](const auto &change) {
        const QStringList before = view.values();
        const int changesBefore = changes;
        change();
        Fuzzing::require(view.values() == before || changes > changesBefore, "changes are told");
        Fuzzing::require(view.values().size() <= 4, "a row gives one text at most");
        Fuzzing::require(view.value() == view.joined(view.values()),
                         "the sentence is of the texts");
        Fuzzing::require(model || view.values().isEmpty(), "without a model there is no text");
    };

    const QString role = takePath(&input);
    const QString matchRole = takePath(&input);
    changesAreTold([&] { view.setModel(rows); });
    changesAreTold([&] { view.setRole(role); });
    if (model && !role.isEmpty()) {
        Fuzzing::require(view.values().size() == 4,
                         "without a role to match each row gives a text");
    }
    changesAreTold([&] { view.setMatch(takeMatch(&input, contact, 0)); });
    changesAreTold([&] { view.setMatchRole(matchRole); });

    if (!view.role().isEmpty()) {
        const QStringList values = view.values();
        changesAreTold([&] { view.setRole(QLatin1Char('.') + view.role()); });
        Fuzzing::require(!model || view.values() == values, "an empty step leads nowhere");
    }
    if (input.takeByte() % 2 != 0) {
        changesAreTold([&] { qDeleteAll(contacts.children()); });
    }
    delete model;
    Fuzzing::require(view.values().isEmpty(), "without a model there is no text");
    return 0;
}

#include "fuzz_titlesview.moc"
