#ifndef QUORVEX_DWB_TABLE_RECORDING_H
#define QUORVEX_DWB_TABLE_RECORDING_H

#include <string>
#include <vector>

#include "quorvex/date_time.h"
#include "quorvex/dwb_table.h"
#include "quorvex/dwb_types.h"
#include "quorvex/export.h"

// One row of "MetaRecording".
struct SRecordingTable {
    int32_t ID = 0;
    int32_t DeviceID = 0;
    int32_t StorageLocationID = 0;
    std::string FileName;
    std::string SubDirectory;
    int32_t NumberOfFiles = 0;
    CDateTime StartTime;
    CDateTime StartTimeAvailable;
    CDateTime EndTime;
    int32_t Trigger = 0;
    int32_t Deleted = 0;
    int32_t Archived = 0;
    std::string FullPath;
};

// "MetaRecording", the catalogue of recording files, keyed by (DeviceID, StorageLocationID,
// FileName, SubDirectory). Query members return DWB_OK, DWB_ERR_DB_NOT_CONNECT,
// DWB_ERR_NOT_FOUND or DWB_ERR_SQL_EXEC.
class QUORVEX_API CDwbTableRecording : public CDwbTable {
public:
    enum EColumn {
        kID = 0,
        kDeviceID,
        kStorageLocationID,
        kFileName,
        kSubDirectory,
        kTrigger,
        kStartTime,
        kStartTimeAvailable,
        kEndTime,
        kNumberOfFiles,
        kDeleted,
        kArchived,
        kFullPath,
    };

    explicit CDwbTableRecording(CDwbDb* db);

    // Creates the table when it is missing, adds and fills "FullPath" on a table from before
    // that column, and creates the indexes.
    bool CreateTable() override;
    bool CreateIndex();

    int IsExistRecord(const SRecordingTable& rec, bool& exists);
    int AddRecItem(const SRecordingTable& rec);
    int UpdateRecItem(const SRecordingTable& rec, int mask);
    int DelRecItem(SRecordingTable& rec);
    // Times are seconds since 1970 (UTC), -1 for none; -1 and null select any camera,
    // storage location or directory. *list receives a list that the caller frees with
    // ClearRecItemList.
    int GetRecItem(long deviceID, long storageLocationID, char* subDirectory, long time, long time2,
                   bool descending, void** list);
    int GetRecItemStartEnd(long deviceID, long storageLocationID, char* subDirectory, long start,
                           long end, bool descending, void** list);
    // Hands out the list from its end, one item per call.
    static bool GetNext(void* list, SDwbRecItem& item);
    static void ClearRecItemList(void* list);
    int GetOldestRecItem(long storageLocationID, SDwbRecItem& item);

    // Conversions between the host's record and the row.
    static void ToRow(const SDwbRecItem& item, SRecordingTable& row);
    static void FromRow(const SRecordingTable& row, SDwbRecItem& item);

    std::string GetWhereString(long deviceID, long storageLocationID, const char* subDirectory,
                               long time, long time2, bool descending);
    std::string GetWhereStringStartEnd(long deviceID, long storageLocationID,
                                       const char* subDirectory, long start, long end,
                                       bool descending);

private:
    void AppendKeyTerms(long deviceID, long storageLocationID, const char* subDirectory,
                        std::vector<std::string>& terms);
    int QueryList(const std::string& sql, void** list);
    void SetKey(const SRecordingTable& rec);
    static const CColumnList& KeyColumns();

    SRecordingTable m_rec;
};

#endif  // QUORVEX_DWB_TABLE_RECORDING_H
