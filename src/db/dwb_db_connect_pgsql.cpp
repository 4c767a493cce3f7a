#include "quorvex/dwb_db_connect_pgsql.h"

#include <libpq-fe.h>

#include <cerrno>
#include <cstdlib>
#include <mutex>
#include <string>

#include "quorvex/dwb_db_result_pgsql.h"

namespace {

CDwbDbResultPgsql* AsPgsql(CDwbDbResult* result) {
    return dynamic_cast<CDwbDbResultPgsql*>(result);
}

}  // namespace

void CDwbDbConnectPgsql::NoteFailure() {
    // A server that went away leaves the handle in a bad state: from then on the connection
    // reports itself as not connected, so callers can tell a lost link from a bad statement.
    if (m_pConn != nullptr && PQstatus(m_pConn) == CONNECTION_BAD) {
        m_connected = false;
    }
}

CDwbDbConnectPgsql::CDwbDbConnectPgsql() {
    m_type = kConnectionPostgreSql;
}

CDwbDbConnectPgsql::~CDwbDbConnectPgsql() {
    Disconnect();
}

bool CDwbDbConnectPgsql::Connect(const char* database, const char* user, const char* password) {
    m_connected = false;
    Disconnect();
    m_pConn = PQsetdbLogin(nullptr, nullptr, nullptr, nullptr, database, user, password);
    if (m_pConn == nullptr || PQstatus(m_pConn) != CONNECTION_OK) {
        Disconnect();
        return false;
    }
    m_connected = true;
    return true;
}

bool CDwbDbConnectPgsql::Disconnect() {
    if (m_pConn != nullptr) {
        PQfinish(m_pConn);
    }
    m_pConn = nullptr;
    m_connected = false;
    return true;
}

bool CDwbDbConnectPgsql::RunCommand(const char* sql) {
    if (m_pConn == nullptr) {
        return false;
    }
    std::lock_guard<CDwbLock> guard(m_lock);
    PGresult* res = PQexec(m_pConn, sql);
    bool ok = res != nullptr && PQresultStatus(res) == PGRES_COMMAND_OK;
    PQclear(res);
    if (!ok) {
        NoteFailure();
    }
    return ok;
}

bool CDwbDbConnectPgsql::Begin() {
    return RunCommand("BEGIN");
}
bool CDwbDbConnectPgsql::Rollback() {
    return RunCommand("ROLLBACK");
}
bool CDwbDbConnectPgsql::Commit() {
    return RunCommand("COMMIT");
}

bool CDwbDbConnectPgsql::ExecuteSql(const char* sql, CDwbDbResult* result) {
    CDwbDbResultPgsql* res = AsPgsql(result);
    if (res == nullptr || sql == nullptr || m_pConn == nullptr) {
        return false;
    }
    res->Discard();
    res->ClearColumns();
    PGresult* pg = nullptr;
    {
        std::lock_guard<CDwbLock> guard(m_lock);
        pg = PQexec(m_pConn, sql);
    }
    if (pg == nullptr) {
        NoteFailure();
        return false;
    }
    switch (PQresultStatus(pg)) {
        case PGRES_COMMAND_OK:
            PQclear(pg);
            return true;
        case PGRES_TUPLES_OK:
            res->m_pResult = pg;
            return true;
        default:
            PQclear(pg);
            NoteFailure();
            return false;
    }
}

bool CDwbDbConnectPgsql::MoveNext(CDwbDbResult* result) {
    CDwbDbResultPgsql* res = AsPgsql(result);
    if (res == nullptr) {
        return false;
    }
    if (res->m_pResult == nullptr) {
        res->ClearColumns();
        return false;
    }
    const int rows = PQntuples(res->m_pResult);
    // Stay one past the end so that further calls keep failing.
    if (res->m_row < rows) {
        ++res->m_row;
    }
    if (res->m_row < 0 || res->m_row >= rows) {
        res->ClearColumns();
        return false;
    }
    const int fields = PQnfields(res->m_pResult);
    res->ResizeColumns(fields);
    for (int c = 0; c < fields; ++c) {
        res->AssignColumn(c, PQgetvalue(res->m_pResult, res->m_row, c));
    }
    return res->GetColumnCount() == fields;
}

bool CDwbDbConnectPgsql::MoveLast(CDwbDbResult* result) {
    CDwbDbResultPgsql* res = AsPgsql(result);
    if (res == nullptr || res->m_pResult == nullptr) {
        return false;
    }
    res->m_row = PQntuples(res->m_pResult) - 2;
    return MoveNext(result);
}

bool CDwbDbConnectPgsql::MoveFirst(CDwbDbResult* result) {
    CDwbDbResultPgsql* res = AsPgsql(result);
    if (res == nullptr) {
        return false;
    }
    res->m_row = -1;
    return MoveNext(result);
}

int CDwbDbConnectPgsql::GetRowCount(CDwbDbResult* result) {
    CDwbDbResultPgsql* res = AsPgsql(result);
    if (res == nullptr || res->m_pResult == nullptr) {
        return 0;
    }
    const int rows = PQntuples(res->m_pResult);
    if (rows > 0) {
        MoveFirst(result);
    }
    return rows;
}

int CDwbDbConnectPgsql::CountRemainingRows(CDwbDbResult* result) {
    int n = 0;
    while (MoveNext(result)) {
        ++n;
    }
    return n;
}

long CDwbDbConnectPgsql::GetLastID(CDwbDbResult* result, const char* tableName) {
    CDwbDbResultPgsql* res = AsPgsql(result);
    if (res == nullptr || tableName == nullptr || m_pConn == nullptr) {
        return 0;
    }
    const std::string sql =
        std::string("SELECT \"ID\" FROM ") + tableName + " ORDER BY \"ID\" DESC LIMIT 1";
    res->Discard();
    PGresult* pg = nullptr;
    {
        std::lock_guard<CDwbLock> guard(m_lock);
        pg = PQexec(m_pConn, sql.c_str());
    }
    long id = 0;
    if (pg != nullptr && PQresultStatus(pg) == PGRES_TUPLES_OK) {
        res->m_pResult = pg;
        pg = nullptr;
        if (MoveFirst(result)) {
            const std::string& text = res->GetValue(0);
            char* end = nullptr;
            errno = 0;
            long value = std::strtol(text.c_str(), &end, 10);
            if (end != text.c_str() && errno == 0) {
                id = value;
            }
        }
    }
    PQclear(pg);
    res->Discard();
    return id;
}

CDwbDbResult* CDwbDbConnectPgsql::CreateResult(CDwbDbResult::ECursorType type) {
    return new (std::nothrow) CDwbDbResultPgsql(this, type);
}
