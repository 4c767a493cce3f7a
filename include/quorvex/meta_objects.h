#ifndef QUORVEX_META_OBJECTS_H
#define QUORVEX_META_OBJECTS_H

#include <cstdint>

// Decoded object metadata of one frame, as the library hands it to the host and to the
// analytics engine. Field widths and order are those of the camera's wire records; where the
// camera does not say a field is unsigned it is kept signed.

// Capacity of one object list: a frame whose object block announces this many objects or more
// is refused by the decoding operations that fill these records.
constexpr uint32_t kMetaMaxObjects = 1000;

// One object record, 20 bytes without padding.
struct SHaqMetaBinaryObjectData {
    uint32_t m_objectId;  // the camera's object identifier
    uint16_t m_boxX1;     // box corners in units of the camera's object grid
    uint16_t m_boxY1;
    uint16_t m_boxX2;
    uint16_t m_boxY2;
    int32_t m_attr32;  // attributes of the camera, carried unchanged
    int16_t m_attr16;
    int8_t m_attr8a;
    int8_t m_attr8b;
};
static_assert(sizeof(SHaqMetaBinaryObjectData) == 20, "object records are 20 bytes");

// One list of objects; m_pObject points at kMetaMaxObjects records owned by the library.
struct SDwbMetaObjectList {
    int16_t m_listId;        // always 0
    uint32_t m_numObject;    // valid records in m_pObject
    uint16_t m_packageType;  // object block type 0x1001 to 0x1003, 0 when the frame had none
    SHaqMetaBinaryObjectData* m_pObject;
};

// One decoded frame. m_pList points at two lists of which only the first is filled.
struct SDwbMetaObjectsInFrame {
    uint32_t m_sec;   // frame time, seconds since 1970
    uint32_t m_msec;  // the frame's second time value
    int32_t m_numList;
    SDwbMetaObjectList* m_pList;
};

#endif  // QUORVEX_META_OBJECTS_H
