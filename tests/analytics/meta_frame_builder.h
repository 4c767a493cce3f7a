#ifndef QUORVEX_TESTS_ANALYTICS_META_FRAME_BUILDER_H
#define QUORVEX_TESTS_ANALYTICS_META_FRAME_BUILDER_H

#include <cstdint>
#include <vector>

#include "quorvex/meta_objects.h"

namespace testkit {

// Builds binary metadata block by block, every field written byte by byte, little-endian, so
// that tests can also produce the malformed chains that no encoder would.
class CMetaFrameBuilder {
public:
    CMetaFrameBuilder& U8(uint8_t v) {
        m_bytes.push_back(v);
        return *this;
    }
    CMetaFrameBuilder& U16(uint16_t v) {
        m_bytes.push_back(static_cast<uint8_t>(v & 0xFF));
        m_bytes.push_back(static_cast<uint8_t>(v >> 8));
        return *this;
    }
    CMetaFrameBuilder& U32(uint32_t v) {
        U16(static_cast<uint16_t>(v & 0xFFFF));
        return U16(static_cast<uint16_t>(v >> 16));
    }
    CMetaFrameBuilder& Header(uint16_t type, uint16_t length) { return U16(type).U16(length); }

    CMetaFrameBuilder& Time(uint32_t seconds, uint32_t second) {
        return Header(0x0001, 12).U32(seconds).U32(second);
    }
    CMetaFrameBuilder& Block0101() { return Header(0x0101, 12).U32(0).U32(0); }
    // Block of some other type: header plus length - 4 filler bytes.
    CMetaFrameBuilder& Other(uint16_t type, uint16_t length) {
        Header(type, length);
        for (int i = 4; i < length; ++i) {
            U8(0x5A);
        }
        return *this;
    }
    // Object block header announcing `count` records; the length field says the same unless
    // given.
    CMetaFrameBuilder& ObjectHeader(uint16_t type, uint16_t count, uint16_t gridWidth,
                                    uint16_t gridHeight) {
        return Header(type, static_cast<uint16_t>(12 + 20 * count))
            .U16(count)
            .U16(gridWidth)
            .U16(gridHeight)
            .U16(0);
    }
    CMetaFrameBuilder& Object(const SHaqMetaBinaryObjectData& o) {
        U32(o.m_objectId).U16(o.m_boxX1).U16(o.m_boxY1).U16(o.m_boxX2).U16(o.m_boxY2);
        U32(static_cast<uint32_t>(o.m_attr32)).U16(static_cast<uint16_t>(o.m_attr16));
        return U8(static_cast<uint8_t>(o.m_attr8a)).U8(static_cast<uint8_t>(o.m_attr8b));
    }
    CMetaFrameBuilder& End() { return U32(0xFFFFFFFFu); }
    CMetaFrameBuilder& CrLf() { return U8(0x0D).U8(0x0A); }

    const std::vector<uint8_t>& Bytes() const { return m_bytes; }
    int32_t Size() const { return static_cast<int32_t>(m_bytes.size()); }

private:
    std::vector<uint8_t> m_bytes;
};

// A record whose every field differs from its neighbours' and uses the high bits, so that a
// swapped, shifted or sign-mangled field shows.
inline SHaqMetaBinaryObjectData SampleObject(uint32_t i) {
    SHaqMetaBinaryObjectData o{};
    o.m_objectId = 0x80000000u + i;
    o.m_boxX1 = static_cast<uint16_t>(i);
    o.m_boxY1 = static_cast<uint16_t>(0x8000u + i);
    o.m_boxX2 = static_cast<uint16_t>(0x1200u + i);
    o.m_boxY2 = static_cast<uint16_t>(0xFE00u + (i & 0xFF));
    o.m_attr32 = -static_cast<int32_t>(i) - 2;
    o.m_attr16 = static_cast<int16_t>(-300 - static_cast<int32_t>(i & 0xFF));
    o.m_attr8a = static_cast<int8_t>(-5);
    o.m_attr8b = static_cast<int8_t>(i & 0x7F);
    return o;
}

}  // namespace testkit

#endif  // QUORVEX_TESTS_ANALYTICS_META_FRAME_BUILDER_H
