#include "quorvex/save_meta.h"

#include <cstdarg>
#include <cstdio>
#include <ctime>
#include <mutex>
#include <new>
#include <set>
#include <string>
#include <vector>

#include "catalogue/filter_row_codec.h"
#include "catalogue/setting_text_codec.h"
#include "platform/local_time.h"
#include "quorvex/date_time.h"
#include "quorvex/dwb_db.h"
#include "quorvex/dwb_lock.h"
#include "quorvex/dwb_log.h"
#include "quorvex/dwb_table.h"
#include "quorvex/dwb_table_filter.h"
#include "quorvex/dwb_table_recording.h"
#include "quorvex/dwb_table_storage_location.h"

namespace {

// Row kinds of the filter table.
constexpr int kKindFilter = 0;
constexpr int kKindMask = 1;
constexpr int kKindCombo = 2;

// Every member holds the object's lock for its whole body; the guard releases it on every
// return.
using CLockHolder = std::lock_guard<CDwbLock>;

const char* Mark(int code) {
    return code == DWB_OK ? "[R]" : "[E]";
}

const char* OrNull(const char* text) {
    return text ? text : "NULL";
}

// A mask row and an update of a mask rewrite the conditions a mask does not carry with these.
SFilterTable EmptyRow() {
    SFilterTable row{};
    row.EnableDvxy = CSettingTextCodec::EncodeEnableDvxy(false, false, true);
    return row;
}

// Every row of one package in the table's order; -2 when the package has none.
int PackageRows(CDwbTableFilter& table, int camera, int packNo, std::vector<SFilterTable>& rows) {
    return table.GetRecordList(camera, packNo, -1, -1, true, true, false, false, rows);
}

bool HasRow(const std::vector<SFilterTable>& rows, int kind, int filterNo) {
    for (const SFilterTable& row : rows) {
        if (row.FilterType == kind && row.FilterNo == filterNo) {
            return true;
        }
    }
    return false;
}

}  // namespace

CSaveMeta::CSaveMeta()
    : m_pDb(nullptr),
      m_pTableFilter(nullptr),
      m_pTableRecording(nullptr),
      m_pTableStorageLocation(nullptr),
      m_pLock(nullptr),
      m_pLog(nullptr),
      m_connected(false),
      m_updateDatabaseTime(0) {
    CDwbTable::SetDoUseUTC(true);
    m_pLock = new CDwbLock(true, 4000);
    m_pDb = new CDwbDb();
    m_pTableFilter = new CDwbTableFilter(m_pDb);
    m_pTableRecording = new CDwbTableRecording(m_pDb);
    m_pTableStorageLocation = new CDwbTableStorageLocation(m_pDb);
}

CSaveMeta::~CSaveMeta() {
    if (m_connected) {
        Disconnect();
    }
    delete m_pTableStorageLocation;
    delete m_pTableRecording;
    delete m_pTableFilter;
    delete m_pDb;
    delete m_pLog;
    delete m_pLock;
}

const char* CSaveMeta::ErrorCodeString(int code) {
    switch (code) {
        case DWB_OK:
            return "DWB_OK";
        case DWB_ERR_DB_NOT_CONNECT:
            return "DWB_ERR_DB_NOT_CONNECT";
        case DWB_ERR_NOT_FOUND:
            return "DWB_ERR_NOT_FOUND";
        case DWB_ERR_ALREADY_EXIST:
            return "DWB_ERR_ALREADY_EXIST";
        case DWB_ERR_SQL_EXEC:
            return "DWB_ERR_SQL_EXEC";
        case DWB_ERR_NOMORE_ADD_ITEM:
            return "DWB_ERR_NOMORE_ADD_ITEM";
        case DWB_ERR_INVALID_FILTER_NO:
            return "DWB_ERR_INVALID_FILTER_NO";
        case DWB_ERR_INVALID_PACKAGE_TYPE:
            return "DWB_ERR_INVALID_PACKAGE_TYPE";
        case DWB_ERR_INVALID_PARAM:
            return "DWB_ERR_INVALID_PARAM";
        default:
            return "Unknown ErrorCode";
    }
}

bool CSaveMeta::OpenDebugLog(const char* path) {
    CLockHolder hold(*m_pLock);
    if (!path) {
        return false;
    }
    CDwbLog* log = new (std::nothrow) CDwbLog();
    if (!log) {
        return false;
    }
    if (!log->Open(path)) {
        delete log;
        return false;
    }
    delete m_pLog;
    m_pLog = log;
    return true;
}

void CSaveMeta::Log(const char* format, ...) {
    if (!m_pLog || !format) {
        return;
    }
    char text[2048];
    va_list args;
    va_start(args, format);
    std::vsnprintf(text, sizeof(text), format, args);
    va_end(args);
    m_pLog->Print(text);
}

// ---------------------------------------------------------------------------------------------
// Connection

int CSaveMeta::Connect(const char* database, const char* user, const char* password) {
    CLockHolder hold(*m_pLock);
    Log("[S] CSaveMeta::Connect(%s)", OrNull(database));
    if (!database) {
        Log("[E] CSaveMeta::Connect() %s", ErrorCodeString(DWB_ERR_INVALID_PARAM));
        return DWB_ERR_INVALID_PARAM;
    }
    if (!m_connected) {
        m_connected =
            m_pDb->Connect(kConnectionPostgreSql, CDwbDb::kSqlPostgreSql, database, user, password);
        if (m_connected) {
            // Both create or upgrade what they need; an existing table is not a failure.
            m_pTableFilter->CreateTable();
            m_pTableRecording->CreateTable();
        }
    }
    int code = m_connected ? DWB_OK : DWB_ERR_DB_NOT_CONNECT;
    Log("%s CSaveMeta::Connect() %s", Mark(code), ErrorCodeString(code));
    return code;
}

int CSaveMeta::Disconnect() {
    CLockHolder hold(*m_pLock);
    if (m_connected) {
        m_pDb->Disconnect();
        m_connected = false;
    }
    return DWB_OK;
}

void CSaveMeta::SetUpdateDatabaseTime(long seconds) {
    m_updateDatabaseTime = seconds;
}

// ---------------------------------------------------------------------------------------------
// Recording catalogue

int CSaveMeta::AddRecItem(SDwbRecItem& item) {
    CLockHolder hold(*m_pLock);
    Log("[S] CSaveMeta::AddRecItem(DeviceNo=%ld, StorageNo=%ld, Rercord=%s)", item.DeviceID,
        item.StorageLocationID, item.FileName);
    char path[kDwbRecTextLength + 1];
    if (GetStorageLocationPath(item.StorageLocationID, path, sizeof(path)) != DWB_OK) {
        path[0] = '\0';
    }
    std::snprintf(item.FullPath, sizeof(item.FullPath), "%s", path);

    SRecordingTable rec;
    CDwbTableRecording::ToRow(item, rec);
    bool exists = false;
    int code = m_pTableRecording->IsExistRecord(rec, exists);
    if (code == DWB_OK) {
        code = exists ? DWB_ERR_ALREADY_EXIST : m_pTableRecording->AddRecItem(rec);
    }
    Log("%s CSaveMeta::AddRecItem() %s", Mark(code), ErrorCodeString(code));
    return code;
}

int CSaveMeta::UpdateRecItem(const SDwbRecItem& item, int mask) {
    CLockHolder hold(*m_pLock);
    Log("[S] CSaveMeta::UpdateItem(DevId=%ld, StorageID=%ld, FileName=%s, UpdateItem=%0x)",
        item.DeviceID, item.StorageLocationID, item.FileName, static_cast<unsigned>(mask));
    SRecordingTable rec;
    CDwbTableRecording::ToRow(item, rec);
    bool exists = false;
    int code = m_pTableRecording->IsExistRecord(rec, exists);
    if (code == DWB_OK) {
        code = exists ? m_pTableRecording->UpdateRecItem(rec, mask) : DWB_ERR_NOT_FOUND;
    }
    Log("%s CSaveMeta::UpdateItem() %s", Mark(code), ErrorCodeString(code));
    return code;
}

int CSaveMeta::DelRecItem(long deviceID, long storageLocationID, char* subDirectory,
                          char* fileName) {
    CLockHolder hold(*m_pLock);
    Log("[S] CSaveMeta::DelRecItem(DevId=%ld, StorageID=%ld, FileName=%s)", deviceID,
        storageLocationID, OrNull(fileName));
    int code = DWB_ERR_INVALID_PARAM;
    if (subDirectory && fileName) {
        SRecordingTable rec{};
        rec.DeviceID = static_cast<int32_t>(deviceID);
        rec.StorageLocationID = static_cast<int32_t>(storageLocationID);
        rec.SubDirectory = subDirectory;
        rec.FileName = fileName;
        bool exists = false;
        code = m_pTableRecording->IsExistRecord(rec, exists);
        if (code == DWB_OK) {
            code = exists ? m_pTableRecording->DelRecItem(rec) : DWB_ERR_NOT_FOUND;
        }
    }
    Log("%s CSaveMeta::DelRecItem() %s", Mark(code), ErrorCodeString(code));
    return code;
}

void CSaveMeta::TraceTime(const char* member, long deviceID, long storageLocationID,
                          const char* subDirectory, long time) {
    if (!m_pLog) {
        return;  // the formatting below is only worth it when someone reads it
    }
    char shown[160];
    std::tm local{};
    if (time == -1 || time == -2) {
        std::snprintf(shown, sizeof(shown), "-1");
    } else if (!plat::LocalTimeFromUnix(time, &local)) {
        std::snprintf(shown, sizeof(shown), "Invalid Time");
    } else {
        std::string utc = CDateTime::FromTimeT(time).Format("#%Y-%O-%D %H:%M:%S#", true);
        std::snprintf(shown, sizeof(shown), "Local=(%d/%02d/%02d %02d:%02d:%02d), UTC=(%s)",
                      local.tm_year + 1900, local.tm_mon + 1, local.tm_mday, local.tm_hour,
                      local.tm_min, local.tm_sec, utc.c_str());
    }
    Log("[S] CSaveMeta::%s(DevId=%ld, StorageID=%ld, DirName=%s, StartTime=%s)", member, deviceID,
        storageLocationID, OrNull(subDirectory), shown);
}

int CSaveMeta::GetRecItemList(long deviceID, long storageLocationID, char* subDirectory, long time,
                              long time2, bool descending, void** list) {
    CLockHolder hold(*m_pLock);
    TraceTime("GetRecItemList", deviceID, storageLocationID, subDirectory, time);
    int code = DWB_ERR_INVALID_PARAM;
    if (list) {
        *list = nullptr;
        code = m_pTableRecording->GetRecItem(deviceID, storageLocationID, subDirectory, time, time2,
                                             descending, list);
        // A running recording's end time lags by up to one update interval: look back once.
        if (code == DWB_ERR_NOT_FOUND && m_updateDatabaseTime != 0 &&
            time - m_updateDatabaseTime > 0) {
            code =
                m_pTableRecording->GetRecItem(deviceID, storageLocationID, subDirectory,
                                              time - m_updateDatabaseTime, time2, descending, list);
        }
    }
    Log("%s CSaveMeta::GetRecItemList() %s", Mark(code), ErrorCodeString(code));
    return code;
}

int CSaveMeta::GetRecItemListStartEnd(long deviceID, long storageLocationID, char* subDirectory,
                                      long start, long end, bool descending, void** list) {
    CLockHolder hold(*m_pLock);
    TraceTime("GetRecItemListStartEnd", deviceID, storageLocationID, subDirectory, start);
    int code = DWB_ERR_INVALID_PARAM;
    if (list) {
        *list = nullptr;
        code = m_pTableRecording->GetRecItemStartEnd(deviceID, storageLocationID, subDirectory,
                                                     start, end, descending, list);
    }
    Log("%s CSaveMeta::GetRecItemListStartEnd() %s", Mark(code), ErrorCodeString(code));
    return code;
}

bool CSaveMeta::GetNext(void* list, SDwbRecItem& item) {
    return CDwbTableRecording::GetNext(list, item);
}

void CSaveMeta::ClearRecItemList(void* list) {
    CDwbTableRecording::ClearRecItemList(list);
}

int CSaveMeta::GetOldestRecItem(long storageLocationID, SDwbRecItem& item) {
    CLockHolder hold(*m_pLock);
    Log("[S] CSaveMeta::GetOldestRecItem(StorageNo=%ld)", storageLocationID);
    int code = m_pTableRecording->GetOldestRecItem(storageLocationID, item);
    Log("%s CSaveMeta::() %s", Mark(code), ErrorCodeString(code));
    return code;
}

int CSaveMeta::GetStorageLocationPath(long storageLocationID, char* path, unsigned int size) {
    CLockHolder hold(*m_pLock);
    Log("[S] CSaveMeta::GetStorageLocationPath(StorageNo=%ld)", storageLocationID);
    int code = DWB_ERR_INVALID_PARAM;
    if (path && size > 0) {
        char found[kDwbRecTextLength + 1];
        found[0] = '\0';
        code = m_pTableStorageLocation->GetStorageLocationPath(storageLocationID, found,
                                                               sizeof(found));
        if (code == DWB_OK) {
            std::snprintf(path, size, "%s", found);
        }
    }
    if (code == DWB_OK) {
        Log("[R] CSaveMeta::GetStorageLocationPath() path=[%s]", path);
    } else {
        Log("[E] CSaveMeta::GetStorageLocationPath() %s", ErrorCodeString(code));
    }
    return code;
}

// ---------------------------------------------------------------------------------------------
// Packages

namespace {

bool ValidPackType(int type) {
    return type == 0 || type == 1;
}

}  // namespace

int CSaveMeta::AddPackageRow(int camera, const SDwbFilterPack& pack, const SDwbFilter* filter) {
    if (!ValidPackType(pack.PackType)) {
        return DWB_ERR_INVALID_PACKAGE_TYPE;
    }
    std::vector<SFilterTable> rows;
    int code = PackageRows(*m_pTableFilter, camera, pack.PackNo, rows);
    if (code == DWB_OK) {
        return DWB_ERR_ALREADY_EXIST;
    }
    if (code != DWB_ERR_NOT_FOUND) {
        return code;
    }
    SFilterTable row{};
    if (filter) {
        CFilterRowCodec::EncodeFilter(*filter, row);
        row.FilterNo = 0;
        row.FilterType = kKindFilter;
    } else {
        SDwbFilter blank{};
        blank.FilterNo = -1;
        blank.Enable = false;
        blank.Condition = BlankAmfFilter();
        CFilterRowCodec::EncodeFilter(blank, row);
        row.FilterNo = -1;
        row.FilterType = -1;
    }
    row.DeviceID = camera;
    CFilterRowCodec::EncodePack(pack, row);
    return m_pTableFilter->AddRecord(row);
}

int CSaveMeta::AddPackage(int camera, const SDwbFilterPack& pack) {
    CLockHolder hold(*m_pLock);
    Log("[S] CSaveMeta::AddPackage(DevId=%d, PackNo=%d)", camera, pack.PackNo);
    int code = AddPackageRow(camera, pack, nullptr);
    Log("%s CSaveMeta::AddPackage() %s", Mark(code), ErrorCodeString(code));
    return code;
}

int CSaveMeta::AddPackage(int camera, const SDwbFilterPack& pack, const SDwbFilter& filter) {
    CLockHolder hold(*m_pLock);
    Log("[S] CSaveMeta::AddPackage(DevId=%d, PackNo=%d, FilterNo=%d)", camera, pack.PackNo,
        filter.FilterNo);
    int code = AddPackageRow(camera, pack, &filter);
    Log("%s CSaveMeta::AddPackage() %s", Mark(code), ErrorCodeString(code));
    return code;
}

int CSaveMeta::UpdatePackage(int camera, const SDwbFilterPack& pack) {
    CLockHolder hold(*m_pLock);
    Log("[S] CSaveMeta::UpdatePackage(DevId=%d, PackNo=%d)", camera, pack.PackNo);
    int code = ValidPackType(pack.PackType) ? m_pTableFilter->UpdatePackage(camera, pack)
                                            : DWB_ERR_INVALID_PACKAGE_TYPE;
    Log("%s CSaveMeta::UpdatePackage() %s", Mark(code), ErrorCodeString(code));
    return code;
}

int CSaveMeta::DelPackage(int camera, int packNo) {
    CLockHolder hold(*m_pLock);
    Log("[S] CSaveMeta::DelPackage(DevId=%d, PackNo=%d)", camera, packNo);
    std::vector<SFilterTable> rows;
    int code = PackageRows(*m_pTableFilter, camera, packNo, rows);
    if (code == DWB_OK) {
        code = m_pTableFilter->DeleteRecord(camera, packNo, -1, -1, false, false);
    }
    Log("%s CSaveMeta::DelPackage() %s", Mark(code), ErrorCodeString(code));
    return code;
}

int CSaveMeta::GetPackage(int camera, SDwbFilterPack& pack) {
    CLockHolder hold(*m_pLock);
    Log("[S] CSaveMeta::GetPackage(DevId=%d, PackNo=%d)", camera, pack.PackNo);
    std::vector<SFilterTable> rows;
    int code = PackageRows(*m_pTableFilter, camera, pack.PackNo, rows);
    if (code == DWB_OK) {
        CFilterRowCodec::DecodePack(rows.front(), pack);
    }
    Log("%s CSaveMeta::GetPackage() %s", Mark(code), ErrorCodeString(code));
    return code;
}

int CSaveMeta::GetPackage(int camera, int packNo, SDwbPackageInfo& info) {
    CLockHolder hold(*m_pLock);
    Log("[S] CSaveMeta::GetPackage(DevId=%d, PackNo=%d)", camera, packNo);
    info.FilterCount = 0;
    info.MaskCount = 0;
    info.ComboCount = 0;
    info.Pack.PackNo = packNo;
    std::vector<SFilterTable> rows;
    int code = PackageRows(*m_pTableFilter, camera, packNo, rows);
    if (code == DWB_OK) {
        CFilterRowCodec::DecodePack(rows.front(), info.Pack);
        for (const SFilterTable& row : rows) {
            if (row.FilterType == kKindFilter && info.FilterCount < kDwbMaxFilters) {
                CFilterRowCodec::DecodeFilter(row, info.Filters[info.FilterCount++]);
            } else if (row.FilterType == kKindMask && info.MaskCount < kDwbMaxMasks) {
                CFilterRowCodec::DecodeMask(row, info.Masks[info.MaskCount++]);
            } else if (row.FilterType == kKindCombo && info.ComboCount == 0) {
                CFilterRowCodec::DecodeCombo(row, info.Combo);
                info.ComboCount = 1;
            }
        }
    }
    Log("%s CSaveMeta::GetPackage() %s", Mark(code), ErrorCodeString(code));
    return code;
}

int CSaveMeta::GetPackageList(int camera, SDwbFilterPackList* out, int maxCount, int start) {
    CLockHolder hold(*m_pLock);
    Log("[S] CSaveMeta::GetPackageList(DevId=%d, MaxCount=%d, Start=%d)", camera, maxCount, start);
    if (!out || maxCount < 1 || start < 0) {
        Log("[E] CSaveMeta::GetPackageList() %s", ErrorCodeString(DWB_ERR_INVALID_PARAM));
        return DWB_ERR_INVALID_PARAM;
    }
    std::vector<SFilterTable> rows;
    int code = m_pTableFilter->GetRecordList(camera, -1, -1, -1, true, false, false, false, rows);
    if (code != DWB_OK) {
        Log("[E] CSaveMeta::GetPackageList() %s", ErrorCodeString(code));
        return code;
    }
    std::vector<const SFilterTable*> packs;
    std::set<int32_t> seen;
    for (const SFilterTable& row : rows) {
        if (seen.insert(row.PackNo).second) {
            packs.push_back(&row);
        }
    }
    int count = static_cast<int>(packs.size());
    for (int i = start; i < count && i < maxCount; ++i) {
        SDwbFilterPack pack{};
        CFilterRowCodec::DecodePack(*packs[i], pack);
        out[i].PackNo = pack.PackNo;
        std::snprintf(out[i].PackName, sizeof(out[i].PackName), "%s", pack.PackName);
        out[i].ZelPinNo = pack.ZelPinNo;
        out[i].DetectionType = pack.DetectionType;
    }
    int result = count < maxCount ? count : maxCount;
    Log("[R] CSaveMeta::GetPackageList() return=%d", result);
    return result;
}

// ---------------------------------------------------------------------------------------------
// Filters, masks and the combination filter

// Reads the package's rows into `rows` (the new row copies its package columns from the
// first) and refuses a row of `kind` beyond the package's limit.
int CSaveMeta::CheckPackageRoom(int camera, int packNo, int kind, std::vector<SFilterTable>& rows) {
    int code = PackageRows(*m_pTableFilter, camera, packNo, rows);
    if (code != DWB_OK) {
        return code;
    }
    int count = 0;
    for (const SFilterTable& row : rows) {
        if (row.FilterType != kind) {
            continue;
        }
        ++count;
        bool full = false;
        if (kind == kKindFilter) {
            full =
                (count >= kDwbMaxFiltersSmallPack && row.PackType == 0) || count >= kDwbMaxFilters;
        } else if (kind == kKindMask) {
            full = count >= kDwbMaxMasks;
        } else {
            full = true;  // one combination filter per package
        }
        if (full) {
            return DWB_ERR_NOMORE_ADD_ITEM;
        }
    }
    return DWB_OK;
}

// Each filter a combination names must be a filter row among the package's rows.
int CSaveMeta::CheckComboFilters(const std::vector<SFilterTable>& rows,
                                 const SDwbAmfComboFilter& combo, const char* tag) {
    for (uint8_t no : combo.m_filterNo) {
        if (no != kAmfComboUnused && !HasRow(rows, kKindFilter, no)) {
            Log("[E] CSaveMeta::%s() %s, Unknown filter no=%d.", tag,
                ErrorCodeString(DWB_ERR_INVALID_FILTER_NO), no);
            return DWB_ERR_INVALID_FILTER_NO;
        }
    }
    return DWB_OK;
}

// A row of that kind and number must not exist yet: numbers are unique per kind.
int CSaveMeta::RefuseExisting(int camera, int packNo, int filterNo, int kind) {
    bool exists = false;
    int code = m_pTableFilter->IsExistRecord(camera, packNo, filterNo, kind, true, exists);
    if (code != DWB_OK) {
        return code;
    }
    return exists ? DWB_ERR_ALREADY_EXIST : DWB_OK;
}

// A new filter, mask or combination row takes its package columns from the package's first
// row; only a package's own row carries a detection type.
int CSaveMeta::AddKindRow(int camera, int packNo, int kind, const SFilterTable& first,
                          SFilterTable& row) {
    row.DeviceID = camera;
    row.PackNo = packNo;
    row.FilterType = kind;
    row.PackName = first.PackName;
    row.PackType = first.PackType;
    row.ZelPinNo = first.ZelPinNo;
    row.DetectionType = 0;
    return m_pTableFilter->AddRecord(row);
}

int CSaveMeta::AddFilter(int camera, int packNo, const SDwbFilter& filter) {
    CLockHolder hold(*m_pLock);
    Log("[S] CSaveMeta::AddFilter(DevId=%d, PackNo=%d, FilterNo=%d)", camera, packNo,
        filter.FilterNo);
    std::vector<SFilterTable> rows;
    int code = RefuseExisting(camera, packNo, filter.FilterNo, kKindFilter);
    if (code == DWB_OK) {
        code = CheckPackageRoom(camera, packNo, kKindFilter, rows);
    }
    if (code == DWB_OK) {
        SFilterTable row{};
        CFilterRowCodec::EncodeFilter(filter, row);
        code = AddKindRow(camera, packNo, kKindFilter, rows.front(), row);
    }
    Log("%s CSaveMeta::AddFilter() %s", Mark(code), ErrorCodeString(code));
    return code;
}

int CSaveMeta::AddMask(int camera, int packNo, const SDwbMaskArea& mask) {
    CLockHolder hold(*m_pLock);
    Log("[S] CSaveMeta::AddMask(DevId=%d, PackNo=%d, FilterNo=%d)", camera, packNo, mask.FilterNo);
    std::vector<SFilterTable> rows;
    int code = RefuseExisting(camera, packNo, mask.FilterNo, kKindMask);
    if (code == DWB_OK) {
        code = CheckPackageRoom(camera, packNo, kKindMask, rows);
    }
    if (code == DWB_OK) {
        SFilterTable row = EmptyRow();
        CFilterRowCodec::EncodeMask(mask, row);
        code = AddKindRow(camera, packNo, kKindMask, rows.front(), row);
    }
    Log("%s CSaveMeta::AddMask() %s", Mark(code), ErrorCodeString(code));
    return code;
}

int CSaveMeta::AddCombo(int camera, int packNo, const SDwbCombo& combo) {
    CLockHolder hold(*m_pLock);
    Log("[S] CSaveMeta::AddCombo(DevId=%d, PackNo=%d, FilterNo=%d)", camera, packNo,
        combo.FilterNo);
    std::vector<SFilterTable> rows;
    int code = RefuseExisting(camera, packNo, combo.FilterNo, kKindCombo);
    if (code == DWB_OK) {
        code = CheckPackageRoom(camera, packNo, kKindCombo, rows);
    }
    if (code == DWB_OK) {
        code = CheckComboFilters(rows, combo.Combo, "AddCombo");
        if (code == DWB_ERR_INVALID_FILTER_NO) {
            return code;  // traced with the filter number
        }
    }
    if (code == DWB_OK) {
        SFilterTable row = EmptyRow();
        CFilterRowCodec::EncodeCombo(combo, row);
        code = AddKindRow(camera, packNo, kKindCombo, rows.front(), row);
    }
    Log("%s CSaveMeta::AddCombo() %s", Mark(code), ErrorCodeString(code));
    return code;
}

int CSaveMeta::UpdateFilter(int camera, int packNo, const SDwbFilter& filter) {
    CLockHolder hold(*m_pLock);
    Log("[S] CSaveMeta::UpdateFilter(DevId=%d, PackNo=%d, FilterNo=%d)", camera, packNo,
        filter.FilterNo);
    SFilterTable row{};
    CFilterRowCodec::EncodeFilter(filter, row);
    row.DeviceID = camera;
    row.PackNo = packNo;
    row.FilterType = kKindFilter;
    int code = m_pTableFilter->UpdateFilter(row);
    Log("%s CSaveMeta::UpdateFilter() %s", Mark(code), ErrorCodeString(code));
    return code;
}

int CSaveMeta::UpdateMask(int camera, int packNo, const SDwbMaskArea& mask) {
    CLockHolder hold(*m_pLock);
    Log("[S] CSaveMeta::UpdateMask(DevId=%d, PackNo=%d, FilterNo=%d)", camera, packNo,
        mask.FilterNo);
    SFilterTable row = EmptyRow();
    CFilterRowCodec::EncodeMask(mask, row);
    row.DeviceID = camera;
    row.PackNo = packNo;
    row.FilterType = kKindMask;
    int code = m_pTableFilter->UpdateFilter(row);
    Log("%s CSaveMeta::UpdateMask() %s", Mark(code), ErrorCodeString(code));
    return code;
}

int CSaveMeta::UpdateCombo(int camera, int packNo, const SDwbCombo& combo) {
    CLockHolder hold(*m_pLock);
    Log("[S] CSaveMeta::UpdateCombo(DevId=%d, PackNo=%d, FilterNo=%d)", camera, packNo,
        combo.FilterNo);
    std::vector<SFilterTable> rows;
    int code = PackageRows(*m_pTableFilter, camera, packNo, rows);
    if (code == DWB_OK && !HasRow(rows, kKindCombo, combo.FilterNo)) {
        code = DWB_ERR_NOT_FOUND;
    }
    if (code == DWB_OK) {
        code = CheckComboFilters(rows, combo.Combo, "UpdateCombo");
        if (code == DWB_ERR_INVALID_FILTER_NO) {
            return code;
        }
    }
    if (code == DWB_OK) {
        SFilterTable row = EmptyRow();
        CFilterRowCodec::EncodeCombo(combo, row);
        row.DeviceID = camera;
        row.PackNo = packNo;
        row.FilterType = kKindCombo;
        code = m_pTableFilter->UpdateFilter(row);
    }
    Log("%s CSaveMeta::UpdateCombo() %s", Mark(code), ErrorCodeString(code));
    return code;
}

int CSaveMeta::DelRow(int camera, int packNo, int filterNo, int kind, const char* name) {
    CLockHolder hold(*m_pLock);
    Log("[S] CSaveMeta::%s(DevId=%d, PackNo=%d, FilterNo=%d)", name, camera, packNo, filterNo);
    int code = m_pTableFilter->DeleteRecord(camera, packNo, filterNo, kind, true, true);
    Log("%s CSaveMeta::%s() %s", Mark(code), name, ErrorCodeString(code));
    return code;
}

int CSaveMeta::DelFilter(int camera, int packNo, int filterNo) {
    return DelRow(camera, packNo, filterNo, kKindFilter, "DelFilter");
}

int CSaveMeta::DelMask(int camera, int packNo, int filterNo) {
    return DelRow(camera, packNo, filterNo, kKindMask, "DelMask");
}

int CSaveMeta::DelCombo(int camera, int packNo, int filterNo) {
    return DelRow(camera, packNo, filterNo, kKindCombo, "DelCombo");
}

int CSaveMeta::GetFilter(int camera, int packNo, SDwbFilter& filter) {
    CLockHolder hold(*m_pLock);
    Log("[S] CSaveMeta::GetFilter(DevId=%d, PackNo=%d, FilterNo=%d)", camera, packNo,
        filter.FilterNo);
    std::vector<SFilterTable> rows;
    int code = m_pTableFilter->GetRecordList(camera, packNo, filter.FilterNo, kKindFilter, true,
                                             true, true, true, rows);
    if (code == DWB_OK) {
        CFilterRowCodec::DecodeFilter(rows.front(), filter);
    }
    Log("%s CSaveMeta::GetFilter() %s", Mark(code), ErrorCodeString(code));
    return code;
}

int CSaveMeta::GetMask(int camera, int packNo, SDwbMaskArea& mask) {
    CLockHolder hold(*m_pLock);
    Log("[S] CSaveMeta::GetMask(DevId=%d, PackNo=%d, FilterNo=%d)", camera, packNo, mask.FilterNo);
    std::vector<SFilterTable> rows;
    int code = m_pTableFilter->GetRecordList(camera, packNo, mask.FilterNo, kKindMask, true, true,
                                             true, true, rows);
    if (code == DWB_OK) {
        CFilterRowCodec::DecodeMask(rows.front(), mask);
    }
    Log("%s CSaveMeta::GetMask() %s", Mark(code), ErrorCodeString(code));
    return code;
}

int CSaveMeta::GetCombo(int camera, int packNo, SDwbCombo& combo) {
    CLockHolder hold(*m_pLock);
    Log("[S] CSaveMeta::GetCombo(DevId=%d, PackNo=%d, FilterNo=%d)", camera, packNo,
        combo.FilterNo);
    std::vector<SFilterTable> rows;
    int code = m_pTableFilter->GetRecordList(camera, packNo, combo.FilterNo, kKindCombo, true, true,
                                             true, true, rows);
    if (code == DWB_OK) {
        CFilterRowCodec::DecodeCombo(rows.front(), combo);
    }
    Log("%s CSaveMeta::GetCombo() %s", Mark(code), ErrorCodeString(code));
    return code;
}

int CSaveMeta::GetList(int camera, int packNo, int kind, SDwbSetList* out, int maxCount, int start,
                       const char* name) {
    CLockHolder hold(*m_pLock);
    Log("[S] CSaveMeta::%s(DevId=%d, PackNo=%d, MaxCount=%d, Start=%d)", name, camera, packNo,
        maxCount, start);
    if (!out || maxCount < 1 || start < 0) {
        Log("[E] CSaveMeta::%s() %s", name, ErrorCodeString(DWB_ERR_INVALID_PARAM));
        return DWB_ERR_INVALID_PARAM;
    }
    int count = m_pTableFilter->GetFilterList(camera, packNo, kind, out, maxCount, start);
    if (count < 0) {
        Log("[E] CSaveMeta::%s() %s", name, ErrorCodeString(count));
        return count;
    }
    if (count > maxCount) {
        count = maxCount;
    }
    Log("[R} CSaveMeta::%s() return=%d", name, count);
    return count;
}

int CSaveMeta::GetFilterList(int camera, int packNo, SDwbSetList* out, int maxCount, int start) {
    return GetList(camera, packNo, kKindFilter, out, maxCount, start, "GetFilterList");
}

int CSaveMeta::GetMaskList(int camera, int packNo, SDwbSetList* out, int maxCount, int start) {
    return GetList(camera, packNo, kKindMask, out, maxCount, start, "GetMaskList");
}

int CSaveMeta::GetComboList(int camera, int packNo, SDwbSetList* out, int maxCount, int start) {
    return GetList(camera, packNo, kKindCombo, out, maxCount, start, "GetComboList");
}
