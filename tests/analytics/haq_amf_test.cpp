#include "analytics/haq_amf.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdint>
#include <limits>
#include <vector>

namespace {

using Polygon = std::vector<SHaqPoint>;

bool Usable(const Polygon& p) {
    CHaqAmf engine;
    return engine.CheckConvexPolygon(static_cast<uint16_t>(p.size()), p.data());
}

// The answer must not depend on where the walk starts or which way it goes.
void ExpectUsableInEveryOrder(const Polygon& polygon, bool usable) {
    for (int reversed = 0; reversed < 2; ++reversed) {
        Polygon p = polygon;
        if (reversed) {
            std::reverse(p.begin(), p.end());
        }
        for (size_t start = 0; start < p.size(); ++start) {
            SCOPED_TRACE(testing::Message() << "start " << start << " reversed " << reversed);
            EXPECT_EQ(usable, Usable(p));
            std::rotate(p.begin(), p.begin() + 1, p.end());
        }
    }
}

TEST(HaqAmfPolygonTest, ConvexPolygonsAreUsableInEitherOrientation) {
    ExpectUsableInEveryOrder({{0, 0}, {160, 0}, {80, 120}}, true);
    ExpectUsableInEveryOrder({{10, 10}, {100, 10}, {100, 90}, {10, 90}}, true);
    // Eight nodes, the most a node list holds.
    ExpectUsableInEveryOrder(
        {{40, 0}, {80, 0}, {120, 40}, {120, 80}, {80, 120}, {40, 120}, {0, 80}, {0, 40}}, true);
    // A node on the straight edge between its neighbours keeps the area convex.
    ExpectUsableInEveryOrder({{0, 0}, {50, 0}, {100, 0}, {100, 100}, {0, 100}}, true);
}

TEST(HaqAmfPolygonTest, ConcaveAndSelfCrossingOutlinesAreRefused) {
    // An arrow head: one reflex node.
    ExpectUsableInEveryOrder({{0, 0}, {100, 50}, {0, 100}, {40, 50}}, false);
    // A bow tie crosses itself.
    ExpectUsableInEveryOrder({{0, 0}, {100, 100}, {100, 0}, {0, 100}}, false);
    // A pentagram turns the same way at every node but winds around twice.
    ExpectUsableInEveryOrder({{50, 0}, {79, 90}, {2, 35}, {98, 35}, {21, 90}}, false);
    // The outline doubles back along a line at node (100, 0).
    ExpectUsableInEveryOrder({{0, 0}, {100, 0}, {60, 0}, {50, 80}}, false);
}

TEST(HaqAmfPolygonTest, DegenerateNodeListsAreRefused) {
    ExpectUsableInEveryOrder({{0, 0}, {50, 50}, {100, 100}}, false);
    ExpectUsableInEveryOrder({{0, 0}, {10, 0}, {20, 0}, {30, 0}, {40, 0}}, false);
    // Repeated nodes, next to each other and apart.
    ExpectUsableInEveryOrder({{0, 0}, {100, 0}, {100, 0}, {100, 100}}, false);
    ExpectUsableInEveryOrder({{0, 0}, {100, 0}, {100, 100}, {0, 0}, {0, 100}}, false);

    EXPECT_FALSE(Usable({{0, 0}, {100, 100}}));
    EXPECT_FALSE(Usable({}));
    // Nine nodes of a convex outline exceed a node list.
    EXPECT_FALSE(Usable({{40, 0},
                         {80, 0},
                         {120, 40},
                         {120, 80},
                         {80, 120},
                         {40, 120},
                         {0, 80},
                         {0, 40},
                         {20, 10}}));
    CHaqAmf engine;
    EXPECT_FALSE(engine.CheckConvexPolygon(4, nullptr));
}

TEST(HaqAmfPolygonTest, ExtremeCoordinatesAreDecidedExactly) {
    constexpr int32_t lo = std::numeric_limits<int32_t>::min();
    constexpr int32_t hi = std::numeric_limits<int32_t>::max();
    // Products of these differences overflow 64 bits; a wrapped product would misjudge them.
    ExpectUsableInEveryOrder({{lo, lo}, {hi, lo}, {hi, hi}, {lo, hi}}, true);
    ExpectUsableInEveryOrder({{lo, lo}, {0, 0}, {hi - 1, hi - 1}}, false);
    ExpectUsableInEveryOrder({{lo, lo}, {hi, hi}, {hi, hi - 1}}, true);
    ExpectUsableInEveryOrder({{lo, lo}, {hi, lo}, {0, -1}, {hi, hi}, {lo, hi}}, false);
}

TEST(HaqAmfRevisionTest, MajorVersionsOneAndTwoAreSupported) {
    CHaqAmf engine;
    for (uint16_t major : {1, 2}) {
        for (const SHaqRevision r : {SHaqRevision{major, 0, 0, 0}, SHaqRevision{major, 10, 2, 0},
                                     SHaqRevision{major, 99, 99, 0}}) {
            SCOPED_TRACE(testing::Message()
                         << r.m_major << "." << r.m_minor << "." << r.m_revision);
            EXPECT_NE(0, engine.CheckDmoRevision(&r));
            EXPECT_NE(0, engine.CheckDsoRevision(&r));
        }
    }
    for (const SHaqRevision r : {SHaqRevision{0, 0, 0, 0}, SHaqRevision{0, 9, 9, 0},
                                 SHaqRevision{3, 0, 0, 0}, SHaqRevision{12, 3, 45, 0}}) {
        SCOPED_TRACE(testing::Message() << r.m_major << "." << r.m_minor << "." << r.m_revision);
        EXPECT_EQ(0, engine.CheckDmoRevision(&r));
        EXPECT_EQ(0, engine.CheckDsoRevision(&r));
    }
    EXPECT_EQ(0, engine.CheckDmoRevision(nullptr));
    EXPECT_EQ(0, engine.CheckDsoRevision(nullptr));
}

}  // namespace
