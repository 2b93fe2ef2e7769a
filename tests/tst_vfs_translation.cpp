// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/catalogue.h"
#include "support/startupprobe.h"
#include "support/temporarytree.h"

#include <QProcess>
#include <QTest>

#include <cstdarg>
#include <cstdlib>
#include <cstring>
#include <string>

#include <dlfcn.h>
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

namespace {

const char systemFolder[] = "/usr/share/veyfm/translations/";

// The system's folder of catalogues lies in a folder of the test.
std::string redirected(const char* path)
{
    const char* const folder = std::getenv("VEYFM_TEST_CATALOGUES");
    const size_t length = sizeof(systemFolder) - 1;
    if (!folder || !path || std::strncmp(path, systemFolder, length) != 0) {
        return path ? path : "";
    }
    return std::string(folder) + '/' + (path + length);
}

template <typename Function>
Function original(const char* name, Function)
{
    return reinterpret_cast<Function>(::dlsym(RTLD_NEXT, name));
}

} // namespace

// These stand before the C library's in this process: the library looks at one absolute path, and
// no test may write there.
extern "C" {

Q_DECL_EXPORT int access(const char* path, int mode) noexcept
{
    return original("access", &access)(redirected(path).c_str(), mode);
}

Q_DECL_EXPORT int stat64(const char* path, struct stat64* status) noexcept
{
    return original("stat64", &stat64)(redirected(path).c_str(), status);
}

Q_DECL_EXPORT int
statx(int directory, const char* path, int flags, unsigned mask, struct statx* status) noexcept
{
    return original("statx", &statx)(directory, redirected(path).c_str(), flags, mask, status);
}

Q_DECL_EXPORT int open64(const char* path, int flags, ...)
{
    va_list arguments;
    va_start(arguments, flags);
    const mode_t mode = flags & O_CREAT ? va_arg(arguments, mode_t) : 0;
    va_end(arguments);
    return original("open64", &open64)(redirected(path).c_str(), flags, mode);
}

} // extern "C"

/// The catalogue that the library brings along, found by the user's language.
class TestVfsTranslation : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void placesAreTranslated_data();
    void placesAreTranslated();
    void installedOnce();

private:
    QStringList run(const char* mode, const QString& locale) const;

    TemporaryTree m_tree;
};

void TestVfsTranslation::initTestCase()
{
    // The names are bare: there is no ".qm" behind the language.
    QVERIFY(m_tree.makeDir("catalogues"));
    QVERIFY(m_tree.write(
        "catalogues/libveyfmvfs_ru.qm", catalogue("VeyFM::VFS", {{"Home", QStringLiteral("X")}})));
    QVERIFY(m_tree.write(
        "catalogues/libveyfmvfs_de",
        catalogue(
            "VeyFM::VFS", {{"Home", QString::fromUtf8("Persönlicher Ordner")},
                           {"Network", QStringLiteral("Netzwerk")},
                           {"_", QStringLiteral("Wurzel")}})));
    QVERIFY(m_tree.write(
        "catalogues/libveyfmvfs_pt_BR",
        catalogue("VeyFM::VFS", {{"Home", QStringLiteral("Pasta pessoal")}})));
    QVERIFY(m_tree.write(
        "catalogues/libveyfmvfs_fr",
        catalogue("Elsewhere", {{"Home", QStringLiteral("Dossier personnel")}})));
}

QStringList TestVfsTranslation::run(const char* mode, const QString& locale) const
{
    QProcessEnvironment environment = QProcessEnvironment::systemEnvironment();
    environment.insert(QStringLiteral("VEYFM_TEST_CATALOGUES"), m_tree.path("catalogues"));
    environment.insert(QStringLiteral("HOME"), m_tree.path());
    environment.insert(QStringLiteral("LC_ALL"), locale);
    environment.remove(QStringLiteral("LANGUAGE"));
    QProcess process;
    process.setProcessEnvironment(environment);
    process.start(
        QCoreApplication::applicationFilePath(),
        {QStringLiteral("probe"), QString::fromUtf8(mode)});
    if (!process.waitForFinished(60000) || process.exitStatus() != QProcess::NormalExit ||
        process.exitCode() != 0) {
        process.kill();
        process.waitForFinished();
        return {};
    }
    return QString::fromUtf8(process.readAllStandardOutput()).split(QLatin1Char('\n'));
}

void TestVfsTranslation::placesAreTranslated_data()
{
    QTest::addColumn<QString>("home");
    QTest::addColumn<QString>("network");
    const QString english = QStringLiteral("Home");
    const QString german = QString::fromUtf8("Persönlicher Ordner");
    const QString network = QStringLiteral("Network");
    QTest::newRow("C.UTF-8") << english << network;
    QTest::newRow("de_DE.UTF-8") << german << QStringLiteral("Netzwerk");
    QTest::newRow("de_AT.UTF-8") << german << QStringLiteral("Netzwerk");
    QTest::newRow("pt_BR.UTF-8") << QStringLiteral("Pasta pessoal") << network;
    // No catalogue, and one without the context. Nobody is told.
    QTest::newRow("ru_RU.UTF-8") << english << network;
    QTest::newRow("fr_FR.UTF-8") << english << network;
}

void TestVfsTranslation::placesAreTranslated()
{
    QFETCH(QString, home);
    QFETCH(QString, network);
    const QStringList output = run("tree", QString::fromUtf8(QTest::currentDataTag()));
    // The root has one name everywhere, even where somebody translated it.
    QVERIFY(output.contains(QStringLiteral("root=_|1000|")));
    QVERIFY(output.contains(QStringLiteral("home=%1|2001|%2").arg(home, m_tree.path())));
    QVERIFY(output.contains(QStringLiteral("network=%1|1002|").arg(network)));
    QVERIFY(output.contains(QStringLiteral("vey-fm:Home=") + home));
}

void TestVfsTranslation::installedOnce()
{
    const QStringList output = run("initialize", QStringLiteral("de_DE.UTF-8"));
    QVERIFY(output.contains(QStringLiteral("translators after the first call=1")));
    QVERIFY(output.contains(QStringLiteral("translators after the third call=1")));
    QVERIFY(output.contains(QStringLiteral("language changes of the later calls=0")));
}

int main(int argc, char** argv)
{
    if (argc == 3 && qstrcmp(argv[1], "probe") == 0) {
        return startupProbe(argc, argv, argv[2]);
    }
    QCoreApplication application(argc, argv);
    TestVfsTranslation tests;
    return QTest::qExec(&tests, argc, argv);
}

#include "tst_vfs_translation.moc"
