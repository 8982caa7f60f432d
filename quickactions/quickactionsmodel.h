// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef QUICKACTIONSMODEL_H
#define QUICKACTIONSMODEL_H

#include "files/directorywatcher.h"
#include "mgconfitem.h"
#include "models/requestqueue.h"
#include "translations/catalogtable.h"

#include <QAbstractListModel>
#include <QList>
#include <QPair>
#include <QQmlParserStatus>
#include <QSet>
#include <QStringList>
#include <QTimer>
#include <QVector>

#include <optional>

class QDBusError;
class QDBusMessage;
class QuickAction;

// Lists the quick actions that packages offer and the user has enabled, for the events screen. With
// showPotential it lists every offered action, for the page on which the user chooses.
class QuickActionsModel : public QAbstractListModel, public QQmlParserStatus
{
    Q_OBJECT
    Q_INTERFACES(QQmlParserStatus)
    Q_PROPERTY(
        bool showPotential READ showPotential WRITE setShowPotential NOTIFY showPotentialChanged)
    Q_PROPERTY(int count READ count NOTIFY countChanged)

public:
    using Action = QuickAction;

    // Also the numbers of Qt's display, decoration, edit and tool tip roles, for generic views.
    enum Role { TitleRole, IconRole, PathRole, EnabledRole };

    explicit QuickActionsModel(QObject *parent = nullptr);
    ~QuickActionsModel() override;

    bool showPotential() const { return m_showPotential; }
    void setShowPotential(bool showPotential);
    int count() const { return rowCount(); }

    int rowCount(const QModelIndex &parent = QModelIndex()) const override;
    QVariant data(const QModelIndex &index, int role = Qt::DisplayRole) const override;
    QHash<int, QByteArray> roleNames() const override;

    Q_INVOKABLE QVariantMap get(int index) const;
    Q_INVOKABLE void triggerAction(int index);

    void classBegin() override { }
    void componentComplete() override;

public Q_SLOTS:
    void enableAction(const QString &path);
    void disableAction(const QString &path);
    void move(int index, int newIndex);

Q_SIGNALS:
    void showPotentialChanged();
    void countChanged();

private Q_SLOTS:
    void loadActions();
    void updateEnabledActions();
    void directoryChanged();
    void triggerActionError(const QDBusError &error, const QDBusMessage &msg);
    void showStorePackage(const QString &packageName);

private:
    using ChangeScope = RequestQueue<QuickActionsModel>::ChangeScope;

    // The paths of the actions to list.
    struct Selection {
        QStringList enabled; // in the user's order
        QStringList others; // by name
    };

    bool hasRow(int index) const;
    void applyShowPotential();
    void applyMoves();
    void applyMove(int index, int newIndex);
    void storeMove(int index, int newIndex);
    void beginMoveAction(int index, int newIndex);
    Selection select() const;
    void removeRowsExcept(const QSet<QString> &paths);
    void updateRows(const QSet<QString> &enabled);
    void insertMissing(const Selection &selected);
    int rowForPriority(std::optional<int> priority) const;
    void insertAction(int row, const Action &action);
    QStringList storedList() const;
    void storeList(const QStringList &list);

    CatalogTable m_catalogs;
    QList<Action> m_rows;
    RequestQueue<QuickActionsModel> m_requests{this};
    DirectoryWatcher m_watcher;
    QTimer m_reloadTimer;
    MGConfItem m_enabledItem;
    MGConfItem m_blockedItem;
    QStringList m_enabledList;
    QStringList m_blockedList;
    QVector<QPair<int, int>> m_moves; // waiting
    bool m_showPotential = false;
    bool m_complete = false;
    // True while move() writes the enabled list.
    bool m_moving = false;
};

#endif
