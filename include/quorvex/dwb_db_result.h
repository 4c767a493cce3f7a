#ifndef QUORVEX_DWB_DB_RESULT_H
#define QUORVEX_DWB_DB_RESULT_H

#include <string>
#include <vector>

#include "quorvex/export.h"

// The values of the current row of a query, as texts.
class QUORVEX_API CDwbDbResult {
public:
    // What a cursor is used for: 0 creating or upgrading a table, 1 everything else.
    enum ECursorType { kCursorSchema = 0, kCursorDefault = 1 };

    class QUORVEX_API CColumn {
    public:
        explicit CColumn(const char* value) : m_value(value != nullptr ? value : "") {}
        virtual ~CColumn() = default;
        const std::string& Value() const { return m_value; }
        void Assign(const char* value) { m_value.assign(value != nullptr ? value : ""); }

    private:
        std::string m_value;
    };

    CDwbDbResult() = default;
    virtual ~CDwbDbResult() = default;

    // Appends one value; returns the number of values now held.
    int AddColumn(const char* value);
    void ClearColumns() { m_columns.clear(); }
    // Room for the values of a row of count columns, then value i of it. The texts of the
    // previous row keep their storage, so walking a large result does not allocate per value.
    void ResizeColumns(int count);
    void AssignColumn(int i, const char* value);
    int GetColumnCount() const { return static_cast<int>(m_columns.size()); }
    // The value of column i of the current row; empty for a bad index.
    const std::string& GetValue(int i) const;

private:
    std::vector<CColumn> m_columns;
};

#endif  // QUORVEX_DWB_DB_RESULT_H
