#include "quorvex/dwb_db_result.h"

#include "quorvex/dwb_db_result_pgsql.h"

#include <libpq-fe.h>

#include <cstddef>

int CDwbDbResult::AddColumn(const char* value) {
    m_columns.emplace_back(value);
    return static_cast<int>(m_columns.size());
}

void CDwbDbResult::ResizeColumns(int count) {
    const size_t n = count > 0 ? static_cast<size_t>(count) : 0;
    if (m_columns.size() > n) {
        m_columns.erase(m_columns.begin() + static_cast<std::ptrdiff_t>(n), m_columns.end());
    }
    while (m_columns.size() < n) {
        m_columns.emplace_back("");
    }
}

void CDwbDbResult::AssignColumn(int i, const char* value) {
    if (i >= 0 && i < static_cast<int>(m_columns.size())) {
        m_columns[static_cast<size_t>(i)].Assign(value);
    }
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
