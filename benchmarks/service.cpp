// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

// What comes from a live service: many shares, much news, and the memory that a place takes.

#include "support/contest.h"
#include "support/liveservice.h"
#include "support/options.h"
#include "support/program.h"

namespace Benchmarks {

namespace {

double figureOf(const char* program, const std::string& job, int count)
{
    return std::stod(runProgram({program, job, std::to_string(count)}).output);
}

// The library beside a program that only reads the same from the bus, each time in a new process:
// what was read once is known.
void runRow(
    benchmark::State& state, const LiveService& service, const std::string& job, int count,
    const char* floor, double bound, double limit = 0)
{
    service.use();
    Contest contest([&] { return figureOf(VEYFM_SERVICE_VFS, job, count); });
    contest.operations(count).limit(limit);
    contest.floor(floor, bound, [&] { return figureOf(VEYFM_SERVICE_BARE, job, count); });
    contest.run(state);
    service.check();
}

// What one device costs among many, beside what it costs among a tenth of them.
void runGrowthRow(
    benchmark::State& state, const LiveService& service, const std::string& job, int count)
{
    service.use();
    const auto costOf = [&service, job](int devices) {
        return [&service, job, devices] {
            service.control().setValue(
                u"StoragePlacesManager.availableStoragePlaces"_s, manyDevices(devices));
            service.control().setRules(
                u"SmbBrowser.smbNetworkLocalPath"_s,
                {QJsonObject{{u"signals"_s, manyRemovals(devices)}, {u"keep"_s, true}}});
            return figureOf(VEYFM_SERVICE_VFS, job, devices) / devices;
        };
    };
    Contest contest(costOf(count));
    contest.floor("a tenth of them", 2, costOf(count / 10));
    contest.run(state);
    service.check();
}

void setBurst(const LiveService& service, int count, int devices)
{
    service.control().setValue(
        u"StoragePlacesManager.availableStoragePlaces"_s, manyDevices(devices));
    service.control().setRules(
        u"SmbBrowser.smbNetworkLocalPath"_s,
        {QJsonObject{{u"signals"_s, manyUpdates(count, devices)}, {u"keep"_s, true}}});
}

} // namespace

void registerRows(const Options& options)
{
    const int count = options.size(10000);
    const std::shared_ptr<LiveService> service = LiveService::running(object(R"({"values": {
        "SmbBrowser.workgroups": ["WG"], "SmbBrowser.hosts": ["host"]}})"));
    service->control().setValue(u"SmbBrowser.shares"_s, manyShares(count));
    service->control().setValue(
        u"StoragePlacesManager.availableStoragePlaces"_s, manyDevices(count));

    addRow("open a host, a share", options.rounds(15), [=](benchmark::State& state) {
        runRow(state, *service, "shares", count, "the call", 2.75);
    });
    addRow("memory, a share", options.rounds(5), [=](benchmark::State& state) {
        runRow(state, *service, "share-bytes", count, "the list", 4, 650);
    });
    addRow("memory, a storage device", options.rounds(5), [=](benchmark::State& state) {
        runRow(state, *service, "device-bytes", count, "the list", 2.75, 850);
    });
    addRow(
        "isDirPlace(), " + std::to_string(count) + " devices", options.rounds(9),
        [=](benchmark::State& state) { runGrowthRow(state, *service, "device-dirs", count); });
    addRow(
        "storagePlaceRemoved, " + std::to_string(count) + " devices", options.rounds(9),
        [=](benchmark::State& state) { runGrowthRow(state, *service, "removals", count); });
    // Each update looks for its device, wherever there are many of them.
    const std::pair<int, double> bursts[] = {{10, 1.5}, {count, 2}};
    for (const auto& [devices, bound] : bursts) {
        const std::string name = "storagePlaceUpdated, " + std::to_string(devices) + " devices";
        addRow(name, options.rounds(9), [=, devices = devices, bound = bound](auto& state) {
            setBurst(*service, count, devices);
            runRow(state, *service, "burst", count, "a slot", bound);
        });
    }
}

} // namespace Benchmarks
