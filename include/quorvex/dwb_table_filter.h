#ifndef QUORVEX_DWB_TABLE_FILTER_H
#define QUORVEX_DWB_TABLE_FILTER_H

#include <string>
#include <vector>

#include "quorvex/dwb_table.h"
#include "quorvex/dwb_types.h"
#include "quorvex/export.h"

// One row of "MetaFilter": a package header, filter, mask or combination filter.
struct SFilterTable {
    int32_t ID = 0;
    int32_t DeviceID = 0;
    int32_t PackNo = 0;
    int32_t FilterNo = 0;
    int32_t ZelPinNo = 0;
    std::string PackName;
    int32_t PackType = 0;
    int32_t DetectionType = 0;
    int32_t FilterType = 0;
    std::string FilterName;
    int32_t DetailType = 0;
    int32_t Enable = 0;
    std::string CombiInfo;
    int32_t NodeNum = 0;
    int32_t Node[8][2] = {};  // (X, Y) pairs
    int32_t ObjMinW = 0;
    int32_t ObjMinH = 0;
    int32_t ObjMaxW = 0;
    int32_t ObjMaxH = 0;
    float ObjMinDvX = 0;
    float ObjMaxDvX = 0;
    float ObjMinDvY = 0;
    float ObjMaxDvY = 0;
    float ObjMinDv = 0;
    float ObjMaxDv = 0;
    std::string EnableDvxy;
    int32_t ObjMinStay = 0;
    int32_t ObjMaxStay = 0;
    int32_t ObjMinCap = 0;
    int32_t ObjMaxCap = 0;
    int32_t ObjDirection = 0;
    int32_t ObjCollosion = 0;
    int32_t AreaIntersect = 0;
    int32_t SparseAlertInterval = 0;
};

// "MetaFilter", the stored analytics settings. Query members return DWB_OK,
// DWB_ERR_DB_NOT_CONNECT, DWB_ERR_NOT_FOUND or DWB_ERR_SQL_EXEC.
class QUORVEX_API CDwbTableFilter : public CDwbTable {
public:
    enum EColumn {
        kID = 0,
        kDeviceID = 1,
        kPackNo = 2,
        kFilterNo = 3,
        kZelPinNo = 4,
        kPackName = 5,
        kPackType = 6,
        kDetectionType = 7,
        kFilterType = 8,
        kFilterName = 9,
        kNodeFirst = 14,
        kSparseAlertInterval = 48,
    };

    explicit CDwbTableFilter(CDwbDb* db);

    // Creates the table when it is missing; always true.
    bool CreateTable() override;

    int IsExistRecord(int deviceID, int packNo, int filterNo, int filterType, bool byType,
                      bool& exists);
    int AddRecord(const SFilterTable& rec);
    int UpdateFilter(const SFilterTable& rec);
    int DeleteRecord(int deviceID, int packNo, int filterNo, int filterType, bool byFilterNo,
                     bool byType);
    int GetRecordList(int deviceID, int packNo, int filterNo, int filterType, bool byDevice,
                      bool byPack, bool byFilterNo, bool byType, std::vector<SFilterTable>& rows);
    // Fills out[start] .. out[min(rows, maxCount) - 1]; returns the number of rows found.
    int GetFilterList(int deviceID, int packNo, int filterType, SDwbSetList* out, int maxCount,
                      int start);
    int UpdatePackage(int deviceID, const SDwbFilterPack& pack);

private:
    static CColumnList Range(int first, int last);

    SFilterTable m_rec;
};

#endif  // QUORVEX_DWB_TABLE_FILTER_H
