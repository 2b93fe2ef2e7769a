// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

// The first VFS::ptr() on a bus, with and without the service, and the round trips that it takes.

#include "support/busmonitor.h"
#include "support/contest.h"
#include "support/liveservice.h"
#include "support/options.h"
#include "support/program.h"

namespace Benchmarks {

namespace {

// How a program of this job is run, for a bus where the service offers that many bookmarks.
struct Scene
{
    std::shared_ptr<LiveService> service;
    std::string favourites;
};

enum Measure { CpuTime, ElapsedTime };

double costOf(std::initializer_list<std::string> command, Measure measure)
{
    const ProgramRun run = runProgram(command);
    return measure == CpuTime ? run.cpu : run.elapsed;
}

void runStartRow(benchmark::State& state, const Scene& scene, Measure measure, double ofConnecting)
{
    scene.service->use();
    Contest contest([&] {
        return costOf({VEYFM_SERVICE_VFS, "start", scene.favourites}, measure);
    });
    contest.floor("QCoreApplication and session bus", ofConnecting, [&] {
        return costOf({VEYFM_START_BUS, "live"}, measure);
    });
    // How long one waits depends on who else runs, the service and the daemon among them.
    contest.floor("the calls by hand", measure == CpuTime ? 1.25 : 1.5, [&] {
        return costOf({VEYFM_START_CALLS}, measure);
    });
    contest.run(state);
}

// The calls that a program waits for, up to that of GetId. Whoever subscribes to signals does not
// wait for the daemon.
QStringList roundTrips(const LiveService& service, std::initializer_list<std::string> command)
{
    BusMonitor monitor;
    if (!monitor.start(service.address())) {
        qFatal("dbus-monitor does not start");
    }
    runProgram(command);
    if (!monitor.waitFor(QStringLiteral("GetId"))) {
        qFatal("the program made no call of GetId");
    }
    // type, time, serial, sender, destination, path, interface, member
    const QString caller = monitor.lines.last().section(QLatin1Char('\t'), 3, 3);
    QStringList members;
    for (const QString& line : qAsConst(monitor.lines)) {
        const QStringList fields = line.split(QLatin1Char('\t'));
        if (fields.value(0) == QLatin1String("mc") && fields.value(3) == caller &&
            !fields.value(7).endsWith(QLatin1String("Match"))) {
            members << fields.value(7);
        }
    }
    members.removeLast(); // GetId
    return members;
}

const QStringList fromTheService = {
    QStringLiteral("incrementProcessRef"), QStringLiteral("favouritePlaces"),
    QStringLiteral("mounts"), QStringLiteral("networkPlaces")};

void runCountRow(
    benchmark::State& state, const Scene& scene, double limit,
    const std::function<double(const QStringList&)>& count)
{
    scene.service->use();
    Contest contest([&] {
        return count(roundTrips(*scene.service, {VEYFM_SERVICE_VFS, "mark", scene.favourites}));
    });
    contest.limit(limit);
    contest.floor("the calls by hand", 1, [&] {
        return count(roundTrips(*scene.service, {VEYFM_START_CALLS, "mark"}));
    });
    contest.run(state);
}

double all(const QStringList& members)
{
    return members.size();
}

double ofTheService(const QStringList& members)
{
    return double(std::count_if(members.begin(), members.end(), [](const QString& member) {
        return fromTheService.contains(member);
    }));
}

double introspections(const QStringList& members)
{
    return members.count(QStringLiteral("Introspect"));
}

} // namespace

void registerRows(const Options& options)
{
    const Scene live{
        LiveService::running(object(R"({"values": {
            "FavouritePlacesManager.favouritePlaces": [["/tmp", "Temporary"]],
            "NetworkPlacesManager.networkPlaces": [["office", "smb://office/", ""]]}})")),
        "1"};
    const Scene missing{LiveService::missing(), "0"};

    const int rounds = options.rounds(101);
    addRow("first VFS::ptr() with the service, CPU time", rounds, [=](benchmark::State& state) {
        runStartRow(state, live, CpuTime, 2.5);
    });
    addRow("first VFS::ptr() with the service, elapsed", rounds, [=](benchmark::State& state) {
        runStartRow(state, live, ElapsedTime, 3.5);
    });
    addRow("first VFS::ptr() without it, CPU time", rounds, [=](benchmark::State& state) {
        runStartRow(state, missing, CpuTime, 2);
    });
    addRow("first VFS::ptr() without it, elapsed", rounds, [=](benchmark::State& state) {
        runStartRow(state, missing, ElapsedTime, 2.5);
    });
    // Of 18, the library asks for 14: the list of names, the start, an introspection for each of 7
    // objects, 4 methods, and Hello. The rest is QtDBus, which asks who owns the name.
    addRow("round trips with the service", 1, [=](benchmark::State& state) {
        runCountRow(state, live, 18, all);
    });
    addRow("round trips with the service, its methods", 1, [=](benchmark::State& state) {
        runCountRow(state, live, 4, ofTheService);
        live.service->check();
    });
    addRow("round trips with the service, introspections", 1, [=](benchmark::State& state) {
        runCountRow(state, live, 7, introspections);
    });
    addRow("round trips without it", 1, [=](benchmark::State& state) {
        runCountRow(state, missing, 19, all);
    });
}

} // namespace Benchmarks
