#ifndef QUORVEX_ANALYTICS_HAQ_AMF_H
#define QUORVEX_ANALYTICS_HAQ_AMF_H

#include <cstdint>

#include "quorvex/haq_point.h"
#include "quorvex/meta_objects.h"

// Version of a camera's analytics as the camera reports it ("major.minor.revision").
struct SHaqRevision {
    uint16_t m_major;
    uint16_t m_minor;
    uint16_t m_revision;
    uint16_t m_reserved;  // not reported by cameras; kept 0
};

// The engine reads decoded frames in the same layout as the host receives them.
using SHaqMetaObjectsInFrame = SDwbMetaObjectsInFrame;

// The analytics filter engine of one camera slot.
//
// Supported analytics versions. The engine interprets the object blocks 0x1001 to 0x1003 with
// their 20-byte records and grid header; the camera's moving-object analytics of major
// versions 1 and 2 produce exactly that, and a new major version is the camera's way of saying
// the object format or its meaning changed. So CheckDmoRevision accepts majors 1 and 2 with
// any minor and revision, and refuses everything else, including 0.0.0, which is what remains
// when a camera reports no version at all (without moving-object analytics there are no
// objects to evaluate). CheckDsoRevision applies the same rule to the unattended-object
// analytics; its result is informational for callers.
//
// Usable polygons (areas and masks), as CheckConvexPolygon decides:
//  - 3 to 8 nodes (the capacity of a node list); fewer or more is refused;
//  - no node repeated anywhere in the list;
//  - not all nodes on one line (the area must enclose something);
//  - convex: walking the nodes, every turn goes the same way; either orientation is accepted
//    (clockwise and counter-clockwise describe the same area, and with y growing downwards
//    hosts draw both). A node lying on the straight edge between its neighbours is accepted,
//    a node where the outline doubles back on itself is not;
//  - simple: no two non-neighbouring edges meet, which refuses star outlines whose turns all
//    go the same way but wind around more than once.
// Any 32-bit coordinates are accepted as input: products are formed in 128-bit integers, so
// the decision is exact and free of overflow; range checks of the nodes are the callers'.
//
// Configuration (non-detection areas, filters, the combination) and per-frame evaluation
// (object metadata in, fired alert slots and alert details out) belong to this class as well;
// they are added together with the settings records they consume.
class CHaqAmf {
public:
    static constexpr uint16_t kMinNodes = 3;
    static constexpr uint16_t kMaxNodes = 8;
    static constexpr uint16_t kSupportedMajors[] = {1, 2};

    CHaqAmf() = default;
    virtual ~CHaqAmf() = default;
    CHaqAmf(const CHaqAmf&) = delete;
    CHaqAmf& operator=(const CHaqAmf&) = delete;

    // True when the polygon is usable (rules above); false also for null nodes.
    bool CheckConvexPolygon(uint16_t numNode, const SHaqPoint* nodes) const;

    // Non-zero when the version is supported, 0 otherwise (and for null).
    int CheckDmoRevision(const SHaqRevision* revision) const;
    int CheckDsoRevision(const SHaqRevision* revision) const;

private:
    static bool IsSupportedMajor(const SHaqRevision* revision);
};

#endif  // QUORVEX_ANALYTICS_HAQ_AMF_H
