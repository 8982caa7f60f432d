// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "directorywatcher.h"

#include <QCoreApplication>
#include <QFile>
#include <QFileSystemWatcher>
#include <QMultiHash>
#include <QSocketNotifier>
#include <QVarLengthArray>
#include <QVector>

#include <algorithm>
#include <utility>

#include <sys/inotify.h>
#include <sys/ioctl.h>
#include <unistd.h>

namespace {

// The same for every directory: watchers share watches, and adding a watch again replaces its
// events.
constexpr uint32_t watchedEvents =
    IN_CREATE | IN_DELETE | IN_MOVED_FROM | IN_MOVED_TO | IN_ATTRIB | IN_CLOSE_WRITE | IN_MOVE_SELF;

} // namespace

// The inotify instance of the process. A directory has one watch, whatever path leads to it.
class Inotify : public QObject
{
public:
    // Null if the process cannot get one.
    static Inotify *instance();

    ~Inotify() override;
    Q_DISABLE_COPY_MOVE(Inotify)

    // Returns the watch of the directory, or a negative number if it cannot be watched.
    int add(const QString &directory, DirectoryWatcher *watcher);
    void remove(int watch, DirectoryWatcher *watcher);

private:
    explicit Inotify(int descriptor);

    void readEvents();

    const int m_descriptor;
    QSocketNotifier m_notifier;
    QMultiHash<int, DirectoryWatcher *> m_watchers;
};

Inotify *Inotify::instance()
{
    static QPointer<Inotify> instance;
    if (instance == nullptr) {
        const int descriptor = inotify_init1(IN_NONBLOCK | IN_CLOEXEC);
        if (descriptor >= 0) {
            instance = new Inotify(descriptor);
        }
    }
    return instance;
}

Inotify::Inotify(int descriptor)
    : QObject(QCoreApplication::instance()), m_descriptor(descriptor),
      m_notifier(descriptor, QSocketNotifier::Read)
{
    connect(&m_notifier, &QSocketNotifier::activated, this, [this] { readEvents(); });
}

Inotify::~Inotify()
{
    m_notifier.setEnabled(false);
    close(m_descriptor);
}

int Inotify::add(const QString &directory, DirectoryWatcher *watcher)
{
    const int watch =
        inotify_add_watch(m_descriptor, QFile::encodeName(directory).constData(), watchedEvents);
    if (watch >= 0 && !m_watchers.contains(watch, watcher)) {
        m_watchers.insert(watch, watcher);
    }
    return watch;
}

void Inotify::remove(int watch, DirectoryWatcher *watcher)
{
    if (m_watchers.remove(watch, watcher) > 0 && !m_watchers.contains(watch)) {
        // Fails if the directory does not exist any more.
        inotify_rm_watch(m_descriptor, watch);
    }
}

void Inotify::readEvents()
{
    int pending = 0;
    ioctl(m_descriptor, FIONREAD, &pending);
    QVarLengthArray<char, 4096> buffer(pending);
    const ssize_t size = read(m_descriptor, buffer.data(), size_t(pending));

    // Each watcher reports once for all of these events. A receiver may destroy any watcher.
    QVector<QPointer<DirectoryWatcher>> reporting;
    for (ssize_t at = 0; at < size;) {
        const auto &event = *reinterpret_cast<const inotify_event *>(buffer.constData() + at);
        at += ssize_t(sizeof(inotify_event) + event.len);
        // After an overflow anything may have happened.
        const bool overflow = (event.mask & IN_Q_OVERFLOW) != 0;
        auto watcher = overflow ? m_watchers.cbegin() : m_watchers.constFind(event.wd);
        for (; watcher != m_watchers.cend() && (overflow || watcher.key() == event.wd); ++watcher) {
            if ((*watcher)->take(event)) {
                reporting.append(*watcher);
            }
        }
    }
    for (const QPointer<DirectoryWatcher> &watcher : qAsConst(reporting)) {
        if (watcher != nullptr) {
            watcher->report();
        }
    }
}

DirectoryWatcher::DirectoryWatcher(const QString &directory, const QString &nameFilter,
                                   QObject *parent)
    : QObject(parent), m_nameFilter(QRegularExpression::wildcardToRegularExpression(nameFilter),
                                    QRegularExpression::CaseInsensitiveOption),
      m_inotify(Inotify::instance())
{
    const QStringList names = directory.split(QLatin1Char('/'));
    for (int i = 0; i < names.size(); ++i) {
        // Only a directory can be reached by a path that ends with a slash.
        const QString path = names.mid(0, i + 1).join(QLatin1Char('/')) + QLatin1Char('/');
        m_levels.push_back({path, QFile::encodeName(names.at(i)), -1});
    }
    if (m_inotify == nullptr) {
        m_poller = new QFileSystemWatcher(this);
        // Queued: the poller emits the signal while it iterates over its paths, and watch() adds
        // paths.
        connect(
            m_poller, &QFileSystemWatcher::directoryChanged, this,
            [this] {
                watch();
                Q_EMIT changed();
            },
            Qt::QueuedConnection);
    }
    watch();
}

DirectoryWatcher::~DirectoryWatcher()
{
    if (m_inotify != nullptr) {
        for (const Level &level : m_levels) {
            m_inotify->remove(level.watch, this);
        }
    }
}

void DirectoryWatcher::watch()
{
    if (m_poller != nullptr) {
        for (const Level &level : m_levels) {
            m_poller->addPath(level.path);
        }
        return;
    }
    const std::vector<Level> before = m_levels;
    for (Level &level : m_levels) {
        level.watch = m_inotify->add(level.path, this);
    }
    for (const Level &old : before) {
        const auto has = [&old](const Level &level) { return level.watch == old.watch; };
        if (std::none_of(m_levels.cbegin(), m_levels.cend(), has)) {
            m_inotify->remove(old.watch, this);
        }
    }
}

bool DirectoryWatcher::take(const inotify_event &event)
{
    const bool reporting = m_pathChanged || m_entriesChanged;
    if ((event.mask & IN_Q_OVERFLOW) != 0) {
        m_pathChanged = true;
        m_entriesChanged = true;
    }
    for (auto level = m_levels.cbegin(); level != m_levels.cend(); ++level) {
        if (level->watch != event.wd) {
            continue;
        }
        const auto next = level + 1;
        const bool isDirectory = next == m_levels.cend();
        if (event.len == 0) {
            // The directory itself may have been moved away, removed or unmounted.
            m_pathChanged = true;
            m_entriesChanged = m_entriesChanged || (isDirectory && (event.mask & IN_ATTRIB) != 0);
        } else if (isDirectory) {
            m_entriesChanged =
                m_entriesChanged || m_nameFilter.match(QFile::decodeName(event.name)).hasMatch();
        } else {
            m_pathChanged = m_pathChanged || next->name == event.name;
        }
    }
    return !reporting && (m_pathChanged || m_entriesChanged);
}

void DirectoryWatcher::report()
{
    bool isChanged = std::exchange(m_entriesChanged, false);
    if (std::exchange(m_pathChanged, false)) {
        const int before = m_levels.back().watch;
        watch();
        isChanged = isChanged || m_levels.back().watch != before;
    }
    if (isChanged) {
        Q_EMIT changed();
    }
}
