#include "analytics/haq_amf.h"

namespace {

using Wide = __int128;

struct SVec {
    Wide x;
    Wide y;
};

SVec Diff(const SHaqPoint& from, const SHaqPoint& to) {
    return {Wide{to.m_x} - from.m_x, Wide{to.m_y} - from.m_y};
}

// Differences of 32-bit coordinates need 33 bits, their products 66: exact in 128 bits.
Wide Cross(const SVec& a, const SVec& b) {
    return a.x * b.y - a.y * b.x;
}

Wide Dot(const SVec& a, const SVec& b) {
    return a.x * b.x + a.y * b.y;
}

int Sign(Wide v) {
    return (v > 0) - (v < 0);
}

int Orientation(const SHaqPoint& a, const SHaqPoint& b, const SHaqPoint& c) {
    return Sign(Cross(Diff(a, b), Diff(a, c)));
}

bool Same(const SHaqPoint& a, const SHaqPoint& b) {
    return a.m_x == b.m_x && a.m_y == b.m_y;
}

// c lies within the bounding box of segment ab (used for collinear triples only).
bool WithinBox(const SHaqPoint& a, const SHaqPoint& b, const SHaqPoint& c) {
    const auto lo = [](int32_t u, int32_t v) { return u < v ? u : v; };
    const auto hi = [](int32_t u, int32_t v) { return u < v ? v : u; };
    return c.m_x >= lo(a.m_x, b.m_x) && c.m_x <= hi(a.m_x, b.m_x) && c.m_y >= lo(a.m_y, b.m_y) &&
           c.m_y <= hi(a.m_y, b.m_y);
}

// Closed segments ab and cd share at least one point.
bool SegmentsMeet(const SHaqPoint& a, const SHaqPoint& b, const SHaqPoint& c, const SHaqPoint& d) {
    const int o1 = Orientation(a, b, c);
    const int o2 = Orientation(a, b, d);
    const int o3 = Orientation(c, d, a);
    const int o4 = Orientation(c, d, b);
    if (o1 != o2 && o3 != o4 && o1 != 0 && o2 != 0 && o3 != 0 && o4 != 0) {
        return true;
    }
    return (o1 == 0 && WithinBox(a, b, c)) || (o2 == 0 && WithinBox(a, b, d)) ||
           (o3 == 0 && WithinBox(c, d, a)) || (o4 == 0 && WithinBox(c, d, b));
}

}  // namespace

bool CHaqAmf::CheckConvexPolygon(uint16_t numNode, const SHaqPoint* nodes) const {
    if (nodes == nullptr || numNode < kMinNodes || numNode > kMaxNodes) {
        return false;
    }
    const int n = numNode;
    for (int i = 0; i < n; ++i) {
        for (int j = i + 1; j < n; ++j) {
            if (Same(nodes[i], nodes[j])) {
                return false;
            }
        }
    }

    int turnSign = 0;
    for (int i = 0; i < n; ++i) {
        const SHaqPoint& prev = nodes[(i + n - 1) % n];
        const SHaqPoint& here = nodes[i];
        const SHaqPoint& next = nodes[(i + 1) % n];
        const SVec in = Diff(prev, here);
        const SVec out = Diff(here, next);
        const int turn = Sign(Cross(in, out));
        if (turn == 0) {
            // Straight on is a node on an edge; straight back is a spike.
            if (Dot(in, out) <= 0) {
                return false;
            }
            continue;
        }
        if (turnSign != 0 && turn != turnSign) {
            return false;
        }
        turnSign = turn;
    }
    if (turnSign == 0) {
        return false;  // every node on one line
    }

    for (int i = 0; i < n; ++i) {
        for (int j = i + 1; j < n; ++j) {
            const bool neighbours = j == i + 1 || (i == 0 && j == n - 1);
            if (!neighbours &&
                SegmentsMeet(nodes[i], nodes[(i + 1) % n], nodes[j], nodes[(j + 1) % n])) {
                return false;
            }
        }
    }
    return true;
}

bool CHaqAmf::IsSupportedMajor(const SHaqRevision* revision) {
    if (revision == nullptr) {
        return false;
    }
    for (const uint16_t major : kSupportedMajors) {
        if (revision->m_major == major) {
            return true;
        }
    }
    return false;
}

int CHaqAmf::CheckDmoRevision(const SHaqRevision* revision) const {
    return IsSupportedMajor(revision) ? 1 : 0;
}

int CHaqAmf::CheckDsoRevision(const SHaqRevision* revision) const {
    return IsSupportedMajor(revision) ? 1 : 0;
}
