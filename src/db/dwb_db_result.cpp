#include "quorvex/dwb_db_result.h"

#include "quorvex/dwb_db_result_pgsql.h"

#include <libpq-fe.h>

int CDwbDbResult::AddColumn(const char* value) {
    m_columns.emplace_back(value);
    return static_cast<int>(m_columns.size());
}

const std::string& CDwbDbResult::GetValue(int i) const {
    static const std::string kEmpty;
    if (i < 0 || i >= static_cast<int>(m_columns.size())) {
        return kEmpty;
    }
    return m_columns[static_cast<size_t>(i)].Value();
}

CDwbDbResultPgsql::CDwbDbResultPgsql(CDwbDbConnect* /*connection*/, ECursorType /*type*/) {}

CDwbDbResultPgsql::~CDwbDbResultPgsql() {
    Discard();
}

void CDwbDbResultPgsql::Discard() {
    if (m_pResult != nullptr) {
        PQclear(m_pResult);
        m_pResult = nullptr;
    }
    m_row = -1;
}
