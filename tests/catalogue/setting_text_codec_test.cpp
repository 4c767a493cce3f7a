#include "catalogue/setting_text_codec.h"

#include <gtest/gtest.h>

namespace {

TEST(SettingTextCodec, EnableDvxyRoundTripsEveryCombination) {
    for (int bits = 0; bits < 8; ++bits) {
        bool dx = bits & 1, dy = bits & 2, dv = bits & 4;
        std::string text = CSettingTextCodec::EncodeEnableDvxy(dx, dy, dv);
        bool rx = !dx, ry = !dy, rv = !dv;
        EXPECT_TRUE(CSettingTextCodec::DecodeEnableDvxy(text, rx, ry, rv)) << text;
        EXPECT_EQ(rx, dx) << text;
        EXPECT_EQ(ry, dy) << text;
        EXPECT_EQ(rv, dv) << text;
    }
    EXPECT_EQ(CSettingTextCodec::EncodeEnableDvxy(true, false, true), "1 & 0 & 1");
    EXPECT_EQ(CSettingTextCodec::EncodeEnableDvxy(false, false, true), "0 & 0 & 1");
}

TEST(SettingTextCodec, EnableDvxyUnreadableSwitchesAreOff) {
    bool dx = true, dy = true, dv = true;
    EXPECT_FALSE(CSettingTextCodec::DecodeEnableDvxy("", dx, dy, dv));
    EXPECT_FALSE(dx || dy || dv);

    dx = dy = dv = true;
    EXPECT_FALSE(CSettingTextCodec::DecodeEnableDvxy("1 & x & 1", dx, dy, dv));
    EXPECT_TRUE(dx);
    EXPECT_FALSE(dy);
    EXPECT_FALSE(dv);

    // Any non-zero number switches a limit on, as a stored 1 would.
    EXPECT_TRUE(CSettingTextCodec::DecodeEnableDvxy("2 & 0 & -1", dx, dy, dv));
    EXPECT_TRUE(dx);
    EXPECT_FALSE(dy);
    EXPECT_TRUE(dv);
}

TEST(SettingTextCodec, CombiInfoKeepsOrderAndUnusedSlots) {
    SDwbAmfComboFilter combo{};
    combo.m_filterNo[0] = 4;
    combo.m_filterNo[1] = 1;
    combo.m_filterNo[2] = kAmfComboUnused;
    combo.m_logic[0] = 0;
    combo.m_logic[1] = 3;
    combo.m_interval[0] = 9999;
    combo.m_interval[1] = 4000000000u;
    combo.m_sparseAlertInterval = 77;
    std::string text = CSettingTextCodec::EncodeCombiInfo(combo);
    // The row holds the interval as a signed 32-bit number; it reads back unchanged.
    EXPECT_EQ(text, "4 & 1 & 255 & 0 & 3 & 9999 & -294967296");

    SDwbAmfComboFilter back{};
    back.m_sparseAlertInterval = 5;
    EXPECT_TRUE(CSettingTextCodec::DecodeCombiInfo(text, back));
    EXPECT_EQ(back.m_filterNo[0], 4);
    EXPECT_EQ(back.m_filterNo[1], 1);
    EXPECT_EQ(back.m_filterNo[2], kAmfComboUnused);
    EXPECT_EQ(back.m_logic[1], 3);
    EXPECT_EQ(back.m_interval[0], 9999u);
    EXPECT_EQ(back.m_interval[1], 4000000000u);
    EXPECT_EQ(back.m_sparseAlertInterval, 5) << "the sparse interval has a column of its own";
}

TEST(SettingTextCodec, CombiInfoCorruptTextLeavesSafeValues) {
    SDwbAmfComboFilter combo{};
    combo.m_filterNo[0] = combo.m_filterNo[1] = combo.m_filterNo[2] = 2;
    combo.m_interval[0] = combo.m_interval[1] = 9;
    EXPECT_FALSE(CSettingTextCodec::DecodeCombiInfo("", combo));
    for (uint8_t no : combo.m_filterNo) {
        EXPECT_EQ(no, kAmfComboUnused);
    }
    EXPECT_EQ(combo.m_interval[0], 0u);

    EXPECT_FALSE(CSettingTextCodec::DecodeCombiInfo("1 & 2", combo));
    EXPECT_EQ(combo.m_filterNo[0], 1);
    EXPECT_EQ(combo.m_filterNo[1], 2);
    EXPECT_EQ(combo.m_filterNo[2], kAmfComboUnused);

    // Values too wide for their fields keep their low bits instead of overflowing the scan.
    EXPECT_TRUE(CSettingTextCodec::DecodeCombiInfo("256 & 1 & 2 & 0 & 0 & 99999999999 & 1", combo));
    EXPECT_EQ(combo.m_filterNo[0], 0);
    EXPECT_EQ(combo.m_interval[0], static_cast<uint32_t>(99999999999ll));
}

TEST(SettingTextCodec, NewFilterSettingCarriesItsDefaults) {
    SFilterSetting s;
    EXPECT_FALSE(s.m_active);
    EXPECT_EQ(s.m_filter.m_minWidth, 2);
    EXPECT_EQ(s.m_filter.m_maxWidth, 160);
    EXPECT_EQ(s.m_filter.m_maxHeight, 120);
    EXPECT_FLOAT_EQ(s.m_filter.m_maxDv, 9999.0f);
    EXPECT_TRUE(s.m_filter.m_enableDv);
    EXPECT_FALSE(s.m_filter.m_enableDx);
    EXPECT_EQ(s.m_filter.m_maxStay, 9999);
    EXPECT_EQ(s.m_filter.m_minCapacity, 1);
    EXPECT_EQ(s.m_filter.m_numNode, 0);
}

}  // namespace
