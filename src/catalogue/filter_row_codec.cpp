#include "catalogue/filter_row_codec.h"

#include <cstdio>
#include <cstring>
#include <string>

#include "catalogue/setting_text_codec.h"

namespace {

// Texts of package records keep at most 512 characters.
template <size_t N>
void CopyText(char (&out)[N], const std::string& text) {
    std::snprintf(out, N, "%s", text.c_str());
}

void EncodeNodes(uint16_t count, const SHaqPoint (&nodes)[kAmfMaxNodes], SFilterTable& row) {
    row.NodeNum = count;
    for (int i = 0; i < kAmfMaxNodes; ++i) {
        row.Node[i][0] = nodes[i].m_x;
        row.Node[i][1] = nodes[i].m_y;
    }
}

void DecodeNodes(const SFilterTable& row, uint16_t& count, SHaqPoint (&nodes)[kAmfMaxNodes]) {
    count = static_cast<uint16_t>(row.NodeNum);
    for (int i = 0; i < kAmfMaxNodes; ++i) {
        nodes[i].m_x = row.Node[i][0];
        nodes[i].m_y = row.Node[i][1];
    }
}

}  // namespace

void CFilterRowCodec::EncodePack(const SDwbFilterPack& pack, SFilterTable& row) {
    row.PackNo = pack.PackNo;
    row.PackName = std::string(pack.PackName, strnlen(pack.PackName, sizeof(pack.PackName)));
    row.PackType = pack.PackType;
    row.ZelPinNo = pack.ZelPinNo;
    row.DetectionType = pack.DetectionType;
}

void CFilterRowCodec::DecodePack(const SFilterTable& row, SDwbFilterPack& pack) {
    pack.PackNo = row.PackNo;
    CopyText(pack.PackName, row.PackName);
    pack.PackType = row.PackType;
    pack.ZelPinNo = row.ZelPinNo;
    pack.DetectionType = row.DetectionType;
}

void CFilterRowCodec::EncodeFilter(const SDwbFilter& filter, SFilterTable& row) {
    const SDwbAmfFilter& c = filter.Condition;
    row.FilterNo = filter.FilterNo;
    row.Enable = filter.Enable ? 1 : 0;
    row.FilterName =
        std::string(filter.FilterName, strnlen(filter.FilterName, sizeof(filter.FilterName)));
    row.DetailType = c.m_event;
    EncodeNodes(c.m_numNode, c.m_nodeList, row);
    row.ObjMinW = c.m_minWidth;
    row.ObjMaxW = c.m_maxWidth;
    row.ObjMinH = c.m_minHeight;
    row.ObjMaxH = c.m_maxHeight;
    row.ObjMinDvX = c.m_minDx;
    row.ObjMaxDvX = c.m_maxDx;
    row.ObjMinDvY = c.m_minDy;
    row.ObjMaxDvY = c.m_maxDy;
    row.ObjMinDv = c.m_minDv;
    row.ObjMaxDv = c.m_maxDv;
    row.EnableDvxy = CSettingTextCodec::EncodeEnableDvxy(c.m_enableDx, c.m_enableDy, c.m_enableDv);
    row.ObjMinStay = c.m_minStay;
    row.ObjMaxStay = c.m_maxStay;
    row.ObjMinCap = c.m_minCapacity;
    row.ObjMaxCap = c.m_maxCapacity;
    row.ObjDirection = c.m_direction;
    row.ObjCollosion = c.m_collision;
    row.AreaIntersect = c.m_areaIntersect;
    row.SparseAlertInterval = c.m_sparseAlertInterval;
}

void CFilterRowCodec::DecodeFilter(const SFilterTable& row, SDwbFilter& filter) {
    SDwbAmfFilter& c = filter.Condition;
    filter.FilterNo = row.FilterNo;
    filter.Enable = row.Enable != 0;
    CopyText(filter.FilterName, row.FilterName);
    c.m_event = static_cast<uint16_t>(row.DetailType);
    DecodeNodes(row, c.m_numNode, c.m_nodeList);
    c.m_minWidth = row.ObjMinW;
    c.m_maxWidth = row.ObjMaxW;
    c.m_minHeight = row.ObjMinH;
    c.m_maxHeight = row.ObjMaxH;
    c.m_minDx = row.ObjMinDvX;
    c.m_maxDx = row.ObjMaxDvX;
    c.m_minDy = row.ObjMinDvY;
    c.m_maxDy = row.ObjMaxDvY;
    c.m_minDv = row.ObjMinDv;
    c.m_maxDv = row.ObjMaxDv;
    CSettingTextCodec::DecodeEnableDvxy(row.EnableDvxy, c.m_enableDx, c.m_enableDy, c.m_enableDv);
    c.m_minStay = row.ObjMinStay;
    c.m_maxStay = row.ObjMaxStay;
    c.m_minCapacity = row.ObjMinCap;
    c.m_maxCapacity = row.ObjMaxCap;
    c.m_direction = static_cast<uint16_t>(row.ObjDirection);
    c.m_collision = static_cast<uint16_t>(row.ObjCollosion);
    c.m_areaIntersect = static_cast<int16_t>(row.AreaIntersect);
    c.m_sparseAlertInterval = row.SparseAlertInterval;
}

void CFilterRowCodec::EncodeMask(const SDwbMaskArea& mask, SFilterTable& row) {
    row.FilterNo = mask.FilterNo;
    row.Enable = mask.Enable ? 1 : 0;
    row.FilterName = std::string(mask.Name, strnlen(mask.Name, sizeof(mask.Name)));
    EncodeNodes(mask.Area.m_numNode, mask.Area.m_nodeList, row);
}

void CFilterRowCodec::DecodeMask(const SFilterTable& row, SDwbMaskArea& mask) {
    mask.FilterNo = row.FilterNo;
    mask.Enable = row.Enable != 0;
    CopyText(mask.Name, row.FilterName);
    DecodeNodes(row, mask.Area.m_numNode, mask.Area.m_nodeList);
}

void CFilterRowCodec::EncodeCombo(const SDwbCombo& combo, SFilterTable& row) {
    row.FilterNo = combo.FilterNo;
    row.Enable = 0;
    row.FilterName = std::string(combo.Name, strnlen(combo.Name, sizeof(combo.Name)));
    row.CombiInfo = CSettingTextCodec::EncodeCombiInfo(combo.Combo);
    row.SparseAlertInterval = combo.Combo.m_sparseAlertInterval;
}

void CFilterRowCodec::DecodeCombo(const SFilterTable& row, SDwbCombo& combo) {
    combo.FilterNo = row.FilterNo;
    CopyText(combo.Name, row.FilterName);
    CSettingTextCodec::DecodeCombiInfo(row.CombiInfo, combo.Combo);
    combo.Combo.m_sparseAlertInterval = row.SparseAlertInterval;
}
