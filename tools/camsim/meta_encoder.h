#ifndef QUORVEX_TOOLS_CAMSIM_META_ENCODER_H
#define QUORVEX_TOOLS_CAMSIM_META_ENCODER_H

#include <cstdint>
#include <vector>

namespace camsim {

// One detected object as the camera reports it. Box coordinates are in units of the
// object grid (see CMetaEncoder::SetGrid); the attribute fields are the camera's own and are
// carried unchanged.
struct SMetaObject {
    uint32_t objectId = 0;
    uint16_t boxX1 = 0;
    uint16_t boxY1 = 0;
    uint16_t boxX2 = 0;
    uint16_t boxY2 = 0;
    int32_t attr32 = 0;
    int16_t attr16 = 0;
    int8_t attr8a = 0;
    int8_t attr8b = 0;
};

// Builds the binary object metadata of one frame, as a camera puts it into each part of its
// metadata stream: a time block, optionally a type-0x0101 block, one object block and the end
// marker FF FF FF FF, optionally followed by CR LF. Everything is written byte by byte,
// little-endian, independently of the library's decoder, so that the two can check each other.
//
// Layout written (offsets within each block):
//   time block    0x0001, length 12: +4 u32 seconds since 1970, +8 u32 milliseconds
//   0x0101 block  0x0101, length 12: +4..+11 zero
//   object block  type (0x1001..0x1003), length 12 + 20 n: +4 u16 n, +6 u16 grid width,
//                 +8 u16 grid height, +10 u16 zero, then n records of 20 bytes:
//                 +0 u32 id, +4 u16 x1, +6 u16 y1, +8 u16 x2, +10 u16 y2, +12 i32 attr32,
//                 +16 i16 attr16, +18 i8 attr8a, +19 i8 attr8b
//   end marker    FF FF FF FF
class CMetaEncoder {
public:
    // The object block's 16-bit length field limits one block to this many records.
    static constexpr uint32_t kMaxObjects = (0xFFFFu - 12u) / 20u;

    CMetaEncoder() = default;

    void SetTime(uint32_t seconds, uint32_t milliseconds);
    // Grid extent of the box coordinates: 80, 160 or 320 wide for the scaled grids, the frame
    // size itself (for example 640 x 480) for a full-resolution grid. Default 160 x 120.
    void SetGrid(uint16_t width, uint16_t height);
    // 0x1001 (default), 0x1002 or 0x1003.
    void SetObjectBlockType(uint16_t type);
    void SetWith0101Block(bool with);
    void SetTrailingCrLf(bool with);

    // Returns false (and adds nothing) once kMaxObjects objects are held.
    bool AddObject(const SMetaObject& object);
    void ClearObjects();
    uint32_t ObjectCount() const { return static_cast<uint32_t>(m_objects.size()); }

    // The frame's binary metadata; the encoder keeps its settings and objects.
    std::vector<uint8_t> Encode() const;
    // Byte count Encode() would produce.
    uint32_t EncodedSize() const;

private:
    uint32_t m_seconds = 0;
    uint32_t m_milliseconds = 0;
    uint16_t m_gridWidth = 160;
    uint16_t m_gridHeight = 120;
    uint16_t m_blockType = 0x1001;
    bool m_with0101 = false;
    bool m_crLf = false;
    std::vector<SMetaObject> m_objects;
};

}  // namespace camsim

#endif  // QUORVEX_TOOLS_CAMSIM_META_ENCODER_H
