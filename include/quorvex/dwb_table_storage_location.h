#ifndef QUORVEX_DWB_TABLE_STORAGE_LOCATION_H
#define QUORVEX_DWB_TABLE_STORAGE_LOCATION_H

#include <string>

#include "quorvex/dwb_table.h"
#include "quorvex/export.h"

// "StorageLocation": the directories that recordings live in. The library only reads it.
class QUORVEX_API CDwbTableStorageLocation : public CDwbTable {
public:
    explicit CDwbTableStorageLocation(CDwbDb* db);

    // The "FullPath" of that row into path (at most size - 1 and 1020 characters,
    // terminated); DWB_OK, DWB_ERR_NOT_FOUND, DWB_ERR_SQL_EXEC, DWB_ERR_DB_NOT_CONNECT, or
    // DWB_ERR_INVALID_PARAM for a null or empty buffer.
    int GetStorageLocationPath(long id, char* path, unsigned int size);

private:
    int32_t m_id = 0;
    std::string m_fullPath;
};

#endif  // QUORVEX_DWB_TABLE_STORAGE_LOCATION_H
