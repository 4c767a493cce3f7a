#include "quorvex/dwb_table_storage_location.h"

#include <cstdio>

#include "quorvex/dwb_types.h"
#include "quorvex/dwb_use_record_set.h"

CDwbTableStorageLocation::CDwbTableStorageLocation(CDwbDb* db) : CDwbTable(db) {
    SetTableName("StorageLocation");
    AddColumn("ID", kColumnIdentity, 4, &m_id);
    AddColumn("FullPath", kColumnText, 255, &m_fullPath);
}

int CDwbTableStorageLocation::GetStorageLocationPath(long id, char* path, unsigned int size) {
    if (path == nullptr || size == 0) {
        return DWB_ERR_INVALID_PARAM;
    }
    path[0] = '\0';
    if (!IsConnected()) {
        return DWB_ERR_DB_NOT_CONNECT;
    }
    CDwbUseRecordSet cursor(this, CDwbDbResult::kCursorDefault);
    if (!cursor.IsSuccessful()) {
        return DWB_ERR_DB_NOT_CONNECT;
    }
    m_id = static_cast<int32_t>(id);
    std::string sql = (GetSqlType() == CDwbDb::kSqlPostgreSql ? "SELECT \"ID\", \"FullPath\" FROM "
                                                              : "SELECT ID, FullPath FROM ") +
                      m_name + " WHERE " + FormatColumn(0, " = ");
    if (!ExecuteSql(sql.c_str())) {
        return StatementFailure();
    }
    if (!MoveNext()) {
        return DWB_ERR_NOT_FOUND;
    }
    unsigned int limit = size < kDwbRecTextLength + 1 ? size : kDwbRecTextLength + 1;
    std::snprintf(path, limit, "%s", m_fullPath.c_str());
    return DWB_OK;
}
