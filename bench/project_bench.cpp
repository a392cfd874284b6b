/// Saving, loading, analysing and resolving a project of 2,000 tables with 50,000 columns and 5,000 queries,
/// and each of these steps for one query by itself.

#include <benchmark/benchmark.h>
#include <zrparsersql/analysis.h>

#include <filesystem>

#include "bench/counting_heap.h"
#include "bench/large_project.h"
#include "host/project.h"
#include "host/stored_tree.h"

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

/// The last query of a chain of four, which reads from the one before it, in a project of its own.
struct OneQuery {
    std::unique_ptr<Database> database = zr::bench::makeProject({28, 25, 4});
    CZRQueryInfo& query = *database->Queries.GetTail();
};

/// One step of one query, over and over. A step is given an analysed and resolved query.
template <class Step>
void oneQuery(benchmark::State& state, Step step) {
    OneQuery one;
    analyseAll(*one.database);
    for (CZRQueryInfo* query : one.database->Queries) {
        query->ResolveSources();
        query->ResolveAllItems();
    }
    for (auto _ : state) step(one.query);
    const zr::bench::HeapCount count;
    step(one.query);
    state.counters["allocs"] = static_cast<double>(count.use().allocations);
    state.counters["peak KB"] = static_cast<double>(count.use().peakBytes) / 1e3;
}

/// What a section of a project's file is written from.
zr::host::StoredTree saved(CZRQueryInfo& query) {
    zr::host::StoredTree tree;
    zr::host::TreeStorage storage(tree, zr::host::TreeStorage::Use::Save);
    query.Save(storage);
    return tree;
}

void registerOneQuery() {
    const auto add = [](const char* name, auto step) {
        benchmark::RegisterBenchmark((std::string("one_query/") + name).c_str(),
                                     [step](benchmark::State& state) { oneQuery(state, step); });
    };
    // Each is made anew, since what an analysis replaces stays with its descriptor.
    add("analyse", [](CZRQueryInfo& query) {
        CZRQueryInfo made;
        made.SetDatabase(query.GetDatabase());
        made.SetSQL(query.GetSQL());
        BuildQueryInfo(&made, DB_MSSQL);
    });
    add("resolve", [](CZRQueryInfo& query) {
        query.ResolveSources();
        benchmark::DoNotOptimize(query.GetCorrect());
        query.ResolveAllItems();
    });
    add("copy", [](CZRQueryInfo& query) { delete query.Clone(); });
    add("save", [](CZRQueryInfo& query) { benchmark::DoNotOptimize(saved(query)); });
    add("load", [](CZRQueryInfo& query) {
        static zr::host::StoredTree tree = saved(query);
        zr::host::TreeStorage storage(tree, zr::host::TreeStorage::Use::Load);
        zr::host::Factory factory;
        zr::host::Query loaded(DB_MSSQL);
        loaded.Load(storage, factory);
    });
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
    registerOneQuery();
    benchmark::Initialize(&argc, argv);
    benchmark::RunSpecifiedBenchmarks();
    for (const StorageForm form : {StorageForm::Json, StorageForm::Sqlite})
        std::filesystem::remove(pathOf(form));
    return 0;
}
