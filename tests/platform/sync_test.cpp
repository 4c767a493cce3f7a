#include <gtest/gtest.h>

#include <atomic>
#include <thread>
#include <vector>

#include "platform/clock.h"
#include "platform/critical_section.h"
#include "platform/event.h"
#include "platform/once.h"
#include "platform/thread.h"

TEST(Event, AutoResetReleasesOneWaitAndClears) {
    plat::CEvent ev(false, false);
    uint32_t start = plat::TickCount();
    EXPECT_FALSE(ev.Wait(80));
    EXPECT_GE(plat::TickCount() - start, 75u);
    ev.Set();
    EXPECT_TRUE(ev.Wait(0));
    EXPECT_FALSE(ev.Wait(0));
}

TEST(Event, ManualResetStaysSignalledUntilReset) {
    plat::CEvent ev(true, true);
    EXPECT_TRUE(ev.Wait(0));
    EXPECT_TRUE(ev.Wait(0));
    ev.Reset();
    EXPECT_FALSE(ev.Wait(10));
}

TEST(Event, WakesWaiterOnAnotherThread) {
    plat::CEvent ev(false, false);
    std::atomic<bool> woke{false};
    std::thread waiter([&] { woke = ev.Wait(plat::kWaitInfinite); });
    plat::SleepMs(20);
    ev.Set();
    waiter.join();
    EXPECT_TRUE(woke);
}

TEST(CriticalSection, IsReentrantAndExcludesOtherThreads) {
    plat::CCriticalSection cs;
    long counter = 0;
    auto work = [&] {
        for (int i = 0; i < 20000; ++i) {
            plat::CScopedLock outer(cs);
            plat::CScopedLock inner(cs);
            ++counter;
        }
    };
    std::thread a(work);
    std::thread b(work);
    a.join();
    b.join();
    EXPECT_EQ(40000, counter);
}

TEST(Once, RunsTheInitialisationExactlyOnceUnderContention) {
    plat::COnce once;
    std::atomic<int> runs{0};
    std::atomic<int> sawReady{0};
    std::vector<std::thread> threads;
    for (int i = 0; i < 8; ++i) {
        threads.emplace_back([&] {
            once.Run([&] {
                plat::SleepMs(20);
                ++runs;
            });
            // Nobody returns before the initialisation finished.
            if (runs.load() == 1) {
                ++sawReady;
            }
        });
    }
    for (auto& t : threads) {
        t.join();
    }
    EXPECT_EQ(1, runs.load());
    EXPECT_EQ(8, sawReady.load());
    EXPECT_TRUE(once.IsReady());
}

TEST(Thread, RunsBodyOnASmallStackAndJoins) {
    plat::CThread thread;
    std::atomic<bool> wasCurrent{false};
    std::atomic<long> sum{0};
    ASSERT_TRUE(thread.Start([&] {
        // Most of a 128 KB stack, touched so that a smaller stack would fault.
        volatile char buf[96 * 1024];
        for (size_t i = 0; i < sizeof(buf); i += 512) {
            buf[i] = static_cast<char>(1 + i / 512 % 100);
        }
        long s = 0;
        for (size_t i = 0; i < sizeof(buf); i += 512) {
            s += buf[i];
        }
        sum = s;
        wasCurrent = thread.IsCurrent();
    }));
    EXPECT_TRUE(thread.Joinable());
    EXPECT_FALSE(thread.IsCurrent());
    thread.Join();
    EXPECT_FALSE(thread.Joinable());
    EXPECT_TRUE(wasCurrent);
    EXPECT_NE(0, sum.load());
    EXPECT_GE(plat::CThread::EffectiveStackBytes(plat::kWorkerStackBytes), plat::kWorkerStackBytes);
}

TEST(Thread, CanBeStartedAgainAfterJoin) {
    plat::CThread thread;
    std::atomic<int> runs{0};
    ASSERT_TRUE(thread.Start([&] { ++runs; }));
    EXPECT_FALSE(thread.Start([&] { ++runs; }));  // still running or not joined yet
    thread.Join();
    ASSERT_TRUE(thread.Start([&] { ++runs; }));
    thread.Join();
    EXPECT_EQ(2, runs.load());
}

TEST(Clock, TickCountAdvancesWithSleep) {
    uint32_t start = plat::TickCount();
    plat::SleepMs(30);
    uint32_t elapsed = plat::TickCount() - start;
    EXPECT_GE(elapsed, 29u);
    EXPECT_LT(elapsed, 5000u);
    EXPECT_GT(plat::UnixTimeNow(), 1700000000);
    EXPECT_NEAR(static_cast<double>(plat::UnixTime100nsNow() / 10000000),
                static_cast<double>(plat::UnixTimeNow()), 2.0);
}
