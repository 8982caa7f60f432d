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
    QVariant data(const QModelIndex &index, int role) const override;
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
    using Change = RequestQueue<EventsWidgetsModel>::Change;

    QStringList enabledList() const;
    std::vector<Widget> readWidgets();
    void mergeWidgets(const std::vector<Widget> &widgets);
    void insertWidget(int row, const Widget &widget);
    void updateWidget(int row, const Widget &widget);
    void removeStaleRows(const QSet<QString> &paths);

    CatalogTable m_catalogs;
    QList<Widget> m_rows;
    RequestQueue<EventsWidgetsModel> m_requests{this};
    DirectoryWatcher m_watcher;
    MGConfItem m_enabledItem;
    // The value of the key. Without a value, the paths of all widgets, on purpose: the user's first
    // choice stores them.
    QStringList m_enabledList;
    // True while the key has no value; an empty list is a choice.
    bool m_defaults = false;
    bool m_complete = false;
};

#endif
