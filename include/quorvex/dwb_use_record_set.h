#ifndef QUORVEX_DWB_USE_RECORD_SET_H
#define QUORVEX_DWB_USE_RECORD_SET_H

#include "quorvex/dwb_db_result.h"
#include "quorvex/export.h"

class CDwbTable;

// Opens a table's cursor for the length of a block and always closes it again.
class QUORVEX_API CDwbUseRecordSet {
public:
    CDwbUseRecordSet(CDwbTable* table, CDwbDbResult::ECursorType type);
    ~CDwbUseRecordSet();
    CDwbUseRecordSet(const CDwbUseRecordSet&) = delete;
    CDwbUseRecordSet& operator=(const CDwbUseRecordSet&) = delete;

    bool IsSuccessful() const { return m_success; }

private:
    CDwbTable* m_pTable;
    bool m_success;
};

#endif  // QUORVEX_DWB_USE_RECORD_SET_H
