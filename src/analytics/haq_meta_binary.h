#ifndef QUORVEX_ANALYTICS_HAQ_META_BINARY_H
#define QUORVEX_ANALYTICS_HAQ_META_BINARY_H

#include <cstdint>
#include <memory>

#include "quorvex/meta_objects.h"

// Checks the binary object metadata of one frame and locates its blocks.
//
// The data is a chain of blocks (u16 type, u16 length, little-endian) closed by the end marker
// FF FF FF FF, which must be the last four bytes or the four before a trailing CR LF. Decode()
// copies the data into a work buffer sized by Init(); every accessor reads from that copy,
// field by field, and never beyond the bytes that were decoded, whatever the block headers
// claim:
//  - a block is recorded only when the bytes it takes lie within the data (a time block cut
//    short fails the decoding and is not recorded);
//  - an object block whose n records do not all fit makes the decoding fail, and ObjectCount()
//    then counts only the records that do fit; DeclaredObjectCount() keeps the n of the header.
// Blocks recorded before a fault stay available, so callers can use whatever was found.
// The decoder does not log: its callers know the camera and log the failure themselves.
class CHaqMetaBinary {
public:
    static constexpr int kOk = 0;
    static constexpr int kBadCall = 1;
    static constexpr int kNoBuffer = 2;
    static constexpr int kNoEndMarker = 3;
    static constexpr int kBadChain = 4;

    static constexpr uint16_t kTimeBlock = 0x0001;
    static constexpr uint16_t kBlock0101 = 0x0101;
    static constexpr uint16_t kObjectBlockFirst = 0x1001;
    static constexpr uint16_t kObjectBlockLast = 0x1003;
    static constexpr uint32_t kSmallBlockSize = 12;
    static constexpr uint32_t kObjectHeaderSize = 12;
    static constexpr uint32_t kObjectRecordSize = 20;

    // m_flags bits: set by a time or object block, and by a type-0x0101 or object block.
    static constexpr uint32_t kFlagTime = 1u << 0;
    static constexpr uint32_t kFlagObjects = 1u << 1;

    CHaqMetaBinary() = default;
    virtual ~CHaqMetaBinary();
    CHaqMetaBinary(const CHaqMetaBinary&) = delete;
    CHaqMetaBinary& operator=(const CHaqMetaBinary&) = delete;

    // Sizes the work buffer for maxObjects object records: 20,040 bytes for (3, 1000), the
    // call every user makes. Returns kOk, or kNoBuffer when it cannot be had (also for a
    // maxObjects outside 0 to 65535, more than any object block can announce); the old buffer
    // is gone either way.
    int Init(int flags, int maxObjects);

    // kOk for valid data; kBadCall without a buffer, for null data, fewer than 4 bytes or more
    // than the work buffer holds; kNoEndMarker; kBadChain for a malformed chain or when the time
    // block or the object block is missing.
    int Decode(const uint8_t* data, int32_t size);

    uint32_t Flags() const { return m_flags; }
    uint32_t BufferSize() const { return m_bufferSize; }

    bool HasTimeBlock() const { return m_pTimeBlock != nullptr; }
    bool Has0101Block() const { return m_pBlock0101 != nullptr; }
    bool HasObjectBlock() const { return m_pObjectBlock != nullptr; }

    // The time block's two values (seconds since 1970, then the second value); false without
    // a time block, leaving the outputs unchanged.
    bool GetTime(uint32_t& first, uint32_t& second) const;

    // Object block; 0 for each without one.
    uint16_t ObjectBlockType() const;
    uint16_t GridWidth() const;
    uint16_t GridHeight() const;
    uint32_t DeclaredObjectCount() const;
    // Records of the object block that lie within the data.
    uint32_t ObjectCount() const;

    // Record `index` below ObjectCount(); false otherwise.
    bool GetObject(uint32_t index, SHaqMetaBinaryObjectData& out) const;
    // Copies the first min(ObjectCount(), capacity) records; returns how many.
    uint32_t CopyObjects(SHaqMetaBinaryObjectData* out, uint32_t capacity) const;

    // Frame geometry from the object block's grid: coordScale = 320 / grid width, and when that
    // is 0 the grid width and height become the frame size (otherwise the frame size is left
    // as it was). Returns false, changing nothing, without an object block or with a grid width
    // of 0, which carries no usable grid.
    bool DeriveGeometry(int32_t& coordScale, int32_t& frameWidth, int32_t& frameHeight) const;

private:
    bool ScanBlocks(uint32_t size);
    void ClearBlocks();

    uint32_t m_flags = 0;
    int32_t m_maxObjects = 0;
    std::unique_ptr<uint8_t[]> m_buffer;
    uint32_t m_bufferSize = 0;
    const uint8_t* m_pTimeBlock = nullptr;
    const uint8_t* m_pBlock0101 = nullptr;
    const uint8_t* m_pObjectBlock = nullptr;
    const uint8_t* m_pObjectCount = nullptr;
    const uint8_t* m_pObjects = nullptr;
    // Bytes of the last decoded data: the bound of every read.
    uint32_t m_dataSize = 0;
};

#endif  // QUORVEX_ANALYTICS_HAQ_META_BINARY_H
