#include "analytics/haq_meta_binary.h"

#include <gtest/gtest.h>

#include <cstring>
#include <memory>
#include <vector>

#include "meta_frame_builder.h"

namespace {

using testkit::CMetaFrameBuilder;
using testkit::SampleObject;

void ExpectSameObject(const SHaqMetaBinaryObjectData& want, const SHaqMetaBinaryObjectData& got) {
    EXPECT_EQ(want.m_objectId, got.m_objectId);
    EXPECT_EQ(want.m_boxX1, got.m_boxX1);
    EXPECT_EQ(want.m_boxY1, got.m_boxY1);
    EXPECT_EQ(want.m_boxX2, got.m_boxX2);
    EXPECT_EQ(want.m_boxY2, got.m_boxY2);
    EXPECT_EQ(want.m_attr32, got.m_attr32);
    EXPECT_EQ(want.m_attr16, got.m_attr16);
    EXPECT_EQ(want.m_attr8a, got.m_attr8a);
    EXPECT_EQ(want.m_attr8b, got.m_attr8b);
}

CMetaFrameBuilder FrameWithObjects(uint16_t count, uint16_t type = 0x1001) {
    CMetaFrameBuilder b;
    b.Time(1700000000u, 0x89ABCDEFu).ObjectHeader(type, count, 160, 120);
    for (uint16_t i = 0; i < count; ++i) {
        b.Object(SampleObject(i));
    }
    b.End();
    return b;
}

class MetaBinaryTest : public ::testing::Test {
protected:
    void SetUp() override { ASSERT_EQ(CHaqMetaBinary::kOk, m_decoder.Init(3, 1000)); }

    // Decodes from a heap block of exactly the frame's size, so that AddressSanitizer reports
    // any read past its end.
    int Decode(const std::vector<uint8_t>& bytes, size_t size) {
        std::unique_ptr<uint8_t[]> exact(new uint8_t[size == 0 ? 1 : size]);
        if (size > 0) {
            std::memcpy(exact.get(), bytes.data(), size);
        }
        return m_decoder.Decode(exact.get(), static_cast<int32_t>(size));
    }
    int Decode(const CMetaFrameBuilder& b) { return Decode(b.Bytes(), b.Bytes().size()); }

    CHaqMetaBinary m_decoder;
};

TEST_F(MetaBinaryTest, ValidChainYieldsTimeGridAndEveryObjectField) {
    CMetaFrameBuilder b;
    b.Time(1700000123u, 456u).Block0101().Other(0x0200, 8).ObjectHeader(0x1003, 3, 80, 60);
    for (uint32_t i = 0; i < 3; ++i) {
        b.Object(SampleObject(i));
    }
    b.End();

    ASSERT_EQ(CHaqMetaBinary::kOk, Decode(b));
    uint32_t first = 0;
    uint32_t second = 0;
    ASSERT_TRUE(m_decoder.GetTime(first, second));
    EXPECT_EQ(1700000123u, first);
    EXPECT_EQ(456u, second);
    EXPECT_TRUE(m_decoder.Has0101Block());
    EXPECT_EQ(0x1003, m_decoder.ObjectBlockType());
    EXPECT_EQ(80, m_decoder.GridWidth());
    EXPECT_EQ(60, m_decoder.GridHeight());
    EXPECT_EQ(CHaqMetaBinary::kFlagTime | CHaqMetaBinary::kFlagObjects, m_decoder.Flags());
    ASSERT_EQ(3u, m_decoder.ObjectCount());

    std::vector<SHaqMetaBinaryObjectData> objects(kMetaMaxObjects);
    ASSERT_EQ(3u, m_decoder.CopyObjects(objects.data(), kMetaMaxObjects));
    for (uint32_t i = 0; i < 3; ++i) {
        SCOPED_TRACE(i);
        ExpectSameObject(SampleObject(i), objects[i]);
    }
    SHaqMetaBinaryObjectData beyond{};
    EXPECT_FALSE(m_decoder.GetObject(3, beyond));
    // A smaller destination gets only what it holds.
    EXPECT_EQ(2u, m_decoder.CopyObjects(objects.data(), 2));
}

TEST_F(MetaBinaryTest, TrailingCrLfAfterTheEndMarkerIsAccepted) {
    CMetaFrameBuilder b = FrameWithObjects(2);
    b.CrLf();
    ASSERT_EQ(CHaqMetaBinary::kOk, Decode(b));
    ASSERT_EQ(2u, m_decoder.ObjectCount());
    SHaqMetaBinaryObjectData got{};
    ASSERT_TRUE(m_decoder.GetObject(1, got));
    ExpectSameObject(SampleObject(1), got);

    // CR LF alone is no end marker, nor is a marker followed by anything else.
    CMetaFrameBuilder noMarker;
    noMarker.Time(1, 2).ObjectHeader(0x1001, 0, 160, 120).CrLf();
    EXPECT_EQ(CHaqMetaBinary::kNoEndMarker, Decode(noMarker));
    CMetaFrameBuilder trailing = FrameWithObjects(1);
    trailing.U8(0x0A);
    EXPECT_EQ(CHaqMetaBinary::kNoEndMarker, Decode(trailing));
    CMetaFrameBuilder onlyCrLf;
    onlyCrLf.U16(0xFFFF).CrLf();
    EXPECT_EQ(CHaqMetaBinary::kNoEndMarker, Decode(onlyCrLf));
}

TEST_F(MetaBinaryTest, MalformedChainsAreRefused) {
    CMetaFrameBuilder zeroLength;
    zeroLength.Time(1, 2).Header(0x0200, 0).ObjectHeader(0x1001, 0, 160, 120).End();
    EXPECT_EQ(CHaqMetaBinary::kBadChain, Decode(zeroLength));

    CMetaFrameBuilder invalidType;
    invalidType.Time(1, 2).Other(0x0000, 8).ObjectHeader(0x1001, 0, 160, 120).End();
    EXPECT_EQ(CHaqMetaBinary::kBadChain, Decode(invalidType));

    // A length reaching into the end marker leaves no room for it.
    CMetaFrameBuilder tooLong;
    tooLong.Time(1, 2).ObjectHeader(0x1001, 0, 160, 120).Header(0x0200, 6).End();
    EXPECT_EQ(CHaqMetaBinary::kBadChain, Decode(tooLong));

    // Only the end marker.
    CMetaFrameBuilder empty;
    empty.End();
    EXPECT_EQ(CHaqMetaBinary::kBadChain, Decode(empty));
}

TEST_F(MetaBinaryTest, MissingTimeOrObjectBlockFailsButKeepsWhatWasFound) {
    CMetaFrameBuilder noTime;
    noTime.ObjectHeader(0x1002, 1, 160, 120).Object(SampleObject(7)).End();
    EXPECT_EQ(CHaqMetaBinary::kBadChain, Decode(noTime));
    EXPECT_FALSE(m_decoder.HasTimeBlock());
    ASSERT_EQ(1u, m_decoder.ObjectCount());
    SHaqMetaBinaryObjectData got{};
    ASSERT_TRUE(m_decoder.GetObject(0, got));
    ExpectSameObject(SampleObject(7), got);

    CMetaFrameBuilder noObjects;
    noObjects.Time(42, 43).Block0101().End();
    EXPECT_EQ(CHaqMetaBinary::kBadChain, Decode(noObjects));
    uint32_t first = 0;
    uint32_t second = 0;
    EXPECT_TRUE(m_decoder.GetTime(first, second));
    EXPECT_EQ(42u, first);
    EXPECT_FALSE(m_decoder.HasObjectBlock());
    EXPECT_EQ(0u, m_decoder.ObjectCount());
    EXPECT_EQ(0, m_decoder.ObjectBlockType());
}

TEST_F(MetaBinaryTest, BlocksOfAnEarlierFrameDoNotSurvive) {
    ASSERT_EQ(CHaqMetaBinary::kOk, Decode(FrameWithObjects(4)));
    CMetaFrameBuilder timeOnly;
    timeOnly.Time(5, 6).End();
    EXPECT_EQ(CHaqMetaBinary::kBadChain, Decode(timeOnly));
    EXPECT_FALSE(m_decoder.HasObjectBlock());
    EXPECT_EQ(0u, m_decoder.ObjectCount());

    ASSERT_EQ(CHaqMetaBinary::kOk, Decode(FrameWithObjects(4)));
    EXPECT_EQ(CHaqMetaBinary::kBadCall, m_decoder.Decode(nullptr, 100));
    EXPECT_FALSE(m_decoder.HasTimeBlock());
    EXPECT_EQ(0u, m_decoder.ObjectCount());
}

TEST_F(MetaBinaryTest, ObjectCountsAtTheLimits) {
    ASSERT_EQ(CHaqMetaBinary::kOk, Decode(FrameWithObjects(0)));
    EXPECT_EQ(0u, m_decoder.ObjectCount());
    EXPECT_EQ(0x1001, m_decoder.ObjectBlockType());

    for (uint16_t n : {999, 1000}) {
        SCOPED_TRACE(n);
        ASSERT_EQ(CHaqMetaBinary::kOk, Decode(FrameWithObjects(n)));
        EXPECT_EQ(n, m_decoder.ObjectCount());
        EXPECT_EQ(n, m_decoder.DeclaredObjectCount());
        SHaqMetaBinaryObjectData last{};
        ASSERT_TRUE(m_decoder.GetObject(n - 1u, last));
        ExpectSameObject(SampleObject(n - 1u), last);
    }
    // 1001 records no longer fit the work buffer of Init(3, 1000).
    EXPECT_EQ(CHaqMetaBinary::kBadCall, Decode(FrameWithObjects(1001)));
}

TEST_F(MetaBinaryTest, CountBeyondTheDataFailsAndCountsOnlyRecordsPresent) {
    CMetaFrameBuilder b;
    b.Time(1, 2).Header(0x1001, 52).U16(500).U16(160).U16(120).U16(0);
    b.Object(SampleObject(0)).Object(SampleObject(1)).End();

    EXPECT_EQ(CHaqMetaBinary::kBadChain, Decode(b));
    EXPECT_EQ(500u, m_decoder.DeclaredObjectCount());
    // Two whole records, the end marker is not a third one.
    EXPECT_EQ(2u, m_decoder.ObjectCount());
    std::vector<SHaqMetaBinaryObjectData> objects(kMetaMaxObjects);
    EXPECT_EQ(2u, m_decoder.CopyObjects(objects.data(), kMetaMaxObjects));
    ExpectSameObject(SampleObject(1), objects[1]);

    // A count whose records end just short of the end marker's last bytes: the scan must not
    // read a block header that sticks out of the data.
    CMetaFrameBuilder shifted;
    shifted.Time(1, 2).Header(0x1001, 12).U16(1).U16(160).U16(120).U16(0);
    shifted.U16(0x0200).U16(4).U32(0).U32(0).U32(0).U16(0).End();
    EXPECT_EQ(CHaqMetaBinary::kBadChain, Decode(shifted));
    EXPECT_EQ(1u, m_decoder.ObjectCount());
}

TEST_F(MetaBinaryTest, BlocksCutShortAreNotRecorded) {
    // The time block's length lets it end before its second value; its 12 bytes are not there.
    CMetaFrameBuilder shortTime;
    shortTime.Header(0x0001, 4).End();
    EXPECT_EQ(CHaqMetaBinary::kBadChain, Decode(shortTime));
    EXPECT_FALSE(m_decoder.HasTimeBlock());

    CMetaFrameBuilder shortObjects;
    shortObjects.Time(1, 2).Header(0x1001, 4).U16(1).End();
    EXPECT_EQ(CHaqMetaBinary::kBadChain, Decode(shortObjects));
    EXPECT_FALSE(m_decoder.HasObjectBlock());
    EXPECT_EQ(0u, m_decoder.GridWidth());
}

TEST_F(MetaBinaryTest, EveryTruncationOfAValidFrameStaysWithinTheData) {
    CMetaFrameBuilder full;
    full.Time(1700000000u, 7).Block0101().Other(0x0300, 10).ObjectHeader(0x1001, 4, 320, 240);
    for (uint32_t i = 0; i < 4; ++i) {
        full.Object(SampleObject(i));
    }
    full.End();
    const std::vector<uint8_t>& bytes = full.Bytes();
    // The object records start after time (12), 0x0101 (12), other (10) and object header (12).
    const size_t firstRecord = 46;

    for (size_t cut = 0; cut < bytes.size(); ++cut) {
        SCOPED_TRACE(cut);
        EXPECT_NE(CHaqMetaBinary::kOk, Decode(bytes, cut));

        // The same prefix closed with an end marker: the chain itself is cut.
        std::vector<uint8_t> closed(bytes.begin(), bytes.begin() + static_cast<long>(cut));
        for (int i = 0; i < 4; ++i) {
            closed.push_back(0xFF);
        }
        const int result = Decode(closed, closed.size());
        EXPECT_NE(CHaqMetaBinary::kBadCall, result);
        const uint32_t present =
            cut + 4 > firstRecord ? static_cast<uint32_t>((cut + 4 - firstRecord) / 20) : 0;
        EXPECT_LE(m_decoder.ObjectCount(), present < 4 ? present : 4u);
        for (uint32_t i = 0; i < m_decoder.ObjectCount(); ++i) {
            SHaqMetaBinaryObjectData got{};
            ASSERT_TRUE(m_decoder.GetObject(i, got));
            // Records wholly before the cut are the original ones.
            if (firstRecord + 20 * (i + 1) <= cut) {
                ExpectSameObject(SampleObject(i), got);
            }
        }
    }
}

TEST(MetaBinaryCallTest, BadCallsAndBufferLimits) {
    std::vector<uint8_t> marker{0xFF, 0xFF, 0xFF, 0xFF};
    CHaqMetaBinary uninitialised;
    EXPECT_EQ(CHaqMetaBinary::kBadCall, uninitialised.Decode(marker.data(), 4));

    CHaqMetaBinary decoder;
    ASSERT_EQ(CHaqMetaBinary::kOk, decoder.Init(3, 1000));
    EXPECT_EQ(20040u, decoder.BufferSize());
    EXPECT_EQ(CHaqMetaBinary::kBadCall, decoder.Decode(nullptr, 4));
    EXPECT_EQ(CHaqMetaBinary::kBadCall, decoder.Decode(marker.data(), 3));
    EXPECT_EQ(CHaqMetaBinary::kBadCall, decoder.Decode(marker.data(), -1));

    // Exactly the work buffer is taken, one byte more is not.
    CMetaFrameBuilder fill;
    fill.Time(1, 2).ObjectHeader(0x1001, 0, 160, 120);
    fill.Other(0x0200, 20040 - 24 - 4).End();
    ASSERT_EQ(20040, fill.Size());
    EXPECT_EQ(CHaqMetaBinary::kOk, decoder.Decode(fill.Bytes().data(), fill.Size()));
    std::vector<uint8_t> over(fill.Bytes());
    over.insert(over.begin() + 24, 0x00);
    EXPECT_EQ(CHaqMetaBinary::kBadCall,
              decoder.Decode(over.data(), static_cast<int32_t>(over.size())));

    // A refused Init leaves no buffer behind.
    EXPECT_EQ(CHaqMetaBinary::kNoBuffer, decoder.Init(3, -1));
    EXPECT_EQ(CHaqMetaBinary::kBadCall, decoder.Decode(fill.Bytes().data(), fill.Size()));
    EXPECT_EQ(CHaqMetaBinary::kNoBuffer, decoder.Init(3, 65536));
}

TEST(MetaBinaryGeometryTest, GridWidthGivesScaleOrFrameSize) {
    struct SCase {
        uint16_t gridWidth;
        uint16_t gridHeight;
        int32_t scale;
        int32_t width;
        int32_t height;
    };
    // Frame size stays as it was (-1) unless the grid is wider than 320.
    const SCase cases[] = {{80, 60, 4, -1, -1},   {160, 120, 2, -1, -1},   {320, 240, 1, -1, -1},
                           {200, 100, 1, -1, -1}, {321, 240, 0, 321, 240}, {640, 480, 0, 640, 480}};
    for (const SCase& c : cases) {
        SCOPED_TRACE(c.gridWidth);
        CHaqMetaBinary decoder;
        ASSERT_EQ(CHaqMetaBinary::kOk, decoder.Init(3, 1000));
        CMetaFrameBuilder b;
        b.Time(1, 2).ObjectHeader(0x1001, 0, c.gridWidth, c.gridHeight).End();
        ASSERT_EQ(CHaqMetaBinary::kOk, decoder.Decode(b.Bytes().data(), b.Size()));
        int32_t scale = -1;
        int32_t width = -1;
        int32_t height = -1;
        ASSERT_TRUE(decoder.DeriveGeometry(scale, width, height));
        EXPECT_EQ(c.scale, scale);
        EXPECT_EQ(c.width, width);
        EXPECT_EQ(c.height, height);
    }

    // No grid: a zero width, or no object block at all, leaves the geometry alone.
    CHaqMetaBinary decoder;
    ASSERT_EQ(CHaqMetaBinary::kOk, decoder.Init(3, 1000));
    int32_t scale = 2;
    int32_t width = 7;
    int32_t height = 8;
    CMetaFrameBuilder zero;
    zero.Time(1, 2).ObjectHeader(0x1001, 0, 0, 120).End();
    ASSERT_EQ(CHaqMetaBinary::kOk, decoder.Decode(zero.Bytes().data(), zero.Size()));
    EXPECT_FALSE(decoder.DeriveGeometry(scale, width, height));
    CMetaFrameBuilder none;
    none.Time(1, 2).End();
    decoder.Decode(none.Bytes().data(), none.Size());
    EXPECT_FALSE(decoder.DeriveGeometry(scale, width, height));
    EXPECT_EQ(2, scale);
    EXPECT_EQ(7, width);
    EXPECT_EQ(8, height);
}

}  // namespace
