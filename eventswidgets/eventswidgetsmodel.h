// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef EVENTSWIDGETSMODEL_H
#define EVENTSWIDGETSMODEL_H

#include "files/directorywatcher.h"
#include "mgconfitem.h"
#include "models/requestqueue.h"
#include "translations/catalogtable.h"

#include <QAbstractListModel>
#include <QList>
#include <QQmlParserStatus>
#include <QSet>
#include <QStringList>

#include <vector>

struct EventsWidget;
struct EventsWidgetsFile;

// The widgets that packages offer for the events screen, and which of them the user has enabled.
class EventsWidgetsModel : public QAbstractListModel, public QQmlParserStatus
{
    Q_OBJECT
    Q_INTERFACES(QQmlParserStatus)

public:
    using Widget = EventsWidget;

    enum Role {
        TitleRole = Qt::UserRole,
        IconRole,
        PathRole,
        EnabledRole,
        DescriptionRole,
        AvailableRole
    };

    explicit EventsWidgetsModel(QObject *parent = nullptr);
    ~EventsWidgetsModel() override;

    int rowCount(const QModelIndex &parent = QModelIndex()) const override;
    QVariant data(const QModelIndex &index, int role = Qt::DisplayRole) const override;
    QHash<int, QByteArray> roleNames() const override;

    void classBegin() override { }
    void componentComplete() override;

public Q_SLOTS:
    void enableWidget(const QString &path);
    void disableWidget(const QString &path);
    void directoryChanged();
    void enabledWidgetsChanged();
    void updateAvailable();

private:
    using ChangeScope = RequestQueue<EventsWidgetsModel>::ChangeScope;

    QStringList enabledList() const;
    void mergeWidgets(const std::vector<EventsWidgetsFile> &files);
    int findWidget(const QString &path, int firstRow) const;
    int insertWidget(const Widget &widget);
    void updateWidget(int row, const Widget &widget);
    void removeRowsExcept(const QSet<QString> &paths);

    CatalogTable m_catalogs;
    QList<Widget> m_rows;
    RequestQueue<EventsWidgetsModel> m_requests{this};
    DirectoryWatcher m_watcher;
    MGConfItem m_enabledItem;
    // The paths of all widgets. The user's first choice stores them, on purpose.
    QStringList m_knownPaths;
    bool m_complete = false;
};

#endif
