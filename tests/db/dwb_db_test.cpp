#include <gtest/gtest.h>

#include <cstdlib>
#include <memory>
#include <regex>
#include <string>
#include <thread>

#include "common/pg_database.h"
#include "common/temp_dir.h"
#include "quorvex/dwb_db.h"
#include "quorvex/dwb_db_connect.h"
#include "quorvex/dwb_lock.h"
#include "quorvex/dwb_log.h"

namespace {

class DwbDb : public ::testing::Test {
protected:
    void SetUp() override {
        ASSERT_TRUE(m_pg.Exec("CREATE TABLE \"T\" (\"ID\" SERIAL, \"Name\" VARCHAR(20))"));
        ASSERT_TRUE(m_db.Connect(kConnectionPostgreSql, CDwbDb::kSqlPostgreSql, m_pg.Name(),
                                 nullptr, nullptr));
        m_result.reset(m_db.GetConnection()->CreateResult(CDwbDbResult::kCursorDefault));
        ASSERT_NE(nullptr, m_result);
    }

    testkit::CPgDatabase m_pg{"dwb_db"};
    CDwbDb m_db;
    std::unique_ptr<CDwbDbResult> m_result;
};

}  // namespace

TEST_F(DwbDb, CursorRulesOfResults) {
    CDwbDbResult* r = m_result.get();
    EXPECT_EQ(0, m_db.GetLastID(r, "\"T\""));  // empty table
    // A statement without rows leaves nothing to read.
    ASSERT_TRUE(m_db.ExecuteSql("INSERT INTO \"T\" (\"Name\") VALUES ('a'),('b'),('c')", r));
    EXPECT_FALSE(m_db.MoveNext(r));
    EXPECT_EQ(3, m_db.GetLastID(r, "\"T\""));

    ASSERT_TRUE(m_db.ExecuteSql("SELECT \"Name\" FROM \"T\" ORDER BY \"ID\"", r));
    EXPECT_EQ(3, m_db.GetRowCount(r));  // and stands on row 0
    EXPECT_EQ("a", r->GetValue(0));
    ASSERT_TRUE(m_db.MoveNext(r));
    EXPECT_EQ("b", r->GetValue(0));
    ASSERT_TRUE(m_db.MoveLast(r));
    EXPECT_EQ("c", r->GetValue(0));
    EXPECT_FALSE(m_db.MoveNext(r));
    EXPECT_FALSE(m_db.MoveNext(r));
    ASSERT_TRUE(m_db.MoveFirst(r));
    EXPECT_EQ(2, m_db.CountRemainingRows(r));

    ASSERT_TRUE(m_db.ExecuteSql("SELECT \"Name\" FROM \"T\" WHERE \"ID\" = 2", r));
    ASSERT_TRUE(m_db.MoveLast(r));
    EXPECT_EQ("b", r->GetValue(0));

    ASSERT_TRUE(m_db.ExecuteSql("SELECT \"Name\" FROM \"T\" WHERE \"ID\" > 99", r));
    EXPECT_EQ(0, m_db.GetRowCount(r));
    EXPECT_FALSE(m_db.MoveLast(r));
    EXPECT_FALSE(m_db.MoveNext(r));

    // A rejected statement leaves no result behind.
    EXPECT_FALSE(m_db.ExecuteSql("SELECT * FROM \"Missing\"", r));
    EXPECT_FALSE(m_db.MoveFirst(r));
    EXPECT_EQ("", r->GetValue(5));
    EXPECT_FALSE(m_db.ExecuteSql("SELECT 1", nullptr));
}

TEST_F(DwbDb, ConnectReplacesTheConnectionAndRefusesUnknownKinds) {
    EXPECT_TRUE(m_db.IsConnected());
    EXPECT_FALSE(
        m_db.Connect(kConnectionNone, CDwbDb::kSqlPostgreSql, m_pg.Name(), nullptr, nullptr));
    EXPECT_FALSE(m_db.IsConnected());
    EXPECT_EQ(nullptr, m_db.GetConnection());
    // Forwarders without a connection fail quietly.
    EXPECT_FALSE(m_db.ExecuteSql("SELECT 1", m_result.get()));
    EXPECT_EQ(0, m_db.GetRowCount(m_result.get()));
    EXPECT_FALSE(m_db.Connect(kConnectionPostgreSql, CDwbDb::kSqlPostgreSql, "qvx_no_such_database",
                              nullptr, nullptr));
    EXPECT_FALSE(m_db.IsConnected());
}

TEST_F(DwbDb, TransactionsOnTheConnection) {
    CDwbDbConnect* c = m_db.GetConnection();
    ASSERT_TRUE(c->Begin());
    ASSERT_TRUE(m_db.ExecuteSql("INSERT INTO \"T\" (\"Name\") VALUES ('x')", m_result.get()));
    ASSERT_TRUE(c->Rollback());
    EXPECT_EQ(0, m_db.GetLastID(m_result.get(), "\"T\""));
    ASSERT_TRUE(c->Begin());
    ASSERT_TRUE(m_db.ExecuteSql("INSERT INTO \"T\" (\"Name\") VALUES ('y')", m_result.get()));
    ASSERT_TRUE(c->Commit());
    EXPECT_EQ(2, m_db.GetLastID(m_result.get(), "\"T\""));
}

TEST(DwbDbNoServer, DeadPortFailsWithoutCrash) {
    const char* old = std::getenv("PGPORT");
    std::string saved = old != nullptr ? old : "";
    const char* oldHost = std::getenv("PGHOST");
    std::string savedHost = oldHost != nullptr ? oldHost : "";
    setenv("PGHOST", "127.0.0.1", 1);
    setenv("PGPORT", "1", 1);
    CDwbDb db;
    EXPECT_FALSE(
        db.Connect(kConnectionPostgreSql, CDwbDb::kSqlPostgreSql, "postgres", nullptr, nullptr));
    EXPECT_FALSE(db.IsConnected());
    if (old != nullptr) {
        setenv("PGPORT", saved.c_str(), 1);
    } else {
        unsetenv("PGPORT");
    }
    if (oldHost != nullptr) {
        setenv("PGHOST", savedHost.c_str(), 1);
    } else {
        unsetenv("PGHOST");
    }
}

TEST(DwbLock, IsReentrantAndCopiesStartUnheld) {
    CDwbLock lock;
    EXPECT_FALSE(lock.IsInitialized());
    lock.Lock();
    lock.Lock();
    EXPECT_TRUE(lock.IsInitialized());
    CDwbLock copy(lock);
    EXPECT_FALSE(copy.IsInitialized());
    bool taken = false;
    std::thread other([&] {
        copy.Lock();  // would block if the copy shared the held lock
        taken = true;
        copy.Release();
    });
    other.join();
    EXPECT_TRUE(taken);
    lock.Release();
    lock.Release();
}

TEST(DwbLog, WritesPrefixedLines) {
    testkit::CTempDir dir;
    CDwbLog log;
    log.Print("dropped");  // no file yet
    ASSERT_TRUE(log.Open(dir.File("db.log").c_str()));
    log.Print("first");
    log.Print(nullptr);
    log.Close();
    log.Print("after close");
    std::string text = testkit::ReadFile(dir.File("db.log"));
    EXPECT_TRUE(std::regex_match(text, std::regex("\\d{2}/\\d{2}/\\d{2}-\\d{2}:\\d{2}:\\d{2} "
                                                  "\\d{6} first\\n"
                                                  "\\d{2}/\\d{2}/\\d{2}-\\d{2}:\\d{2}:\\d{2} "
                                                  "\\d{6} \\n")))
        << text;
    EXPECT_FALSE(log.Open(dir.File("missing/db.log").c_str()));
}
