#include <gtest/gtest.h>

#include <panekit/WTimer.h>

#include "support/RunUntil.h"

using panekit::WTimer;

namespace {

TEST(WTimerTest, RunsUntilItsCallbackAnswersFalseAndThenExpires)
{
    int ticks = 0;
    int data = 7;
    void* seen = nullptr;
    const auto timer = WTimer::addTimer(
        0.005,
        [&](void* userData) {
            seen = userData;
            return ++ticks < 3;
        },
        &data);
    EXPECT_NE(nullptr, wuitimer_get_timer_handle(timer));
    ASSERT_TRUE(support::runUntil([&] { return timer.expired(); }));
    EXPECT_EQ(3, ticks);
    EXPECT_EQ(&data, seen);
    EXPECT_EQ(nullptr, wuitimer_get_timer_handle(timer));
}

TEST(WTimerTest, MayDestroyItselfInItsCallback)
{
    for (const bool again : {true, false}) {
        SCOPED_TRACE(again);
        WTimer::Weak timer;
        int ticks = 0;
        bool expiredInside = false;
        timer = WTimer::addTimer(0.005, [&](void*) {
            ++ticks;
            WTimer::destroy(timer);
            expiredInside = timer.expired();
            return again;
        });
        ASSERT_TRUE(support::runUntil([&] { return ticks > 0; }));
        support::runFor(0.03);
        EXPECT_EQ(1, ticks);
        EXPECT_TRUE(expiredInside);
    }
}

TEST(WTimerTest, ADestroyedTimerJobOrIdlerNeverRuns)
{
    int runs = 0;
    const auto count = [&](void*) { return ++runs > 0; };
    const WTimer::Weak all[]
        = {WTimer::addTimer(0.005, count), WTimer::addJob([&](void*) { ++runs; }), WTimer::addIdler(count)};
    for (const WTimer::Weak& timer : all) {
        WTimer::destroy(timer);
        EXPECT_TRUE(timer.expired());
        WTimer::destroy(timer); // again, without effect
    }
    support::runFor(0.03);
    EXPECT_EQ(0, runs);
}

TEST(WTimerTest, AJobRunsOnceAndMayAddAnother)
{
    int first = 0;
    int second = 0;
    WTimer::Weak job = WTimer::addJob([&](void*) {
        ++first;
        EXPECT_TRUE(job.expired());
        WTimer::addJob([&](void*) { ++second; });
    });
    EXPECT_FALSE(job.expired());
    EXPECT_EQ(nullptr, wuitimer_get_timer_handle(job));
    ASSERT_TRUE(support::runUntil([&] { return second > 0; }));
    support::runFor(0.02);
    EXPECT_EQ(1, first);
    EXPECT_EQ(1, second);
}

}
