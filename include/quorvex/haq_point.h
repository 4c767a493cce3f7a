#ifndef QUORVEX_HAQ_POINT_H
#define QUORVEX_HAQ_POINT_H

#include <cstdint>

// One node of an analytics polygon or line, in the coordinates of the analytics grid.
struct SHaqPoint {
    int32_t m_x;
    int32_t m_y;
};
static_assert(sizeof(SHaqPoint) == 8, "nodes are two 32-bit values");

#endif  // QUORVEX_HAQ_POINT_H
