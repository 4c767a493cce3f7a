#ifndef QUORVEX_DWB_TYPES_H
#define QUORVEX_DWB_TYPES_H

#include <cstdint>

// Records and result codes shared by the database tables and the catalogue CSaveMeta.

// Result codes of every catalogue and settings member. Success is 1.
constexpr int DWB_OK = 1;
constexpr int DWB_ERR_DB_NOT_CONNECT = -1;
constexpr int DWB_ERR_NOT_FOUND = -2;
constexpr int DWB_ERR_ALREADY_EXIST = -3;
constexpr int DWB_ERR_SQL_EXEC = -4;
constexpr int DWB_ERR_NOMORE_ADD_ITEM = -5;
constexpr int DWB_ERR_INVALID_FILTER_NO = -6;
constexpr int DWB_ERR_INVALID_PACKAGE_TYPE = -7;
constexpr int DWB_ERR_INVALID_PARAM = -8;

// Texts of records held in the catalogue: at most this many characters plus the terminator.
constexpr unsigned kDwbRecTextLength = 1020;
// Texts of package records.
constexpr unsigned kDwbPackTextLength = 512;
// Slots of one package.
constexpr int kDwbMaxFilters = 6;
constexpr int kDwbMaxFiltersSmallPack = 3;
constexpr int kDwbMaxMasks = 6;

// One catalogued hour of recording of one camera. Times are seconds since 1970 (UTC); a time
// the database could not supply is -1.
struct SDwbRecItem {
    long DeviceID;
    long StorageLocationID;
    char SubDirectory[kDwbRecTextLength + 1];
    char FileName[kDwbRecTextLength + 1];
    long NumberOfFiles;
    long StartTime;
    long StartTimeAvailable;
    long EndTime;
    long Trigger;
    long Deleted;
    long Archived;
    char FullPath[kDwbRecTextLength + 1];
};

// Bits of the update mask of CSaveMeta::UpdateRecItem.
constexpr int kDwbUpdateEndTime = 0x01;
constexpr int kDwbUpdateTrigger = 0x02;
constexpr int kDwbUpdateNumberOfFiles = 0x04;
constexpr int kDwbUpdateDeleted = 0x08;
constexpr int kDwbUpdateArchived = 0x10;
constexpr int kDwbUpdateStartTimeAvailable = 0x20;

// Texts of package records: at most this many characters plus the terminator.
constexpr unsigned kDwbSetTextLength = 512;

// Attributes of one analytics settings package.
struct SDwbFilterPack {
    int32_t PackNo;
    char PackName[kDwbSetTextLength + 1];
    int32_t PackType;  // 0 or 1
    int32_t ZelPinNo;
    int32_t DetectionType;
};

// One entry of a filter, mask or combination list handed to the host.
struct SDwbSetList {
    int32_t FilterNo;
    char Name[kDwbSetTextLength + 1];
    int32_t DetailType;
};

#endif  // QUORVEX_DWB_TYPES_H
