#ifndef QUORVEX_PLATFORM_CLOCK_H
#define QUORVEX_PLATFORM_CLOCK_H

#include <cstdint>

namespace plat {

// Milliseconds of a monotonic clock, wrapping at 2^32 like the tick counters that the
// callers compare by unsigned subtraction.
uint32_t TickCount();
void SleepMs(uint32_t ms);
void YieldThread();

// Wall clock: seconds since 1970-01-01 UTC, and the same instant in 100 ns units.
int64_t UnixTimeNow();
int64_t UnixTime100nsNow();

}  // namespace plat

#endif  // QUORVEX_PLATFORM_CLOCK_H
