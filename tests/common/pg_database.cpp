#include "common/pg_database.h"

#include <libpq-fe.h>

#include <gtest/gtest.h>

#include <atomic>
#include <cctype>
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
    // The server's notices ("does not exist, skipping") would only clutter the test output.
    PQsetNoticeProcessor(
        c, [](void*, const char*) {}, nullptr);
    return c;
}

bool Run(PGconn* c, const std::string& sql) {
    PGresult* r = PQexec(c, sql.c_str());
    ExecStatusType s = PQresultStatus(r);
    PQclear(r);
    return s == PGRES_COMMAND_OK || s == PGRES_TUPLES_OK;
}

}  // namespace

CPgDatabase::CPgDatabase(const std::string& suite) {
    static std::atomic<int> serial{0};
    if (std::getenv("PGHOST") == nullptr) {
        ADD_FAILURE() << "no test database server: PGHOST is not set (scripts/test starts one)";
    }
    m_name = "qvx_" + suite + "_" + std::to_string(std::random_device()() % 1000000) + "_" +
             std::to_string(serial++);
    // Unquoted names are folded to lower case by the server; the connection must match.
    for (char& c : m_name) {
        c = static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
    }
    PGconn* admin = OpenDb("postgres");
    Run(admin, "DROP DATABASE IF EXISTS " + m_name);
    EXPECT_TRUE(Run(admin, "CREATE DATABASE " + m_name)) << PQerrorMessage(admin);
    PQfinish(admin);
    m_conn = OpenDb(m_name.c_str());
}

CPgDatabase::~CPgDatabase() {
    PQfinish(m_conn);
    PGconn* admin = OpenDb("postgres");
    Run(admin, "DROP DATABASE IF EXISTS " + m_name + " WITH (FORCE)");
    PQfinish(admin);
}

bool CPgDatabase::Exec(const std::string& sql) {
    return Run(m_conn, sql);
}

std::vector<std::vector<std::string>> CPgDatabase::Query(const std::string& sql) {
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

void CPgDatabase::DropOtherSessions() {
    Exec("SELECT pg_terminate_backend(pid) FROM pg_stat_activity WHERE datname = '" + m_name +
         "' AND pid <> pg_backend_pid()");
}

}  // namespace testkit
