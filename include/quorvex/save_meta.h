#ifndef QUORVEX_SAVE_META_H
#define QUORVEX_SAVE_META_H

#include <cstdint>
#include <vector>

#include "quorvex/amf_settings.h"
#include "quorvex/dwb_types.h"
#include "quorvex/export.h"

class CDwbDb;
class CDwbTableFilter;
class CDwbTableRecording;
class CDwbTableStorageLocation;
class CDwbLock;
class CDwbLog;
struct SFilterTable;

// One filter of a package.
struct SDwbFilter {
    int32_t FilterNo;
    bool Enable;
    char FilterName[kDwbSetTextLength + 1];
    SDwbAmfFilter Condition;
};

// One non-detection mask of a package.
struct SDwbMaskArea {
    int32_t FilterNo;
    bool Enable;
    char Name[kDwbSetTextLength + 1];
    SDwbAmfNonDetectionArea Area;
};

// The combination filter of a package.
struct SDwbCombo {
    int32_t FilterNo;
    char Name[kDwbSetTextLength + 1];
    SDwbAmfComboFilter Combo;
};

// A whole package as read back.
struct SDwbPackageInfo {
    int32_t FilterCount;
    int32_t MaskCount;
    int32_t ComboCount;  // 0 or 1
    SDwbFilterPack Pack;
    SDwbFilter Filters[kDwbMaxFilters];
    SDwbMaskArea Masks[kDwbMaxMasks];
    SDwbCombo Combo;
};

// One entry of a package list.
struct SDwbFilterPackList {
    int32_t PackNo;
    char PackName[kDwbSetTextLength + 1];
    int32_t ZelPinNo;
    int32_t DetectionType;
};

// The library's one entry into the database: the recording catalogue and the stored analytics
// packages. Every member runs under the object's lock, so recording writers, players and the
// host may share one object.
class QUORVEX_API CSaveMeta {
public:
    CSaveMeta();
    virtual ~CSaveMeta();
    // The object owns its database and tables; a copy would free them twice.
    CSaveMeta(const CSaveMeta&) = delete;
    CSaveMeta& operator=(const CSaveMeta&) = delete;

    int Connect(const char* database, const char* user, const char* password);
    int Disconnect();
    // Interval at which a running recording's end time is rewritten; list searches for the
    // present moment look back by it once.
    void SetUpdateDatabaseTime(long seconds);

    // Recording catalogue.
    int AddRecItem(SDwbRecItem& item);
    int UpdateRecItem(const SDwbRecItem& item, int mask);
    int DelRecItem(long deviceID, long storageLocationID, char* subDirectory, char* fileName);
    // -1 and null mean "any". On DWB_OK the caller owns *list (ClearRecItemList).
    int GetRecItemList(long deviceID, long storageLocationID, char* subDirectory, long time,
                       long time2, bool descending, void** list);
    int GetRecItemListStartEnd(long deviceID, long storageLocationID, char* subDirectory,
                               long start, long end, bool descending, void** list);
    // Hands out the list from its end, that is in the reverse of the search order.
    bool GetNext(void* list, SDwbRecItem& item);
    void ClearRecItemList(void* list);
    int GetOldestRecItem(long storageLocationID, SDwbRecItem& item);
    // Copies at most size - 1 bytes (and at most 1020 characters) and terminates.
    int GetStorageLocationPath(long storageLocationID, char* path, unsigned int size);

    // Packages.
    int AddPackage(int camera, const SDwbFilterPack& pack);
    int AddPackage(int camera, const SDwbFilterPack& pack, const SDwbFilter& filter);
    int UpdatePackage(int camera, const SDwbFilterPack& pack);
    int DelPackage(int camera, int packNo);
    int GetPackage(int camera, SDwbFilterPack& pack);
    int GetPackage(int camera, int packNo, SDwbPackageInfo& info);
    // Returns the number of entries (at most maxCount), or a negative code.
    int GetPackageList(int camera, SDwbFilterPackList* out, int maxCount, int start);

    // Filters, masks and the combination filter of a package.
    int AddFilter(int camera, int packNo, const SDwbFilter& filter);
    int AddMask(int camera, int packNo, const SDwbMaskArea& mask);
    int AddCombo(int camera, int packNo, const SDwbCombo& combo);
    int UpdateFilter(int camera, int packNo, const SDwbFilter& filter);
    int UpdateMask(int camera, int packNo, const SDwbMaskArea& mask);
    int UpdateCombo(int camera, int packNo, const SDwbCombo& combo);
    int DelFilter(int camera, int packNo, int filterNo);
    int DelMask(int camera, int packNo, int filterNo);
    int DelCombo(int camera, int packNo, int filterNo);
    // The record's FilterNo names the row to read.
    int GetFilter(int camera, int packNo, SDwbFilter& filter);
    int GetMask(int camera, int packNo, SDwbMaskArea& mask);
    int GetCombo(int camera, int packNo, SDwbCombo& combo);
    // Return the number of entries (at most maxCount), or a negative code.
    int GetFilterList(int camera, int packNo, SDwbSetList* out, int maxCount, int start);
    int GetMaskList(int camera, int packNo, SDwbSetList* out, int maxCount, int start);
    int GetComboList(int camera, int packNo, SDwbSetList* out, int maxCount, int start);

    // Sends the trace texts of every member to a debug log file from now on (appending).
    bool OpenDebugLog(const char* path);
    // Trace hook: written to the debug log when one is open, discarded otherwise.
    void Log(const char* format, ...) __attribute__((format(printf, 2, 3)));

protected:
    static const char* ErrorCodeString(int code);

private:
    int RefuseExisting(int camera, int packNo, int filterNo, int kind);
    int AddPackageRow(int camera, const SDwbFilterPack& pack, const SDwbFilter* filter);
    int CheckPackageRoom(int camera, int packNo, int kind, std::vector<SFilterTable>& rows);
    int AddKindRow(int camera, int packNo, int kind, const SFilterTable& first, SFilterTable& row);
    int CheckComboFilters(const std::vector<SFilterTable>& rows, const SDwbAmfComboFilter& combo,
                          const char* tag);
    int GetList(int camera, int packNo, int kind, SDwbSetList* out, int maxCount, int start,
                const char* name);
    int DelRow(int camera, int packNo, int filterNo, int kind, const char* name);
    void TraceTime(const char* member, long deviceID, long storageLocationID,
                   const char* subDirectory, long time);

    CDwbDb* m_pDb;
    CDwbTableFilter* m_pTableFilter;
    CDwbTableRecording* m_pTableRecording;
    CDwbTableStorageLocation* m_pTableStorageLocation;
    CDwbLock* m_pLock;
    CDwbLog* m_pLog;
    bool m_connected;
    long m_updateDatabaseTime;
};

#endif  // QUORVEX_SAVE_META_H
