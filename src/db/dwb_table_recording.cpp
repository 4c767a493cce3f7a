#include "quorvex/dwb_table_recording.h"

#include <cstdio>
#include <cstring>
#include <new>
#include <vector>

#include "quorvex/dwb_use_record_set.h"

namespace {

using CRecordingList = std::vector<SRecordingTable>;

bool IsPostgres() {
    return CDwbTable::GetSqlType() == CDwbDb::kSqlPostgreSql;
}

CDateTime TimeFromSeconds(long seconds) {
    return CDateTime::FromTimeT(static_cast<time_t>(seconds));
}

long SecondsFromTime(const CDateTime& t) {
    return t.IsZero() ? -1 : static_cast<long>(t.ToTimeT());
}

void CopyText(char* out, size_t size, const std::string& text) {
    std::snprintf(out, size, "%s", text.c_str());
}

}  // namespace

CDwbTableRecording::CDwbTableRecording(CDwbDb* db) : CDwbTable(db) {
    SetTableName("MetaRecording");
    AddColumn("ID", kColumnIdentity, 4, &m_rec.ID);
    AddColumn("DeviceID", kColumnInteger, 4, &m_rec.DeviceID);
    AddColumn("StorageLocationID", kColumnInteger, 4, &m_rec.StorageLocationID);
    AddColumn("FileName", kColumnText, 255, &m_rec.FileName);
    AddColumn("SubDirectory", kColumnText, 255, &m_rec.SubDirectory);
    AddColumn("Trigger", kColumnInteger, 4, &m_rec.Trigger);
    AddColumn("StartTime", kColumnDateTime, 0, &m_rec.StartTime);
    AddColumn("StartTimeAvailable", kColumnDateTime, 0, &m_rec.StartTimeAvailable);
    AddColumn("EndTime", kColumnDateTime, 0, &m_rec.EndTime);
    AddColumn("NumberOfFiles", kColumnInteger, 4, &m_rec.NumberOfFiles);
    AddColumn("Deleted", kColumnInteger, 4, &m_rec.Deleted);
    AddColumn("Archived", kColumnInteger, 4, &m_rec.Archived);
    AddColumn("FullPath", kColumnText, 1020, &m_rec.FullPath);
}

const CDwbTable::CColumnList& CDwbTableRecording::KeyColumns() {
    static const CColumnList kKey = {kDeviceID, kStorageLocationID, kFileName, kSubDirectory};
    return kKey;
}

void CDwbTableRecording::SetKey(const SRecordingTable& rec) {
    m_rec = rec;
}

bool CDwbTableRecording::CreateTable() {
    SRecordingTable probe;
    probe.DeviceID = -1;
    probe.StorageLocationID = -1;
    bool exists = false;
    if (IsExistRecord(probe, exists) != DWB_OK) {
        CDwbTable::CreateTable();
    }
    {
        CDwbUseRecordSet cursor(this, CDwbDbResult::kCursorSchema);
        if (!cursor.IsSuccessful()) {
            return false;
        }
        const std::string add = "ALTER TABLE " + m_name + " ADD COLUMN \"FullPath\" TEXT";
        if (ExecuteSql(add.c_str())) {
            // A table from before the column: fill it from each row's storage location.
            const std::string fill = "UPDATE " + m_name +
                                     " SET \"FullPath\" = \"StorageLocation\".\"FullPath\"" +
                                     " FROM \"StorageLocation\"" +
                                     " WHERE \"StorageLocationID\" = \"StorageLocation\".\"ID\"";
            ExecuteSql(fill.c_str());
        }
    }
    CreateIndex();
    return true;
}

bool CDwbTableRecording::CreateIndex() {
    if (!IsConnected()) {
        return false;
    }
    CDwbUseRecordSet cursor(this, CDwbDbResult::kCursorDefault);
    if (!cursor.IsSuccessful()) {
        return false;
    }
    static const char* const kColumns[] = {"DeviceID",     "StorageLocationID",  "FileName",
                                           "SubDirectory", "StartTimeAvailable", "EndTime"};
    for (const char* column : kColumns) {
        std::string sql;
        if (IsPostgres()) {
            sql = std::string("CREATE INDEX \"MetaRecord_") + column + "\" ON " + m_name + " (\"" +
                  column + "\")";
        } else {
            sql = std::string("CREATE INDEX ") + column + " ON " + m_name + " (" + column + " ASC)";
        }
        // An index that exists already makes the statement fail, which is fine.
        ExecuteSql(sql.c_str());
    }
    return true;
}

int CDwbTableRecording::IsExistRecord(const SRecordingTable& rec, bool& exists) {
    exists = false;
    if (!IsConnected()) {
        return DWB_ERR_DB_NOT_CONNECT;
    }
    CDwbUseRecordSet cursor(this, CDwbDbResult::kCursorDefault);
    if (!cursor.IsSuccessful()) {
        return DWB_ERR_DB_NOT_CONNECT;
    }
    SetKey(rec);
    if (!Select(KeyColumns(), {})) {
        return StatementFailure();
    }
    exists = GetRowCount() != 0;
    return DWB_OK;
}

int CDwbTableRecording::AddRecItem(const SRecordingTable& rec) {
    if (!IsConnected()) {
        return DWB_ERR_DB_NOT_CONNECT;
    }
    CDwbUseRecordSet cursor(this, CDwbDbResult::kCursorDefault);
    if (!cursor.IsSuccessful()) {
        return DWB_ERR_DB_NOT_CONNECT;
    }
    m_rec = rec;
    CColumnList cols;
    for (int i = kDeviceID; i <= kFullPath; ++i) {
        cols.push_back(i);
    }
    return Insert(cols) ? DWB_OK : StatementFailure();
}

int CDwbTableRecording::UpdateRecItem(const SRecordingTable& rec, int mask) {
    if (!IsConnected()) {
        return DWB_ERR_DB_NOT_CONNECT;
    }
    CDwbUseRecordSet cursor(this, CDwbDbResult::kCursorDefault);
    if (!cursor.IsSuccessful()) {
        return DWB_ERR_DB_NOT_CONNECT;
    }
    m_rec = rec;
    CColumnList set;
    if (mask & kDwbUpdateEndTime)
        set.push_back(kEndTime);
    if (mask & kDwbUpdateNumberOfFiles)
        set.push_back(kNumberOfFiles);
    if (mask & kDwbUpdateDeleted)
        set.push_back(kDeleted);
    if (mask & kDwbUpdateArchived)
        set.push_back(kArchived);
    if (mask & kDwbUpdateTrigger)
        set.push_back(kTrigger);
    if (mask & kDwbUpdateStartTimeAvailable)
        set.push_back(kStartTimeAvailable);
    if (set.empty()) {
        return DWB_OK;
    }
    return Update(set, KeyColumns()) ? DWB_OK : StatementFailure();
}

int CDwbTableRecording::DelRecItem(SRecordingTable& rec) {
    if (!IsConnected()) {
        return DWB_ERR_DB_NOT_CONNECT;
    }
    CDwbUseRecordSet cursor(this, CDwbDbResult::kCursorDefault);
    if (!cursor.IsSuccessful()) {
        return DWB_ERR_DB_NOT_CONNECT;
    }
    m_rec = rec;
    return Delete(KeyColumns()) ? DWB_OK : StatementFailure();
}

namespace {

std::string JoinTerms(const std::vector<std::string>& terms) {
    std::string out;
    for (size_t i = 0; i < terms.size(); ++i) {
        out += (i > 0 ? " AND " : "") + terms[i];
    }
    return out;
}

}  // namespace

// The key terms both searches put after their time terms.
void CDwbTableRecording::AppendKeyTerms(long deviceID, long storageLocationID,
                                        const char* subDirectory, std::vector<std::string>& terms) {
    if (deviceID != -1) {
        m_rec.DeviceID = static_cast<int32_t>(deviceID);
        terms.push_back(FormatColumn(kDeviceID, " = "));
    }
    if (subDirectory != nullptr) {
        m_rec.SubDirectory = subDirectory;
        terms.push_back(FormatColumn(kSubDirectory, " = "));
    }
    if (storageLocationID != -1) {
        m_rec.StorageLocationID = static_cast<int32_t>(storageLocationID);
        terms.push_back(FormatColumn(kStorageLocationID, " = "));
    }
}

std::string CDwbTableRecording::GetWhereString(long deviceID, long storageLocationID,
                                               const char* subDirectory, long time, long time2,
                                               bool descending) {
    std::string out = " ";
    if (deviceID == -1 && storageLocationID == -1 && subDirectory == nullptr && time == -1 &&
        time2 == -1) {
        return out;
    }
    std::vector<std::string> terms;
    if (time != -1) {
        if (descending) {
            m_rec.EndTime = TimeFromSeconds(time);
            terms.push_back(FormatColumn(kEndTime, " >= "));
        } else {
            m_rec.StartTimeAvailable = TimeFromSeconds(time);
            terms.push_back(FormatColumn(kStartTimeAvailable, " <= "));
        }
    }
    AppendKeyTerms(deviceID, storageLocationID, subDirectory, terms);
    return out + "WHERE " + JoinTerms(terms);
}

std::string CDwbTableRecording::GetWhereStringStartEnd(long deviceID, long storageLocationID,
                                                       const char* subDirectory, long start,
                                                       long end, bool /*descending*/) {
    std::string out = " ";
    if (deviceID == -1 && storageLocationID == -1 && subDirectory == nullptr && start == -1 &&
        end == -1) {
        return out;
    }
    std::vector<std::string> terms;
    if (start != -1 && end != -1) {
        m_rec.StartTime = TimeFromSeconds(end);
        terms.push_back(FormatColumn(kStartTime, " <= "));
        m_rec.EndTime = TimeFromSeconds(start);
        terms.push_back(FormatColumn(kEndTime, " >= "));
    }
    AppendKeyTerms(deviceID, storageLocationID, subDirectory, terms);
    if (terms.empty()) {
        // Only one end of a window was given: nothing narrows the search.
        return out;
    }
    return out + "WHERE " + JoinTerms(terms);
}

int CDwbTableRecording::QueryList(const std::string& sql, void** list) {
    if (!ExecuteSql(sql.c_str())) {
        return StatementFailure();
    }
    auto* rows = new (std::nothrow) CRecordingList();
    if (rows == nullptr) {
        return StatementFailure();
    }
    // Counting moves the cursor onto the first row, so that row is converted here and the
    // walk goes on from it.
    const int count = GetRowCount();
    if (count > 0 && ResultToValue()) {
        rows->reserve(static_cast<size_t>(count));
        do {
            rows->push_back(m_rec);
        } while (MoveNext());
    }
    if (rows->empty()) {
        delete rows;
        return DWB_ERR_NOT_FOUND;
    }
    if (list != nullptr) {
        *list = rows;
    } else {
        delete rows;
    }
    return DWB_OK;
}

int CDwbTableRecording::GetRecItem(long deviceID, long storageLocationID, char* subDirectory,
                                   long time, long time2, bool descending, void** list) {
    if (!IsConnected()) {
        return DWB_ERR_DB_NOT_CONNECT;
    }
    CDwbUseRecordSet cursor(this, CDwbDbResult::kCursorDefault);
    if (!cursor.IsSuccessful()) {
        return DWB_ERR_DB_NOT_CONNECT;
    }
    std::string sql =
        "SELECT * FROM " + m_name +
        GetWhereString(deviceID, storageLocationID, subDirectory, time, time2, descending) +
        (IsPostgres() ? " ORDER BY \"StartTimeAvailable\"" : " ORDER BY `StartTimeAvailable`") +
        (descending ? " DESC " : " ");
    return QueryList(sql, list);
}

int CDwbTableRecording::GetRecItemStartEnd(long deviceID, long storageLocationID,
                                           char* subDirectory, long start, long end,
                                           bool descending, void** list) {
    if (!IsConnected()) {
        return DWB_ERR_DB_NOT_CONNECT;
    }
    CDwbUseRecordSet cursor(this, CDwbDbResult::kCursorDefault);
    if (!cursor.IsSuccessful()) {
        return DWB_ERR_DB_NOT_CONNECT;
    }
    std::string sql =
        "SELECT * FROM " + m_name +
        GetWhereStringStartEnd(deviceID, storageLocationID, subDirectory, start, end, descending) +
        (IsPostgres() ? " ORDER BY \"StartTime\"" : " ORDER BY `StartTime`") +
        (descending ? " DESC " : " ");
    return QueryList(sql, list);
}

void CDwbTableRecording::ToRow(const SDwbRecItem& item, SRecordingTable& row) {
    row = SRecordingTable();
    row.DeviceID = static_cast<int32_t>(item.DeviceID);
    row.StorageLocationID = static_cast<int32_t>(item.StorageLocationID);
    row.SubDirectory.assign(item.SubDirectory, ::strnlen(item.SubDirectory, kDwbRecTextLength));
    row.FileName.assign(item.FileName, ::strnlen(item.FileName, kDwbRecTextLength));
    row.FullPath.assign(item.FullPath, ::strnlen(item.FullPath, kDwbRecTextLength));
    row.NumberOfFiles = static_cast<int32_t>(item.NumberOfFiles);
    row.StartTime = TimeFromSeconds(item.StartTime);
    row.StartTimeAvailable = TimeFromSeconds(item.StartTimeAvailable);
    row.EndTime = TimeFromSeconds(item.EndTime);
    row.Trigger = static_cast<int32_t>(item.Trigger);
    row.Deleted = static_cast<int32_t>(item.Deleted);
    row.Archived = static_cast<int32_t>(item.Archived);
}

void CDwbTableRecording::FromRow(const SRecordingTable& row, SDwbRecItem& item) {
    item.DeviceID = row.DeviceID;
    item.StorageLocationID = row.StorageLocationID;
    CopyText(item.SubDirectory, sizeof(item.SubDirectory), row.SubDirectory);
    CopyText(item.FileName, sizeof(item.FileName), row.FileName);
    CopyText(item.FullPath, sizeof(item.FullPath), row.FullPath);
    item.NumberOfFiles = row.NumberOfFiles;
    item.StartTime = SecondsFromTime(row.StartTime);
    item.StartTimeAvailable = SecondsFromTime(row.StartTimeAvailable);
    item.EndTime = SecondsFromTime(row.EndTime);
    item.Trigger = row.Trigger;
    item.Deleted = row.Deleted;
    item.Archived = row.Archived;
}

bool CDwbTableRecording::GetNext(void* list, SDwbRecItem& item) {
    auto* rows = static_cast<CRecordingList*>(list);
    if (rows == nullptr || rows->empty()) {
        return false;
    }
    FromRow(rows->back(), item);
    rows->pop_back();
    return true;
}

void CDwbTableRecording::ClearRecItemList(void* list) {
    delete static_cast<CRecordingList*>(list);
}

int CDwbTableRecording::GetOldestRecItem(long storageLocationID, SDwbRecItem& item) {
    if (!IsConnected()) {
        return DWB_ERR_DB_NOT_CONNECT;
    }
    CDwbUseRecordSet cursor(this, CDwbDbResult::kCursorDefault);
    if (!cursor.IsSuccessful()) {
        return DWB_ERR_DB_NOT_CONNECT;
    }
    m_rec.StorageLocationID = static_cast<int32_t>(storageLocationID);
    std::string sql = "SELECT * FROM " + m_name + " WHERE " +
                      FormatColumn(kStorageLocationID, " = ") +
                      (IsPostgres() ? " ORDER BY \"StartTimeAvailable\" LIMIT 1"
                                    : " ORDER BY `StartTimeAvailable` LIMIT 1");
    if (!ExecuteSql(sql.c_str())) {
        return StatementFailure();
    }
    if (!MoveNext()) {
        return DWB_ERR_NOT_FOUND;
    }
    FromRow(m_rec, item);
    return DWB_OK;
}
