#include "analytics/haq_meta_binary.h"

#include <cstring>
#include <new>

#if defined(__SANITIZE_ADDRESS__)
#define QUORVEX_POISON_TAIL 1
#elif defined(__has_feature)
#if __has_feature(address_sanitizer)
#define QUORVEX_POISON_TAIL 1
#endif
#endif
#if defined(QUORVEX_POISON_TAIL)
#include <sanitizer/asan_interface.h>
#endif

namespace {

constexpr uint16_t kEndType = 0xFFFF;
constexpr uint16_t kEndLength = 0xFFFF;
constexpr uint32_t kHeaderSize = 4;
// No object block can announce more records than its 16-bit count.
constexpr int kMaxObjectCapacity = 0xFFFF;

uint16_t ReadU16(const uint8_t* p) {
    return static_cast<uint16_t>(p[0] | (p[1] << 8));
}

uint32_t ReadU32(const uint8_t* p) {
    return static_cast<uint32_t>(p[0]) | (static_cast<uint32_t>(p[1]) << 8) |
           (static_cast<uint32_t>(p[2]) << 16) | (static_cast<uint32_t>(p[3]) << 24);
}

bool IsEndMarker(const uint8_t* p) {
    return p[0] == 0xFF && p[1] == 0xFF && p[2] == 0xFF && p[3] == 0xFF;
}

// In sanitized builds the part of the work buffer beyond the decoded data is marked
// unaddressable, so that a read past the data is reported even though it stays inside the
// buffer.
void MarkUsable(const uint8_t* buffer, uint32_t bufferSize, uint32_t dataSize) {
#if defined(QUORVEX_POISON_TAIL)
    if (buffer != nullptr) {
        ASAN_UNPOISON_MEMORY_REGION(buffer, bufferSize);
        ASAN_POISON_MEMORY_REGION(buffer + dataSize, bufferSize - dataSize);
    }
#else
    (void)buffer;
    (void)bufferSize;
    (void)dataSize;
#endif
}

}  // namespace

CHaqMetaBinary::~CHaqMetaBinary() {
    MarkUsable(m_buffer.get(), m_bufferSize, m_bufferSize);
}

int CHaqMetaBinary::Init(int flags, int maxObjects) {
    MarkUsable(m_buffer.get(), m_bufferSize, m_bufferSize);
    m_buffer.reset();
    m_bufferSize = 0;
    m_maxObjects = maxObjects;
    ClearBlocks();
    m_dataSize = 0;
    if (maxObjects < 0 || maxObjects > kMaxObjectCapacity) {
        return kNoBuffer;
    }

    const uint32_t records = static_cast<uint32_t>(maxObjects) * kObjectRecordSize;
    uint32_t size = 0;
    if (flags == 0) {
        size = records + 28;
    } else {
        if (flags & 1) {
            size += kSmallBlockSize;
        }
        if (flags & 2) {
            size += kSmallBlockSize;
        }
        if (flags & 3) {
            size += records + kObjectHeaderSize;
        }
        size += kHeaderSize;
    }

    m_buffer.reset(new (std::nothrow) uint8_t[size]);
    if (!m_buffer) {
        return kNoBuffer;
    }
    m_bufferSize = size;
    MarkUsable(m_buffer.get(), m_bufferSize, 0);
    return kOk;
}

void CHaqMetaBinary::ClearBlocks() {
    m_flags = 0;
    m_pTimeBlock = nullptr;
    m_pBlock0101 = nullptr;
    m_pObjectBlock = nullptr;
    m_pObjectCount = nullptr;
    m_pObjects = nullptr;
}

int CHaqMetaBinary::Decode(const uint8_t* data, int32_t size) {
    // Blocks of an earlier frame must not survive into this one, whatever happens below.
    ClearBlocks();
    m_dataSize = 0;
    if (!m_buffer || data == nullptr || size < static_cast<int32_t>(kHeaderSize) ||
        static_cast<uint32_t>(size) > m_bufferSize) {
        return kBadCall;
    }
    const uint32_t length = static_cast<uint32_t>(size);
    MarkUsable(m_buffer.get(), m_bufferSize, length);
    std::memcpy(m_buffer.get(), data, length);
    m_dataSize = length;

    const uint8_t* bytes = m_buffer.get();
    if (!IsEndMarker(bytes + length - 4)) {
        const bool crLf = bytes[length - 2] == 0x0D && bytes[length - 1] == 0x0A;
        if (!crLf || length - 2 < kHeaderSize || !IsEndMarker(bytes + length - 6)) {
            return kNoEndMarker;
        }
    }

    if (!ScanBlocks(length)) {
        return kBadChain;
    }
    if (m_pTimeBlock == nullptr || m_pObjectBlock == nullptr || m_pObjectCount == nullptr ||
        m_pObjects == nullptr) {
        return kBadChain;
    }
    return kOk;
}

bool CHaqMetaBinary::ScanBlocks(uint32_t size) {
    const uint8_t* bytes = m_buffer.get();
    // 64-bit offsets: a block announcing 65535 records steps past any 32-bit sum safely.
    uint64_t off = 0;
    if (size == 0) {
        return false;
    }
    for (;;) {
        // Each step only guarantees that the offset lies inside the data; the header itself
        // must fit before it is read.
        if (off + kHeaderSize > size) {
            return false;
        }
        const uint16_t type = ReadU16(bytes + off);
        const uint16_t blockLength = ReadU16(bytes + off + 2);
        if (type == kEndType && blockLength == kEndLength) {
            return true;
        }
        if (blockLength == 0 || off + blockLength + kHeaderSize > size) {
            return false;
        }

        if (type >= kObjectBlockFirst && type <= kObjectBlockLast) {
            if (off + kObjectHeaderSize > size) {
                return false;
            }
            m_flags |= kFlagTime | kFlagObjects;
            m_pObjectBlock = bytes + off;
            m_pObjectCount = bytes + off + 4;
            m_pObjects = bytes + off + kObjectHeaderSize;
            off += kObjectHeaderSize + uint64_t{kObjectRecordSize} * ReadU16(m_pObjectCount);
        } else if (type == kBlock0101) {
            if (off + kSmallBlockSize > size) {
                return false;
            }
            m_flags |= kFlagObjects;
            m_pBlock0101 = bytes + off;
            off += kSmallBlockSize;
        } else if (type == 0x0000) {
            return false;
        } else if (type == kTimeBlock) {
            if (off + kSmallBlockSize > size) {
                return false;
            }
            m_flags |= kFlagTime;
            m_pTimeBlock = bytes + off;
            off += kSmallBlockSize;
        } else {
            off += blockLength;
        }

        if (off >= size) {
            return false;
        }
    }
}

bool CHaqMetaBinary::GetTime(uint32_t& first, uint32_t& second) const {
    if (m_pTimeBlock == nullptr) {
        return false;
    }
    first = ReadU32(m_pTimeBlock + 4);
    second = ReadU32(m_pTimeBlock + 8);
    return true;
}

uint16_t CHaqMetaBinary::ObjectBlockType() const {
    return m_pObjectBlock != nullptr ? ReadU16(m_pObjectBlock) : 0;
}

uint16_t CHaqMetaBinary::GridWidth() const {
    return m_pObjectBlock != nullptr ? ReadU16(m_pObjectBlock + 6) : 0;
}

uint16_t CHaqMetaBinary::GridHeight() const {
    return m_pObjectBlock != nullptr ? ReadU16(m_pObjectBlock + 8) : 0;
}

uint32_t CHaqMetaBinary::DeclaredObjectCount() const {
    return m_pObjectCount != nullptr ? ReadU16(m_pObjectCount) : 0;
}

uint32_t CHaqMetaBinary::ObjectCount() const {
    if (m_pObjects == nullptr) {
        return 0;
    }
    const uint32_t start = static_cast<uint32_t>(m_pObjects - m_buffer.get());
    const uint32_t room = m_dataSize > start ? (m_dataSize - start) / kObjectRecordSize : 0;
    const uint32_t declared = DeclaredObjectCount();
    return declared < room ? declared : room;
}

bool CHaqMetaBinary::GetObject(uint32_t index, SHaqMetaBinaryObjectData& out) const {
    if (index >= ObjectCount()) {
        return false;
    }
    const uint8_t* p = m_pObjects + uint64_t{index} * kObjectRecordSize;
    out.m_objectId = ReadU32(p);
    out.m_boxX1 = ReadU16(p + 4);
    out.m_boxY1 = ReadU16(p + 6);
    out.m_boxX2 = ReadU16(p + 8);
    out.m_boxY2 = ReadU16(p + 10);
    out.m_attr32 = static_cast<int32_t>(ReadU32(p + 12));
    out.m_attr16 = static_cast<int16_t>(ReadU16(p + 16));
    out.m_attr8a = static_cast<int8_t>(p[18]);
    out.m_attr8b = static_cast<int8_t>(p[19]);
    return true;
}

uint32_t CHaqMetaBinary::CopyObjects(SHaqMetaBinaryObjectData* out, uint32_t capacity) const {
    if (out == nullptr) {
        return 0;
    }
    const uint32_t count = ObjectCount();
    const uint32_t n = count < capacity ? count : capacity;
    for (uint32_t i = 0; i < n; ++i) {
        GetObject(i, out[i]);
    }
    return n;
}

bool CHaqMetaBinary::DeriveGeometry(int32_t& coordScale, int32_t& frameWidth,
                                    int32_t& frameHeight) const {
    const uint16_t gridWidth = GridWidth();
    if (m_pObjectBlock == nullptr || gridWidth == 0) {
        return false;
    }
    coordScale = 320 / gridWidth;
    if (coordScale == 0) {
        frameWidth = gridWidth;
        frameHeight = GridHeight();
    }
    return true;
}
