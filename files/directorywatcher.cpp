// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "directorywatcher.h"

#include <QCoreApplication>
#include <QDir>
#include <QFile>
#include <QHash>
#include <QSet>
#include <QSocketNotifier>
#include <QVarLengthArray>
#include <QVector>
#include <QtDebug>

#include <algorithm>
#include <cerrno>
#include <chrono>
#include <climits>
#include <iterator>
#include <utility>

#include <sys/inotify.h>
#include <sys/ioctl.h>
#include <sys/stat.h>
#include <unistd.h>

namespace {

// The same for every directory: watchers share watches, and adding a watch again replaces its
// events.
constexpr uint32_t watchedEvents =
    IN_CREATE | IN_DELETE | IN_MOVED_FROM | IN_MOVED_TO | IN_ATTRIB | IN_CLOSE_WRITE | IN_MOVE_SELF;

constexpr std::chrono::seconds pollInterval(1);

// As many symbolic links as the kernel follows in a path.
constexpr int maximumLinks = 40;

// Empty if the path is not a symbolic link.
QByteArray linkTarget(const QByteArray &path)
{
    QByteArray target(PATH_MAX, Qt::Uninitialized);
    const ssize_t size = readlink(path.constData(), target.data(), size_t(target.size()));
    target.truncate(int(std::max<ssize_t>(size, 0)));
    return target;
}

} // namespace

// The inotify instance of the process. A directory has one watch, whatever path leads to it.
class DirectoryWatcher::Inotify : public QObject
{
public:
    // Null, and errno is set, if the process cannot get one.
    static Inotify *instance();

    ~Inotify() override;
    Q_DISABLE_COPY_MOVE(Inotify)

    // Returns the watch of the directory. If it cannot be watched, returns a negative number and
    // sets errno.
    int add(const QByteArray &directory, DirectoryWatcher *watcher);
    void remove(int watch, DirectoryWatcher *watcher);

private:
    using Watchers = QSet<DirectoryWatcher *>;

    explicit Inotify(int descriptor);

    void readEvents();
    Watchers watchersOf(const inotify_event &event) const;

    const int m_descriptor;
    QSocketNotifier m_notifier;
    QHash<int, Watchers> m_watchers;
};

DirectoryWatcher::Inotify *DirectoryWatcher::Inotify::instance()
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

DirectoryWatcher::Inotify::Inotify(int descriptor)
    : QObject(QCoreApplication::instance()), m_descriptor(descriptor),
      m_notifier(descriptor, QSocketNotifier::Read)
{
    connect(&m_notifier, &QSocketNotifier::activated, this, [this] { readEvents(); });
}

DirectoryWatcher::Inotify::~Inotify()
{
    m_notifier.setEnabled(false);
    close(m_descriptor);
}

int DirectoryWatcher::Inotify::add(const QByteArray &directory, DirectoryWatcher *watcher)
{
    const int watch = inotify_add_watch(m_descriptor, directory.constData(), watchedEvents);
    if (watch >= 0) {
        m_watchers[watch].insert(watcher);
    }
    return watch;
}

void DirectoryWatcher::Inotify::remove(int watch, DirectoryWatcher *watcher)
{
    const auto known = m_watchers.find(watch);
    if (known != m_watchers.end() && known->remove(watcher) && known->isEmpty()) {
        m_watchers.erase(known);
        // Fails if the directory does not exist any more.
        inotify_rm_watch(m_descriptor, watch);
    }
}

void DirectoryWatcher::Inotify::readEvents()
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
        const Watchers watchers = watchersOf(event);
        std::copy_if(watchers.cbegin(), watchers.cend(), std::back_inserter(reporting),
                     [&event](DirectoryWatcher *watcher) { return watcher->take(event); });
    }
    for (const QPointer<DirectoryWatcher> &watcher : qAsConst(reporting)) {
        if (watcher != nullptr) {
            watcher->report();
        }
    }
}

DirectoryWatcher::Inotify::Watchers
DirectoryWatcher::Inotify::watchersOf(const inotify_event &event) const
{
    if ((event.mask & IN_Q_OVERFLOW) == 0) {
        return m_watchers.value(event.wd);
    }
    // Anything may have happened.
    Watchers all;
    for (const Watchers &some : m_watchers) {
        all.unite(some);
    }
    return all;
}

DirectoryWatcher::DirectoryWatcher(const QString &directory, QString nameFilter, QObject *parent)
    : QObject(parent), m_directory(QFile::encodeName(directory)),
      m_nameFilter(std::move(nameFilter)), m_inotify(Inotify::instance()), m_pollTimer(this)
{
    connect(&m_pollTimer, &QTimer::timeout, this, &DirectoryWatcher::poll);
    if (m_inotify != nullptr) {
        watch();
    } else {
        startPolling(errno);
    }
}

DirectoryWatcher::~DirectoryWatcher()
{
    if (m_inotify != nullptr) {
        for (const Level &level : m_levels) {
            m_inotify->remove(level.watch, this);
        }
    }
}

// Follows the path through symbolic links, as the kernel does.
void DirectoryWatcher::watch()
{
    const std::vector<Level> before = std::exchange(m_levels, {});
    QByteArrayList names = m_directory.split('/');
    QByteArray path = "/"; // Only a directory can be reached by a path that ends with a slash.
    int links = 0;
    int error = 0;
    while (error == 0) {
        names.removeAll(QByteArray());
        m_levels.push_back({m_inotify->add(path, this), names.value(0)});
        if (m_levels.back().watch < 0 && (errno == ENOSPC || errno == ENOMEM)) {
            error = errno;
        }
        if (names.isEmpty()) {
            break;
        }
        const QByteArray name = names.takeFirst();
        const QByteArray target = linkTarget(path + name);
        if (target.isEmpty() || ++links > maximumLinks) {
            path += name + '/';
        } else {
            names = target.split('/') + names;
            path = target.startsWith('/') ? "/" : path;
        }
    }
    if (error != 0) {
        startPolling(error);
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
        return !reporting;
    }
    for (const Level &level : m_levels) {
        if (level.watch != event.wd) {
            continue;
        }
        const bool isDirectory = &level == &m_levels.back();
        if (event.len == 0) {
            // The directory itself may have been moved away, removed or unmounted.
            m_pathChanged = true;
            m_entriesChanged = m_entriesChanged || (isDirectory && (event.mask & IN_ATTRIB) != 0);
        } else if (isDirectory) {
            m_entriesChanged = m_entriesChanged || (event.mask & IN_CLOSE_WRITE) == 0
                || QDir::match(m_nameFilter, QFile::decodeName(event.name));
        } else {
            m_pathChanged = m_pathChanged || level.name == event.name;
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
        isChanged = isChanged || m_levels.empty() || m_levels.back().watch != before;
    }
    if (isChanged) {
        Q_EMIT changed();
    }
}

void DirectoryWatcher::startPolling(int error)
{
    static bool hasWarned = false;
    if (!std::exchange(hasWarned, true)) {
        qWarning().noquote() << "Directories cannot be watched and are checked once a second:"
                             << qt_error_string(error);
    }
    for (const Level &level : std::exchange(m_levels, {})) {
        m_inotify->remove(level.watch, this);
    }
    m_status = status();
    m_pollTimer.start(pollInterval);
}

void DirectoryWatcher::poll()
{
    if (std::exchange(m_status, status()) != m_status) {
        Q_EMIT changed();
    }
}

DirectoryWatcher::Status DirectoryWatcher::status() const
{
    struct stat directory = {};
    stat(m_directory.constData(), &directory);
    return {quint64(directory.st_dev),         quint64(directory.st_ino),
            quint64(directory.st_mtim.tv_sec), quint64(directory.st_mtim.tv_nsec),
            quint64(directory.st_ctim.tv_sec), quint64(directory.st_ctim.tv_nsec)};
}
