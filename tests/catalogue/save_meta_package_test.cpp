#include <gtest/gtest.h>

#include <cstdio>
#include <cstring>
#include <string>
#include <vector>

#include "catalogue_db.h"
#include "common/temp_dir.h"
#include "quorvex/save_meta.h"

namespace {

SDwbFilterPack Pack(int no, const char* name, int type) {
    SDwbFilterPack pack{};
    pack.PackNo = no;
    std::snprintf(pack.PackName, sizeof(pack.PackName), "%s", name);
    pack.PackType = type;
    pack.ZelPinNo = 40 + no;
    pack.DetectionType = 3;
    return pack;
}

SDwbFilter Filter(int no, const char* name) {
    SDwbFilter filter{};
    filter.FilterNo = no;
    filter.Enable = true;
    std::snprintf(filter.FilterName, sizeof(filter.FilterName), "%s", name);
    filter.Condition = BlankAmfFilter();
    filter.Condition.m_event = 2;
    return filter;
}

SDwbMaskArea Mask(int no, const char* name) {
    SDwbMaskArea mask{};
    mask.FilterNo = no;
    mask.Enable = true;
    std::snprintf(mask.Name, sizeof(mask.Name), "%s", name);
    mask.Area.m_numNode = 3;
    mask.Area.m_nodeList[0] = {10, 10};
    mask.Area.m_nodeList[1] = {90, 10};
    mask.Area.m_nodeList[2] = {50, 70};
    return mask;
}

SDwbCombo Combo(int no, uint8_t a, uint8_t b, uint8_t c) {
    SDwbCombo combo{};
    combo.FilterNo = no;
    std::snprintf(combo.Name, sizeof(combo.Name), "combo %d", no);
    combo.Combo.m_filterNo[0] = a;
    combo.Combo.m_filterNo[1] = b;
    combo.Combo.m_filterNo[2] = c;
    combo.Combo.m_interval[0] = 30;
    combo.Combo.m_interval[1] = 9999;
    combo.Combo.m_sparseAlertInterval = 5;
    return combo;
}

void ExpectSameConditions(const SDwbAmfFilter& want, const SDwbAmfFilter& got) {
    EXPECT_EQ(want.m_event, got.m_event);
    EXPECT_EQ(want.m_numNode, got.m_numNode);
    for (int i = 0; i < kAmfMaxNodes; ++i) {
        EXPECT_EQ(want.m_nodeList[i].m_x, got.m_nodeList[i].m_x) << "node " << i;
        EXPECT_EQ(want.m_nodeList[i].m_y, got.m_nodeList[i].m_y) << "node " << i;
    }
    EXPECT_EQ(want.m_minWidth, got.m_minWidth);
    EXPECT_EQ(want.m_maxWidth, got.m_maxWidth);
    EXPECT_EQ(want.m_minHeight, got.m_minHeight);
    EXPECT_EQ(want.m_maxHeight, got.m_maxHeight);
    EXPECT_FLOAT_EQ(want.m_minDx, got.m_minDx);
    EXPECT_FLOAT_EQ(want.m_maxDx, got.m_maxDx);
    EXPECT_FLOAT_EQ(want.m_minDy, got.m_minDy);
    EXPECT_FLOAT_EQ(want.m_maxDy, got.m_maxDy);
    EXPECT_FLOAT_EQ(want.m_minDv, got.m_minDv);
    EXPECT_FLOAT_EQ(want.m_maxDv, got.m_maxDv);
    EXPECT_EQ(want.m_enableDx, got.m_enableDx);
    EXPECT_EQ(want.m_enableDy, got.m_enableDy);
    EXPECT_EQ(want.m_enableDv, got.m_enableDv);
    EXPECT_EQ(want.m_minStay, got.m_minStay);
    EXPECT_EQ(want.m_maxStay, got.m_maxStay);
    EXPECT_EQ(want.m_minCapacity, got.m_minCapacity);
    EXPECT_EQ(want.m_maxCapacity, got.m_maxCapacity);
    EXPECT_EQ(want.m_direction, got.m_direction);
    EXPECT_EQ(want.m_collision, got.m_collision);
    EXPECT_EQ(want.m_areaIntersect, got.m_areaIntersect);
    EXPECT_EQ(want.m_sparseAlertInterval, got.m_sparseAlertInterval);
}

class PackageStore : public ::testing::Test {
protected:
    PackageStore() : m_db("pack") {}
    void SetUp() override { ASSERT_EQ(m_meta.Connect(m_db.Name(), nullptr, nullptr), DWB_OK); }

    std::string RowCount(int camera) {
        auto rows = m_db.Query("SELECT count(*) FROM \"MetaFilter\" WHERE \"DeviceID\" = " +
                               std::to_string(camera));
        return rows.empty() ? "query failed" : rows[0][0];
    }

    // The columns of rows of one kind in a package, by FilterNo.
    std::vector<std::vector<std::string>> Rows(int camera, int packNo, int kind,
                                               const std::string& columns) {
        return m_db.Query("SELECT " + columns + " FROM \"MetaFilter\" WHERE \"DeviceID\" = " +
                          std::to_string(camera) + " AND \"PackNo\" = " + std::to_string(packNo) +
                          " AND \"FilterType\" = " + std::to_string(kind) +
                          " ORDER BY \"FilterNo\"");
    }

    testkit::CCatalogueDb m_db;
    CSaveMeta m_meta;
};

TEST_F(PackageStore, AddPackageWritesOneRowAndRefusesBadTypeAndDuplicates) {
    EXPECT_EQ(m_meta.AddPackage(1, Pack(1, "p", 2)), DWB_ERR_INVALID_PACKAGE_TYPE);
    EXPECT_EQ(m_meta.AddPackage(1, Pack(1, "p", -1)), DWB_ERR_INVALID_PACKAGE_TYPE);
    EXPECT_EQ(RowCount(1), "0") << "a refused package left a row";

    ASSERT_EQ(m_meta.AddPackage(1, Pack(1, "entrance", 0)), DWB_OK);
    // The header row carries the blank conditions of a filter nothing was set on.
    auto header = Rows(1, 1, -1,
                       "\"FilterNo\", \"Enable\", \"FilterName\", \"PackName\", \"ZelPinNo\", "
                       "\"DetectionType\", \"ObjMax-W\", \"ObjMax-H\", \"ObjMax-Stay\", "
                       "\"ObjMin-Cap\", \"EnableDvxy\", \"CombiInfo\"");
    ASSERT_EQ(header.size(), 1u);
    EXPECT_EQ(header[0], (std::vector<std::string>{"-1", "0", "", "entrance", "41", "3", "160",
                                                   "120", "9999", "1", "0 & 0 & 1", ""}));
    EXPECT_EQ(m_meta.AddPackage(1, Pack(1, "again", 1)), DWB_ERR_ALREADY_EXIST);
    EXPECT_EQ(m_meta.AddPackage(1, Pack(1, "again", 1), Filter(3, "f")), DWB_ERR_ALREADY_EXIST);
    EXPECT_EQ(RowCount(1), "1");

    // With a filter the package is that one row, numbered 0 whatever the filter says.
    ASSERT_EQ(m_meta.AddPackage(1, Pack(2, "yard", 1), Filter(5, "gate")), DWB_OK);
    auto rows = m_db.Query(
        "SELECT \"FilterNo\", \"FilterType\", \"FilterName\", \"PackName\", \"PackType\" FROM "
        "\"MetaFilter\" WHERE \"PackNo\" = 2");
    ASSERT_EQ(rows.size(), 1u);
    EXPECT_EQ(rows[0], (std::vector<std::string>{"0", "0", "gate", "yard", "1"}));

    SDwbFilterPack back{};
    back.PackNo = 2;
    ASSERT_EQ(m_meta.GetPackage(1, back), DWB_OK);
    EXPECT_STREQ(back.PackName, "yard");
    EXPECT_EQ(back.PackType, 1);
    EXPECT_EQ(back.ZelPinNo, 42);
    EXPECT_EQ(back.DetectionType, 3);
    back.PackNo = 9;
    EXPECT_EQ(m_meta.GetPackage(1, back), DWB_ERR_NOT_FOUND);
    // Packages belong to their camera.
    back.PackNo = 2;
    EXPECT_EQ(m_meta.GetPackage(2, back), DWB_ERR_NOT_FOUND);
}

TEST_F(PackageStore, FilterLimitFollowsThePackType) {
    ASSERT_EQ(m_meta.AddPackage(1, Pack(1, "small", 0)), DWB_OK);
    EXPECT_EQ(m_meta.AddFilter(1, 7, Filter(1, "nowhere")), DWB_ERR_NOT_FOUND);
    for (int no = 1; no <= 3; ++no) {
        ASSERT_EQ(m_meta.AddFilter(1, 1, Filter(no, "f")), DWB_OK) << no;
    }
    EXPECT_EQ(m_meta.AddFilter(1, 1, Filter(2, "twin")), DWB_ERR_ALREADY_EXIST);
    EXPECT_EQ(m_meta.AddFilter(1, 1, Filter(4, "fourth")), DWB_ERR_NOMORE_ADD_ITEM);

    EXPECT_EQ(m_meta.UpdatePackage(1, Pack(1, "large", 2)), DWB_ERR_INVALID_PACKAGE_TYPE);
    EXPECT_EQ(m_meta.UpdatePackage(1, Pack(5, "absent", 1)), DWB_ERR_NOT_FOUND);
    ASSERT_EQ(m_meta.UpdatePackage(1, Pack(1, "large", 1)), DWB_OK);
    for (int no = 4; no <= 6; ++no) {
        ASSERT_EQ(m_meta.AddFilter(1, 1, Filter(no, "f")), DWB_OK) << no;
    }
    EXPECT_EQ(m_meta.AddFilter(1, 1, Filter(7, "seventh")), DWB_ERR_NOMORE_ADD_ITEM);
    EXPECT_EQ(RowCount(1), "7");

    // New rows take the package columns of the package's first row, detection type 0.
    auto filters = Rows(1, 1, 0, "\"PackName\", \"PackType\", \"ZelPinNo\", \"DetectionType\"");
    ASSERT_EQ(filters.size(), 6u);
    EXPECT_EQ(filters[5], (std::vector<std::string>{"large", "1", "41", "0"}));
}

TEST_F(PackageStore, MaskAndCombinationLimitsAndFilterChecks) {
    ASSERT_EQ(m_meta.AddPackage(1, Pack(1, "p", 1), Filter(0, "first")), DWB_OK);
    for (int no = 0; no < 6; ++no) {
        ASSERT_EQ(m_meta.AddMask(1, 1, Mask(no, "m")), DWB_OK) << no;
    }
    EXPECT_EQ(m_meta.AddMask(1, 1, Mask(6, "seventh")), DWB_ERR_NOMORE_ADD_ITEM);
    EXPECT_EQ(m_meta.AddMask(1, 1, Mask(2, "twin")), DWB_ERR_ALREADY_EXIST);
    // Numbers are unique per kind: a filter may share a mask's number.
    ASSERT_EQ(m_meta.AddFilter(1, 1, Filter(2, "second")), DWB_OK);

    // A mask row keeps the blank conditions a mask does not carry.
    auto mask =
        Rows(1, 1, 1, "\"NodeNum\", \"Node2-X\", \"Node2-Y\", \"EnableDvxy\", \"ObjMax-W\"");
    ASSERT_EQ(mask.size(), 6u);
    EXPECT_EQ(mask[0], (std::vector<std::string>{"3", "50", "70", "0 & 0 & 1", "0"}));

    EXPECT_EQ(m_meta.AddCombo(1, 1, Combo(0, 0, 4, 255)), DWB_ERR_INVALID_FILTER_NO);
    EXPECT_EQ(m_meta.AddCombo(1, 3, Combo(0, 255, 255, 255)), DWB_ERR_NOT_FOUND);
    EXPECT_TRUE(Rows(1, 1, 2, "\"ID\"").empty()) << "a refused combination was stored";
    ASSERT_EQ(m_meta.AddCombo(1, 1, Combo(0, 255, 255, 255)), DWB_OK);
    EXPECT_EQ(m_meta.AddCombo(1, 1, Combo(1, 0, 2, 255)), DWB_ERR_NOMORE_ADD_ITEM);
    EXPECT_EQ(m_meta.AddCombo(1, 1, Combo(0, 0, 2, 255)), DWB_ERR_ALREADY_EXIST);

    EXPECT_EQ(m_meta.UpdateCombo(1, 1, Combo(1, 0, 2, 255)), DWB_ERR_NOT_FOUND);
    EXPECT_EQ(m_meta.UpdateCombo(1, 1, Combo(0, 0, 9, 255)), DWB_ERR_INVALID_FILTER_NO);
    EXPECT_EQ(Rows(1, 1, 2, "\"CombiInfo\"")[0][0], "255 & 255 & 255 & 0 & 0 & 30 & 9999");
    ASSERT_EQ(m_meta.UpdateCombo(1, 1, Combo(0, 2, 0, 255)), DWB_OK);
    EXPECT_EQ(Rows(1, 1, 2, "\"CombiInfo\"")[0][0], "2 & 0 & 255 & 0 & 0 & 30 & 9999");

    // Deleting a filter leaves the combination that names it alone.
    EXPECT_EQ(m_meta.DelFilter(1, 1, 5), DWB_ERR_NOT_FOUND);
    ASSERT_EQ(m_meta.DelFilter(1, 1, 2), DWB_OK);
    EXPECT_EQ(m_meta.DelMask(1, 1, 2), DWB_OK);
    EXPECT_EQ(m_meta.DelMask(1, 1, 2), DWB_ERR_NOT_FOUND);
    SDwbCombo combo{};
    combo.FilterNo = 0;
    ASSERT_EQ(m_meta.GetCombo(1, 1, combo), DWB_OK);
    EXPECT_EQ(combo.Combo.m_filterNo[0], 2);
    ASSERT_EQ(m_meta.DelCombo(1, 1, 0), DWB_OK);
    EXPECT_EQ(m_meta.GetCombo(1, 1, combo), DWB_ERR_NOT_FOUND);

    EXPECT_EQ(RowCount(1), "6");
    ASSERT_EQ(m_meta.DelPackage(1, 1), DWB_OK);
    EXPECT_EQ(RowCount(1), "0");
    EXPECT_EQ(m_meta.DelPackage(1, 1), DWB_ERR_NOT_FOUND);
}

TEST_F(PackageStore, RecordsReadBackAsStored) {
    SDwbFilter filter = Filter(1, "it's C:\\gate — Tür");
    SDwbAmfFilter& c = filter.Condition;
    c.m_numNode = 4;
    for (int i = 0; i < kAmfMaxNodes; ++i) {
        c.m_nodeList[i] = {10 * i + 1, -7 * i};
    }
    c.m_minWidth = 3;
    c.m_maxDx = 12.5f;
    c.m_minDy = -4.25f;
    c.m_minDv = 0.5f;
    c.m_enableDx = true;
    c.m_enableDy = false;
    c.m_enableDv = true;
    c.m_minStay = 7;
    c.m_maxCapacity = 12;
    c.m_direction = 2;
    c.m_collision = 4;
    c.m_areaIntersect = -1;
    c.m_sparseAlertInterval = 60;

    ASSERT_EQ(m_meta.AddPackage(1, Pack(1, "p'\\ä", 1)), DWB_OK);
    ASSERT_EQ(m_meta.AddFilter(1, 1, filter), DWB_OK);
    EXPECT_EQ(Rows(1, 1, 0, "\"EnableDvxy\"")[0][0], "1 & 0 & 1");

    SDwbFilter back{};
    back.FilterNo = 1;
    ASSERT_EQ(m_meta.GetFilter(1, 1, back), DWB_OK);
    EXPECT_TRUE(back.Enable);
    EXPECT_STREQ(back.FilterName, filter.FilterName);
    ExpectSameConditions(c, back.Condition);

    // An update rewrites the conditions and the name.
    filter.Enable = false;
    std::snprintf(filter.FilterName, sizeof(filter.FilterName), "renamed");
    c.m_enableDx = false;
    c.m_maxStay = 100;
    ASSERT_EQ(m_meta.UpdateFilter(1, 1, filter), DWB_OK);
    EXPECT_EQ(m_meta.UpdateFilter(1, 1, Filter(8, "absent")), DWB_ERR_NOT_FOUND);
    back = SDwbFilter{};
    back.FilterNo = 1;
    ASSERT_EQ(m_meta.GetFilter(1, 1, back), DWB_OK);
    EXPECT_FALSE(back.Enable);
    EXPECT_STREQ(back.FilterName, "renamed");
    ExpectSameConditions(c, back.Condition);

    SDwbMaskArea mask = Mask(4, "mask ä");
    ASSERT_EQ(m_meta.AddMask(1, 1, mask), DWB_OK);
    mask.Area.m_numNode = 4;
    mask.Area.m_nodeList[3] = {5, 95};
    mask.Enable = false;
    ASSERT_EQ(m_meta.UpdateMask(1, 1, mask), DWB_OK);
    EXPECT_EQ(m_meta.UpdateMask(1, 1, Mask(5, "absent")), DWB_ERR_NOT_FOUND);
    ASSERT_EQ(m_meta.AddCombo(1, 1, Combo(2, 1, 255, 255)), DWB_OK);

    // The whole package: the header row is skipped, every kind lands in its slots.
    SDwbPackageInfo info{};
    ASSERT_EQ(m_meta.GetPackage(1, 1, info), DWB_OK);
    EXPECT_EQ(info.FilterCount, 1);
    EXPECT_EQ(info.MaskCount, 1);
    EXPECT_EQ(info.ComboCount, 1);
    EXPECT_STREQ(info.Pack.PackName, "p'\\ä");
    EXPECT_EQ(info.Pack.PackType, 1);
    EXPECT_STREQ(info.Filters[0].FilterName, "renamed");
    ExpectSameConditions(c, info.Filters[0].Condition);
    EXPECT_EQ(info.Masks[0].FilterNo, 4);
    EXPECT_FALSE(info.Masks[0].Enable);
    EXPECT_STREQ(info.Masks[0].Name, "mask ä");
    EXPECT_EQ(info.Masks[0].Area.m_numNode, 4);
    EXPECT_EQ(info.Masks[0].Area.m_nodeList[3].m_y, 95);
    EXPECT_EQ(info.Combo.FilterNo, 2);
    EXPECT_STREQ(info.Combo.Name, "combo 2");
    EXPECT_EQ(info.Combo.Combo.m_filterNo[0], 1);
    EXPECT_EQ(info.Combo.Combo.m_filterNo[2], 255);
    EXPECT_EQ(info.Combo.Combo.m_interval[1], 9999u);
    EXPECT_EQ(info.Combo.Combo.m_sparseAlertInterval, 5);

    info.FilterCount = 9;
    EXPECT_EQ(m_meta.GetPackage(1, 2, info), DWB_ERR_NOT_FOUND);
    EXPECT_EQ(info.FilterCount, 0) << "counts are cleared before the lookup";
    EXPECT_EQ(info.Pack.PackNo, 2);
}

TEST_F(PackageStore, ListsArePagedAndBoundedByMaxCount) {
    SDwbFilterPackList packs[3];
    EXPECT_EQ(m_meta.GetPackageList(1, packs, 3, 0), DWB_ERR_NOT_FOUND);
    // Rows of packages 1, 1, 2, 1 in that order: each package is listed once, first seen first.
    ASSERT_EQ(m_meta.AddPackage(1, Pack(1, "one", 1), Filter(0, "a")), DWB_OK);
    ASSERT_EQ(m_meta.AddFilter(1, 1, Filter(1, "b")), DWB_OK);
    ASSERT_EQ(m_meta.AddPackage(1, Pack(2, "two", 1)), DWB_OK);
    for (int no = 2; no < 6; ++no) {
        ASSERT_EQ(m_meta.AddFilter(1, 1, Filter(no, "f")), DWB_OK);
    }
    ASSERT_EQ(m_meta.AddPackage(2, Pack(3, "other camera", 1)), DWB_OK);

    EXPECT_EQ(m_meta.GetPackageList(1, nullptr, 3, 0), DWB_ERR_INVALID_PARAM);
    EXPECT_EQ(m_meta.GetPackageList(1, packs, 0, 0), DWB_ERR_INVALID_PARAM);
    EXPECT_EQ(m_meta.GetPackageList(1, packs, 3, -1), DWB_ERR_INVALID_PARAM);

    std::memset(packs, 0x7f, sizeof(packs));
    EXPECT_EQ(m_meta.GetPackageList(1, packs, 1, 0), 1);
    EXPECT_EQ(packs[0].PackNo, 1);
    EXPECT_STREQ(packs[0].PackName, "one");
    EXPECT_EQ(packs[1].PackNo, 0x7f7f7f7f) << "wrote beyond maxCount";

    std::memset(packs, 0x7f, sizeof(packs));
    EXPECT_EQ(m_meta.GetPackageList(1, packs, 3, 0), 2);
    EXPECT_EQ(packs[1].PackNo, 2);
    EXPECT_STREQ(packs[1].PackName, "two");
    EXPECT_EQ(packs[1].ZelPinNo, 42);
    EXPECT_EQ(packs[1].DetectionType, 3);
    EXPECT_EQ(packs[2].PackNo, 0x7f7f7f7f);

    // Paging keeps each package at its own index.
    std::memset(packs, 0x7f, sizeof(packs));
    EXPECT_EQ(m_meta.GetPackageList(1, packs, 3, 1), 2);
    EXPECT_EQ(packs[0].PackNo, 0x7f7f7f7f);
    EXPECT_EQ(packs[1].PackNo, 2);

    SDwbSetList set[6];
    EXPECT_EQ(m_meta.GetFilterList(1, 1, nullptr, 4, 0), DWB_ERR_INVALID_PARAM);
    EXPECT_EQ(m_meta.GetFilterList(1, 1, set, 0, 0), DWB_ERR_INVALID_PARAM);
    EXPECT_EQ(m_meta.GetMaskList(1, 1, set, 4, -2), DWB_ERR_INVALID_PARAM);
    EXPECT_EQ(m_meta.GetMaskList(1, 1, set, 4, 0), DWB_ERR_NOT_FOUND);
    std::memset(set, 0x7f, sizeof(set));
    EXPECT_EQ(m_meta.GetFilterList(1, 1, set, 4, 0), 4);
    for (int i = 0; i < 4; ++i) {
        EXPECT_EQ(set[i].FilterNo, i);
        EXPECT_EQ(set[i].DetailType, 2);
    }
    EXPECT_STREQ(set[1].Name, "b");
    EXPECT_EQ(set[4].FilterNo, 0x7f7f7f7f) << "wrote beyond maxCount";
}

TEST_F(PackageStore, LostConnectionAndTraces) {
    testkit::CTempDir dir;
    std::string path = dir.File("trace.txt");
    ASSERT_TRUE(m_meta.OpenDebugLog(path.c_str()));
    ASSERT_EQ(m_meta.AddPackage(4, Pack(1, "p", 1), Filter(0, "f")), DWB_OK);
    EXPECT_EQ(m_meta.AddCombo(4, 1, Combo(0, 0, 4, 255)), DWB_ERR_INVALID_FILTER_NO);
    SDwbSetList set[2];
    SDwbFilterPackList packs[2];
    EXPECT_EQ(m_meta.GetFilterList(4, 1, set, 2, 0), 1);
    EXPECT_EQ(m_meta.GetPackageList(4, packs, 2, 0), 1);
    std::string text = testkit::ReadFile(path);
    EXPECT_NE(text.find("[S] CSaveMeta::AddPackage(DevId=4, PackNo=1, FilterNo=0)"),
              std::string::npos)
        << text;
    EXPECT_NE(
        text.find("[E] CSaveMeta::AddCombo() DWB_ERR_INVALID_FILTER_NO, Unknown filter no=4."),
        std::string::npos)
        << text;
    EXPECT_NE(text.find("[R} CSaveMeta::GetFilterList() return=1"), std::string::npos) << text;
    EXPECT_NE(text.find("[R] CSaveMeta::GetPackageList() return=1"), std::string::npos) << text;

    m_db.DropOtherSessions();
    EXPECT_EQ(m_meta.AddPackage(4, Pack(2, "p", 1)), DWB_ERR_DB_NOT_CONNECT);
    EXPECT_EQ(m_meta.AddFilter(4, 1, Filter(1, "f")), DWB_ERR_DB_NOT_CONNECT);
    EXPECT_EQ(m_meta.GetPackageList(4, packs, 2, 0), DWB_ERR_DB_NOT_CONNECT);
    EXPECT_EQ(m_meta.GetFilterList(4, 1, set, 2, 0), DWB_ERR_DB_NOT_CONNECT);
    EXPECT_EQ(m_meta.DelPackage(4, 1), DWB_ERR_DB_NOT_CONNECT);
}

}  // namespace
