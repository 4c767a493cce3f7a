// The camera simulator's encoder and the library's decoder are written independently; each
// checks the other's reading of the wire format.
#include <gtest/gtest.h>

#include <cstdint>
#include <vector>

#include "analytics/haq_meta_binary.h"
#include "camsim/meta_encoder.h"

namespace {

camsim::SMetaObject SimObject(uint32_t i) {
    camsim::SMetaObject o;
    o.objectId = 0xC0000000u + i;
    o.boxX1 = static_cast<uint16_t>(3 * i);
    o.boxY1 = static_cast<uint16_t>(0x9000u + i);
    o.boxX2 = static_cast<uint16_t>(0x0400u + i);
    o.boxY2 = static_cast<uint16_t>(0xFF00u + (i & 0xFF));
    o.attr32 = -70000 - static_cast<int32_t>(i);
    o.attr16 = static_cast<int16_t>(-1 - static_cast<int32_t>(i & 0x3FF));
    o.attr8a = static_cast<int8_t>(-128 + static_cast<int32_t>(i & 0x7F));
    o.attr8b = static_cast<int8_t>(i & 0x7F);
    return o;
}

TEST(MetaEncoderRoundTripTest, EncodedFramesDecodeToTheSameTimeGridAndObjects) {
    struct SCase {
        uint16_t type;
        uint16_t gridWidth;
        uint16_t gridHeight;
        bool with0101;
        bool crLf;
        uint32_t count;
    };
    // 999: the most a frame may carry; with both optional parts, 1000 records would exceed the
    // 20,040-byte work buffer.
    const SCase cases[] = {{0x1001, 160, 120, false, false, 0},
                           {0x1002, 80, 60, true, false, 1},
                           {0x1003, 640, 480, false, true, 17},
                           {0x1001, 320, 240, true, true, 999}};
    CHaqMetaBinary decoder;
    ASSERT_EQ(CHaqMetaBinary::kOk, decoder.Init(3, 1000));
    for (const SCase& c : cases) {
        SCOPED_TRACE(testing::Message() << c.type << " n=" << c.count);
        camsim::CMetaEncoder encoder;
        encoder.SetTime(1765000000u + c.count, 999u - c.count % 1000);
        encoder.SetGrid(c.gridWidth, c.gridHeight);
        encoder.SetObjectBlockType(c.type);
        encoder.SetWith0101Block(c.with0101);
        encoder.SetTrailingCrLf(c.crLf);
        for (uint32_t i = 0; i < c.count; ++i) {
            ASSERT_TRUE(encoder.AddObject(SimObject(i)));
        }
        const std::vector<uint8_t> bytes = encoder.Encode();
        ASSERT_EQ(encoder.EncodedSize(), bytes.size());

        ASSERT_EQ(CHaqMetaBinary::kOk,
                  decoder.Decode(bytes.data(), static_cast<int32_t>(bytes.size())));
        uint32_t seconds = 0;
        uint32_t milliseconds = 0;
        ASSERT_TRUE(decoder.GetTime(seconds, milliseconds));
        EXPECT_EQ(1765000000u + c.count, seconds);
        EXPECT_EQ(999u - c.count % 1000, milliseconds);
        EXPECT_EQ(c.with0101, decoder.Has0101Block());
        EXPECT_EQ(c.type, decoder.ObjectBlockType());
        EXPECT_EQ(c.gridWidth, decoder.GridWidth());
        EXPECT_EQ(c.gridHeight, decoder.GridHeight());
        ASSERT_EQ(c.count, decoder.ObjectCount());
        for (uint32_t i = 0; i < c.count; ++i) {
            SHaqMetaBinaryObjectData got{};
            ASSERT_TRUE(decoder.GetObject(i, got));
            const camsim::SMetaObject want = SimObject(i);
            ASSERT_EQ(want.objectId, got.m_objectId) << i;
            ASSERT_EQ(want.boxX1, got.m_boxX1) << i;
            ASSERT_EQ(want.boxY1, got.m_boxY1) << i;
            ASSERT_EQ(want.boxX2, got.m_boxX2) << i;
            ASSERT_EQ(want.boxY2, got.m_boxY2) << i;
            ASSERT_EQ(want.attr32, got.m_attr32) << i;
            ASSERT_EQ(want.attr16, got.m_attr16) << i;
            ASSERT_EQ(want.attr8a, got.m_attr8a) << i;
            ASSERT_EQ(want.attr8b, got.m_attr8b) << i;
        }
    }
}

TEST(MetaEncoderRoundTripTest, EncoderStopsAtWhatOneBlockLengthCanCarry) {
    camsim::CMetaEncoder encoder;
    for (uint32_t i = 0; i < camsim::CMetaEncoder::kMaxObjects; ++i) {
        ASSERT_TRUE(encoder.AddObject(SimObject(i)));
    }
    EXPECT_FALSE(encoder.AddObject(SimObject(0)));
    const std::vector<uint8_t> bytes = encoder.Encode();
    // The fullest block the encoder makes still fits a decoder sized for it.
    CHaqMetaBinary decoder;
    ASSERT_EQ(CHaqMetaBinary::kOk,
              decoder.Init(3, static_cast<int>(camsim::CMetaEncoder::kMaxObjects)));
    ASSERT_EQ(CHaqMetaBinary::kOk,
              decoder.Decode(bytes.data(), static_cast<int32_t>(bytes.size())));
    EXPECT_EQ(camsim::CMetaEncoder::kMaxObjects, decoder.ObjectCount());
}

}  // namespace
