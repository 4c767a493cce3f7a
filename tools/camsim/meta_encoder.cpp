#include "meta_encoder.h"

namespace camsim {

namespace {

void PutU8(std::vector<uint8_t>& out, uint8_t value) {
    out.push_back(value);
}

void PutU16(std::vector<uint8_t>& out, uint16_t value) {
    out.push_back(static_cast<uint8_t>(value & 0xFFu));
    out.push_back(static_cast<uint8_t>(value >> 8));
}

void PutU32(std::vector<uint8_t>& out, uint32_t value) {
    for (int shift = 0; shift < 32; shift += 8) {
        out.push_back(static_cast<uint8_t>((value >> shift) & 0xFFu));
    }
}

constexpr uint32_t kSmallBlockSize = 12;
constexpr uint32_t kObjectHeaderSize = 12;
constexpr uint32_t kObjectRecordSize = 20;
constexpr uint32_t kEndMarkerSize = 4;

}  // namespace

void CMetaEncoder::SetTime(uint32_t seconds, uint32_t milliseconds) {
    m_seconds = seconds;
    m_milliseconds = milliseconds;
}

void CMetaEncoder::SetGrid(uint16_t width, uint16_t height) {
    m_gridWidth = width;
    m_gridHeight = height;
}

void CMetaEncoder::SetObjectBlockType(uint16_t type) {
    m_blockType = type;
}

void CMetaEncoder::SetWith0101Block(bool with) {
    m_with0101 = with;
}

void CMetaEncoder::SetTrailingCrLf(bool with) {
    m_crLf = with;
}

bool CMetaEncoder::AddObject(const SMetaObject& object) {
    if (m_objects.size() >= kMaxObjects) {
        return false;
    }
    m_objects.push_back(object);
    return true;
}

void CMetaEncoder::ClearObjects() {
    m_objects.clear();
}

uint32_t CMetaEncoder::EncodedSize() const {
    uint32_t size = kSmallBlockSize;
    if (m_with0101) {
        size += kSmallBlockSize;
    }
    size += kObjectHeaderSize + kObjectRecordSize * ObjectCount();
    size += kEndMarkerSize;
    if (m_crLf) {
        size += 2;
    }
    return size;
}

std::vector<uint8_t> CMetaEncoder::Encode() const {
    std::vector<uint8_t> out;
    out.reserve(EncodedSize());

    PutU16(out, 0x0001);
    PutU16(out, static_cast<uint16_t>(kSmallBlockSize));
    PutU32(out, m_seconds);
    PutU32(out, m_milliseconds);

    if (m_with0101) {
        PutU16(out, 0x0101);
        PutU16(out, static_cast<uint16_t>(kSmallBlockSize));
        PutU32(out, 0);
        PutU32(out, 0);
    }

    const uint32_t count = ObjectCount();
    PutU16(out, m_blockType);
    PutU16(out, static_cast<uint16_t>(kObjectHeaderSize + kObjectRecordSize * count));
    PutU16(out, static_cast<uint16_t>(count));
    PutU16(out, m_gridWidth);
    PutU16(out, m_gridHeight);
    PutU16(out, 0);
    for (const SMetaObject& object : m_objects) {
        PutU32(out, object.objectId);
        PutU16(out, object.boxX1);
        PutU16(out, object.boxY1);
        PutU16(out, object.boxX2);
        PutU16(out, object.boxY2);
        PutU32(out, static_cast<uint32_t>(object.attr32));
        PutU16(out, static_cast<uint16_t>(object.attr16));
        PutU8(out, static_cast<uint8_t>(object.attr8a));
        PutU8(out, static_cast<uint8_t>(object.attr8b));
    }

    PutU32(out, 0xFFFFFFFFu);
    if (m_crLf) {
        PutU8(out, 0x0D);
        PutU8(out, 0x0A);
    }
    return out;
}

}  // namespace camsim
