/// Saving, loading, analysing and resolving a project of 2,000 tables with 50,000 columns and 5,000 queries.

#include <benchmark/benchmark.h>
#include <zrparsersql/analysis.h>

#include <filesystem>

#include "bench/counting_heap.h"
#include "bench/large_project.h"
#include "host/project.h"

namespace {

using zr::bench::kLargeProject;
using zr::host::Database;
using zr::host::StorageForm;

Database& project() {
    static const std::unique_ptr<Database> made = zr::bench::makeProject(kLargeProject);
    return *made;
}

std::string pathOf(StorageForm form) {
    return (std::filesystem::temp_directory_path() /
            (form == StorageForm::Json ? "zr_project_bench.json" : "zr_project_bench.db"))
        .string();
}

void tellSize(benchmark::State& state, StorageForm form) {
    state.counters["MB"] = static_cast<double>(std::filesystem::file_size(pathOf(form))) / 1e6;
}

/// What one run asks of the heap; SQLite's own memory is not among it.
template <class Run>
void tellHeap(benchmark::State& state, Run run) {
    const zr::bench::HeapCount count;
    run();
    state.counters["allocs"] = static_cast<double>(count.use().allocations);
    state.counters["peak MB"] = static_cast<double>(count.use().peakBytes) / 1e6;
}

void saveNew(benchmark::State& state, StorageForm form) {
    for (auto _ : state) {
        std::filesystem::remove(pathOf(form));
        zr::host::saveProject(project(), pathOf(form), form);
    }
    tellSize(state, form);
    tellHeap(state, [form] { zr::host::saveProject(project(), pathOf(form), form); });
}

void saveOver(benchmark::State& state, StorageForm form) {
    zr::host::saveProject(project(), pathOf(form), form);
    for (auto _ : state) zr::host::saveProject(project(), pathOf(form), form);
}

void load(benchmark::State& state, StorageForm form) {
    zr::host::saveProject(project(), pathOf(form), form);
    for (auto _ : state) benchmark::DoNotOptimize(zr::host::loadProject(pathOf(form)));
    tellHeap(state, [form] { benchmark::DoNotOptimize(zr::host::loadProject(pathOf(form))); });
}

void analyseAll(Database& database) {
    for (CZRQueryInfo* query : database.Queries) BuildQueryInfo(query, DB_MSSQL);
}

/// The time of a step over a project made anew for each round.
template <class Prepare, class Step>
void measure(benchmark::State& state, Prepare prepare, Step step) {
    std::unique_ptr<Database> database;
    for (auto _ : state) {
        state.PauseTiming();
        database = zr::bench::makeProject(kLargeProject);
        prepare(*database);
        state.ResumeTiming();
        step(*database);
    }
    database = zr::bench::makeProject(kLargeProject);
    prepare(*database);
    tellHeap(state, [&] { step(*database); });
}

void analyse(benchmark::State& state) {
    measure(
        state, [](Database&) {}, analyseAll);
}

/// Everything that looks sources and columns up: sources, validation, and the items of all clauses.
void resolve(benchmark::State& state) {
    int correct = 0;
    measure(state, analyseAll, [&correct](Database& database) {
        database.SortQueries();
        for (CZRQueryInfo* query : database.Queries) {
            query->ResolveSources();
            correct += query->GetCorrect() == 0;
            query->ResolveAllItems();
        }
    });
    state.counters["valid queries"] =
        benchmark::Counter(static_cast<double>(correct), benchmark::Counter::kAvgIterations);
}

template <class Run>
void registerOne(const std::string& name, Run run) {
    benchmark::RegisterBenchmark(name.c_str(), run)
        ->Unit(benchmark::kMillisecond)
        ->UseRealTime()
        ->Iterations(3);
}

void registerForms(const char* name, void (*run)(benchmark::State&, StorageForm)) {
    for (const StorageForm form : {StorageForm::Json, StorageForm::Sqlite})
        registerOne(std::string(name) + (form == StorageForm::Json ? "/json" : "/sqlite"),
                    [run, form](benchmark::State& state) { run(state, form); });
}

}  // namespace

int main(int argc, char** argv) {
    registerForms("save_new", saveNew);
    registerForms("save_over_old", saveOver);
    registerForms("load", load);
    registerOne("analyse", analyse);
    registerOne("resolve", resolve);
    benchmark::Initialize(&argc, argv);
    benchmark::RunSpecifiedBenchmarks();
    for (const StorageForm form : {StorageForm::Json, StorageForm::Sqlite})
        std::filesystem::remove(pathOf(form));
    return 0;
}
