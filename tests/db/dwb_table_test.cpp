#include <gtest/gtest.h>

#include <cstdlib>
#include <cstring>
#include <string>

#include "common/pg_database.h"
#include "platform/local_time.h"
#include "quorvex/dwb_db.h"
#include "quorvex/dwb_table.h"
#include "quorvex/dwb_table_filter.h"
#include "quorvex/dwb_table_recording.h"
#include "quorvex/dwb_table_storage_location.h"
#include "quorvex/dwb_use_record_set.h"

namespace {

// A small table of every column type, to look at the statements the base class builds.
class CSampleTable : public CDwbTable {
public:
    explicit CSampleTable(CDwbDb* db) : CDwbTable(db) {
        SetTableName("Sample");
        AddColumn("ID", kColumnIdentity, 4, &id);
        AddColumn("Small", kColumnInteger, 1, &small);
        AddColumn("Flag", kColumnBool, 0, &flag);
        AddColumn("Text", kColumnText, 64, &text);
        AddColumn("At", kColumnDateTime, 0, &at);
        AddColumn("Span", kColumnTime, 0, &span);
        AddColumn("Ratio", kColumnFloat, 4, &ratio);
    }
    using CDwbTable::FormatValue;

    int32_t id = 0;
    int8_t small = 0;
    bool flag = false;
    std::string text;
    CDateTime at;
    CTimeSpan span;
    float ratio = 0;
};

class ScopedTimeZone {
public:
    explicit ScopedTimeZone(const char* zone) {
        const char* old = std::getenv("TZ");
        m_had = old != nullptr;
        m_old = m_had ? old : "";
        setenv("TZ", zone, 1);
        plat::ReloadTimeZone();
    }
    ~ScopedTimeZone() {
        m_had ? setenv("TZ", m_old.c_str(), 1) : unsetenv("TZ");
        plat::ReloadTimeZone();
    }

private:
    bool m_had;
    std::string m_old;
};

class DwbTables : public ::testing::Test {
protected:
    void SetUp() override {
        CDwbTable::SetDoUseUTC(true);
        ASSERT_TRUE(m_db.Connect(kConnectionPostgreSql, CDwbDb::kSqlPostgreSql, m_pg.Name(),
                                 nullptr, nullptr));
    }
    void TearDown() override { CDwbTable::SetSqlType(CDwbDb::kSqlPostgreSql); }

    static SRecordingTable Rec(const char* file, long start, long end) {
        SRecordingTable r;
        r.DeviceID = 7;
        r.StorageLocationID = 1;
        r.FileName = file;
        r.SubDirectory = "cam7/2026";
        r.NumberOfFiles = 1;
        r.StartTime = CDateTime::FromTimeT(start);
        r.StartTimeAvailable = CDateTime::FromTimeT(start);
        r.EndTime = CDateTime::FromTimeT(end);
        return r;
    }

    testkit::CPgDatabase m_pg{"dwb_tables"};
    CDwbDb m_db;
};

constexpr long kT0 = 1767225600;  // 2026-01-01 00:00:00 UTC

}  // namespace

TEST(DwbTableText, EscapingBothWays) {
    EXPECT_EQ("O''Brien", CDwbTable::EscapeForPostgreSQL("O'Brien", true));
    EXPECT_EQ("C:\\\\rec\\\\a", CDwbTable::EscapeForPostgreSQL("C:\\rec\\a", true));
    EXPECT_EQ("plain", CDwbTable::EscapeForPostgreSQL("plain", true));
    EXPECT_EQ("", CDwbTable::EscapeForPostgreSQL(nullptr, true));
    EXPECT_EQ("O'Brien", CDwbTable::EscapeForPostgreSQL("O''Brien", false));
    EXPECT_EQ("\\", CDwbTable::EscapeForPostgreSQL("'\\", false));
}

TEST(DwbTableText, StatementsPerDialect) {
    CDwbDb db;
    CSampleTable pg(&db);
    pg.flag = true;
    pg.small = -3;
    pg.text = "it's";
    pg.ratio = 0.25f;
    EXPECT_EQ("UPDATE \"Sample\" SET \"Flag\"=true,\"Small\"=-3 WHERE \"Text\"=E'it''s'",
              pg.BuildUpdate({2, 1}, {3}));
    EXPECT_EQ("DELETE FROM \"Sample\"", pg.BuildDelete({}));
    EXPECT_EQ("SELECT * FROM \"Sample\" WHERE \"Ratio\"=0.25 AND \"ID\"=0",
              pg.BuildSelect({6, 99, 0}, {}));
    EXPECT_EQ(
        "CREATE TABLE \"Sample\" (\"ID\" SERIAL,\"Small\" SMALLINT,\"Flag\" BOOLEAN,\"Text\" "
        "VARCHAR(64),\"At\" TIMESTAMP(4) without time zone,\"Span\" TIME(4) without time "
        "zone,\"Ratio\" FLOAT)",
        pg.BuildCreateTable());

    CDwbTable::SetSqlType(CDwbDb::kSqlMySql);
    CSampleTable my(&db);
    my.flag = true;
    EXPECT_EQ("UPDATE Sample SET `Flag`=1 WHERE `ID`=0", my.BuildUpdate({2}, {0}));
    EXPECT_EQ(0u, my.BuildCreateTable().find(
                      "CREATE TABLE IF NOT EXISTS `Sample` (\"ID\" INTEGER AUTO_INCREMENT PRIMARY "
                      "KEY,\"Small\" TINYINT,\"Flag\" BIT,"));
    CDwbTable::SetSqlType(CDwbDb::kSqlAccess);
    CSampleTable access(&db);
    EXPECT_EQ("DELETE * FROM Sample WHERE `ID`=0", access.BuildDelete({0}));
    EXPECT_NE(std::string::npos, access.BuildCreateTable().find("\"Text\" TEXT(64)"));
    EXPECT_EQ("#1601-01-01 00:00:00#", access.FormatValue(4));
    CDwbTable::SetSqlType(CDwbDb::kSqlPostgreSql);
}

TEST_F(DwbTables, UtcStorageInAZoneNineHoursAhead) {
    ScopedTimeZone tokyo("Asia/Tokyo");
    CSampleTable t(&m_db);
    ASSERT_TRUE(t.CreateTable());
    t.at = CDateTime::FromComponents(2026, 1, 1, 9, 0, 0, 0, 0, false);
    t.span = CTimeSpan::FromComponents(0, 0, 25, 2, 3, 0);
    t.text = "x";
    EXPECT_EQ("'2026-01-01 00:00:00'", t.FormatValue(4));
    {
        CDwbUseRecordSet rs(&t, CDwbDbResult::kCursorDefault);
        ASSERT_TRUE(rs.IsSuccessful());
        ASSERT_TRUE(t.Insert({1, 2, 3, 4, 5, 6}));
        EXPECT_EQ(1, t.GetLastID());
    }
    // A stored fraction of a second reads back as the whole second.
    ASSERT_TRUE(m_pg.Exec("UPDATE \"Sample\" SET \"At\" = \"At\" + interval '0.1234 second'"));
    CDateTime expected = t.at;
    t.at = CDateTime();
    t.span = CTimeSpan();
    CDwbUseRecordSet rs(&t, CDwbDbResult::kCursorDefault);
    ASSERT_TRUE(t.Select({}, {}));
    ASSERT_TRUE(t.MoveNext());
    EXPECT_EQ(expected, t.at);
    EXPECT_EQ(CTimeSpan::FromComponents(0, 0, 1, 2, 3, 0), t.span);
    EXPECT_EQ("2026-01-01 00:00:00.1234", m_pg.Query("SELECT \"At\" FROM \"Sample\"")[0][0]);
}

TEST_F(DwbTables, MalformedRowValuesReadAsZero) {
    ASSERT_TRUE(m_pg.Exec(
        "CREATE TABLE \"Sample\" (\"ID\" TEXT, \"Small\" TEXT, \"Flag\" TEXT, \"Text\" TEXT, "
        "\"At\" TEXT, \"Span\" TEXT, \"Ratio\" TEXT)"));
    ASSERT_TRUE(
        m_pg.Exec("INSERT INTO \"Sample\" VALUES ('x', '300', 'maybe', NULL, "
                  "'2026-99', '25', 'abc')"));
    CSampleTable t(&m_db);
    t.small = 5;
    t.at = CDateTime::Now();
    CDwbUseRecordSet rs(&t, CDwbDbResult::kCursorDefault);
    ASSERT_TRUE(t.Select({}, {}));
    ASSERT_TRUE(t.MoveNext());
    EXPECT_EQ(0, t.id);
    EXPECT_EQ(0, t.small);  // out of range for one byte
    EXPECT_FALSE(t.flag);
    EXPECT_EQ("", t.text);
    EXPECT_TRUE(t.at.IsZero());
    EXPECT_EQ(0, t.span.Ticks());
    EXPECT_EQ(0.0f, t.ratio);
}

// Each row's values replace the previous row's whole: a short text after a long one, an
// empty value after a text, the server's timestamp forms with and without a fraction and
// a year beyond four digits.
TEST_F(DwbTables, RowsReadInTurnCarryNothingOver) {
    CSampleTable t(&m_db);
    ASSERT_TRUE(t.CreateTable());
    ASSERT_TRUE(
        m_pg.Exec("INSERT INTO \"Sample\" (\"Small\", \"Text\", \"At\") VALUES "
                  "(1, 'a rather long text that needs storage of its own', "
                  "'2026-03-04 05:06:07.25'), "
                  "(2, 'b', '1999-12-31 23:59:59'), "
                  "(3, NULL, '12026-01-02 03:04:05')"));
    CDwbUseRecordSet rs(&t, CDwbDbResult::kCursorDefault);
    ASSERT_TRUE(t.Select({}, {1}));
    ASSERT_TRUE(t.MoveNext());
    EXPECT_EQ("a rather long text that needs storage of its own", t.text);
    EXPECT_EQ(CDateTime::FromComponents(2026, 3, 4, 5, 6, 7, 0, 0, true), t.at);
    ASSERT_TRUE(t.MoveNext());
    EXPECT_EQ("b", t.text);
    EXPECT_EQ(CDateTime::FromComponents(1999, 12, 31, 23, 59, 59, 0, 0, true), t.at);
    ASSERT_TRUE(t.MoveNext());
    EXPECT_EQ("", t.text);
    EXPECT_FALSE(t.at.IsZero());
    EXPECT_EQ(CDateTime::FromComponents(12026, 1, 2, 3, 4, 5, 0, 0, true), t.at);
    EXPECT_FALSE(t.MoveNext());
}

TEST_F(DwbTables, RecordingTableCreationIsIdempotent) {
    CDwbTableRecording rec(&m_db);
    ASSERT_TRUE(rec.CreateTable());
    const std::string indexes =
        "SELECT indexname FROM pg_indexes WHERE tablename = 'MetaRecording' ORDER BY indexname";
    auto first = m_pg.Query(indexes);
    ASSERT_EQ(6u, first.size());
    EXPECT_EQ("MetaRecord_DeviceID", first[0][0]);
    ASSERT_TRUE(rec.CreateTable());
    EXPECT_EQ(first, m_pg.Query(indexes));
    EXPECT_EQ("13", m_pg.Query("SELECT count(*) FROM information_schema.columns WHERE "
                               "table_name = 'MetaRecording'")[0][0]);
    CDwbTableFilter filter(&m_db);
    EXPECT_TRUE(filter.CreateTable());
    EXPECT_TRUE(filter.CreateTable());
    EXPECT_EQ("49", m_pg.Query("SELECT count(*) FROM information_schema.columns WHERE "
                               "table_name = 'MetaFilter'")[0][0]);
}

TEST_F(DwbTables, FullPathMigrationFillsOldRows) {
    ASSERT_TRUE(
        m_pg.Exec("CREATE TABLE \"StorageLocation\" (\"ID\" SERIAL, \"FullPath\" "
                  "VARCHAR(255))"));
    ASSERT_TRUE(m_pg.Exec("INSERT INTO \"StorageLocation\" (\"FullPath\") VALUES ('/srv/rec')"));
    ASSERT_TRUE(m_pg.Exec(
        "CREATE TABLE \"MetaRecording\" (\"ID\" SERIAL, \"DeviceID\" INTEGER, "
        "\"StorageLocationID\" INTEGER, \"FileName\" VARCHAR(255), \"SubDirectory\" "
        "VARCHAR(255), \"Trigger\" INTEGER, \"StartTime\" TIMESTAMP(4), \"StartTimeAvailable\" "
        "TIMESTAMP(4), \"EndTime\" TIMESTAMP(4), \"NumberOfFiles\" INTEGER, \"Deleted\" "
        "INTEGER, \"Archived\" INTEGER)"));
    ASSERT_TRUE(
        m_pg.Exec("INSERT INTO \"MetaRecording\" (\"DeviceID\", \"StorageLocationID\", "
                  "\"FileName\") VALUES (1, 1, 'a'), (1, 9, 'b')"));
    CDwbTableRecording rec(&m_db);
    ASSERT_TRUE(rec.CreateTable());
    auto rows = m_pg.Query(
        "SELECT \"FileName\", coalesce(\"FullPath\", 'null') FROM \"MetaRecording\" ORDER BY 1");
    ASSERT_EQ(2u, rows.size());
    EXPECT_EQ("/srv/rec", rows[0][1]);
    EXPECT_EQ("null", rows[1][1]);
    EXPECT_EQ("text",
              m_pg.Query("SELECT data_type FROM information_schema.columns WHERE "
                         "table_name = 'MetaRecording' AND column_name = 'FullPath'")[0][0]);

    char path[8];
    EXPECT_EQ(DWB_OK,
              CDwbTableStorageLocation(&m_db).GetStorageLocationPath(1, path, sizeof(path)));
    EXPECT_STREQ("/srv/re", path);  // cut to the buffer, terminated
    EXPECT_EQ(DWB_ERR_NOT_FOUND,
              CDwbTableStorageLocation(&m_db).GetStorageLocationPath(5, path, sizeof(path)));
    EXPECT_EQ(DWB_ERR_INVALID_PARAM,
              CDwbTableStorageLocation(&m_db).GetStorageLocationPath(1, nullptr, 10));
}

TEST_F(DwbTables, RecordingTextsRoundTripAndListsComeFromTheEnd) {
    CDwbTableRecording rec(&m_db);
    ASSERT_TRUE(rec.CreateTable());
    const std::string awkward = "O'Brien\\cam 1\\\\\xE6\x97\xA5\xE6\x9C\xAC";
    SRecordingTable a = Rec(awkward.c_str(), kT0, kT0 + 3600);
    SRecordingTable b = Rec("b", kT0 + 3600, kT0 + 7200);
    SRecordingTable c = Rec("c", kT0 + 7200, kT0 + 10800);
    for (const SRecordingTable* r : {&a, &b, &c}) {
        ASSERT_EQ(DWB_OK, rec.AddRecItem(*r));
    }
    EXPECT_EQ(awkward,
              m_pg.Query("SELECT \"FileName\" FROM \"MetaRecording\" WHERE \"ID\" = 1")[0][0]);
    bool exists = false;
    ASSERT_EQ(DWB_OK, rec.IsExistRecord(a, exists));
    EXPECT_TRUE(exists);

    a.EndTime = CDateTime::FromTimeT(kT0 + 1800);
    a.NumberOfFiles = 9;
    a.StartTimeAvailable = CDateTime::FromTimeT(kT0 + 60);
    ASSERT_EQ(DWB_OK, rec.UpdateRecItem(a, kDwbUpdateEndTime | kDwbUpdateStartTimeAvailable));

    void* list = nullptr;
    ASSERT_EQ(DWB_OK, rec.GetRecItem(-1, -1, nullptr, -1, -1, false, &list));
    SDwbRecItem item;
    std::string order;
    while (CDwbTableRecording::GetNext(list, item)) {
        order += std::string(item.FileName) == awkward ? "a" : item.FileName;
        if (std::string(item.FileName) == awkward) {
            EXPECT_EQ(kT0 + 1800, item.EndTime);
            EXPECT_EQ(kT0 + 60, item.StartTimeAvailable);
            EXPECT_EQ(1, item.NumberOfFiles);  // not selected by the mask
            EXPECT_STREQ("cam7/2026", item.SubDirectory);
        }
    }
    EXPECT_EQ("cba", order);
    CDwbTableRecording::ClearRecItemList(list);
    EXPECT_FALSE(CDwbTableRecording::GetNext(nullptr, item));

    // Searches: available start at or before a time, or end at or after it, newest first.
    list = nullptr;
    ASSERT_EQ(DWB_OK,
              rec.GetRecItem(7, 1, const_cast<char*>("cam7/2026"), kT0 + 3600, -1, false, &list));
    order.clear();
    while (CDwbTableRecording::GetNext(list, item)) {
        order += item.FileName[0] == 'O' ? "a" : item.FileName;
    }
    CDwbTableRecording::ClearRecItemList(list);
    EXPECT_EQ("ba", order);
    list = nullptr;
    EXPECT_EQ(DWB_ERR_NOT_FOUND, rec.GetRecItem(8, -1, nullptr, -1, -1, false, &list));
    EXPECT_EQ(nullptr, list);
    ASSERT_EQ(DWB_OK, rec.GetRecItemStartEnd(7, -1, nullptr, kT0 + 7300, kT0 + 7400, false, &list));
    ASSERT_TRUE(CDwbTableRecording::GetNext(list, item));
    EXPECT_STREQ("c", item.FileName);
    EXPECT_FALSE(CDwbTableRecording::GetNext(list, item));
    CDwbTableRecording::ClearRecItemList(list);

    ASSERT_EQ(DWB_OK, rec.GetOldestRecItem(1, item));
    EXPECT_EQ(awkward, item.FileName);
    EXPECT_EQ(DWB_ERR_NOT_FOUND, rec.GetOldestRecItem(2, item));

    ASSERT_EQ(DWB_OK, rec.DelRecItem(a));
    ASSERT_EQ(DWB_OK, rec.IsExistRecord(a, exists));
    EXPECT_FALSE(exists);
}

TEST_F(DwbTables, FilterRowsListsAndPackages) {
    CDwbTableFilter filter(&m_db);
    ASSERT_TRUE(filter.CreateTable());
    for (int no = 0; no < 5; ++no) {
        SFilterTable row;
        row.DeviceID = 3;
        row.PackNo = 1;
        row.FilterNo = no;
        row.FilterName = "f'" + std::to_string(no);
        row.DetailType = 10 + no;
        row.Node[7][1] = 479;
        row.ObjMaxDv = 1.5f;
        ASSERT_EQ(DWB_OK, filter.AddRecord(row));
    }
    SDwbSetList out[5];
    std::memset(out, 0, sizeof(out));
    EXPECT_EQ(5, filter.GetFilterList(3, 1, 0, out, 3, 2));
    EXPECT_EQ(0, out[1].FilterNo);
    EXPECT_STREQ("", out[1].Name);
    EXPECT_EQ(2, out[2].FilterNo);
    EXPECT_STREQ("f'2", out[2].Name);
    EXPECT_EQ(12, out[2].DetailType);
    EXPECT_STREQ("", out[3].Name);

    EXPECT_EQ(DWB_ERR_NOT_FOUND, filter.DeleteRecord(3, 1, 9, 0, true, true));
    std::vector<SFilterTable> rows;
    ASSERT_EQ(DWB_OK, filter.GetRecordList(3, 1, -1, -1, true, true, false, false, rows));
    ASSERT_EQ(5u, rows.size());
    EXPECT_EQ(479, rows[0].Node[7][1]);
    EXPECT_EQ(1.5f, rows[0].ObjMaxDv);

    SFilterTable changed = rows[1];
    changed.FilterName = "renamed";
    changed.PackName = "not written";
    ASSERT_EQ(DWB_OK, filter.UpdateFilter(changed));
    SDwbFilterPack pack{};
    pack.PackNo = 1;
    std::snprintf(pack.PackName, sizeof(pack.PackName), "%s", "Gate \\ North");
    pack.PackType = 1;
    ASSERT_EQ(DWB_OK, filter.UpdatePackage(3, pack));
    ASSERT_EQ(DWB_OK, filter.GetRecordList(3, 1, 1, 0, true, true, true, true, rows));
    ASSERT_EQ(1u, rows.size());
    EXPECT_EQ("renamed", rows[0].FilterName);
    EXPECT_EQ("Gate \\ North", rows[0].PackName);
    EXPECT_EQ(1, rows[0].PackType);
    pack.PackNo = 2;
    EXPECT_EQ(DWB_ERR_NOT_FOUND, filter.UpdatePackage(3, pack));

    ASSERT_EQ(DWB_OK, filter.DeleteRecord(3, 1, 0, 0, false, false));
    EXPECT_EQ(DWB_ERR_NOT_FOUND,
              filter.GetRecordList(3, 1, -1, -1, true, true, false, false, rows));
}

TEST_F(DwbTables, LostConnectionGivesErrorsNotCrashes) {
    CDwbTableRecording rec(&m_db);
    ASSERT_TRUE(rec.CreateTable());
    m_pg.DropOtherSessions();
    bool exists = true;
    // The statement that meets the dropped session reports the lost link, and so does
    // everything after it.
    EXPECT_EQ(DWB_ERR_DB_NOT_CONNECT, rec.IsExistRecord(Rec("x", kT0, kT0), exists));
    EXPECT_FALSE(exists);
    EXPECT_FALSE(m_db.IsConnected());
    m_db.Disconnect();
    EXPECT_EQ(DWB_ERR_DB_NOT_CONNECT, rec.AddRecItem(Rec("x", kT0, kT0)));
    void* list = nullptr;
    EXPECT_EQ(DWB_ERR_DB_NOT_CONNECT, rec.GetRecItem(-1, -1, nullptr, -1, -1, false, &list));
    char path[16];
    EXPECT_EQ(DWB_ERR_DB_NOT_CONNECT,
              CDwbTableStorageLocation(&m_db).GetStorageLocationPath(1, path, sizeof(path)));
}
