#ifndef QUORVEX_DWB_DB_RESULT_PGSQL_H
#define QUORVEX_DWB_DB_RESULT_PGSQL_H

#include "quorvex/dwb_db_result.h"
#include "quorvex/export.h"

struct pg_result;
class CDwbDbConnect;

// A query result of the PostgreSQL connection: the server's result set and the current row.
class QUORVEX_API CDwbDbResultPgsql : public CDwbDbResult {
public:
    CDwbDbResultPgsql(CDwbDbConnect* connection, ECursorType type);
    ~CDwbDbResultPgsql() override;
    CDwbDbResultPgsql(const CDwbDbResultPgsql&) = delete;
    CDwbDbResultPgsql& operator=(const CDwbDbResultPgsql&) = delete;

private:
    friend class CDwbDbConnectPgsql;
    // Releases the result set, if any; the row goes back before the first.
    void Discard();

    pg_result* m_pResult = nullptr;
    int m_row = -1;
};

#endif  // QUORVEX_DWB_DB_RESULT_PGSQL_H
