// Catalogue rates against the plainest use of the same server: one libpq statement per row,
// built as text, in the same run. The catalogue adds its lock, the existence check before
// each insert and update, the storage-location lookup of an insert, literal escaping and the
// conversion of every fetched row. The large catalogue (100 cameras, one year of hourly items)
// shows how a search by camera and time scales when the table is full.
//
// The server is the one PGHOST, PGPORT and PGUSER name.
#include <benchmark/benchmark.h>
#include <libpq-fe.h>

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <ctime>
#include <string>

#include "quorvex/save_meta.h"

namespace {

constexpr const char* kSmallDb = "qvx_catalogue_bench";
constexpr const char* kLargeDb = "qvx_catalogue_bench_large";
constexpr int kCameras = 100;
constexpr int kHours = 24 * 365;
// 2026-01-01 00:00:00 UTC.
constexpr long kYearStart = 1767225600;

PGconn* Open(const char* db) {
    PGconn* c = PQsetdbLogin(nullptr, nullptr, nullptr, nullptr, db, nullptr, nullptr);
    if (PQstatus(c) != CONNECTION_OK) {
        std::fprintf(stderr, "cannot connect to %s: %s", db, PQerrorMessage(c));
        PQfinish(c);
        std::exit(2);
    }
    return c;
}

bool Exec(PGconn* c, const std::string& sql) {
    PGresult* r = PQexec(c, sql.c_str());
    ExecStatusType s = PQresultStatus(r);
    bool ok = s == PGRES_COMMAND_OK || s == PGRES_TUPLES_OK;
    if (!ok) {
        std::fprintf(stderr, "%s: %s", sql.c_str(), PQerrorMessage(c));
    }
    PQclear(r);
    return ok;
}

void Recreate(const char* db) {
    PGconn* admin = Open("postgres");
    Exec(admin, std::string("DROP DATABASE IF EXISTS ") + db);
    Exec(admin, std::string("CREATE DATABASE ") + db);
    PQfinish(admin);
    PGconn* c = Open(db);
    // The catalogue reads storage locations but never creates them.
    Exec(c, "CREATE TABLE \"StorageLocation\" (\"ID\" SERIAL, \"FullPath\" VARCHAR(255))");
    Exec(c, "INSERT INTO \"StorageLocation\" (\"FullPath\") VALUES ('/srv/recordings')");
    PQfinish(c);
}

std::string Utc(long seconds) {
    time_t t = seconds;
    std::tm tm{};
    gmtime_r(&t, &tm);
    char buf[32];
    std::strftime(buf, sizeof(buf), "%Y-%m-%d %H:%M:%S", &tm);
    return buf;
}

SDwbRecItem Item(long device, long hour) {
    SDwbRecItem item{};
    item.DeviceID = device;
    item.StorageLocationID = 1;
    std::snprintf(item.SubDirectory, sizeof(item.SubDirectory), "cam%03ld", device);
    std::snprintf(item.FileName, sizeof(item.FileName), "rec_%08ld", hour);
    item.NumberOfFiles = 1;
    item.StartTime = kYearStart + hour * 3600;
    item.StartTimeAvailable = item.StartTime;
    item.EndTime = item.StartTime + 3599;
    return item;
}

std::string RawInsert(const SDwbRecItem& it) {
    // Built by concatenation: the item's texts are far longer than any fixed buffer here.
    return "INSERT INTO \"MetaRecording\" (\"DeviceID\",\"StorageLocationID\",\"FileName\","
           "\"SubDirectory\",\"Trigger\",\"StartTime\",\"StartTimeAvailable\",\"EndTime\","
           "\"NumberOfFiles\",\"Deleted\",\"Archived\",\"FullPath\") VALUES (" +
           std::to_string(it.DeviceID) + "," + std::to_string(it.StorageLocationID) + ",'" +
           it.FileName + "','" + it.SubDirectory + "',0,'" + Utc(it.StartTime) + "','" +
           Utc(it.StartTimeAvailable) + "','" + Utc(it.EndTime) + "',1,0,0,'/srv/recordings')";
}

// One catalogue connected to a fresh small database, shared by the small-table benchmarks.
struct SSmall {
    SSmall() {
        Recreate(kSmallDb);
        if (meta.Connect(kSmallDb, nullptr, nullptr) != DWB_OK) {
            std::fprintf(stderr, "catalogue cannot connect\n");
            std::exit(2);
        }
        raw = Open(kSmallDb);
    }
    ~SSmall() { PQfinish(raw); }
    CSaveMeta meta;
    PGconn* raw;
    long nextHour = 0;
};

SSmall& Small() {
    static SSmall s;
    return s;
}

void BM_RawInsert(benchmark::State& state) {
    SSmall& s = Small();
    for (auto _ : state) {
        SDwbRecItem it = Item(1, s.nextHour++);
        if (!Exec(s.raw, RawInsert(it))) {
            state.SkipWithError("insert failed");
            break;
        }
    }
    state.SetItemsProcessed(state.iterations());
}

void BM_AddRecItem(benchmark::State& state) {
    SSmall& s = Small();
    for (auto _ : state) {
        SDwbRecItem it = Item(2, s.nextHour++);
        if (s.meta.AddRecItem(it) != DWB_OK) {
            state.SkipWithError("AddRecItem failed");
            break;
        }
    }
    state.SetItemsProcessed(state.iterations());
}

void BM_RawUpdateEndTime(benchmark::State& state) {
    SSmall& s = Small();
    SDwbRecItem it = Item(3, 0);
    s.meta.AddRecItem(it);
    long end = it.EndTime;
    for (auto _ : state) {
        std::string sql = "UPDATE \"MetaRecording\" SET \"EndTime\"='" + Utc(++end) +
                          "' WHERE \"DeviceID\"=" + std::to_string(it.DeviceID) +
                          " AND \"StorageLocationID\"=" + std::to_string(it.StorageLocationID) +
                          " AND \"FileName\"='" + it.FileName + "' AND \"SubDirectory\"='" +
                          it.SubDirectory + "'";
        Exec(s.raw, sql);
    }
    state.SetItemsProcessed(state.iterations());
}

void BM_UpdateRecItemEndTime(benchmark::State& state) {
    SSmall& s = Small();
    SDwbRecItem it = Item(4, 0);
    s.meta.AddRecItem(it);
    for (auto _ : state) {
        ++it.EndTime;
        if (s.meta.UpdateRecItem(it, kDwbUpdateEndTime) != DWB_OK) {
            state.SkipWithError("UpdateRecItem failed");
            break;
        }
    }
    state.SetItemsProcessed(state.iterations());
}

// A small search: camera 5 holds 24 items; a search from 12:30 returns the 12 items that end
// after it.
void FillSearchCamera(SSmall& s) {
    static bool filled = false;
    if (!filled) {
        for (long h = 0; h < 24; ++h) {
            SDwbRecItem it = Item(5, h);
            s.meta.AddRecItem(it);
        }
        filled = true;
    }
}

std::string RawSearch(long device, long time) {
    char sql[512];
    std::snprintf(sql, sizeof(sql),
                  "SELECT * FROM \"MetaRecording\" WHERE \"EndTime\" >= '%s' AND \"DeviceID\" = "
                  "%ld ORDER BY \"StartTimeAvailable\" DESC ",
                  Utc(time).c_str(), device);
    return sql;
}

// Reads every value of every row, as a caller of the raw statement would.
size_t RawFetch(PGconn* c, const std::string& sql) {
    PGresult* r = PQexec(c, sql.c_str());
    size_t bytes = 0;
    int rows = PQntuples(r), cols = PQnfields(r);
    for (int i = 0; i < rows; ++i) {
        for (int j = 0; j < cols; ++j) {
            bytes += std::strlen(PQgetvalue(r, i, j));
        }
    }
    PQclear(r);
    return bytes;
}

void BM_RawSearch(benchmark::State& state) {
    SSmall& s = Small();
    FillSearchCamera(s);
    std::string sql = RawSearch(5, kYearStart + 12 * 3600 + 1800);
    for (auto _ : state) {
        benchmark::DoNotOptimize(RawFetch(s.raw, sql));
    }
    state.SetItemsProcessed(state.iterations());
}

int SearchAndDrain(CSaveMeta& meta, long device, long time) {
    void* list = nullptr;
    if (meta.GetRecItemList(device, -1, nullptr, time, -1, true, &list) != DWB_OK) {
        return -1;
    }
    SDwbRecItem item;
    int n = 0;
    while (meta.GetNext(list, item)) {
        ++n;
    }
    meta.ClearRecItemList(list);
    return n;
}

void BM_GetRecItemList(benchmark::State& state) {
    SSmall& s = Small();
    FillSearchCamera(s);
    for (auto _ : state) {
        int n = SearchAndDrain(s.meta, 5, kYearStart + 12 * 3600 + 1800);
        if (n != 12) {
            state.SkipWithError("unexpected number of items");
            break;
        }
    }
    state.SetItemsProcessed(state.iterations());
}

// The large catalogue, loaded once through COPY.
struct SLarge {
    SLarge() {
        Recreate(kLargeDb);
        // The catalogue creates the table and its indexes; the load then goes around it.
        if (meta.Connect(kLargeDb, nullptr, nullptr) != DWB_OK) {
            std::fprintf(stderr, "catalogue cannot connect\n");
            std::exit(2);
        }
        raw = Open(kLargeDb);
        Load();
    }
    ~SLarge() { PQfinish(raw); }

    void Load() {
        PGresult* r = PQexec(raw,
                             "COPY \"MetaRecording\" (\"DeviceID\",\"StorageLocationID\","
                             "\"FileName\",\"SubDirectory\",\"Trigger\",\"StartTime\","
                             "\"StartTimeAvailable\",\"EndTime\",\"NumberOfFiles\",\"Deleted\","
                             "\"Archived\",\"FullPath\") FROM STDIN");
        if (PQresultStatus(r) != PGRES_COPY_IN) {
            std::fprintf(stderr, "COPY refused: %s", PQerrorMessage(raw));
            std::exit(2);
        }
        PQclear(r);
        std::string chunk;
        for (int cam = 1; cam <= kCameras; ++cam) {
            for (long h = 0; h < kHours; ++h) {
                SDwbRecItem it = Item(cam, h);
                chunk += std::to_string(it.DeviceID) + "\t1\t" + it.FileName + "\t" +
                         it.SubDirectory + "\t0\t" + Utc(it.StartTime) + "\t" +
                         Utc(it.StartTimeAvailable) + "\t" + Utc(it.EndTime) +
                         "\t1\t0\t0\t/srv/recordings\n";
                if (chunk.size() > (1 << 20)) {
                    PQputCopyData(raw, chunk.data(), static_cast<int>(chunk.size()));
                    chunk.clear();
                }
            }
        }
        PQputCopyData(raw, chunk.data(), static_cast<int>(chunk.size()));
        PQputCopyEnd(raw, nullptr);
        r = PQgetResult(raw);
        if (PQresultStatus(r) != PGRES_COMMAND_OK) {
            std::fprintf(stderr, "COPY failed: %s", PQerrorMessage(raw));
            std::exit(2);
        }
        PQclear(r);
        while ((r = PQgetResult(raw)) != nullptr) {
            PQclear(r);
        }
        Exec(raw, "ANALYZE \"MetaRecording\"");
    }

    CSaveMeta meta;
    PGconn* raw;
};

SLarge& Large() {
    static SLarge s;
    return s;
}

// Searches from the last day of the year, so each one returns the 24 items of that day (and
// the table has to find them among 876,000).
long LastDay(int64_t i) {
    return kYearStart + (kHours - 24) * 3600L + (i % 24) * 60;
}

void BM_RawSearchLarge(benchmark::State& state) {
    SLarge& s = Large();
    int64_t i = 0;
    for (auto _ : state) {
        benchmark::DoNotOptimize(RawFetch(s.raw, RawSearch(1 + i % kCameras, LastDay(i))));
        ++i;
    }
    state.SetItemsProcessed(state.iterations());
}

void BM_GetRecItemListLarge(benchmark::State& state) {
    SLarge& s = Large();
    int64_t i = 0;
    for (auto _ : state) {
        int n = SearchAndDrain(s.meta, 1 + i % kCameras, LastDay(i));
        if (n != 24) {
            state.SkipWithError("unexpected number of items");
            break;
        }
        ++i;
    }
    state.SetItemsProcessed(state.iterations());
}

// A search in the middle of the year returns about half a year of one camera's items.
void BM_RawSearchLargeHalfYear(benchmark::State& state) {
    SLarge& s = Large();
    for (auto _ : state) {
        benchmark::DoNotOptimize(RawFetch(s.raw, RawSearch(7, kYearStart + kHours / 2 * 3600L)));
    }
    state.SetItemsProcessed(state.iterations() * kHours / 2);
}

void BM_GetRecItemListLargeHalfYear(benchmark::State& state) {
    SLarge& s = Large();
    for (auto _ : state) {
        int n = SearchAndDrain(s.meta, 7, kYearStart + kHours / 2 * 3600L);
        if (n != kHours / 2) {
            state.SkipWithError("unexpected number of items");
            break;
        }
    }
    state.SetItemsProcessed(state.iterations() * kHours / 2);
}

}  // namespace

BENCHMARK(BM_RawInsert)->Unit(benchmark::kMicrosecond);
BENCHMARK(BM_AddRecItem)->Unit(benchmark::kMicrosecond);
BENCHMARK(BM_RawUpdateEndTime)->Unit(benchmark::kMicrosecond);
BENCHMARK(BM_UpdateRecItemEndTime)->Unit(benchmark::kMicrosecond);
BENCHMARK(BM_RawSearch)->Unit(benchmark::kMicrosecond);
BENCHMARK(BM_GetRecItemList)->Unit(benchmark::kMicrosecond);
BENCHMARK(BM_RawSearchLarge)->Unit(benchmark::kMicrosecond);
BENCHMARK(BM_GetRecItemListLarge)->Unit(benchmark::kMicrosecond);
BENCHMARK(BM_RawSearchLargeHalfYear)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_GetRecItemListLargeHalfYear)->Unit(benchmark::kMillisecond);

BENCHMARK_MAIN();
