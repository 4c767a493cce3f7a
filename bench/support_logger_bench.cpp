// Cost of one logged line against the plainest way to append the same line to a file:
// format it, write it and flush it. The logger adds the level check, its lock, the
// free-space query and the length check that drives rotation.
#include <benchmark/benchmark.h>

#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <string>

#include "support/meta_file_logger.h"

namespace {

std::string MakeDir(const char* name) {
    std::string dir = std::filesystem::temp_directory_path() / name;
    std::filesystem::remove_all(dir);
    std::filesystem::create_directories(dir);
    return dir;
}

void BM_BaselineFormatWriteFlush(benchmark::State& state) {
    std::string dir = MakeDir("quorvex-bench-baseline");
    std::FILE* f = std::fopen((dir + "/baseline.txt").c_str(), "ab");
    char line[1024];
    int i = 0;
    for (auto _ : state) {
        std::snprintf(line, sizeof(line), "%s\tInfo\t%s\t", "06-12-2026\t13:00:00",
                      "CMetaBuffer::Parse");
        std::fputs(line, f);
        std::snprintf(line, sizeof(line), "[%s] frame %d of %d bytes", "Entrance", i++, 412);
        std::fputs(line, f);
        std::fputc('\n', f);
        std::fflush(f);
    }
    std::fclose(f);
    std::filesystem::remove_all(dir);
    state.SetItemsProcessed(state.iterations());
}

void BM_LoggerPrint(benchmark::State& state) {
    std::string dir = MakeDir("quorvex-bench-logger");
    CMetaFileLogger& log = CMetaFileLogger::Instance();
    // Large enough that the run measures writing, with rotation only checked.
    log.Configure(dir.c_str(), 1024 * 1024, 3, 3);
    int i = 0;
    for (auto _ : state) {
        log.Print(kLogInfo, "CMetaBuffer::Parse", "[%s] frame %d of %d bytes", "Entrance", i++,
                  412);
    }
    std::filesystem::remove_all(dir);
    state.SetItemsProcessed(state.iterations());
}

void BM_LoggerFilteredOut(benchmark::State& state) {
    std::string dir = MakeDir("quorvex-bench-filtered");
    CMetaFileLogger& log = CMetaFileLogger::Instance();
    log.Configure(dir.c_str(), 1024, 3, 3);
    int i = 0;
    for (auto _ : state) {
        benchmark::DoNotOptimize(
            log.Print(kLogDebug, "CMetaBuffer::Parse", "[%s] frame %d", "Entrance", i++));
    }
    std::filesystem::remove_all(dir);
}

}  // namespace

BENCHMARK(BM_BaselineFormatWriteFlush);
BENCHMARK(BM_LoggerPrint);
BENCHMARK(BM_LoggerFilteredOut);
BENCHMARK_MAIN();
