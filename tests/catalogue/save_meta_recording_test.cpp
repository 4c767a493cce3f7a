#include <gtest/gtest.h>

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string>
#include <thread>
#include <vector>

#include "catalogue_db.h"
#include "common/temp_dir.h"
#include "platform/local_time.h"
#include "quorvex/save_meta.h"

namespace {

// 2026-03-01 00:00:00 UTC.
constexpr long kDay = 1772323200;

class CSaveMetaTexts : public CSaveMeta {
public:
    using CSaveMeta::ErrorCodeString;
};

SDwbRecItem Item(long device, long storage, const char* dir, const char* file, long start) {
    SDwbRecItem item{};
    item.DeviceID = device;
    item.StorageLocationID = storage;
    std::snprintf(item.SubDirectory, sizeof(item.SubDirectory), "%s", dir);
    std::snprintf(item.FileName, sizeof(item.FileName), "%s", file);
    item.NumberOfFiles = 1;
    item.StartTime = start;
    item.StartTimeAvailable = start;
    item.EndTime = start + 3599;
    item.Trigger = 1;
    return item;
}

// Every item of a search, in the order GetNext hands them out.
std::vector<SDwbRecItem> Drain(CSaveMeta& meta, void* list) {
    std::vector<SDwbRecItem> items;
    SDwbRecItem item;
    while (meta.GetNext(list, item)) {
        items.push_back(item);
    }
    meta.ClearRecItemList(list);
    return items;
}

class RecordingCatalogue : public ::testing::Test {
protected:
    RecordingCatalogue() : m_db("rec") {}
    void SetUp() override {
        m_storage = m_db.AddStorageLocation("/srv/rec'ordings/C:\\vol");
        ASSERT_EQ(m_meta.Connect(m_db.Name(), nullptr, nullptr), DWB_OK);
    }

    std::vector<SDwbRecItem> Search(long device, long time, bool descending) {
        void* list = nullptr;
        int code = m_meta.GetRecItemList(device, -1, nullptr, time, -1, descending, &list);
        if (code != DWB_OK) {
            EXPECT_EQ(list, nullptr);
            return {};
        }
        return Drain(m_meta, list);
    }

    testkit::CCatalogueDb m_db;
    CSaveMetaTexts m_meta;
    long m_storage = 0;
};

TEST(SaveMetaConnect, RefusesNullDatabaseAndDoesNotReconnect) {
    testkit::CCatalogueDb db("connect");
    CSaveMeta meta;
    EXPECT_EQ(meta.Connect(nullptr, nullptr, nullptr), DWB_ERR_INVALID_PARAM);
    SDwbRecItem item = Item(1, 1, "d", "f", kDay);
    EXPECT_EQ(meta.AddRecItem(item), DWB_ERR_DB_NOT_CONNECT) << "null database left it connected";

    EXPECT_EQ(meta.Connect("qvx_no_such_database", nullptr, nullptr), DWB_ERR_DB_NOT_CONNECT);
    ASSERT_EQ(meta.Connect(db.Name(), nullptr, nullptr), DWB_OK);
    // Connected: a second call keeps the connection, even when pointed elsewhere.
    EXPECT_EQ(meta.Connect("qvx_no_such_database", nullptr, nullptr), DWB_OK);
    EXPECT_EQ(meta.AddRecItem(item), DWB_OK);

    auto tables = db.Query(
        "SELECT table_name FROM information_schema.tables WHERE table_name IN "
        "('MetaFilter', 'MetaRecording') ORDER BY table_name");
    ASSERT_EQ(tables.size(), 2u);
    EXPECT_EQ(tables[0][0], "MetaFilter");

    meta.Disconnect();
    EXPECT_EQ(meta.AddRecItem(item), DWB_ERR_DB_NOT_CONNECT);
    ASSERT_EQ(meta.Connect(db.Name(), nullptr, nullptr), DWB_OK) << "reconnect after Disconnect";
    EXPECT_EQ(meta.AddRecItem(item), DWB_ERR_ALREADY_EXIST) << "tables kept over a reconnect";
}

TEST(SaveMetaConnect, ErrorTexts) {
    EXPECT_STREQ(CSaveMetaTexts::ErrorCodeString(DWB_OK), "DWB_OK");
    EXPECT_STREQ(CSaveMetaTexts::ErrorCodeString(-4), "DWB_ERR_SQL_EXEC");
    EXPECT_STREQ(CSaveMetaTexts::ErrorCodeString(-8), "DWB_ERR_INVALID_PARAM");
    EXPECT_STREQ(CSaveMetaTexts::ErrorCodeString(0), "Unknown ErrorCode");
    EXPECT_STREQ(CSaveMetaTexts::ErrorCodeString(-9), "Unknown ErrorCode");
}

// Recording writers, players and the host share one catalogue object from their own threads,
// starting at once on a fresh object.
TEST(SaveMetaShared, ConcurrentWritersAndSearchersKeepTheirOwnRows) {
    testkit::CCatalogueDb db("shared");
    long storage = db.AddStorageLocation("/srv/shared");
    constexpr int kThreads = 4;
    constexpr int kItems = 30;
    for (int round = 0; round < 3; ++round) {
        CSaveMeta meta;
        std::vector<std::string> faults(kThreads);
        std::vector<std::thread> threads;
        for (int t = 0; t < kThreads; ++t) {
            threads.emplace_back([&, t] {
                long device = 100 * (round + 1) + t;
                if (t == 0 && meta.Connect(db.Name(), nullptr, nullptr) != DWB_OK) {
                    faults[t] = "connect failed";
                    return;
                }
                int added = 0;
                for (int i = 0; i < kItems * 20 && added < kItems; ++i) {
                    SDwbRecItem item =
                        Item(device, storage, "d", ("f" + std::to_string(added)).c_str(),
                             kDay + 3600L * added);
                    int code = meta.AddRecItem(item);
                    if (code == DWB_ERR_DB_NOT_CONNECT) {
                        std::this_thread::yield();  // thread 0 has not connected yet
                        continue;
                    }
                    if (code != DWB_OK) {
                        faults[t] = "AddRecItem gave " + std::to_string(code);
                        return;
                    }
                    ++added;
                    void* list = nullptr;
                    if (meta.GetRecItemList(device, -1, nullptr, -1, -1, false, &list) != DWB_OK) {
                        faults[t] = "search failed after " + std::to_string(added);
                        return;
                    }
                    std::vector<SDwbRecItem> items = Drain(meta, list);
                    if (static_cast<int>(items.size()) != added) {
                        faults[t] = "search gave " + std::to_string(items.size()) + " of " +
                                    std::to_string(added);
                        return;
                    }
                    for (const SDwbRecItem& got : items) {
                        if (got.DeviceID != device ||
                            std::strcmp(got.FullPath, "/srv/shared") != 0) {
                            faults[t] = "a row of another writer or a torn path";
                            return;
                        }
                    }
                }
                if (added != kItems) {
                    faults[t] = "never connected";
                }
            });
        }
        for (std::thread& th : threads) {
            th.join();
        }
        for (int t = 0; t < kThreads; ++t) {
            EXPECT_EQ(faults[t], "") << "round " << round << ", thread " << t;
        }
    }
    auto rows = db.Query("SELECT count(*), count(DISTINCT \"DeviceID\") FROM \"MetaRecording\"");
    ASSERT_EQ(rows.size(), 1u);
    EXPECT_EQ(rows[0][0], std::to_string(3 * kThreads * kItems));
    EXPECT_EQ(rows[0][1], std::to_string(3 * kThreads));
}

TEST_F(RecordingCatalogue, AddRefusesDuplicateKeyAndFillsStoragePath) {
    SDwbRecItem item = Item(3, m_storage, "cam3/2026", "rec_01", kDay);
    EXPECT_EQ(m_meta.AddRecItem(item), DWB_OK);
    EXPECT_STREQ(item.FullPath, "/srv/rec'ordings/C:\\vol") << "caller's item gets the path";
    EXPECT_EQ(m_meta.AddRecItem(item), DWB_ERR_ALREADY_EXIST);

    // Same file under another camera, directory or storage is another recording.
    SDwbRecItem other = item;
    other.DeviceID = 4;
    EXPECT_EQ(m_meta.AddRecItem(other), DWB_OK);
    other = item;
    std::snprintf(other.SubDirectory, sizeof(other.SubDirectory), "cam3/2027");
    EXPECT_EQ(m_meta.AddRecItem(other), DWB_OK);

    // A storage location that does not exist: still catalogued, without a path.
    SDwbRecItem lost = Item(3, 999, "cam3/2026", "rec_01", kDay);
    EXPECT_EQ(m_meta.AddRecItem(lost), DWB_OK);
    EXPECT_STREQ(lost.FullPath, "");
    EXPECT_EQ(m_db.Query("SELECT * FROM \"MetaRecording\"").size(), 4u);
}

TEST_F(RecordingCatalogue, TextsAndTimesRoundTripUnchanged) {
    const char* dir = "C:\\Recordings\\O'Brien\\\\share";
    const char* file = "Caméra_東京_'quoted'\\x";
    SDwbRecItem item = Item(7, m_storage, dir, file, kDay + 123);
    item.EndTime = kDay + 5000;
    item.NumberOfFiles = 4;
    item.Trigger = 9;
    item.Deleted = 1;
    item.Archived = 2;
    item.StartTimeAvailable = kDay + 200;
    ASSERT_EQ(m_meta.AddRecItem(item), DWB_OK);

    auto items = Search(7, -1, false);
    ASSERT_EQ(items.size(), 1u);
    const SDwbRecItem& back = items[0];
    EXPECT_STREQ(back.SubDirectory, dir);
    EXPECT_STREQ(back.FileName, file);
    EXPECT_STREQ(back.FullPath, "/srv/rec'ordings/C:\\vol");
    EXPECT_EQ(back.StartTime, kDay + 123);
    EXPECT_EQ(back.StartTimeAvailable, kDay + 200);
    EXPECT_EQ(back.EndTime, kDay + 5000);
    EXPECT_EQ(back.NumberOfFiles, 4);
    EXPECT_EQ(back.Trigger, 9);
    EXPECT_EQ(back.Deleted, 1);
    EXPECT_EQ(back.Archived, 2);

    // The key lookups see the same texts: delete finds the row by them.
    EXPECT_EQ(m_meta.DelRecItem(7, m_storage, const_cast<char*>(dir), const_cast<char*>(file)),
              DWB_OK);
}

TEST_F(RecordingCatalogue, UpdateRewritesOnlyTheMaskedFields) {
    struct SBit {
        int mask;
        long SDwbRecItem::*field;
    };
    const SBit bits[] = {{kDwbUpdateEndTime, &SDwbRecItem::EndTime},
                         {kDwbUpdateTrigger, &SDwbRecItem::Trigger},
                         {kDwbUpdateNumberOfFiles, &SDwbRecItem::NumberOfFiles},
                         {kDwbUpdateDeleted, &SDwbRecItem::Deleted},
                         {kDwbUpdateArchived, &SDwbRecItem::Archived},
                         {kDwbUpdateStartTimeAvailable, &SDwbRecItem::StartTimeAvailable}};
    long device = 20;
    for (const SBit& bit : bits) {
        SDwbRecItem item = Item(device, m_storage, "d", "f", kDay);
        ASSERT_EQ(m_meta.AddRecItem(item), DWB_OK);
        SDwbRecItem changed = item;
        for (const SBit& b : bits) {
            changed.*b.field += 600;  // times stay times, counters stay counters
        }
        changed.StartTime += 600;  // never part of a mask
        ASSERT_EQ(m_meta.UpdateRecItem(changed, bit.mask), DWB_OK);

        auto items = Search(device, -1, false);
        ASSERT_EQ(items.size(), 1u);
        for (const SBit& b : bits) {
            long expected = b.mask == bit.mask ? changed.*b.field : item.*b.field;
            EXPECT_EQ(items[0].*b.field, expected) << "mask " << bit.mask << ", field " << b.mask;
        }
        EXPECT_EQ(items[0].StartTime, item.StartTime);
        ++device;
    }

    // Several bits at once, and a mask that selects nothing.
    SDwbRecItem item = Item(40, m_storage, "d", "f", kDay);
    ASSERT_EQ(m_meta.AddRecItem(item), DWB_OK);
    SDwbRecItem changed = item;
    changed.EndTime += 60;
    changed.StartTimeAvailable += 30;
    changed.Trigger = 5;
    EXPECT_EQ(m_meta.UpdateRecItem(changed, 0), DWB_OK);
    EXPECT_EQ(Search(40, -1, false)[0].EndTime, item.EndTime);
    EXPECT_EQ(m_meta.UpdateRecItem(changed, kDwbUpdateEndTime | kDwbUpdateStartTimeAvailable),
              DWB_OK);
    auto items = Search(40, -1, false);
    EXPECT_EQ(items[0].EndTime, changed.EndTime);
    EXPECT_EQ(items[0].StartTimeAvailable, changed.StartTimeAvailable);
    EXPECT_EQ(items[0].Trigger, item.Trigger);

    SDwbRecItem unknown = Item(41, m_storage, "d", "f", kDay);
    EXPECT_EQ(m_meta.UpdateRecItem(unknown, kDwbUpdateEndTime), DWB_ERR_NOT_FOUND);
    EXPECT_EQ(m_meta.UpdateRecItem(unknown, 0), DWB_ERR_NOT_FOUND);
}

TEST_F(RecordingCatalogue, DeleteTakesDirectoryThenFileName) {
    SDwbRecItem item = Item(5, m_storage, "dir", "file", kDay);
    ASSERT_EQ(m_meta.AddRecItem(item), DWB_OK);
    char dir[] = "dir";
    char file[] = "file";
    EXPECT_EQ(m_meta.DelRecItem(5, m_storage, file, dir), DWB_ERR_NOT_FOUND);
    EXPECT_EQ(m_meta.DelRecItem(5, m_storage, dir, nullptr), DWB_ERR_INVALID_PARAM);
    EXPECT_EQ(Search(5, -1, false).size(), 1u);
    EXPECT_EQ(m_meta.DelRecItem(5, m_storage, dir, file), DWB_OK);
    EXPECT_TRUE(Search(5, -1, false).empty());
    EXPECT_EQ(m_meta.DelRecItem(5, m_storage, dir, file), DWB_ERR_NOT_FOUND);
}

TEST_F(RecordingCatalogue, ListsAreHandedOutFromTheirEnd) {
    // Added out of order so that the database's natural order is not the search order.
    const long hours[] = {2, 0, 1};
    for (long h : hours) {
        std::string name = "h" + std::to_string(h);
        SDwbRecItem item = Item(8, m_storage, "d", name.c_str(), kDay + h * 3600);
        ASSERT_EQ(m_meta.AddRecItem(item), DWB_OK);
    }
    // Available start at or before 02:30, oldest first in the search: newest handed out first.
    auto up = Search(8, kDay + 2 * 3600 + 1800, false);
    ASSERT_EQ(up.size(), 3u);
    EXPECT_STREQ(up[0].FileName, "h2");
    EXPECT_STREQ(up[2].FileName, "h0");
    // Ending at or after 00:30, newest first in the search: oldest handed out first.
    auto down = Search(8, kDay + 1800, true);
    ASSERT_EQ(down.size(), 3u);
    EXPECT_STREQ(down[0].FileName, "h0");
    EXPECT_STREQ(down[2].FileName, "h2");
    // Ending at or after 01:30 leaves out hour 0.
    EXPECT_EQ(Search(8, kDay + 3600 + 1800, true).size(), 2u);
    EXPECT_TRUE(Search(9, -1, false).empty());

    SDwbRecItem item;
    EXPECT_FALSE(m_meta.GetNext(nullptr, item));
    m_meta.ClearRecItemList(nullptr);
    void* list = reinterpret_cast<void*>(1);
    EXPECT_EQ(m_meta.GetRecItemList(9, -1, nullptr, -1, -1, false, &list), DWB_ERR_NOT_FOUND);
    EXPECT_EQ(list, nullptr);
    EXPECT_EQ(m_meta.GetRecItemList(9, -1, nullptr, -1, -1, false, nullptr), DWB_ERR_INVALID_PARAM);
}

TEST_F(RecordingCatalogue, SearchLooksBackOneUpdateIntervalForARunningRecording) {
    long now = kDay + 7200;
    SDwbRecItem running = Item(11, m_storage, "d", "running", kDay);
    running.EndTime = now - 5;  // last rewritten five seconds ago
    ASSERT_EQ(m_meta.AddRecItem(running), DWB_OK);

    EXPECT_TRUE(Search(11, now, true).empty()) << "no interval set: no second search";
    m_meta.SetUpdateDatabaseTime(10);
    auto found = Search(11, now, true);
    ASSERT_EQ(found.size(), 1u);
    EXPECT_STREQ(found[0].FileName, "running");
    // Only one interval back, not further.
    running.EndTime = now - 11;
    ASSERT_EQ(m_meta.UpdateRecItem(running, kDwbUpdateEndTime), DWB_OK);
    EXPECT_TRUE(Search(11, now, true).empty());

    // The window search has no second try.
    void* list = nullptr;
    EXPECT_EQ(m_meta.GetRecItemListStartEnd(11, -1, nullptr, now, now + 100, false, &list),
              DWB_ERR_NOT_FOUND);
    ASSERT_EQ(m_meta.GetRecItemListStartEnd(11, -1, nullptr, now - 20, now, false, &list), DWB_OK);
    EXPECT_EQ(Drain(m_meta, list).size(), 1u);
}

TEST_F(RecordingCatalogue, OldestItemAndStoragePathBoundedByTheBuffer) {
    SDwbRecItem a = Item(1, m_storage, "d", "late", kDay + 7200);
    SDwbRecItem b = Item(2, m_storage, "d", "early", kDay);
    b.StartTimeAvailable = kDay + 60;
    ASSERT_EQ(m_meta.AddRecItem(a), DWB_OK);
    ASSERT_EQ(m_meta.AddRecItem(b), DWB_OK);
    SDwbRecItem oldest{};
    ASSERT_EQ(m_meta.GetOldestRecItem(m_storage, oldest), DWB_OK);
    EXPECT_STREQ(oldest.FileName, "early");
    EXPECT_EQ(oldest.StartTimeAvailable, kDay + 60);
    EXPECT_EQ(m_meta.GetOldestRecItem(m_storage + 1, oldest), DWB_ERR_NOT_FOUND);

    char path[32];
    ASSERT_EQ(m_meta.GetStorageLocationPath(m_storage, path, sizeof(path)), DWB_OK);
    EXPECT_STREQ(path, "/srv/rec'ordings/C:\\vol");
    char small[8];
    std::memset(small, 'x', sizeof(small));
    ASSERT_EQ(m_meta.GetStorageLocationPath(m_storage, small, 5), DWB_OK);
    EXPECT_STREQ(small, "/srv");
    EXPECT_EQ(small[5], 'x') << "wrote past the given size";
    EXPECT_EQ(m_meta.GetStorageLocationPath(m_storage + 5, path, sizeof(path)), DWB_ERR_NOT_FOUND);
    EXPECT_EQ(m_meta.GetStorageLocationPath(m_storage, nullptr, 10), DWB_ERR_INVALID_PARAM);
    EXPECT_EQ(m_meta.GetStorageLocationPath(m_storage, path, 0), DWB_ERR_INVALID_PARAM);
}

// Times go to the database as UTC whatever the zone of the process.
TEST_F(RecordingCatalogue, StoresUtcWhenTheZoneIsNineHoursAhead) {
    const char* old = std::getenv("TZ");
    std::string saved = old ? old : "";
    setenv("TZ", "Asia/Tokyo", 1);
    plat::ReloadTimeZone();

    // 2026-03-01 09:00 in Tokyo is 00:00 UTC.
    SDwbRecItem item = Item(30, m_storage, "d", "tokyo", kDay);
    int added = m_meta.AddRecItem(item);
    auto rows = m_db.Query(
        "SELECT to_char(\"StartTime\", 'YYYY-MM-DD HH24:MI:SS') FROM \"MetaRecording\" WHERE "
        "\"DeviceID\" = 30");
    auto back = Search(30, kDay + 1800, false);

    if (old) {
        setenv("TZ", saved.c_str(), 1);
    } else {
        unsetenv("TZ");
    }
    plat::ReloadTimeZone();

    ASSERT_EQ(added, DWB_OK);
    ASSERT_EQ(rows.size(), 1u);
    EXPECT_EQ(rows[0][0], "2026-03-01 00:00:00");
    ASSERT_EQ(back.size(), 1u);
    EXPECT_EQ(back[0].StartTime, kDay);
}

TEST_F(RecordingCatalogue, LostConnectionIsReportedNotFatal) {
    SDwbRecItem item = Item(12, m_storage, "d", "f", kDay);
    ASSERT_EQ(m_meta.AddRecItem(item), DWB_OK);
    m_db.DropOtherSessions();

    SDwbRecItem next = Item(12, m_storage, "d", "g", kDay + 3600);
    EXPECT_EQ(m_meta.AddRecItem(next), DWB_ERR_DB_NOT_CONNECT);
    EXPECT_EQ(m_meta.UpdateRecItem(item, kDwbUpdateEndTime), DWB_ERR_DB_NOT_CONNECT);
    void* list = nullptr;
    EXPECT_EQ(m_meta.GetRecItemList(12, -1, nullptr, -1, -1, false, &list), DWB_ERR_DB_NOT_CONNECT);
    EXPECT_EQ(list, nullptr);
    char path[64];
    EXPECT_EQ(m_meta.GetStorageLocationPath(m_storage, path, sizeof(path)), DWB_ERR_DB_NOT_CONNECT);

    // After Disconnect the next Connect starts a fresh session.
    m_meta.Disconnect();
    ASSERT_EQ(m_meta.Connect(m_db.Name(), nullptr, nullptr), DWB_OK);
    EXPECT_EQ(m_meta.AddRecItem(next), DWB_OK);
}

TEST_F(RecordingCatalogue, TraceTextsReachTheDebugLog) {
    testkit::CTempDir dir;
    std::string path = dir.File("trace.txt");
    ASSERT_TRUE(m_meta.OpenDebugLog(path.c_str()));
    SDwbRecItem item = Item(13, m_storage, "d", "traced", kDay);
    m_meta.AddRecItem(item);
    m_meta.AddRecItem(item);
    m_meta.GetRecItemList(13, -1, nullptr, -1, -1, false, nullptr);
    std::string text = testkit::ReadFile(path);
    EXPECT_NE(text.find("[S] CSaveMeta::AddRecItem(DeviceNo=13, StorageNo=" +
                        std::to_string(m_storage) + ", Rercord=traced)"),
              std::string::npos)
        << text;
    EXPECT_NE(text.find("[R] CSaveMeta::AddRecItem() DWB_OK"), std::string::npos);
    EXPECT_NE(text.find("[E] CSaveMeta::AddRecItem() DWB_ERR_ALREADY_EXIST"), std::string::npos);
    EXPECT_NE(text.find("[R] CSaveMeta::GetStorageLocationPath() path=[/srv/rec'ordings/C:\\vol]"),
              std::string::npos);
    EXPECT_NE(text.find("DirName=NULL, StartTime=-1)"), std::string::npos);
    EXPECT_NE(text.find("[E] CSaveMeta::GetRecItemList() DWB_ERR_INVALID_PARAM"),
              std::string::npos);
}

}  // namespace
