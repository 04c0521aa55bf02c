// The project file of the stress scene, a million keyframes (100 objects of 30 animated
// channels): saving it, opening it, and the memory an open takes beside the scene it builds.
//
// Memory is measured two ways while an open runs into an empty host:
//   - live heap bytes, counted by this binary's allocation functions (only while a
//     measurement is on): the scene is what stays allocated after the open, the peak is the
//     most that was allocated at any moment during it;
//   - the process's peak resident set (VmHWM, reset through /proc/self/clear_refs first).
#include <benchmark/benchmark.h>
#include <malloc.h>
#include <unistd.h>

#include <atomic>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <new>
#include <string>

#include "host/TQHostAppDelegate.h"
#include "host/TQHostDenseScene.h"
#include "host/TQHostProjectFile.h"

// ---- Allocation counting ----------------------------------------------------------------

namespace {

std::atomic<bool> gCounting{false};
std::atomic<int64_t> gLive{0};
std::atomic<int64_t> gPeak{0};

void* counted(void* p) {
    if (!p) throw std::bad_alloc();
    if (gCounting.load(std::memory_order_relaxed)) {
        const int64_t live = gLive.fetch_add(static_cast<int64_t>(malloc_usable_size(p))) +
                             static_cast<int64_t>(malloc_usable_size(p));
        int64_t peak = gPeak.load(std::memory_order_relaxed);
        while (live > peak && !gPeak.compare_exchange_weak(peak, live)) {}
    }
    return p;
}

void released(void* p) {
    if (p && gCounting.load(std::memory_order_relaxed))
        gLive.fetch_sub(static_cast<int64_t>(malloc_usable_size(p)));
    std::free(p);
}

}  // namespace

void* operator new(size_t size) { return counted(std::malloc(size ? size : 1)); }
void* operator new[](size_t size) { return counted(std::malloc(size ? size : 1)); }
void operator delete(void* p) noexcept { released(p); }
void operator delete[](void* p) noexcept { released(p); }
void operator delete(void* p, size_t) noexcept { released(p); }
void operator delete[](void* p, size_t) noexcept { released(p); }

namespace {

// ---- The scene --------------------------------------------------------------------------

// The stress scene: 100 objects of the kestrel family with 30 animated channels each (the
// modelled ones, then plain ones), a million keyframes in all.
void buildStressScene(TQHostAppDelegate& host) {
    TQHostLoadDenseScene(host, TQHostObjectFamily::Kestrel, TQHostStressSceneLayout());
}

std::string projectPath() {
    return std::string(P_tmpdir) + "/vce_bench_project_" + std::to_string(::getpid()) + ".xml";
}

// The project saved once for the reading benchmarks.
const std::string& savedProject() {
    static const std::string path = [] {
        TQHostAppDelegate host;
        TQHostProject project(host);
        buildStressScene(host);
        if (auto error = project.save(projectPath())) {
            std::fprintf(stderr, "%s\n", error->text().c_str());
            std::abort();
        }
        std::atexit([] { std::remove(projectPath().c_str()); });
        return projectPath();
    }();
    return path;
}

// ---- Benchmarks -------------------------------------------------------------------------

void BM_ProjectSave_1MKeyframes(benchmark::State& state) {
    TQHostAppDelegate host;
    TQHostProject project(host);
    buildStressScene(host);
    const std::string path = projectPath() + ".save";
    for (auto _ : state) {
        if (auto error = project.save(path)) state.SkipWithError(error->text().c_str());
    }
    std::ifstream file(path, std::ios::binary | std::ios::ate);
    state.counters["file_MB"] = static_cast<double>(file.tellg()) / 1e6;
    std::remove(path.c_str());
}
BENCHMARK(BM_ProjectSave_1MKeyframes)->Unit(benchmark::kMillisecond)->Iterations(3);

void BM_ProjectOpen_1MKeyframes(benchmark::State& state) {
    const std::string& path = savedProject();
    for (auto _ : state) {
        state.PauseTiming();
        auto host = std::make_unique<TQHostAppDelegate>();
        auto project = std::make_unique<TQHostProject>(*host);
        state.ResumeTiming();
        if (auto error = project->open(path)) state.SkipWithError(error->text().c_str());
        state.PauseTiming();
        project.reset();
        host.reset();
        state.ResumeTiming();
    }
}
BENCHMARK(BM_ProjectOpen_1MKeyframes)->Unit(benchmark::kMillisecond)->Iterations(3);

int64_t statusKilobytes(const char* field) {
    std::ifstream status("/proc/self/status");
    std::string line;
    while (std::getline(status, line))
        if (line.rfind(field, 0) == 0) return std::atoll(line.c_str() + std::strlen(field));
    return -1;
}

void BM_ProjectOpenMemory_1MKeyframes(benchmark::State& state) {
    const std::string& path = savedProject();
    for (auto _ : state) {
        auto host = std::make_unique<TQHostAppDelegate>();
        auto project = std::make_unique<TQHostProject>(*host);
        malloc_trim(0);
        { std::ofstream("/proc/self/clear_refs") << "5"; }  // resets the peak resident set
        const int64_t rssBefore = statusKilobytes("VmRSS:");
        gLive = 0;
        gPeak = 0;
        gCounting = true;
        const auto error = project->open(path);
        gCounting = false;
        if (error) state.SkipWithError(error->text().c_str());
        const double scene = static_cast<double>(gLive.load());
        const double peak = static_cast<double>(gPeak.load());
        state.counters["scene_MB"] = scene / 1e6;
        state.counters["peak_MB"] = peak / 1e6;
        state.counters["peak_per_scene"] = peak / scene;
        const int64_t rssPeak = statusKilobytes("VmHWM:");
        const int64_t rssAfter = statusKilobytes("VmRSS:");
        state.counters["rss_scene_MB"] = static_cast<double>(rssAfter - rssBefore) / 1e3;
        state.counters["rss_peak_MB"] = static_cast<double>(rssPeak - rssBefore) / 1e3;
        project.reset();
        host.reset();
    }
}
BENCHMARK(BM_ProjectOpenMemory_1MKeyframes)->Unit(benchmark::kMillisecond)->Iterations(1);

}  // namespace
