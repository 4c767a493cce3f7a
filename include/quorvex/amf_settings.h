#ifndef QUORVEX_AMF_SETTINGS_H
#define QUORVEX_AMF_SETTINGS_H

#include <cstdint>

#include "quorvex/haq_point.h"

// Analytics settings as the host hands them over and as the engine receives them. The layouts
// are those the engine exchanges, so the sizes are fixed.

// Maximum nodes of a polygon or line.
constexpr int kAmfMaxNodes = 8;
// A combination slot that names no filter.
constexpr uint8_t kAmfComboUnused = 255;

// One filter: an event in an area or on a line with limits on object size, speed, stay time
// or count.
struct SDwbAmfFilter {
    uint16_t m_event;    // settings: index 0..5; engine: 1 << index
    uint16_t m_numNode;  // nodes in use
    SHaqPoint m_nodeList[kAmfMaxNodes];
    int32_t m_minWidth;
    int32_t m_maxWidth;
    int32_t m_minHeight;
    int32_t m_maxHeight;
    float m_minDx;
    float m_maxDx;
    float m_minDy;
    float m_maxDy;
    float m_minDv;
    float m_maxDv;
    bool m_enableDx;
    bool m_enableDy;
    bool m_enableDv;
    int32_t m_minStay;  // seconds in settings, milliseconds in engine form
    int32_t m_maxStay;
    int32_t m_minCapacity;
    int32_t m_maxCapacity;
    uint16_t m_direction;  // passing direction 0..2
    uint16_t m_collision;  // 0..4
    int16_t m_areaIntersect;
    int32_t m_sparseAlertInterval;
};
static_assert(sizeof(SDwbAmfFilter) == 140, "the engine's filter record is 140 bytes");

// One non-detection area.
struct SDwbAmfNonDetectionArea {
    uint16_t m_numNode;
    SHaqPoint m_nodeList[kAmfMaxNodes];
};
static_assert(sizeof(SDwbAmfNonDetectionArea) == 68, "the engine's mask record is 68 bytes");

// A chain of up to three filters.
struct SDwbAmfComboFilter {
    uint8_t m_filterNo[3];   // filter slots in sequence order; kAmfComboUnused when unused
    uint8_t m_logic[2];      // only 0 is accepted
    uint32_t m_interval[2];  // seconds in settings (at most 9999), milliseconds in engine form
    int32_t m_sparseAlertInterval;
};
static_assert(sizeof(SDwbAmfComboFilter) == 20, "the engine's combination record is 20 bytes");

// Stored settings of one slot; a new filter setting carries the defaults the host starts from.
struct SFilterSetting {
    SFilterSetting();
    bool m_active;
    SDwbAmfFilter m_filter;
};

struct SMaskAreaSetting {
    SMaskAreaSetting() : m_active(false), m_area() {}
    bool m_active;
    SDwbAmfNonDetectionArea m_area;
};

struct SComboSetting {
    SComboSetting() : m_active(false), m_combo() {}
    bool m_active;
    SDwbAmfComboFilter m_combo;
};

// The conditions of a filter that nothing has been set on yet.
inline SDwbAmfFilter BlankAmfFilter() {
    SDwbAmfFilter f{};
    f.m_minWidth = 2;
    f.m_maxWidth = 160;
    f.m_minHeight = 2;
    f.m_maxHeight = 120;
    f.m_maxDv = 9999.0f;
    f.m_enableDv = true;
    f.m_maxStay = 9999;
    f.m_minCapacity = 1;
    f.m_maxCapacity = 9999;
    return f;
}

inline SFilterSetting::SFilterSetting() : m_active(false), m_filter(BlankAmfFilter()) {}

#endif  // QUORVEX_AMF_SETTINGS_H
