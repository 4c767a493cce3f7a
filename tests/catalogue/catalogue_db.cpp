#include "catalogue_db.h"

#include <gtest/gtest.h>

#include <atomic>
#include <cstdlib>
#include <random>

namespace testkit {

namespace {

PGconn* OpenDb(const char* name) {
    PGconn* c = PQsetdbLogin(nullptr, nullptr, nullptr, nullptr, name, nullptr, nullptr);
    if (PQstatus(c) != CONNECTION_OK) {
        ADD_FAILURE() << "cannot reach the test server (PGHOST/PGPORT/PGUSER): "
                      << PQerrorMessage(c);
    }
    return c;
}

bool Run(PGconn* c, const std::string& sql) {
    PGresult* r = PQexec(c, sql.c_str());
    ExecStatusType s = PQresultStatus(r);
    PQclear(r);
    return s == PGRES_COMMAND_OK || s == PGRES_TUPLES_OK;
}

}  // namespace

CCatalogueDb::CCatalogueDb(const std::string& suite) {
    static std::atomic<int> serial{0};
    m_name = "qvx_cat_" + suite + "_" + std::to_string(std::random_device()() % 1000000) + "_" +
             std::to_string(serial++);
    PGconn* admin = OpenDb("postgres");
    Run(admin, "DROP DATABASE IF EXISTS " + m_name);
    EXPECT_TRUE(Run(admin, "CREATE DATABASE " + m_name)) << PQerrorMessage(admin);
    PQfinish(admin);
    m_conn = OpenDb(m_name.c_str());
    EXPECT_TRUE(
        Exec("CREATE TABLE \"StorageLocation\" (\"ID\" SERIAL, \"FullPath\" VARCHAR(255))"));
}

CCatalogueDb::~CCatalogueDb() {
    PQfinish(m_conn);
    PGconn* admin = OpenDb("postgres");
    Run(admin, "DROP DATABASE IF EXISTS " + m_name + " WITH (FORCE)");
    PQfinish(admin);
}

bool CCatalogueDb::Exec(const std::string& sql) {
    return Run(m_conn, sql);
}

std::vector<std::vector<std::string>> CCatalogueDb::Query(const std::string& sql) {
    std::vector<std::vector<std::string>> rows;
    PGresult* r = PQexec(m_conn, sql.c_str());
    if (PQresultStatus(r) == PGRES_TUPLES_OK) {
        for (int i = 0; i < PQntuples(r); ++i) {
            std::vector<std::string> row;
            for (int j = 0; j < PQnfields(r); ++j) {
                row.emplace_back(PQgetvalue(r, i, j));
            }
            rows.push_back(std::move(row));
        }
    } else {
        ADD_FAILURE() << sql << ": " << PQerrorMessage(m_conn);
    }
    PQclear(r);
    return rows;
}

void CCatalogueDb::DropOtherSessions() {
    Exec("SELECT pg_terminate_backend(pid) FROM pg_stat_activity WHERE datname = '" + m_name +
         "' AND pid <> pg_backend_pid()");
}

long CCatalogueDb::AddStorageLocation(const std::string& path) {
    std::string quoted;
    for (char ch : path) {
        quoted += ch;
        if (ch == '\'') {
            quoted += '\'';
        }
    }
    auto rows = Query("INSERT INTO \"StorageLocation\" (\"FullPath\") VALUES ('" + quoted +
                      "') RETURNING \"ID\"");
    return rows.empty() ? -1 : std::atol(rows[0][0].c_str());
}

}  // namespace testkit
