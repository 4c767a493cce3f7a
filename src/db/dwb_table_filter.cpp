#include "quorvex/dwb_table_filter.h"

#include <cstdio>

#include "quorvex/dwb_use_record_set.h"

CDwbTableFilter::CDwbTableFilter(CDwbDb* db) : CDwbTable(db) {
    SetTableName("MetaFilter");
    AddColumn("ID", kColumnIdentity, 4, &m_rec.ID);
    AddColumn("DeviceID", kColumnInteger, 4, &m_rec.DeviceID);
    AddColumn("PackNo", kColumnInteger, 4, &m_rec.PackNo);
    AddColumn("FilterNo", kColumnInteger, 4, &m_rec.FilterNo);
    AddColumn("ZelPinNo", kColumnInteger, 4, &m_rec.ZelPinNo);
    AddColumn("PackName", kColumnText, 128, &m_rec.PackName);
    AddColumn("PackType", kColumnInteger, 4, &m_rec.PackType);
    AddColumn("DetectionType", kColumnInteger, 4, &m_rec.DetectionType);
    AddColumn("FilterType", kColumnInteger, 4, &m_rec.FilterType);
    AddColumn("FilterName", kColumnText, 128, &m_rec.FilterName);
    AddColumn("DetailType", kColumnInteger, 4, &m_rec.DetailType);
    AddColumn("Enable", kColumnInteger, 4, &m_rec.Enable);
    AddColumn("CombiInfo", kColumnText, 128, &m_rec.CombiInfo);
    AddColumn("NodeNum", kColumnInteger, 4, &m_rec.NodeNum);
    static const char* const kNodeNames[16] = {
        "Node0-X", "Node0-Y", "Node1-X", "Node1-Y", "Node2-X", "Node2-Y", "Node3-X", "Node3-Y",
        "Node4-X", "Node4-Y", "Node5-X", "Node5-Y", "Node6-X", "Node6-Y", "Node7-X", "Node7-Y"};
    for (int i = 0; i < 16; ++i) {
        AddColumn(kNodeNames[i], kColumnInteger, 4, &m_rec.Node[i / 2][i % 2]);
    }
    AddColumn("ObjMin-W", kColumnInteger, 4, &m_rec.ObjMinW);
    AddColumn("ObjMin-H", kColumnInteger, 4, &m_rec.ObjMinH);
    AddColumn("ObjMax-W", kColumnInteger, 4, &m_rec.ObjMaxW);
    AddColumn("ObjMax-H", kColumnInteger, 4, &m_rec.ObjMaxH);
    AddColumn("ObjMin-Dv-X", kColumnFloat, 4, &m_rec.ObjMinDvX);
    AddColumn("ObjMax-Dv-X", kColumnFloat, 4, &m_rec.ObjMaxDvX);
    AddColumn("ObjMin-Dv-Y", kColumnFloat, 4, &m_rec.ObjMinDvY);
    AddColumn("ObjMax-Dv-Y", kColumnFloat, 4, &m_rec.ObjMaxDvY);
    AddColumn("ObjMin-Dv", kColumnFloat, 4, &m_rec.ObjMinDv);
    AddColumn("ObjMax-Dv", kColumnFloat, 4, &m_rec.ObjMaxDv);
    AddColumn("EnableDvxy", kColumnText, 128, &m_rec.EnableDvxy);
    AddColumn("ObjMin-Stay", kColumnInteger, 4, &m_rec.ObjMinStay);
    AddColumn("ObjMax-Stay", kColumnInteger, 4, &m_rec.ObjMaxStay);
    AddColumn("ObjMin-Cap", kColumnInteger, 4, &m_rec.ObjMinCap);
    AddColumn("ObjMax-Cap", kColumnInteger, 4, &m_rec.ObjMaxCap);
    AddColumn("ObjDirection", kColumnInteger, 4, &m_rec.ObjDirection);
    AddColumn("ObjCollosion", kColumnInteger, 4, &m_rec.ObjCollosion);
    AddColumn("AreaIntersect", kColumnInteger, 4, &m_rec.AreaIntersect);
    AddColumn("SparseAlertInterval", kColumnInteger, 4, &m_rec.SparseAlertInterval);
}

CDwbTable::CColumnList CDwbTableFilter::Range(int first, int last) {
    CColumnList cols;
    for (int i = first; i <= last; ++i) {
        cols.push_back(i);
    }
    return cols;
}

bool CDwbTableFilter::CreateTable() {
    bool exists = false;
    if (IsExistRecord(-1, -1, 0, 0, false, exists) != DWB_OK) {
        CDwbTable::CreateTable();
    }
    return true;
}

int CDwbTableFilter::IsExistRecord(int deviceID, int packNo, int filterNo, int filterType,
                                   bool byType, bool& exists) {
    exists = false;
    if (!IsConnected()) {
        return DWB_ERR_DB_NOT_CONNECT;
    }
    CDwbUseRecordSet cursor(this, CDwbDbResult::kCursorDefault);
    if (!cursor.IsSuccessful()) {
        return DWB_ERR_DB_NOT_CONNECT;
    }
    bool ok = byType ? SelectParm({kDeviceID, kPackNo, kFilterNo, kFilterType}, deviceID, packNo,
                                  filterNo, filterType)
                     : SelectParm({kDeviceID, kPackNo, kFilterNo}, deviceID, packNo, filterNo);
    if (!ok) {
        return StatementFailure();
    }
    exists = GetRowCount() != 0;
    return DWB_OK;
}

int CDwbTableFilter::AddRecord(const SFilterTable& rec) {
    if (!IsConnected()) {
        return DWB_ERR_DB_NOT_CONNECT;
    }
    CDwbUseRecordSet cursor(this, CDwbDbResult::kCursorDefault);
    if (!cursor.IsSuccessful()) {
        return DWB_ERR_DB_NOT_CONNECT;
    }
    // The statement is built from the bound record, which holds exactly the given values.
    m_rec = rec;
    return Insert(Range(kDeviceID, kSparseAlertInterval)) ? DWB_OK : StatementFailure();
}

int CDwbTableFilter::UpdateFilter(const SFilterTable& rec) {
    bool exists = false;
    int rc = IsExistRecord(rec.DeviceID, rec.PackNo, rec.FilterNo, rec.FilterType, true, exists);
    if (rc != DWB_OK) {
        return rc;
    }
    if (!exists) {
        return DWB_ERR_NOT_FOUND;
    }
    CDwbUseRecordSet cursor(this, CDwbDbResult::kCursorDefault);
    if (!cursor.IsSuccessful()) {
        return DWB_ERR_DB_NOT_CONNECT;
    }
    m_rec = rec;
    return Update(Range(kFilterName, kSparseAlertInterval),
                  {kDeviceID, kPackNo, kFilterNo, kFilterType})
               ? DWB_OK
               : StatementFailure();
}

int CDwbTableFilter::DeleteRecord(int deviceID, int packNo, int filterNo, int filterType,
                                  bool byFilterNo, bool byType) {
    if (byFilterNo) {
        bool exists = false;
        int rc = IsExistRecord(deviceID, packNo, filterNo, filterType, byType, exists);
        if (rc != DWB_OK) {
            return rc;
        }
        if (!exists) {
            return DWB_ERR_NOT_FOUND;
        }
    }
    if (!IsConnected()) {
        return DWB_ERR_DB_NOT_CONNECT;
    }
    CDwbUseRecordSet cursor(this, CDwbDbResult::kCursorDefault);
    if (!cursor.IsSuccessful()) {
        return DWB_ERR_DB_NOT_CONNECT;
    }
    m_rec.DeviceID = deviceID;
    m_rec.PackNo = packNo;
    m_rec.FilterNo = filterNo;
    m_rec.FilterType = filterType;
    CColumnList where = {kDeviceID, kPackNo};
    if (byFilterNo) {
        where.push_back(kFilterNo);
    }
    if (byType) {
        where.push_back(kFilterType);
    }
    return Delete(where) ? DWB_OK : StatementFailure();
}

int CDwbTableFilter::GetRecordList(int deviceID, int packNo, int filterNo, int filterType,
                                   bool byDevice, bool byPack, bool byFilterNo, bool byType,
                                   std::vector<SFilterTable>& rows) {
    rows.clear();
    if (!IsConnected()) {
        return DWB_ERR_DB_NOT_CONNECT;
    }
    CDwbUseRecordSet cursor(this, CDwbDbResult::kCursorDefault);
    if (!cursor.IsSuccessful()) {
        return DWB_ERR_DB_NOT_CONNECT;
    }
    m_rec.DeviceID = deviceID;
    m_rec.PackNo = packNo;
    m_rec.FilterNo = filterNo;
    m_rec.FilterType = filterType;
    CColumnList where;
    if (byDevice)
        where.push_back(kDeviceID);
    if (byPack)
        where.push_back(kPackNo);
    if (byFilterNo)
        where.push_back(kFilterNo);
    if (byType)
        where.push_back(kFilterType);
    // Rows come back in the order they were stored, so a list reads the same every time.
    if (!ExecuteSql((BuildSelect(where, {}) + " ORDER BY \"ID\"").c_str())) {
        return StatementFailure();
    }
    while (MoveNext()) {
        rows.push_back(m_rec);
    }
    return rows.empty() ? DWB_ERR_NOT_FOUND : DWB_OK;
}

int CDwbTableFilter::GetFilterList(int deviceID, int packNo, int filterType, SDwbSetList* out,
                                   int maxCount, int start) {
    std::vector<SFilterTable> rows;
    int rc = GetRecordList(deviceID, packNo, -1, filterType, true, true, false, true, rows);
    if (rc != DWB_OK) {
        return rc;
    }
    if (out != nullptr) {
        for (int i = start < 0 ? 0 : start; i < static_cast<int>(rows.size()) && i < maxCount;
             ++i) {
            const SFilterTable& row = rows[static_cast<size_t>(i)];
            out[i].FilterNo = row.FilterNo;
            std::snprintf(out[i].Name, sizeof(out[i].Name), "%s", row.FilterName.c_str());
            out[i].DetailType = row.DetailType;
        }
    }
    return static_cast<int>(rows.size());
}

int CDwbTableFilter::UpdatePackage(int deviceID, const SDwbFilterPack& pack) {
    std::vector<SFilterTable> rows;
    int rc = GetRecordList(deviceID, pack.PackNo, -1, -1, true, true, false, false, rows);
    if (rc != DWB_OK) {
        return rc;
    }
    CDwbUseRecordSet cursor(this, CDwbDbResult::kCursorDefault);
    if (!cursor.IsSuccessful()) {
        return DWB_ERR_DB_NOT_CONNECT;
    }
    char name[kDwbSetTextLength + 1];
    std::snprintf(name, sizeof(name), "%.*s", static_cast<int>(kDwbSetTextLength), pack.PackName);
    return UpdateParm({kZelPinNo, kPackName, kPackType, kDetectionType}, {kDeviceID, kPackNo},
                      pack.ZelPinNo, name, pack.PackType, pack.DetectionType, deviceID, pack.PackNo)
               ? DWB_OK
               : StatementFailure();
}
