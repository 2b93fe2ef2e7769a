// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "core/fuse.h"

#include <QTemporaryDir>
#include <QtTest>

#include <algorithm>
#include <cerrno>
#include <functional>
#include <grp.h>
#include <sched.h>
#include <sys/mount.h>
#include <sys/wait.h>
#include <unistd.h>
#include <vector>

using VeyFM::Fuse;

namespace {

// How the process that asks stands. Group lists reach the system sorted, so the numbers below
// also say in which order the groups are asked for.
struct Identity
{
    uid_t realUser = 4711;
    uid_t effectiveUser = 4711;
    gid_t realGroup = 1;
    gid_t effectiveGroup = 1;
    std::vector<gid_t> groups;
};

constexpr gid_t Staff = 1;
constexpr gid_t FuseCapital = 2;
constexpr gid_t Fuse2 = 3;
constexpr gid_t LongBeforeFuse = 50;
constexpr gid_t TheFuse = 5000;
constexpr gid_t LongBehindFuse = 6000;
constexpr gid_t Unknown = 7;

const char shortGroups[] = "staff:x:1:\nFuse:x:2:\nfuse2:x:3:\nfuse:x:5000:\n";

// Two more, of lines too long for any look-up that gets so far in the file.
QByteArray longGroups()
{
    const QByteArray members = QByteArray("member,").repeated(1000) + "member\n";
    return shortGroups + ("long:x:50:" + members) + "longer:x:6000:" + members;
}

int lookUp(gid_t gid)
{
    char buffer[4096];
    group record;
    group* found = nullptr;
    const int result = getgrgid_r(gid, &record, buffer, sizeof(buffer), &found);
    return result == 0 && !found ? ENOENT : result;
}

bool assume(const Identity& identity)
{
    return setgroups(identity.groups.size(), identity.groups.data()) == 0 &&
           setresgid(identity.realGroup, identity.effectiveGroup, identity.effectiveGroup) == 0 &&
           setresuid(identity.realUser, identity.effectiveUser, identity.effectiveUser) == 0;
}

enum ExitCode { AnswerNo, AnswerYes, CannotPrepare };

// Runs a question in a process of its own.
int askElsewhere(const std::function<int()>& question)
{
    const pid_t child = fork();
    if (child == 0) {
        _exit(question());
    }
    int status = 0;
    if (child < 0 || waitpid(child, &status, 0) != child || !WIFEXITED(status)) {
        return -1;
    }
    return WEXITSTATUS(status);
}

} // namespace

Q_DECLARE_METATYPE(Identity)

class FuseTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void answers_data();
    void answers();
    void asksAgainAtEachCall();

private:
    // Gives the calling process, a child of the test, the group database of the test.
    bool replaceGroups(const QByteArray& groupFile) const;
    QByteArray writeGroups(const QString& name, const QByteArray& text) const;

    QTemporaryDir m_dir;
    QByteArray m_shortFile;
    QByteArray m_longFile;
};

bool FuseTest::replaceGroups(const QByteArray& groupFile) const
{
    return unshare(CLONE_NEWNS) == 0 &&
           mount(nullptr, "/", nullptr, MS_REC | MS_PRIVATE, nullptr) == 0 &&
           mount(groupFile.constData(), "/etc/group", nullptr, MS_BIND, nullptr) == 0;
}

QByteArray FuseTest::writeGroups(const QString& name, const QByteArray& text) const
{
    QFile file(m_dir.filePath(name));
    const bool written =
        file.open(QIODevice::WriteOnly) && file.write(text) == text.size() &&
        file.setPermissions(
            QFile::ReadOwner | QFile::WriteOwner | QFile::ReadGroup | QFile::ReadOther);
    return written ? QFile::encodeName(file.fileName()) : QByteArray();
}

void FuseTest::initTestCase()
{
    if (getuid() != 0) {
        QSKIP("only root can take on other users and groups");
    }
    m_shortFile = writeGroups(QStringLiteral("short"), shortGroups);
    m_longFile = writeGroups(QStringLiteral("long"), longGroups());
    QVERIFY(!m_shortFile.isEmpty() && !m_longFile.isEmpty());

    // The cases rest on what these groups answer.
    const int prepared = askElsewhere([this] {
        if (!replaceGroups(m_longFile)) {
            return CannotPrepare;
        }
        const bool holds = lookUp(Staff) == 0 && lookUp(TheFuse) == 0 &&
                           lookUp(LongBeforeFuse) == ERANGE && lookUp(LongBehindFuse) == ERANGE;
        return holds ? AnswerYes : AnswerNo;
    });
    if (prepared == CannotPrepare) {
        QSKIP("no mount namespace can be made here to put a group file of the test's own into");
    }
    QCOMPARE(prepared, int(AnswerYes));
    const int unknown = askElsewhere([this] {
        return replaceGroups(m_shortFile) && lookUp(Unknown) == ENOENT ? AnswerYes : AnswerNo;
    });
    QCOMPARE(unknown, int(AnswerYes));
}

void FuseTest::answers_data()
{
    QTest::addColumn<Identity>("identity");
    QTest::addColumn<bool>("expected");

    const auto groups = [](std::vector<gid_t> list) {
        Identity identity;
        identity.groups = std::move(list);
        return identity;
    };
    const auto effective = [](gid_t group, std::vector<gid_t> list) {
        Identity identity;
        identity.effectiveGroup = group;
        identity.groups = std::move(list);
        return identity;
    };

    QTest::newRow("no groups") << groups({}) << false;
    QTest::newRow("other groups") << groups({Staff}) << false;
    QTest::newRow("supplementary") << groups({TheFuse}) << true;
    QTest::newRow("supplementary behind others") << groups({Staff, Fuse2, TheFuse}) << true;
    QTest::newRow("effective") << effective(TheFuse, {}) << true;
    QTest::newRow("similar names") << groups({FuseCapital, Fuse2}) << false;

    // A group that is not there is no failure, one that can't be looked up ends the walk.
    QTest::newRow("unknown group before") << groups({Unknown, TheFuse}) << true;
    QTest::newRow("failure before") << groups({LongBeforeFuse, TheFuse}) << false;
    QTest::newRow("failure behind") << groups({TheFuse, LongBehindFuse}) << true;
    // But a failure of the effective group ends nothing.
    QTest::newRow("failure of the effective group") << effective(LongBeforeFuse, {TheFuse}) << true;
    QTest::newRow("unknown effective group") << effective(Unknown, {TheFuse}) << true;

    Identity realGroup;
    realGroup.realGroup = TheFuse;
    QTest::newRow("real group does not count") << realGroup << false;

    Identity root;
    root.realUser = 0;
    root.effectiveUser = 0;
    QTest::newRow("root") << root << true;
    Identity realRoot = groups({LongBeforeFuse});
    realRoot.realUser = 0;
    QTest::newRow("root by the real user") << realRoot << true;
    Identity effectiveRoot;
    effectiveRoot.effectiveUser = 0;
    QTest::newRow("effective root alone does not count") << effectiveRoot << false;

    std::vector<gid_t> many;
    for (gid_t gid = 1000; gid < 2000; ++gid) {
        many.push_back(gid);
    }
    QTest::newRow("more groups than the buffer holds inline") << groups(many) << false;
    many.push_back(TheFuse);
    QTest::newRow("fuse behind more groups") << groups(many) << true;
}

void FuseTest::answers()
{
    QFETCH(Identity, identity);
    QFETCH(bool, expected);

    const std::vector<gid_t>& groups = identity.groups;
    const bool withLong = identity.effectiveGroup == LongBeforeFuse ||
                          std::count(groups.begin(), groups.end(), LongBeforeFuse) > 0 ||
                          std::count(groups.begin(), groups.end(), LongBehindFuse) > 0;
    const int answer = askElsewhere([&] {
        if (!replaceGroups(withLong ? m_longFile : m_shortFile) || !assume(identity)) {
            return CannotPrepare;
        }
        return Fuse::isInFuseGroup() ? AnswerYes : AnswerNo;
    });
    QCOMPARE(answer, int(expected ? AnswerYes : AnswerNo));
}

void FuseTest::asksAgainAtEachCall()
{
    const int answer = askElsewhere([this] {
        Identity identity;
        identity.effectiveUser = 0; // So that the groups can still be changed.
        if (!replaceGroups(m_shortFile) || !assume(identity)) {
            return CannotPrepare;
        }
        const bool before = Fuse::isInFuseGroup();
        const gid_t fuse = TheFuse;
        if (setgroups(1, &fuse) != 0) {
            return CannotPrepare;
        }
        return !before && Fuse::isInFuseGroup() ? AnswerYes : AnswerNo;
    });
    QCOMPARE(answer, int(AnswerYes));
}

QTEST_APPLESS_MAIN(FuseTest)
#include "tst_fuse.moc"
