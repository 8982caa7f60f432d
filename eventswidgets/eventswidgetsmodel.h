// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef EVENTSWIDGETSMODEL_H
#define EVENTSWIDGETSMODEL_H

#include "files/directorywatcher.h"
#include "mgconfitem.h"
#include "plugin/runningmaximum.h"
#include "plugin/translations/catalogtable.h"
#include "writewatcher.h"

#include <QAbstractListModel>
#include <QHash>
#include <QList>
#include <QQmlParserStatus>
#include <QSet>
#include <QStringList>

#include <vector>

struct EventsWidget;

/*
    The widgets that packages offer for the events screen, and which of them the user has enabled.

    Reads the definition files in /usr/share/glimmera/eventswidgets and follows that directory and
    the user's list in dconf.
*/
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

    void classBegin() override;
    void componentComplete() override;

public Q_SLOTS:
    void enableWidget(const QString &path);
    void disableWidget(const QString &path);
    void directoryChanged();
    void enabledWidgetsChanged();
    void updateAvailable();

private:
    QStringList enabledList() const;
    void readEnabledList();
    std::vector<Widget> readWidgets();
    void mergeWidgets(const std::vector<Widget> &widgets);
    void insertWidget(int row, const Widget &widget);
    void updateWidget(int row, const Widget &widget);
    void removeStaleRows(const QSet<QString> &paths);
    void indexRows();
    int findWidget(const QString &path) const;
    int insertionIndexForWidget(const Widget &widget) const;

    CatalogTable m_catalogs;
    QList<Widget> m_rows;
    // Where to look for the row of a path, from there downwards, while widgets are merged.
    QHash<QString, int> m_index;
    // The order of each row, while widgets are merged.
    RunningMaximum m_orders;
    DirectoryWatcher m_watcher;
    WriteWatcher m_writeWatcher;
    MGConfItem m_enabledItem;
    // What the key holds. While it holds nothing: the paths of all widgets, on purpose. The first
    // choice of the user stores them, so that each widget but the one that was switched is enabled
    // from then on, whatever its default was.
    QStringList m_enabledList;
    // While the key holds nothing at all; an empty list is a choice.
    bool m_defaults = false;
    bool m_complete = false;
    // While rows are announced and changed: whoever follows the model may call back into it.
    bool m_changing = false;
};

#endif
