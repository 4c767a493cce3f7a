#include "quorvex/dwb_use_record_set.h"

#include "quorvex/dwb_table.h"

CDwbUseRecordSet::CDwbUseRecordSet(CDwbTable* table, CDwbDbResult::ECursorType type)
    : m_pTable(table), m_success(table != nullptr && table->Open(type)) {}

CDwbUseRecordSet::~CDwbUseRecordSet() {
    if (m_pTable != nullptr) {
        m_pTable->Close();
    }
}
