#include "catalogue/setting_text_codec.h"

#include <cstdio>

std::string CSettingTextCodec::EncodeEnableDvxy(bool dx, bool dy, bool dv) {
    char buf[32];
    std::snprintf(buf, sizeof(buf), "%d & %d & %d", dx ? 1 : 0, dy ? 1 : 0, dv ? 1 : 0);
    return buf;
}

bool CSettingTextCodec::DecodeEnableDvxy(const std::string& text, bool& dx, bool& dy, bool& dv) {
    int v[3] = {0, 0, 0};
    int n = std::sscanf(text.c_str(), "%d & %d & %d", &v[0], &v[1], &v[2]);
    dx = v[0] != 0;
    dy = v[1] != 0;
    dv = v[2] != 0;
    return n == 3;
}

std::string CSettingTextCodec::EncodeCombiInfo(const SDwbAmfComboFilter& combo) {
    char buf[128];
    // Intervals are written as signed 32-bit numbers, the form rows already in the table use.
    std::snprintf(buf, sizeof(buf), "%d & %d & %d & %d & %d & %d & %d", combo.m_filterNo[0],
                  combo.m_filterNo[1], combo.m_filterNo[2], combo.m_logic[0], combo.m_logic[1],
                  static_cast<int32_t>(combo.m_interval[0]),
                  static_cast<int32_t>(combo.m_interval[1]));
    return buf;
}

bool CSettingTextCodec::DecodeCombiInfo(const std::string& text, SDwbAmfComboFilter& combo) {
    // Read wide so that a corrupt row cannot overflow the scan; the fields take the low bits.
    long long v[7] = {kAmfComboUnused, kAmfComboUnused, kAmfComboUnused, 0, 0, 0, 0};
    int n = std::sscanf(text.c_str(), "%lld & %lld & %lld & %lld & %lld & %lld & %lld", &v[0],
                        &v[1], &v[2], &v[3], &v[4], &v[5], &v[6]);
    for (int i = 0; i < 3; ++i) {
        combo.m_filterNo[i] = static_cast<uint8_t>(v[i]);
    }
    combo.m_logic[0] = static_cast<uint8_t>(v[3]);
    combo.m_logic[1] = static_cast<uint8_t>(v[4]);
    combo.m_interval[0] = static_cast<uint32_t>(v[5]);
    combo.m_interval[1] = static_cast<uint32_t>(v[6]);
    return n == 7;
}
