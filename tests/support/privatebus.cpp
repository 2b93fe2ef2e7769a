// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/privatebus.h"

#include <QDBusConnectionInterface>
#include <QDBusMessage>
#include <QDBusReply>
#include <QFile>
#include <QJsonDocument>
#include <QTest>
#include <QUuid>

#include <csignal>

namespace {

const QString serviceName = QStringLiteral("org.veylabs.vey-fm.vfs");

const char busConfig[] = R"(<!DOCTYPE busconfig PUBLIC
 "-//freedesktop//DTD D-Bus Bus Configuration 1.0//EN"
 "http://www.freedesktop.org/standards/dbus/1.0/busconfig.dtd">
<busconfig>
  <type>session</type>
  <listen>unix:dir=%1</listen>
  <servicedir>%1/services</servicedir>
  <policy context="default">
    <allow send_destination="*" eavesdrop="true"/>
    <allow eavesdrop="true"/>
    <allow own="*"/>
  </policy>
  <limit name="max_incoming_bytes">1000000000</limit>
  <limit name="max_outgoing_bytes">1000000000</limit>
  <limit name="max_message_size">134217728</limit>
  <limit name="service_start_timeout">20000</limit>
</busconfig>
)";

void writeFile(const QString& fileName, const QByteArray& content)
{
    QFile file(fileName);
    if (!file.open(QIODevice::WriteOnly) || file.write(content) != content.size()) {
        qFatal("can't write %s", qPrintable(fileName));
    }
}

} // namespace

PrivateBus::PrivateBus()
{
    QDir(m_directory.path()).mkdir(QStringLiteral("services"));
    writeFile(
        m_directory.filePath(QStringLiteral("bus.conf")),
        QString::fromLatin1(busConfig).arg(m_directory.path()).toLocal8Bit());
}

PrivateBus::~PrivateBus()
{
    if (m_daemon.state() != QProcess::NotRunning) {
        m_daemon.terminate();
        if (!m_daemon.waitForFinished(5000)) {
            m_daemon.kill();
            m_daemon.waitForFinished();
        }
    }
}

QString PrivateBus::writeScript(const QJsonObject& script) const
{
    const QString file = m_directory.filePath(
        QUuid::createUuid().toString(QUuid::WithoutBraces) + QStringLiteral(".json"));
    writeFile(file, QJsonDocument(script).toJson());
    return file;
}

QStringList PrivateBus::fakeServiceCommand(const QJsonObject& script) const
{
    return {
        QStringLiteral(VEYFM_FAKE_SERVICE), QStringLiteral("--contract"),
        QStringLiteral(VEYFM_CONTRACT_DIR), QStringLiteral("--script"), writeScript(script)};
}

void PrivateBus::installFakeService(const QJsonObject& script, const QStringList& arguments)
{
    installService(fakeServiceCommand(script) + arguments);
}

void PrivateBus::installService(const QStringList& command)
{
    writeFile(
        m_directory.filePath(QStringLiteral("services/%1.service").arg(serviceName)),
        QStringLiteral("[D-BUS Service]\nName=%1\nExec=%2\n")
            .arg(serviceName, command.join(QLatin1Char(' ')))
            .toLocal8Bit());
}

bool PrivateBus::start()
{
    m_daemon.setProcessChannelMode(QProcess::SeparateChannels);
    m_daemon.start(
        QStringLiteral("dbus-daemon"),
        {QStringLiteral("--config-file=") + m_directory.filePath(QStringLiteral("bus.conf")),
         QStringLiteral("--nofork"), QStringLiteral("--nopidfile"),
         QStringLiteral("--print-address")});
    while (!m_daemon.canReadLine()) {
        if (!m_daemon.waitForReadyRead(10000)) {
            m_error = m_daemon.errorString() + QLatin1Char('\n') +
                      QString::fromLocal8Bit(m_daemon.readAllStandardError());
            return false;
        }
    }
    m_address = QString::fromLocal8Bit(m_daemon.readLine().trimmed());
    qputenv("DBUS_SESSION_BUS_ADDRESS", m_address.toLocal8Bit());
    return true;
}

QString PrivateBus::address() const
{
    return m_address;
}

QString PrivateBus::errorString() const
{
    return m_error;
}

qint64 PrivateBus::processId() const
{
    return m_daemon.processId();
}

FakeServiceControl::FakeServiceControl(const QString& address)
    : m_name(QUuid::createUuid().toString())
    , m_bus(QDBusConnection::connectToBus(address, m_name))
{
}

FakeServiceControl::~FakeServiceControl()
{
    resume(); // A stopped process would outlive its bus.
    QDBusConnection::disconnectFromBus(m_name);
}

bool FakeServiceControl::isRunning() const
{
    return m_bus.interface()->isServiceRegistered(serviceName);
}

qint64 FakeServiceControl::processId() const
{
    return isRunning() ? qint64(m_bus.interface()->servicePid(serviceName)) : 0;
}

void FakeServiceControl::load(const QJsonObject& script)
{
    call(QStringLiteral("Load"), {QString::fromUtf8(QJsonDocument(script).toJson())});
}

void FakeServiceControl::setValue(const QString& method, const QJsonValue& value)
{
    load({{QStringLiteral("values"), QJsonObject{{method, value}}}});
}

void FakeServiceControl::setRules(const QString& method, const QJsonArray& rules)
{
    load({{QStringLiteral("rules"), QJsonObject{{method, rules}}}});
}

void FakeServiceControl::emitSignal(
    const QString& interface, const QString& name, const QJsonArray& arguments)
{
    call(
        QStringLiteral("Emit"),
        {interface, name, QString::fromUtf8(QJsonDocument(arguments).toJson())});
}

void FakeServiceControl::emitRaw(
    const QString& path, const QString& interface, const QString& name,
    const QStringList& arguments)
{
    call(QStringLiteral("EmitRaw"), {path, interface, name, arguments});
}

QStringList FakeServiceControl::introspections() const
{
    return call(QStringLiteral("Introspections")).toStringList();
}

QStringList FakeServiceControl::calls() const
{
    return call(QStringLiteral("Calls")).toStringList();
}

QStringList FakeServiceControl::takeCalls()
{
    const QStringList result = calls();
    call(QStringLiteral("ClearCalls"));
    return result;
}

QStringList FakeServiceControl::violations() const
{
    return call(QStringLiteral("Violations")).toStringList();
}

void FakeServiceControl::exit(int code)
{
    call(QStringLiteral("Exit"), {code});
    waitForService(false);
}

void FakeServiceControl::kill()
{
    if (const qint64 pid = processId()) {
        ::kill(pid_t(pid), SIGKILL);
        waitForService(false);
    }
}

void FakeServiceControl::stop()
{
    m_stopped = processId();
    if (m_stopped != 0) {
        ::kill(pid_t(m_stopped), SIGSTOP);
    }
}

qint64 FakeServiceControl::stoppedProcess() const
{
    return m_stopped;
}

void FakeServiceControl::resume()
{
    if (m_stopped != 0) {
        ::kill(pid_t(m_stopped), SIGCONT);
        m_stopped = 0;
    }
}

bool FakeServiceControl::waitForService(bool running) const
{
    return QTest::qWaitFor([this, running] { return isRunning() == running; }, 10000);
}

QVariant FakeServiceControl::call(const QString& method, const QList<QVariant>& arguments) const
{
    QDBusMessage message = QDBusMessage::createMethodCall(
        serviceName, QStringLiteral("/Control"), QStringLiteral("org.veylabs.Test.Control"),
        method);
    message.setAutoStartService(false);
    message.setArguments(arguments);
    const QDBusMessage reply = m_bus.call(message);
    if (reply.type() == QDBusMessage::ErrorMessage) {
        qWarning("fake service, %s: %s", qPrintable(method), qPrintable(reply.errorMessage()));
    }
    return reply.arguments().value(0);
}
