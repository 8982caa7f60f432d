// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "filetree.h"
#include "memorycard/fileremover.h"
#include "messagelog.h"
#include "scratchfilesystem.h"

#include <QFile>
#include <QMetaMethod>
#include <QSemaphore>
#include <QSignalSpy>
#include <QTemporaryDir>
#include <QTest>
#include <QThread>
#include <QThreadPool>

#include <atomic>
#include <cerrno>
#include <cstdio>
#include <cstring>
#include <functional>
#include <memory>

#include <dlfcn.h>
#include <fcntl.h>
#include <linux/capability.h>
#include <linux/fs.h>
#include <mntent.h>
#include <sys/ioctl.h>
#include <sys/mount.h>
#include <sys/stat.h>
#include <sys/syscall.h>
#include <sys/wait.h>
#include <unistd.h>

using namespace FileTree;

namespace {

const QByteArray mountTable = QByteArrayLiteral("/etc/mtab");
// No such node exists: the tests' cards are directories.
const QByteArray device = QByteArrayLiteral("/dev/test-card1");
constexpr int runTimeout = 60000;

// Whether the mount table is read as by musl 1.2.3: no escapes are decoded, and a line that is longer
// than the buffer is skipped with an error.
bool readsLikeMusl = false;

enum Outcome {
    Nothing,
    Completed,
    Error,
    Both,
};

// Runs a remover to its end on this thread.
Outcome runHere(const QByteArray &devicePath)
{
    FileRemover remover(QString::fromUtf8(devicePath));
    QSignalSpy completed(&remover, &FileRemover::completed);
    QSignalSpy error(&remover, &FileRemover::error);
    remover.run();
    if (completed.count() + error.count() > 1) {
        return Both;
    }
    return completed.count() == 1 ? Completed : error.count() == 1 ? Error : Nothing;
}

// Runs the function in a child process, which may change its root directory. Returns its result.
int runInChild(const std::function<int()> &function)
{
    const pid_t pid = fork();
    if (pid == 0) {
        _exit(function());
    }
    int status = 0;
    if (pid < 0 || waitpid(pid, &status, 0) != pid || !WIFEXITED(status)) {
        return -1;
    }
    return WEXITSTATUS(status);
}

QByteArray escaped(const QByteArray &path)
{
    QByteArray text;
    for (const char c : path) {
        if (c == ' ' || c == '\t' || c == '\n' || c == '\\') {
            text += '\\' + QByteArray::number(static_cast<uchar>(c), 8).rightJustified(3, '0');
        } else {
            text += c;
        }
    }
    return text;
}

QByteArray line(const QByteArray &source, const QByteArray &directory)
{
    return source + ' ' + escaped(directory) + " vfat rw,nosuid 0 0\n";
}

// Root may read and remove everything. Without these capabilities, root has only an owner's
// permissions.
class WithoutPrivileges
{
public:
    WithoutPrivileges()
    {
        call(SYS_capget);
        m_old[0] = m_data[0];
        m_data[0].effective &= ~((1U << CAP_DAC_OVERRIDE) | (1U << CAP_DAC_READ_SEARCH));
        call(SYS_capset);
    }
    ~WithoutPrivileges()
    {
        m_data[0] = m_old[0];
        call(SYS_capset);
    }
    Q_DISABLE_COPY_MOVE(WithoutPrivileges)

private:
    void call(long number)
    {
        __user_cap_header_struct header = {_LINUX_CAPABILITY_VERSION_3, 0};
        if (syscall(number, &header, m_data) != 0) {
            qFatal("cannot change capabilities");
        }
    }

    __user_cap_data_struct m_data[2] = {};
    __user_cap_data_struct m_old[1] = {};
};

// A mount point: while it is one, neither root nor anybody else can remove the entry.
class MountPoint
{
public:
    explicit MountPoint(const QByteArray &path) : m_path(path)
    {
        if (mount(path.constData(), path.constData(), nullptr, MS_BIND, nullptr) != 0) {
            qFatal("cannot mount on %s", path.constData());
        }
    }
    ~MountPoint() { umount(m_path.constData()); }
    Q_DISABLE_COPY_MOVE(MountPoint)

private:
    const QByteArray m_path;
};

class Receiver : public QObject
{
    Q_OBJECT

public Q_SLOTS:
    void onCompleted()
    {
        ++completed;
        thread = QThread::currentThread();
    }
    void onError()
    {
        ++errors;
        thread = QThread::currentThread();
    }

public:
    int completed = 0;
    int errors = 0;
    QThread *thread = nullptr;
};

} // namespace

// Takes the place of the C library's own.
extern "C" mntent *getmntent_r(FILE *table, mntent *entry, char *buffer, int size) noexcept
{
    static const auto original =
        reinterpret_cast<decltype(&getmntent_r)>(dlsym(RTLD_NEXT, "getmntent_r"));
    if (!readsLikeMusl) {
        return original(table, entry, buffer, size);
    }
    char *fields[4] = {};
    while (!fields[1]) {
        if (!fgets(buffer, size, table)) {
            return nullptr;
        }
        if (!strchr(buffer, '\n') && !feof(table)) {
            for (int c = 0; c != '\n' && c != EOF;) {
                c = fgetc(table);
            }
            errno = ERANGE;
            return nullptr;
        }
        char *rest = buffer;
        for (char *&field : fields) {
            field = strtok_r(rest, " \t\n", &rest);
        }
    }
    static char nothing[] = "";
    *entry = {fields[0], fields[1], fields[2] ? fields[2] : nothing, nothing, 0, 0};
    return entry;
}

class tst_FileRemover : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void init();
    void cleanup();

    void interface();
    void onThreadPool_data();
    void onThreadPool();
    void receiverGoesFirst();
    void emptyCard();
    void removesAllAndKeepsMountDirectory();
    void otherDevicesAreKept();
    void deviceIsComparedExactly_data();
    void deviceIsComparedExactly();
    void devicePathThatNamesNoDevice_data();
    void devicePathThatNamesNoDevice();
    void nothingMounted();
    void missingMountTable();
    void emptyMountTable();
    void mountDirectoriesOfAnyBytes_data();
    void mountDirectoriesOfAnyBytes();
    void relativeMountDirectories_data();
    void relativeMountDirectories();
    void rootMountDirectory_data();
    void rootMountDirectory();
    void longLine();
    void anotherCLibrary();
    void lineCutWithinDirectory();
    void lastLineWithoutBreak();
    void mountedTwice();
    void stopsAfterSuccess();
    void mountedTwiceAndNeitherGoes();
    void entryThatCannotBeRemoved();
    void immutableFile();
    void directoryWithoutPermissions();
    void readOnlyCard();
    void unreadableMountDirectory();
    void missingMountDirectory();
    void mountDirectoryReplaced_data();
    void mountDirectoryReplaced();
    void directoryOfAnotherDisk();
    void removeAllEntries();
    void removeAllEntriesOfNothing();

private:
    void writeMountTable(const QByteArray &content);
    // Runs a remover with a mount table of one card.
    Outcome emptyMounted(const QByteArray &card);
    QByteArray path(const char *name) const;
    // A directory with a file, a hidden one, a directory and a link in it.
    QByteArray makeCard(const char *name);

    std::unique_ptr<MessageLog> m_log;
    std::unique_ptr<ScratchFileSystem> m_files;
};

void tst_FileRemover::init()
{
    m_log = std::make_unique<MessageLog>();
    m_files = std::make_unique<ScratchFileSystem>();
    makeDirectory(path("outside"));
    makeFile(path("outside/file"), "precious");
    writeMountTable(QByteArray());
}

void tst_FileRemover::cleanup()
{
    readsLikeMusl = false;
    QCOMPARE(read(path("outside/file")), QByteArray("precious"));
    m_files.reset();
    QCOMPARE(m_log->takeAll(), QList<MessageLog::Message>());
    m_log.reset();
}

// The table of the system is a link, which must not be written through.
void tst_FileRemover::writeMountTable(const QByteArray &content)
{
    const QByteArray draft = mountTable + ".draft";
    makeFile(draft, content);
    QCOMPARE(::rename(draft.constData(), mountTable.constData()), 0);
}

Outcome tst_FileRemover::emptyMounted(const QByteArray &card)
{
    writeMountTable(line(device, card));
    return runHere(device);
}

QByteArray tst_FileRemover::path(const char *name) const
{
    return m_files->path(name);
}

QByteArray tst_FileRemover::makeCard(const char *name)
{
    const QByteArray card = path(name);
    makeDirectory(card);
    makeFile(card + "/file");
    makeFile(card + "/.hidden");
    makeDirectory(card + "/directory");
    makeFile(card + "/directory/file");
    makeLink(card + "/link", "../outside");
    return card;
}

void tst_FileRemover::interface()
{
    FileRemover remover(QString::fromUtf8(device));
    QVERIFY(remover.autoDelete());
    QVERIFY(!remover.parent());

    const QMetaObject *const meta = remover.metaObject();
    QCOMPARE(meta->className(), "FileRemover");
    QCOMPARE(meta->propertyCount(), QObject::staticMetaObject.propertyCount());
    QByteArrayList methods;
    for (int i = meta->methodOffset(); i < meta->methodCount(); ++i) {
        QCOMPARE(meta->method(i).methodType(), QMetaMethod::Signal);
        methods.append(meta->method(i).methodSignature());
    }
    QCOMPARE(methods, (QByteArrayList{"completed()", "error()"}));
}

void tst_FileRemover::onThreadPool_data()
{
    QTest::addColumn<bool>("mounted");

    QTest::newRow("mounted") << true;
    QTest::newRow("not mounted") << false;
}

void tst_FileRemover::onThreadPool()
{
    QFETCH(const bool, mounted);
    const QByteArray card = makeCard("card");
    writeMountTable(line(mounted ? device : QByteArray("/dev/other"), card));

    auto *const remover = new FileRemover(QString::fromUtf8(device));
    Receiver receiver;
    connect(remover, &FileRemover::completed, &receiver, &Receiver::onCompleted);
    connect(remover, &FileRemover::error, &receiver, &Receiver::onError);
    std::atomic<QThread *> emitter{nullptr};
    const auto note = [&] { emitter = QThread::currentThread(); };
    connect(remover, &FileRemover::completed, remover, note, Qt::DirectConnection);
    connect(remover, &FileRemover::error, remover, note, Qt::DirectConnection);
    QSemaphore deleted;
    connect(
        remover, &QObject::destroyed, remover, [&] { deleted.release(); }, Qt::DirectConnection);
    QThreadPool::globalInstance()->start(remover, 0);

    // Nothing arrives before this thread returns to its event loop, though the remover is gone.
    QVERIFY(deleted.tryAcquire(1, runTimeout));
    QVERIFY(emitter.load() && emitter.load() != QThread::currentThread());
    QCOMPARE(receiver.completed + receiver.errors, 0);
    QTRY_COMPARE(receiver.completed + receiver.errors, 1);
    QCoreApplication::sendPostedEvents();
    QCOMPARE(receiver.completed, mounted ? 1 : 0);
    QCOMPARE(receiver.errors, mounted ? 0 : 1);
    QCOMPARE(receiver.thread, QThread::currentThread());
    QCOMPARE(exists(card + "/file"), !mounted);
}

void tst_FileRemover::receiverGoesFirst()
{
    const QByteArray card = makeCard("card");
    makeFiles(card, 2000);
    writeMountTable(line(device, card));
    auto *const remover = new FileRemover(QString::fromUtf8(device));
    auto receiver = std::make_unique<Receiver>();
    connect(remover, &FileRemover::completed, receiver.get(), &Receiver::onCompleted);
    connect(remover, &FileRemover::error, receiver.get(), &Receiver::onError);
    QThreadPool::globalInstance()->start(remover, 0);
    receiver.reset();
    QVERIFY(QThreadPool::globalInstance()->waitForDone(runTimeout));
    QCoreApplication::sendPostedEvents();
    QCOMPARE(list(card), QByteArrayList());
}

void tst_FileRemover::emptyCard()
{
    makeDirectory(path("card"));
    QCOMPARE(emptyMounted(path("card")), Completed);
    QVERIFY(exists(path("card")));
}

void tst_FileRemover::removesAllAndKeepsMountDirectory()
{
    const QByteArray card = makeCard("card");
    makeFile(card + "/caf\xe9");
    makeLink(card + "/dangling", "nowhere");
    makePipe(card + "/pipe");
    makeDirectory(card + "/.hiddenDirectory");
    struct stat before = {};
    struct stat after = {};
    QCOMPARE(stat(card.constData(), &before), 0);
    writeMountTable(line("sysfs", "/sys") + line(device, card) + line("tmpfs", "/run"));
    QCOMPARE(runHere(device), Completed);
    QCOMPARE(list(card), QByteArrayList());
    QCOMPARE(stat(card.constData(), &after), 0);
    QCOMPARE(after.st_ino, before.st_ino);
}

void tst_FileRemover::otherDevicesAreKept()
{
    const QByteArray card = makeCard("card");
    const QByteArray other = makeCard("other");
    writeMountTable(line("/dev/other1", other) + line(device, card) + line("/dev/other2", other));
    QCOMPARE(runHere(device), Completed);
    QCOMPARE(list(card), QByteArrayList());
    QCOMPARE(list(other).size(), 4);
}

void tst_FileRemover::deviceIsComparedExactly_data()
{
    QTest::addColumn<QByteArray>("source");
    QTest::addColumn<QByteArray>("devicePath");
    QTest::addColumn<bool>("matches");

    QTest::newRow("same") << QByteArray("/dev/card1") << QByteArray("/dev/card1") << true;
    QTest::newRow("case") << QByteArray("/dev/Card1") << QByteArray("/dev/card1") << false;
    QTest::newRow("shorter") << QByteArray("/dev/card1") << QByteArray("/dev/card") << false;
    QTest::newRow("longer") << QByteArray("/dev/card1") << QByteArray("/dev/card11") << false;
    QTest::newRow("slash") << QByteArray("/dev/card1") << QByteArray("/dev/card1/") << false;
    QTest::newRow("slashes") << QByteArray("/dev/card1") << QByteArray("/dev//card1") << false;
    QTest::newRow("blank behind") << QByteArray("/dev/card1") << QByteArray("/dev/card1 ") << false;
    QTest::newRow("escape") << QByteArray("/dev/a\\040card") << QByteArray("/dev/a card") << true;
    QTest::newRow("encoded") << QByteArray("/dev/\xc3\xa9") << QByteArray("/dev/\xc3\xa9") << true;
}

void tst_FileRemover::deviceIsComparedExactly()
{
    QFETCH(const QByteArray, source);
    QFETCH(const QByteArray, devicePath);
    QFETCH(const bool, matches);
    const QByteArray card = makeCard("card");
    writeMountTable(line(source, card));
    QCOMPARE(runHere(devicePath), matches ? Completed : Error);
    QCOMPARE(list(card).size(), matches ? 0 : 4);
}

void tst_FileRemover::devicePathThatNamesNoDevice_data()
{
    QTest::addColumn<QByteArray>("devicePath");

    for (const char *const word : {"tmpfs", "none", "test-card1", "UUID=1234-5678", "./card"}) {
        QTest::newRow(word) << QByteArray(word);
    }
}

void tst_FileRemover::devicePathThatNamesNoDevice()
{
    QFETCH(const QByteArray, devicePath);
    const QByteArray card = makeCard("card");
    writeMountTable(line(devicePath, card));
    QCOMPARE(runHere(devicePath), Error);
    QCOMPARE(runHere(QByteArray()), Error);
    QCOMPARE(list(card).size(), 4);
}

void tst_FileRemover::nothingMounted()
{
    const QByteArray card = makeCard("card");
    writeMountTable("# " + line(device, card) + '#' + line(device, card)
                    + line("/dev/other", card));
    QCOMPARE(runHere(device), Error);
    QCOMPARE(list(card).size(), 4);
}

void tst_FileRemover::missingMountTable()
{
    QCOMPARE(unlink(mountTable.constData()), 0);
    QCOMPARE(runHere(device), Error);
}

void tst_FileRemover::emptyMountTable()
{
    QCOMPARE(runHere(device), Error);
    writeMountTable("\n\n   \n#\n");
    QCOMPARE(runHere(device), Error);
}

void tst_FileRemover::mountDirectoriesOfAnyBytes_data()
{
    QTest::addColumn<QByteArray>("name");

    QTest::newRow("blank") << QByteArray("my card");
    QTest::newRow("tab and line break") << QByteArray("my\tcard\nhere");
    QTest::newRow("backslash") << QByteArray("my\\040card");
    QTest::newRow("UTF-8") << QByteArray("K\xc3\xa4rtchen");
    QTest::newRow("Latin-1") << QByteArray("K\xe4rtchen");
    QTest::newRow("no text at all") << QByteArray("\xff\xfe\x80");
    QTest::newRow("colon") << QByteArray("a:b,c=d");
}

void tst_FileRemover::mountDirectoriesOfAnyBytes()
{
    QFETCH(const QByteArray, name);
    const QByteArray card = makeCard(name.constData());
    // What the name would be after a detour through text.
    const QByteArray reencoded = QString::fromLatin1(name).toUtf8();
    if (reencoded != name) {
        makeCard(reencoded.constData());
    }
    QCOMPARE(emptyMounted(card), Completed);
    QCOMPARE(list(card), QByteArrayList());
    if (reencoded != name) {
        QCOMPARE(list(path(reencoded.constData())).size(), 4);
    }
}

void tst_FileRemover::relativeMountDirectories_data()
{
    QTest::addColumn<QByteArray>("entry");

    QTest::newRow("empty") << device + '\n';
    QTest::newRow("empty, with blanks") << device + "   \n";
    QTest::newRow("one name") << device + " directory vfat rw 0 0\n";
    QTest::newRow("dot") << device + " . vfat rw 0 0\n";
    QTest::newRow("dots") << device + " ../current vfat rw 0 0\n";
    QTest::newRow("none") << device + " none swap sw 0 0\n";
}

void tst_FileRemover::relativeMountDirectories()
{
    QFETCH(const QByteArray, entry);
    const QByteArray current = makeCard("current");
    const QByteArray card = makeCard("card");
    makeDirectory(current + "/none");
    writeMountTable(entry);
    const auto run = [&] { return chdir(current.constData()) == 0 ? int(runHere(device)) : -1; };
    QCOMPARE(runInChild(run), int(Error));
    QCOMPARE(listAll(current).size(), 6);

    // The invalid entry is skipped, and a valid entry after it is used.
    writeMountTable(entry + line(device, card));
    QCOMPARE(runInChild(run), int(Completed));
    QCOMPARE(listAll(current).size(), 6);
    QCOMPARE(list(card), QByteArrayList());
}

void tst_FileRemover::rootMountDirectory_data()
{
    QTest::addColumn<QByteArray>("directory");

    QTest::newRow("slash") << QByteArray("/");
    QTest::newRow("slashes") << QByteArray("//");
    QTest::newRow("dot") << QByteArray("/.");
    QTest::newRow("dots") << QByteArray("/card/..");
}

void tst_FileRemover::rootMountDirectory()
{
    // In a root of its own: a remover that went for it would empty that one.
    QFETCH(const QByteArray, directory);
    const QByteArray root = makeCard("root");
    makeDirectory(root + "/etc");
    makeDirectory(root + "/card");
    makeFile(root + "/card/file");
    makeFile(root + mountTable, line(device, directory));
    const auto run = [&] {
        return chroot(root.constData()) == 0 && chdir("/") == 0 ? int(runHere(device)) : -1;
    };
    QCOMPARE(runInChild(run), int(Error));
    QCOMPARE(list(root).size(), 6);
    QCOMPARE(listAll(root).size(), 9);

    QCOMPARE(unlink((root + mountTable).constData()), 0);
    makeFile(root + mountTable, line(device, directory) + line(device, "/card"));
    QCOMPARE(runInChild(run), int(Completed));
    QCOMPARE(listAll(root).size(), 8);
    QVERIFY(!exists(root + "/card/file"));
}

void tst_FileRemover::longLine()
{
    // A line that is longer than the buffer: wherever it is cut, what follows is no entry.
    const QByteArray tail = line(device, path("outside"));
    for (const int length :
         {12280, 12285, 12286, 12287, 12288, 12289, 13000, 13310, 13311, 13312, 24575, 40000}) {
        QByteArray head = "overlay /run/layers overlay lowerdir=";
        head += QByteArray(length - head.size(), 'x');
        writeMountTable(head + tail);
        QCOMPARE(runHere(device), Error);
        QVERIFY2(exists(path("outside/file")), QByteArray::number(length).constData());
        // Blanks, too, are part of the line.
        head.replace("xxxxxxxx", "       x");
        writeMountTable(head + tail);
        QCOMPARE(runHere(device), Error);
        QVERIFY2(exists(path("outside/file")), QByteArray::number(length).constData());
    }
    // The line after it is read again, and so is the front of a line with long options.
    const QByteArray card = makeCard("card");
    writeMountTable(line("overlay", '/' + QByteArray(30000, 'x')) + line(device, card));
    QCOMPARE(runHere(device), Completed);
    QCOMPARE(list(card), QByteArrayList());

    makeFile(card + "/file");
    writeMountTable(device + ' ' + card + " vfat rw," + QByteArray(30000, 'x') + " 0 0\n");
    QCOMPARE(runHere(device), Completed);
    QCOMPARE(list(card), QByteArrayList());
}

void tst_FileRemover::anotherCLibrary()
{
    readsLikeMusl = true;
    const QByteArray card = makeCard("my\tcard \\040");
    const QByteArray other = makeCard("my\\011card\\040\\134040");
    const QByteArray source = device + "\\040x";
    const QByteArray longLine = line("overlay", '/' + QByteArray(30000, 'x'));
    writeMountTable(longLine + line(source, card) + longLine);
    QCOMPARE(runHere(device + " x"), Completed);
    QCOMPARE(list(card), QByteArrayList());
    QCOMPARE(list(other).size(), 4);
    QCOMPARE(runHere(device), Error);
}

void tst_FileRemover::lineCutWithinDirectory()
{
    // Escapes make a line four times as long as its directory, so that the front of a line may name
    // another directory, which exists.
    const int escapes = 3000;
    QByteArray directory = path("directory");
    makeDirectory(directory);
    QByteArray padding;
    while (directory.size() < escapes) {
        directory += '/' + QByteArray(200, ' ');
        makeDirectory(directory);
    }
    makeFile(directory + "/file");
    const QByteArray front = device + ' ' + escaped(directory);
    QVERIFY(front.size() < 12287);
    // Doubled slashes lead to the same place and fill the buffer exactly.
    const QByteArray filled =
        device + ' ' + QByteArray(12287 - front.size(), '/') + escaped(directory);
    QCOMPARE(filled.size(), 12287);
    writeMountTable(filled + "/inner vfat rw 0 0\n");
    QCOMPARE(runHere(device), Error);
    QVERIFY(exists(directory + "/file"));

    // The same directory, in a line that is short enough.
    QCOMPARE(emptyMounted(directory), Completed);
    QVERIFY(!exists(directory + "/file"));
}

void tst_FileRemover::lastLineWithoutBreak()
{
    const QByteArray card = makeCard("card");
    writeMountTable(line(device, card).trimmed());
    QCOMPARE(runHere(device), Completed);
    QCOMPARE(list(card), QByteArrayList());
}

void tst_FileRemover::mountedTwice()
{
    const QByteArray first = makeCard("first");
    const QByteArray second = makeCard("second");
    const MountPoint stuck(first + "/directory/file");
    writeMountTable(line(device, first) + line("tmpfs", "/run") + line(device, second));
    QCOMPARE(runHere(device), Completed);
    QCOMPARE(listAll(first), (QByteArrayList{"directory", "directory/file"}));
    QCOMPARE(list(second), QByteArrayList());
}

void tst_FileRemover::stopsAfterSuccess()
{
    const QByteArray first = makeCard("first");
    const QByteArray second = makeCard("second");
    writeMountTable(line(device, first) + line(device, second));
    QCOMPARE(runHere(device), Completed);
    QCOMPARE(list(first), QByteArrayList());
    QCOMPARE(list(second).size(), 4);
}

void tst_FileRemover::mountedTwiceAndNeitherGoes()
{
    const QByteArray first = makeCard("first");
    const QByteArray second = makeCard("second");
    const MountPoint stuck(first + "/file");
    const MountPoint stuckToo(second + "/file");
    writeMountTable(line(device, first) + line(device, second));
    QCOMPARE(runHere(device), Error);
    QCOMPARE(list(first), QByteArrayList{"file"});
    QCOMPARE(list(second), QByteArrayList{"file"});
}

void tst_FileRemover::entryThatCannotBeRemoved()
{
    const QByteArray card = makeCard("card");
    makeFiles(card, 100);
    const MountPoint stuck(card + "/file50");
    QCOMPARE(emptyMounted(card), Error);
    QCOMPARE(list(card), QByteArrayList{"file50"});
}

void tst_FileRemover::immutableFile()
{
    const QByteArray card = makeCard("card");
    makeFiles(card, 10);
    const int fd = open((card + "/file5").constData(), O_RDONLY | O_CLOEXEC);
    int flags = FS_IMMUTABLE_FL;
    if (ioctl(fd, FS_IOC_SETFLAGS, &flags) != 0) {
        const int reason = errno;
        close(fd);
        QSKIP(qPrintable(
            QStringLiteral("cannot make a file immutable here: %1").arg(qt_error_string(reason))));
    }
    const Outcome outcome = emptyMounted(card);
    flags = 0;
    QCOMPARE(ioctl(fd, FS_IOC_SETFLAGS, &flags), 0);
    close(fd);
    QCOMPARE(outcome, Error);
    QCOMPARE(list(card), QByteArrayList{"file5"});
}

void tst_FileRemover::directoryWithoutPermissions()
{
    const QByteArray card = makeCard("card");
    for (const char *const name : {"/unreadable", "/unwritable", "/unreadableEmpty"}) {
        makeDirectory(card + name);
        if (qstrcmp(name, "/unreadableEmpty") != 0) {
            makeFile(card + name + "/file");
        }
    }
    makeFile(card + "/unwritableFile");
    QCOMPARE(chmod((card + "/unwritableFile").constData(), 0), 0);
    QCOMPARE(chmod((card + "/unreadable").constData(), 0), 0);
    QCOMPARE(chmod((card + "/unreadableEmpty").constData(), 0), 0);
    QCOMPARE(chmod((card + "/unwritable").constData(), 0500), 0);
    writeMountTable(line(device, card));
    {
        const WithoutPrivileges guard;
        QCOMPARE(runHere(device), Error);
    }
    // The permissions of the directory around it count, not those of the entry.
    QCOMPARE(listAll(card),
             (QByteArrayList{"unreadable", "unreadable/file", "unwritable", "unwritable/file"}));
}

void tst_FileRemover::readOnlyCard()
{
    const QByteArray card = path("card");
    makeDirectory(card);
    QCOMPARE(mount("tmpfs", card.constData(), "tmpfs", 0, nullptr), 0);
    makeDirectory(card + "/directory");
    makeFiles(card + "/directory", 3);
    makeFiles(card, 3);
    QCOMPARE(mount(nullptr, card.constData(), nullptr, MS_REMOUNT | MS_RDONLY, nullptr), 0);
    const Outcome outcome = emptyMounted(card);
    const int left = listAll(card).size();
    QCOMPARE(umount(card.constData()), 0);
    QCOMPARE(outcome, Error);
    QCOMPARE(left, 7);
}

void tst_FileRemover::unreadableMountDirectory()
{
    const QByteArray card = makeCard("card");
    QCOMPARE(chmod(card.constData(), 0), 0);
    writeMountTable(line(device, card));
    {
        // What cannot be read counts as empty.
        const WithoutPrivileges guard;
        QCOMPARE(runHere(device), Completed);
        QVERIFY(FileRemover::removeAllEntries(QFile::decodeName(card)));
    }
    QCOMPARE(chmod(card.constData(), 0700), 0);
    QCOMPARE(list(card).size(), 4);
}

void tst_FileRemover::missingMountDirectory()
{
    QCOMPARE(emptyMounted(path("nowhere")), Completed);
}

void tst_FileRemover::mountDirectoryReplaced_data()
{
    QTest::addColumn<QByteArray>("target");

    QTest::newRow("link to a directory") << QByteArray("outside");
    QTest::newRow("link to a file") << QByteArray("outside/file");
    QTest::newRow("dangling link") << QByteArray("nowhere");
    QTest::newRow("file") << QByteArray();
}

void tst_FileRemover::mountDirectoryReplaced()
{
    QFETCH(const QByteArray, target);
    if (target.isEmpty()) {
        makeFile(path("card"));
    } else {
        makeLink(path("card"), target);
    }
    QCOMPARE(emptyMounted(path("card")), Error);
    QVERIFY(exists(path("outside/file")));

    const QByteArray second = makeCard("second");
    writeMountTable(line(device, path("card")) + line(device, second));
    QCOMPARE(runHere(device), Completed);
    QVERIFY(exists(path("outside/file")));
    QCOMPARE(list(second), QByteArrayList());
}

void tst_FileRemover::directoryOfAnotherDisk()
{
    // The node of one block device and a directory of another: the card was unmounted meanwhile.
    QByteArray node;
    struct stat disk = {};
    const QTemporaryDir onDisk;
    const QByteArray card = QFile::encodeName(onDisk.path());
    makeFiles(card, 4);
    struct stat directory = {};
    QCOMPARE(stat(card.constData(), &directory), 0);
    const QByteArrayList names = list("/dev");
    for (const QByteArray &name : names) {
        const QByteArray candidate = "/dev/" + name;
        if (stat(candidate.constData(), &disk) == 0 && S_ISBLK(disk.st_mode)
            && disk.st_rdev != directory.st_dev) {
            node = candidate;
        }
    }
    if (node.isEmpty()) {
        QSKIP("no block device here");
    }
    if (directory.st_dev >> 8 == 0) {
        QSKIP("the temporary directory lies on no disk");
    }
    writeMountTable(line(node, card));
    QCOMPARE(runHere(node), Error);
    QCOMPARE(list(card).size(), 4);

    // A file system that numbers itself may lie on any device.
    const QByteArray mounted = path("mounted");
    makeDirectory(mounted);
    QCOMPARE(mount("tmpfs", mounted.constData(), "tmpfs", 0, nullptr), 0);
    makeFile(mounted + "/file");
    writeMountTable(line(node, mounted));
    const Outcome outcome = runHere(node);
    const QByteArrayList left = list(mounted);
    QCOMPARE(umount(mounted.constData()), 0);
    QCOMPARE(outcome, Completed);
    QCOMPARE(left, QByteArrayList());
}

void tst_FileRemover::removeAllEntries()
{
    const QByteArray card = makeCard("card");
    QVERIFY(FileRemover::removeAllEntries(QFile::decodeName(card)));
    QCOMPARE(list(card), QByteArrayList());
    QVERIFY(exists(card));
    QVERIFY(FileRemover::removeAllEntries(QFile::decodeName(card)));

    makeFiles(card, 3);
    const MountPoint stuck(card + "/file1");
    QVERIFY(!FileRemover::removeAllEntries(QFile::decodeName(card)));
    QCOMPARE(list(card), QByteArrayList{"file1"});
}

void tst_FileRemover::removeAllEntriesOfNothing()
{
    const QByteArray current = makeCard("current");
    const auto run = [&] {
        return chdir(current.constData()) == 0 && FileRemover::removeAllEntries(QString())
                && FileRemover::removeAllEntries(QStringLiteral("nowhere"))
                && FileRemover::removeAllEntries(QStringLiteral("file"))
                && FileRemover::removeAllEntries(QStringLiteral("link"))
            ? 1
            : 0;
    };
    QCOMPARE(runInChild(run), 1);
    QCOMPARE(list(current).size(), 4);
}

QTEST_GUILESS_MAIN(tst_FileRemover)

#include "tst_fileremover.moc"
