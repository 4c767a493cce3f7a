#ifndef QUORVEX_DWB_DB_CONNECT_PGSQL_H
#define QUORVEX_DWB_DB_CONNECT_PGSQL_H

#include "quorvex/dwb_db_connect.h"
#include "quorvex/dwb_lock.h"
#include "quorvex/export.h"

struct pg_conn;

// The PostgreSQL connection. Host, port and the like come from libpq's defaults and the
// PG* environment variables; every statement on the connection is serialised by its lock.
// A failure is reported as false, 0 rows or ID 0: no error text is kept.
class QUORVEX_API CDwbDbConnectPgsql : public CDwbDbConnect {
public:
    CDwbDbConnectPgsql();
    ~CDwbDbConnectPgsql() override;

    bool Connect(const char* database, const char* user, const char* password) override;
    bool Disconnect() override;
    bool Begin() override;
    bool Rollback() override;
    bool Commit() override;
    bool ExecuteSql(const char* sql, CDwbDbResult* result) override;
    bool MoveNext(CDwbDbResult* result) override;
    bool MoveLast(CDwbDbResult* result) override;
    bool MoveFirst(CDwbDbResult* result) override;
    int GetRowCount(CDwbDbResult* result) override;
    int CountRemainingRows(CDwbDbResult* result) override;
    long GetLastID(CDwbDbResult* result, const char* tableName) override;
    CDwbDbResult* CreateResult(CDwbDbResult::ECursorType type) override;

private:
    bool RunCommand(const char* sql);
    void NoteFailure();

    pg_conn* m_pConn = nullptr;
    CDwbLock m_lock{true, 4000};
};

#endif  // QUORVEX_DWB_DB_CONNECT_PGSQL_H
