// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "filetree.h"
#include "loggedtest.h"
#include "memorycard/fileremover.h"
#include "patience.h"
#include "scratchfilesystem.h"
#include "texts.h"
#include "usedupdescriptors.h"

#include <QDir>
#include <QFile>
#include <QSemaphore>
#include <QSignalSpy>
#include <QTemporaryDir>
#include <QTest>
#include <QThread>
#include <QThreadPool>

#include <atomic>
#include <memory>

#include <dlfcn.h>
#include <linux/capability.h>
#include <linux/magic.h>
#include <sys/mount.h>
#include <sys/stat.h>
#include <sys/syscall.h>
#include <sys/vfs.h>
#include <sys/wait.h>
#include <unistd.h>

using namespace FileTree;

namespace {

const QByteArray mountTable = "/etc/mtab";
// No such node exists: the tests' cards are directories.
const QByteArray device = "/dev/test-card1";

// What makeCard() creates.
const QByteArrayList cardEntries = {".hidden", "directory", "directory/file", "file", "link"};

enum Outcome { Completed, Error, NotOneSignal };

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

// The directories of the tests are on a tmpfs.
QByteArray line(const QByteArray &source, const QByteArray &directory,
                const QByteArray &type = "tmpfs")
{
    return source + ' ' + escaped(directory) + ' ' + type + " rw,nosuid 0 0\n";
}

// The type of all file systems, if it is set.
unsigned pretendedType = 0;

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

} // namespace

// With 64-bit inode numbers this name means fstatfs64.
extern "C" Q_DECL_EXPORT int fstatfs(int descriptor, struct statfs *system) noexcept
{
    static auto *const real =
        reinterpret_cast<int (*)(int, struct statfs *)>(dlsym(RTLD_NEXT, "fstatfs64"));
    const int result = real(descriptor, system);
    if (pretendedType != 0) {
        system->f_type = pretendedType;
    }
    return result;
}

class tst_FileRemover : public LoggedTest
{
    Q_OBJECT

private Q_SLOTS:
    void init();
    void cleanup();

    void onThreadPool();
    void receiverGoesFirst();
    void keepsTheMountDirectory();
    void entriesOfTheMountTable_data();
    void entriesOfTheMountTable();
    void missingMountTable();
    void mountDirectoriesOfAnyBytes_data();
    void mountDirectoriesOfAnyBytes();
    void rootMountDirectory_data();
    void rootMountDirectory();
    void longLine();
    void lineCutWithinDirectory();
    void entriesThatCannotBeRemoved();
    void directoryWithoutPermissions();
    void readOnlyCard();
    void noDescriptorForTheCard();
    void mountDirectoryReplaced_data();
    void mountDirectoryReplaced();
    void directoriesOnTheDevice_data();
    void directoriesOnTheDevice();
    void notRun();
    void removeAllEntries();

private:
    void writeMountTable(const QByteArray &content);
    // Runs a remover to its end on this thread. A removal that fails must say why; see m_reason.
    Outcome runHere(const QByteArray &devicePath);
    // Runs a remover with a mount table of one card.
    Outcome emptyMounted(const QByteArray &card);
    QByteArray path(const char *name) const { return m_files->path(name); }
    QByteArray makeCard(const char *name);

    std::unique_ptr<ScratchFileSystem> m_files;
    // What the last remover logged, without the category and the device.
    QByteArray m_reason;
};

void tst_FileRemover::init()
{
    LoggedTest::init();
    m_files = std::make_unique<ScratchFileSystem>();
    makeDirectory(path("outside"));
    makeFile(path("outside/file"), "precious");
    writeMountTable(QByteArray());
}

void tst_FileRemover::cleanup()
{
    pretendedType = 0;
    QDir::setCurrent("/"_s);
    QCOMPARE(read(path("outside/file")), QByteArray("precious"));
    m_files.reset();
    LoggedTest::cleanup();
}

// The table of the system is a link. This function must not write to its target.
void tst_FileRemover::writeMountTable(const QByteArray &content)
{
    const QByteArray draft = mountTable + ".draft";
    makeFile(draft, content);
    if (::rename(draft.constData(), mountTable.constData()) != 0) {
        qFatal("cannot write the mount table");
    }
}

Outcome tst_FileRemover::runHere(const QByteArray &devicePath)
{
    FileRemover remover(QFile::decodeName(devicePath));
    const QSignalSpy completed(&remover, &FileRemover::completed);
    const QSignalSpy error(&remover, &FileRemover::error);
    remover.run();
    m_reason = m_log->takeReport().toUtf8();
    const QByteArray warning = "warning [com.marlo.settings.system.memorycard] Cannot empty ";
    if (completed.count() + error.count() != 1
        || (error.count() == 1 && !m_reason.startsWith(warning))) {
        return NotOneSignal;
    }
    m_reason.replace(warning + '"' + devicePath + "\" ", "");
    return completed.count() == 1 ? Completed : Error;
}

Outcome tst_FileRemover::emptyMounted(const QByteArray &card)
{
    writeMountTable(line(device, card));
    return runHere(device);
}

QByteArray tst_FileRemover::makeCard(const char *name)
{
    const QByteArray card = path(name);
    makeTree(card, {"file", ".hidden", "directory/file", "link -> ../outside"});
    return card;
}

void tst_FileRemover::onThreadPool()
{
    const QByteArray card = makeCard("card");
    for (const bool mounted : {false, true}) {
        writeMountTable(line(mounted ? device : QByteArray("/dev/other"), card));

        auto *const remover = new FileRemover(QFile::decodeName(device));
        QVERIFY(remover->autoDelete() && !remover->parent());
        QCOMPARE(FileRemover::staticMetaObject.methodCount(),
                 QObject::staticMetaObject.methodCount() + 2); // the two signals
        const QObject receiver;
        QByteArrayList received;
        std::atomic<QThread *> emitter{nullptr};
        const auto record = [&](auto signal, const QByteArray &name) {
            connect(remover, signal, &receiver, [&received, name] { received.append(name); });
            const auto note = [&emitter] { emitter = QThread::currentThread(); };
            connect(remover, signal, remover, note, Qt::DirectConnection);
        };
        record(&FileRemover::completed, "completed");
        record(&FileRemover::error, "error");
        QSemaphore deleted;
        connect(
            remover, &QObject::destroyed, remover, [&] { deleted.release(); },
            Qt::DirectConnection);
        QThreadPool::globalInstance()->start(remover, 0);

        // The remover is gone, but its signal arrives only when this thread returns to its event loop.
        QVERIFY(deleted.tryAcquire(1, patience));
        QVERIFY(emitter.load() && emitter.load() != QThread::currentThread());
        QCOMPARE(received, QByteArrayList());
        TRY_COMPARE(received.size(), 1);
        QCoreApplication::sendPostedEvents();
        QCOMPARE(received, QByteArrayList{mounted ? "completed" : "error"});
        QCOMPARE(m_log->takeAll().size(), mounted ? 0 : 1);
        QCOMPARE(exists(card + "/file"), !mounted);
    }
}

void tst_FileRemover::receiverGoesFirst()
{
    const QByteArray card = makeCard("card");
    makeFiles(card, 2000);
    writeMountTable(line(device, card));
    auto *const remover = new FileRemover(QFile::decodeName(device));
    auto receiver = std::make_unique<QObject>();
    connect(remover, &FileRemover::completed, receiver.get(), [] { QFAIL("no receiver"); });
    connect(remover, &FileRemover::error, receiver.get(), [] { QFAIL("no receiver"); });
    QThreadPool::globalInstance()->start(remover, 0);
    receiver.reset();
    QVERIFY(QThreadPool::globalInstance()->waitForDone(patience));
    QCoreApplication::sendPostedEvents();
    QCOMPARE(list(card), QByteArrayList());
}

void tst_FileRemover::keepsTheMountDirectory()
{
    const QByteArray card = makeCard("card");
    struct stat before = {};
    struct stat after = {};
    QCOMPARE(stat(card.constData(), &before), 0);
    QCOMPARE(emptyMounted(card), Completed);
    QCOMPARE(list(card), QByteArrayList());
    QCOMPARE(emptyMounted(card), Completed);
    QCOMPARE(stat(card.constData(), &after), 0);
    QCOMPARE(after.st_ino, before.st_ino);
}

void tst_FileRemover::entriesOfTheMountTable_data()
{
    QTest::addColumn<QByteArray>("table"); // "@" is the directory of the cards
    QTest::addColumn<QByteArray>("devicePath");
    QTest::addColumn<QByteArray>("emptied");

    const auto completes = [](const char *tag, const QByteArray &table, const char *emptied,
                              const QByteArray &devicePath = device) {
        QTest::newRow(tag) << table << devicePath << QByteArray(emptied);
    };
    const QByteArray card = line(device, "@/card");
    completes("among others", line("sysfs", "/sys") + card + line("tmpfs", "/run"), "card");
    completes("other devices",
              line("/dev/other1", "@/other") + card + line("/dev/other2", "@/other"), "card");
    completes("last line without a break", card.trimmed(), "card");
    completes("mounted twice", card + line(device, "@/other"), "card");
    completes("escape", line("/dev/a\\040card", "@/card"), "card", "/dev/a card");
    completes("encoded", line("/dev/\xc3\xa9", "@/card"), "card", "/dev/\xc3\xa9");
    completes("another device below it", line("/dev/other", "@/card") + card, "card");
    completes("another device between", card + line("/dev/other", "@/card") + card, "card");
    completes("another device beside it",
              card + line("/dev/other", "@/car") + line("/dev/other", "@/cards")
                  + line("/dev/other", "@/card/directory"),
              "card");
    // A directory that cannot be opened counts as empty.
    completes("missing mount directory", line(device, "@/nowhere"), "");

    const auto fails = [](const char *tag, const QByteArray &table,
                          const QByteArray &devicePath = device) {
        QTest::newRow(tag) << table << devicePath << QByteArray("nothing");
    };
    fails("empty table", "");
    fails("blank lines", "\n\n   \n#\n");
    fails("comments", "# " + card + '#' + card + line("/dev/other", "@/card"));
    // The directory may be on the other device.
    fails("another device over it", card + line("/dev/other", "@/card"));
    fails("another device over the directory above it",
          line(device, "@/card/directory") + line("/dev/other", "@/card"));
    fails("another device over the root directory", card + line("/dev/other", "/"));
    // Device paths are compared exactly.
    for (const char *path : {"/dev/Test-card1", "/dev/test-card", "/dev/test-card11",
                             "/dev/test-card1/", "/dev//test-card1", "/dev/test-card1 "}) {
        fails(path, card, path);
    }
    // The device path does not name a device.
    fails("empty device path", card, "");
    for (const char *path : {"tmpfs", "none", "test-card1", "UUID=1234-5678", "./card"}) {
        fails(path, line(path, "@/card"), path);
    }
    // A relative path is not a mount directory. The remover uses a valid entry that follows.
    const auto isSkipped = [=](const QByteArray &tag, const QByteArray &rest) {
        fails(tag.constData(), device + rest);
        completes((tag + ", then valid").constData(), device + rest + card, "card");
    };
    isSkipped("no mount directory", "\n");
    isSkipped("blanks as mount directory", "   \n");
    isSkipped("one name", " directory tmpfs rw 0 0\n");
    isSkipped("dot", " . tmpfs rw 0 0\n");
    isSkipped("dots", " ../current tmpfs rw 0 0\n");
    isSkipped("none", " none swap sw 0 0\n");
}

void tst_FileRemover::entriesOfTheMountTable()
{
    QFETCH(QByteArray, table);
    QFETCH(const QByteArray, devicePath);
    QFETCH(const QByteArray, emptied);
    for (const char *name : {"card", "other", "current"}) {
        makeCard(name);
    }
    makeDirectory(path("current/none"));
    QVERIFY(QDir::setCurrent(QFile::decodeName(path("current"))));
    writeMountTable(table.replace("@/", path("")));
    QCOMPARE(runHere(devicePath), emptied == "nothing" ? Error : Completed);
    QCOMPARE(listAll(path("card")), emptied == "card" ? QByteArrayList() : cardEntries);
    QCOMPARE(listAll(path("other")), cardEntries);
    QCOMPARE(listAll(path("current")).size(), cardEntries.size() + 1);
}

void tst_FileRemover::missingMountTable()
{
    QCOMPARE(unlink(mountTable.constData()), 0);
    QCOMPARE(runHere(device), Error);
    QCOMPARE(m_reason, QByteArray("because the mount table cannot be read"));
}

void tst_FileRemover::mountDirectoriesOfAnyBytes_data()
{
    QTest::addColumn<QByteArray>("name");
    // The last three are UTF-8, Latin-1 and no text at all.
    for (const QByteArray name : {"my card", "my\tcard\nhere", "my\\040card", "a:b,c=d",
                                  "K\xc3\xa4rtchen", "K\xe4rtchen", "\xff\xfe\x80"}) {
        QTest::newRow(name.toPercentEncoding().constData()) << name;
    }
}

void tst_FileRemover::mountDirectoriesOfAnyBytes()
{
    QFETCH(const QByteArray, name);
    const QByteArray card = makeCard(name.constData());
    // What the name would be after a conversion to text and back.
    const QByteArray converted = QString::fromLatin1(name).toUtf8();
    if (converted != name) {
        makeCard(converted.constData());
    }
    QCOMPARE(emptyMounted(card), Completed);
    QCOMPARE(list(card), QByteArrayList());
    if (converted != name) {
        QCOMPARE(listAll(path(converted.constData())), cardEntries);
    }
}

void tst_FileRemover::rootMountDirectory_data()
{
    QTest::addColumn<QByteArray>("directory");

    for (const char *directory : {"/", "//", "/.", "/card/.."}) {
        QTest::newRow(directory) << QByteArray(directory);
    }
}

void tst_FileRemover::rootMountDirectory()
{
    QFETCH(const QByteArray, directory);
    // Runs in a child with a root directory of its own, which a wrong remover would empty.
    const QByteArray root = makeCard("root");
    makeTree(root, {"etc/", "card/file"});
    const auto run = [&](const QByteArray &table) {
        unlink((root + mountTable).constData());
        makeFile(root + mountTable, table);
        const pid_t child = fork();
        if (child == 0) {
            const bool isInRoot = chroot(root.constData()) == 0 && chdir("/") == 0;
            _exit(isInRoot ? int(runHere(device)) : int(NotOneSignal));
        }
        int status = 0;
        return child > 0 && waitpid(child, &status, 0) == child && WIFEXITED(status)
            ? WEXITSTATUS(status)
            : -1;
    };
    QCOMPARE(run(line(device, directory)), int(Error));
    // The other file systems of such a device belong to the system, too.
    QCOMPARE(run(line(device, directory) + line(device, "/card")), int(Error));
    QCOMPARE(run(line(device, "/card") + line(device, directory)), int(Error));
    QCOMPARE(listAll(root).size(), cardEntries.size() + 4);

    QCOMPARE(run(line("/dev/other", directory) + line(device, "/card")), int(Completed));
    QCOMPARE(listAll(root).size(), cardEntries.size() + 3);
    QVERIFY(!exists(root + "/card/file"));
}

void tst_FileRemover::longLine()
{
    // A line that is longer than the buffer: wherever it is cut, the rest is not an entry.
    const QByteArray tail = line(device, path("outside"));
    for (const int length :
         {12280, 12285, 12286, 12287, 12288, 12289, 13000, 13310, 13311, 13312, 24575, 40000}) {
        const QByteArray head =
            QByteArray("overlay /run/layers overlay lowerdir=").leftJustified(length, 'x');
        // Blanks, too, are part of the line.
        const QByteArray withBlanks = QByteArray(head).replace("xxxxxxxx", "       x");
        for (const QByteArray &front : {head, withBlanks}) {
            writeMountTable(front + tail);
            QCOMPARE(runHere(device), Error);
            QVERIFY2(exists(path("outside/file")), QByteArray::number(length).constData());
        }
    }
    // The remover does read the line after it, and also the front of a line with long options.
    const QByteArray card = makeCard("card");
    writeMountTable(line("overlay", '/' + QByteArray(30000, 'x')) + line(device, card));
    QCOMPARE(runHere(device), Completed);
    QCOMPARE(list(card), QByteArrayList());

    makeFile(card + "/file");
    writeMountTable(device + ' ' + card + " tmpfs rw," + QByteArray(30000, 'x') + " 0 0\n");
    QCOMPARE(runHere(device), Completed);
    QCOMPARE(list(card), QByteArrayList());
}

void tst_FileRemover::lineCutWithinDirectory()
{
    // Escapes make a line four times as long as its directory, so that the front of a line may name
    // another directory, which exists.
    const int escapes = 3000;
    QByteArray directory = path("directory");
    makeDirectory(directory);
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
    writeMountTable(filled + "/inner tmpfs rw 0 0\n");
    QCOMPARE(runHere(device), Error);
    QVERIFY(exists(directory + "/file"));

    // The same directory, in a line that is short enough.
    QCOMPARE(emptyMounted(directory), Completed);
    QVERIFY(!exists(directory + "/file"));
}

void tst_FileRemover::entriesThatCannotBeRemoved()
{
    NEEDS_MOUNTS(*m_files)
    const QByteArray first = makeCard("first");
    const QByteArray second = makeCard("second");
    makeFiles(first, 100);
    const MountPoint stuck(first + "/directory/file");
    writeMountTable(line(device, first) + line("tmpfs", "/run") + line(device, second));
    QCOMPARE(runHere(device), Completed);
    const QByteArray reason =
        "on \"" + first + "\" because \"directory/file: Device or resource busy, and 0 more\"";
    QCOMPARE(m_reason, reason);
    QCOMPARE(listAll(first), (QByteArrayList{"directory", "directory/file"}));
    QCOMPARE(list(second), QByteArrayList());

    // If neither of two mount directories can be emptied, that is an error.
    makeTree(second, {"file", "other"});
    const MountPoint stuckToo(second + "/file");
    QCOMPARE(runHere(device), Error);
    QCOMPARE(listAll(first), (QByteArrayList{"directory", "directory/file"}));
    QCOMPARE(list(second), QByteArrayList{"file"});
}

void tst_FileRemover::directoryWithoutPermissions()
{
    const QByteArray card = makeCard("card");
    makeTree(card, {"unreadable/file", "unreadableEmpty/", "unwritable/file", "unwritableFile"});
    for (const char *name : {"/unwritableFile", "/unreadable", "/unreadableEmpty"}) {
        QCOMPARE(chmod((card + name).constData(), 0), 0);
    }
    QCOMPARE(chmod((card + "/unwritable").constData(), 0500), 0);
    {
        const WithoutPrivileges guard;
        QCOMPARE(emptyMounted(card), Error);
    }
    // The permissions of the directory around an entry count, not those of the entry.
    QCOMPARE(listAll(card),
             (QByteArrayList{"unreadable", "unreadable/file", "unwritable", "unwritable/file"}));

    // A card that cannot be read counts as empty.
    QCOMPARE(chmod(card.constData(), 0), 0);
    {
        const WithoutPrivileges guard;
        QCOMPARE(emptyMounted(card), Completed);
        QVERIFY(FileRemover::removeAllEntries(QFile::decodeName(card)));
    }
    QCOMPARE(chmod(card.constData(), 0700), 0);
    QCOMPARE(listAll(card).size(), 4);
}

void tst_FileRemover::readOnlyCard()
{
    NEEDS_MOUNTS(*m_files)
    const QByteArray card = makeCard("card");
    const MountPoint mounted(card);
    QCOMPARE(mount(nullptr, card.constData(), nullptr, MS_BIND | MS_REMOUNT | MS_RDONLY, nullptr),
             0);
    QCOMPARE(emptyMounted(card), Error);
    QCOMPARE(listAll(card), cardEntries);
}

void tst_FileRemover::noDescriptorForTheCard()
{
    const QByteArray card = makeCard("card");
    writeMountTable(line(device, card));
    {
        const UsedUpDescriptors used(1); // the mount table takes it
        QCOMPARE(runHere(device), Error);
    }
    QCOMPARE(m_reason, "on \"" + card + "\" because \"" + qt_error_string(EMFILE).toUtf8() + '"');
    QCOMPARE(listAll(card), cardEntries);
}

void tst_FileRemover::mountDirectoryReplaced_data()
{
    QTest::addColumn<QByteArray>("entry");

    for (const char *entry :
         {"card -> outside", "card -> outside/file", "card -> nowhere", "card"}) {
        QTest::newRow(entry) << QByteArray(entry);
    }
}

void tst_FileRemover::mountDirectoryReplaced()
{
    QFETCH(const QByteArray, entry);
    makeTree(m_files->path(), {entry});
    QCOMPARE(emptyMounted(path("card")), Error);
    QCOMPARE(m_reason, "on \"" + path("card") + "\" because \"not a directory\"");
    QVERIFY(exists(path("outside/file")));

    const QByteArray second = makeCard("second");
    writeMountTable(line(device, path("card")) + line(device, second));
    QCOMPARE(runHere(device), Completed);
    QVERIFY(exists(path("outside/file")));
    QCOMPARE(list(second), QByteArrayList());
}

void tst_FileRemover::directoriesOnTheDevice_data()
{
    QTest::addColumn<QByteArray>("node");
    QTest::addColumn<QByteArray>("directory");
    QTest::addColumn<QByteArray>("type");
    QTest::addColumn<QByteArray>("reason");
    const QByteArray none;
    const QByteArray refused = "not on the device";
    const auto row = [](const QByteArray &node, const QByteArray &directory, const QByteArray &type,
                        const QByteArray &reason) {
        QTest::addRow("%s, node of %s, on %s", type.constData(), node.constData(),
                      directory.constData())
            << node << directory << type << reason;
    };
    // The directory has the number of the block device.
    row("the directory", "tmpfs", "vfat", none);
    // Another file system is mounted over the card, or the card has been unmounted or pulled out.
    for (const char *node : {"another device", "nothing"}) {
        for (const char *type : {"vfat", "exfat", "ext4", "fuseblk", "tmpfsx", "tmp"}) {
            row(node, "tmpfs", type, refused);
            row(node, "overlay", type, refused);
        }
        // A file system without a number of a block device may be on any device.
        row(node, "tmpfs", "tmpfs", none);
        row(node, "tmpfs", "tmpfs.sub", none);
        row(node, "overlay", "overlay", none);
        row(node, "btrfs", "btrfs", none);
        row(node, "fuse", "fuse.exfat", none);
        // But it has the type of the entry.
        for (const char *type : {"btrfs", "fuse", "fuse.exfat", "overlay"}) {
            row(node, "tmpfs", type, refused);
        }
        row(node, "overlay", "tmpfs", refused);
    }
    row("the root directory", "tmpfs", "tmpfs", "it has the root directory");
    row("a file", "tmpfs", "vfat", refused);
}

void tst_FileRemover::directoriesOnTheDevice()
{
    QFETCH(const QByteArray, node);
    QFETCH(const QByteArray, directory);
    QFETCH(const QByteArray, type);
    QFETCH(const QByteArray, reason);
    // The throw-away root has overlays.
    const QTemporaryDir onOverlay("/etc/card"_s);
    const bool inMemory = directory != "overlay";
    const QByteArray card = inMemory ? makeCard("card") : QFile::encodeName(onOverlay.path());
    makeFiles(card, 4);
    struct statfs system = {};
    QCOMPARE(statfs(card.constData(), &system), 0);
    if (!inMemory && uint(system.f_type) != OVERLAYFS_SUPER_MAGIC) {
        QSKIP("/etc is not on an overlay");
    }
    const QByteArrayList before = listAll(card);

    const QByteArray path = m_files->path("device");
    if (node == "a file") {
        makeFile(path);
    } else if (node != "nothing") {
        struct stat numbered = {};
        QCOMPARE(stat(node == "the root directory" ? "/" : card.constData(), &numbered), 0);
        const dev_t number = numbered.st_dev ^ (node == "another device" ? 0x700 : 0);
        if (mknod(path.constData(), S_IFBLK | 0600, number) != 0) {
            QSKIP("this user may not make device nodes");
        }
    }
    writeMountTable(line(path, card, type));
    pretendedType = directory == "btrfs" ? BTRFS_SUPER_MAGIC
        : directory == "fuse"            ? FUSE_SUPER_MAGIC
                                         : 0;
    QCOMPARE(runHere(path), reason.isEmpty() ? Completed : Error);
    QVERIFY2(m_reason.contains(reason), m_reason.constData());
    QCOMPARE(listAll(card), reason.isEmpty() ? QByteArrayList() : before);
}

void tst_FileRemover::notRun()
{
    // A remover that is deleted before it has run reports that it failed.
    auto remover = std::make_unique<FileRemover>(QFile::decodeName(device));
    int errors = 0;
    connect(remover.get(), &FileRemover::error, this, [&errors] { ++errors; });
    remover.reset();
    QCOMPARE(errors, 1);
    QCOMPARE(m_log->takeReport(),
             "warning [com.marlo.settings.system.memorycard] Cannot empty "
             "\"/dev/test-card1\" because it was taken from the thread pool"_s);
}

void tst_FileRemover::removeAllEntries()
{
    QVERIFY(QDir::setCurrent(QFile::decodeName(makeCard("current"))));
    for (const char *name : {"", "nowhere", "file", "link"}) {
        QVERIFY2(FileRemover::removeAllEntries(QString::fromLatin1(name)), name);
    }
    QCOMPARE(listAll(path("current")), cardEntries);

    const QByteArray card = makeCard("card");
    QVERIFY(FileRemover::removeAllEntries(QFile::decodeName(card)));
    QCOMPARE(list(card), QByteArrayList());
    QVERIFY(exists(card));
    QVERIFY(FileRemover::removeAllEntries(QFile::decodeName(card)));

    NEEDS_MOUNTS(*m_files)
    makeFiles(card, 3);
    const MountPoint stuck(card + "/file1");
    QVERIFY(!FileRemover::removeAllEntries(QFile::decodeName(card)));
    QCOMPARE(list(card), QByteArrayList{"file1"});
}

QTEST_GUILESS_MAIN(tst_FileRemover)

#include "tst_fileremover.moc"
