#include "platform/PropertyStore.h"

#include <csignal>
#include <filesystem>
#include <fstream>
#include <map>
#include <sstream>

#include <cutils/properties.h>
#include <sqlite3.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include "platform/PropertyService.h"
#include "tests/DeviceTest.h"
#include "tests/TestFolder.h"

namespace {

namespace fs = std::filesystem;

constexpr char kReason[] = ": cannot keep properties in this file: ";
constexpr char kReplaced[] = "it was deleted or replaced while it was in use";

// What earlier builds wrote, and what marks a store today.
#define TABLE "CREATE TABLE properties (name TEXT PRIMARY KEY, value TEXT NOT NULL) WITHOUT ROWID;"
#define ROW "INSERT INTO properties VALUES ('persist.a', '1');"
#define WAL "PRAGMA journal_mode = WAL;"
#define ID "PRAGMA application_id = 0x53507270;"
#define VERSION "PRAGMA user_version = 1;"

/** A connection of another program. */
class Database {
public:
    explicit Database(const std::string& file, const std::string& sql = "") {
        EXPECT_EQ(sqlite3_open(file.c_str(), &mDb), SQLITE_OK);
        const std::string all = "PRAGMA synchronous = OFF;" + sql;
        EXPECT_EQ(sqlite3_exec(mDb, all.c_str(), nullptr, nullptr, nullptr), SQLITE_OK) << sql;
    }

    ~Database() { sqlite3_close(mDb); }

    std::string value(const std::string& sql) {
        std::string text;
        const auto take = [](void* to, int, char** values, char**) {
            *static_cast<std::string*>(to) += values[0] == nullptr ? "NULL" : values[0];
            return 0;
        };
        EXPECT_EQ(sqlite3_exec(mDb, sql.c_str(), take, &text, nullptr), SQLITE_OK) << sql;
        return text;
    }

private:
    sqlite3* mDb = nullptr;
};

/** Runs `sql` on the database `file` and closes it. */
void change(const std::string& file, const std::string& sql) {
    const Database database(file, sql);
}

void write(const std::string& file, const std::string& text) {
    std::ofstream(file, std::ios::binary) << text;
}

class PropertyStoreTest : public DeviceTest {
protected:
    /** All files of the folder with their bytes. */
    std::map<std::string, std::string> files(const std::string& folder = "") const {
        std::map<std::string, std::string> all;
        for (const auto& entry : fs::directory_iterator(mFolder / folder)) {
            std::ostringstream bytes;
            if (entry.is_regular_file()) bytes << std::ifstream(entry.path()).rdbuf();
            all[entry.path().filename()] = bytes.str();
        }
        return all;
    }

    /** A store with "persist.a" = "1" in it. */
    std::string makeStore(const std::string& name) const {
        for (const char* end : {"", "-wal", "-shm"}) fs::remove(mFolder / name + end);
        change(mFolder / name, TABLE ROW ID VERSION WAL);
        return mFolder / name;
    }

    const TestFolder mFolder;
};

/** Expects `file` to be taken, with what it had, and to be a marked store afterwards. */
void expectStore(const std::string& file, const std::string& value) {
    ASSERT_EQ(platform::openProperties(file), std::nullopt);
    char stored[PROP_VALUE_MAX];
    property_get("persist.a", stored, "");
    EXPECT_EQ(stored, value);
    EXPECT_EQ(property_set("persist.b", "2"), 0);
    EXPECT_EQ(platform::closeProperties(), std::nullopt);
    Database database(file);
    EXPECT_EQ(database.value("PRAGMA application_id"), std::to_string(0x53507270));
    EXPECT_EQ(database.value("PRAGMA user_version"), "1");
    EXPECT_EQ(database.value("SELECT value FROM properties WHERE name = 'persist.b'"), "2");
}

TEST_F(PropertyStoreTest, TakesStoresOfEveryBuildAndRefusesTheRestUntouched) {
    const struct {
        const char* sql;
        const char* refusal;  // null: taken
    } kDatabases[] = {
            {TABLE ROW ID VERSION, nullptr},
            {WAL TABLE ROW ID VERSION, nullptr},
            {WAL TABLE ROW VERSION, nullptr},
            {TABLE ROW VERSION, nullptr},
            {TABLE ROW ID "PRAGMA user_version = 2", "a property store of a newer version"},
            {WAL TABLE ROW ID VERSION "PRAGMA user_version = 2",
             "a property store of a newer version"},
            {WAL TABLE "PRAGMA user_version = 2", "a property store of a newer version"},
            {WAL ID "CREATE TABLE renamed (a); PRAGMA user_version = 3",
             "a property store of a newer version"},
            {"CREATE TABLE bookmarks (a); PRAGMA user_version = 42", "not a property store"},
            {WAL "CREATE TABLE bookmarks (a); PRAGMA user_version = 1", "not a property store"},
            {"VACUUM", "not a property store"},
            {WAL, "not a property store"},
            {TABLE, "not a property store"},
            {TABLE ID, "not a property store"},
            {TABLE VERSION "PRAGMA application_id = 7", "not a property store"},
            {TABLE ID VERSION "CREATE TABLE extra (a)", "not a property store"},
            {ID VERSION "CREATE TABLE properties (name, value)", "not a property store"},
            {VERSION "CREATE TABLE properties (name, value)", "not a property store"},
    };
    const struct {
        const char* what;
        bool isOpen;
        const char* lost;  // of a copy made while it was open; null: the original
    } kStates[] = {
            {"closed", false, nullptr},
            {"in use", true, nullptr},
            {"left behind by a killed program", true, ""},
            {"left behind without its index", true, "-shm"},
            {"left behind without its log", true, "-wal"},
    };
    for (const auto& [sql, refusal] : kDatabases) {
        for (const auto& [what, isOpen, lost] : kStates) {
            SCOPED_TRACE(std::string(what) + ": " + sql);
            fs::remove_all(mFolder / "a");
            fs::remove_all(mFolder / "b");
            fs::create_directories(mFolder / "a");
            auto other = std::make_unique<Database>(mFolder / "a/x?%41#", sql);
            if (!isOpen) other = nullptr;
            if (lost != nullptr) fs::copy(mFolder / "a", mFolder / "b");
            const std::string folder = lost == nullptr ? "a" : "b";
            const std::string file = mFolder / (folder + "/x?%41#");
            // These databases have all they hold in their logs, if they have one.
            const bool isGone = lost != nullptr && *lost != '\0' && fs::remove(file + lost);
            const char* const expected = isGone ? "not a property store" : refusal;
            auto before = files(folder);
            if (expected == nullptr) {
                expectStore(file, "1");
                continue;
            }
            EXPECT_EQ(platform::openProperties(file), file + kReason + expected);
            auto after = files(folder);
            if (isOpen && lost == nullptr) {
                // A reader within the same process marks its place in the index.
                before.erase("x?%41#-shm");
                after.erase("x?%41#-shm");
            }
            EXPECT_TRUE(after == before);
        }
    }
}

TEST_F(PropertyStoreTest, ANewerVersionIsRefusedUntouchedEvenIfOnlyALogWithoutAnIndexTellsOfIt) {
    const std::string store = makeStore("a");
    const std::string copy = mFolder / "b";
    const Database later(store, "PRAGMA user_version = 2");
    fs::copy(store, copy);
    fs::copy(store + "-wal", copy + "-wal");
    const auto before = files();
    EXPECT_EQ(platform::openProperties(copy),
              copy + kReason + "a property store of a newer version");
    const auto after = files();
    EXPECT_TRUE(after.at("b") == before.at("b") && after.at("b-wal") == before.at("b-wal"));
}

TEST_F(PropertyStoreTest, RefusesWhatIsNoDatabaseUntouched) {
    write(mFolder / "text", "hello");
    write(mFolder / "long", std::string(5000, 'x'));
    EXPECT_EQ(mkfifo((mFolder / "pipe").c_str(), 0600), 0);
    const auto before = files();
    const std::pair<std::string, const char*> kFiles[] = {
            {mFolder / "text", "not a property store"},
            {mFolder / "long", "not a property store"},
            {mFolder / "pipe", "not a regular file"},
            {mFolder / "", "not a regular file"},
            {"/dev/zero", "not a regular file"},
            {mFolder / "no/where", "No such file or directory"},
            {"", "No such file or directory"},
    };
    for (const auto& [file, reason] : kFiles) {
        EXPECT_EQ(platform::openProperties(file), file + kReason + reason);
        EXPECT_EQ(platform::pinPropertyFile(file), file + kReason + reason);
    }
    EXPECT_TRUE(files() == before);
}

TEST_F(PropertyStoreTest, AMissingOrEmptyFileBecomesAStoreAndStandsByItselfOnceClosed) {
    write(mFolder / "empty", "");
    for (const char* name : {"empty", "missing"}) {
        SCOPED_TRACE(name);
        expectStore(mFolder / name, "");
        EXPECT_EQ(Database(mFolder / name).value("PRAGMA journal_mode"), "wal");
        expectStore(mFolder / name, "");
    }
    EXPECT_EQ(files().size(), 2u) << "no log and no index is left";
}

TEST_F(PropertyStoreTest, AStoreWhoseCreatorWasKilledAfterItsFirstPageIsCreatedAgain) {
    const std::string store = mFolder / "store";
    if (fork() == 0) {
        const rlimit onePage{4096, 4096};
        setrlimit(RLIMIT_FSIZE, &onePage);
        std::signal(SIGXFSZ, [](int) { _exit(7); });
        platform::openProperties(store);
        _exit(0);
    }
    int status = 0;
    wait(&status);
    EXPECT_EQ(WEXITSTATUS(status), 7);
    EXPECT_EQ(fs::file_size(store), 4096u);
    expectStore(store, "");
}

TEST_F(PropertyStoreTest, AFileThatCannotBeWrittenIsRefusedWithNothingLeftBesideIt) {
    const std::string store = makeStore("store");
    chmod(store.c_str(), 0444);
    chmod((mFolder / "").c_str(), 0777);
    const bool isRoot = getuid() == 0;  // from whom nothing is kept
    EXPECT_EQ(isRoot ? seteuid(65534) : 0, 0);
    EXPECT_EQ(platform::openProperties(store),
              store + kReason + "attempt to write a readonly database");
    EXPECT_EQ(files().size(), 1u);
    EXPECT_EQ(isRoot ? seteuid(0) : 0, 0);
}

TEST_F(PropertyStoreTest, AStoreWithADamagedPageIsRefusedAndTheOneBeforeStaysOpen) {
    const std::string store = makeStore("store");
    const std::string torn = makeStore("torn");
    change(torn,
           "WITH RECURSIVE n(i) AS (SELECT 1 UNION ALL SELECT i + 1 FROM n LIMIT 2000)"
           " INSERT INTO properties SELECT 'persist.' || i, 'value' FROM n");
    ASSERT_EQ(platform::openProperties(store), std::nullopt);
    const auto size = static_cast<std::streamoff>(fs::file_size(torn));
    std::fstream(torn, std::ios::in | std::ios::out).seekp(size / 2)
            << std::string(static_cast<size_t>(size / 2), 'x');
    EXPECT_EQ(platform::openProperties(torn), torn + kReason + "database disk image is malformed");
    EXPECT_EQ(platform::propertyFileError(), std::nullopt);
    EXPECT_EQ(property("persist.a"), "1");
}

TEST_F(PropertyStoreTest, TheFirstFailedWriteIsRememberedAndWhatIsStoredCanStillBeRead) {
    const std::string store = makeStore("store");
    const std::string error = store + kReason + "disk I/O error";
    ASSERT_EQ(platform::openProperties(store), std::nullopt);
    EXPECT_EQ(property_set("persist.b", "2"), 0);
    EXPECT_EQ(platform::propertyFileError(), std::nullopt);

    std::signal(SIGXFSZ, SIG_IGN);
    rlimit limit{};
    getrlimit(RLIMIT_FSIZE, &limit);
    const rlimit full{4096, limit.rlim_max};
    setrlimit(RLIMIT_FSIZE, &full);
    const int status = property_set("persist.b", "3");
    platform::setDeviceProperty("persist.a", std::nullopt);
    setrlimit(RLIMIT_FSIZE, &limit);
    EXPECT_EQ(status, -1);
    EXPECT_EQ(platform::propertyFileError(), error);
    EXPECT_EQ(property("persist.a") + property("persist.b"), "12");
    EXPECT_EQ(taken(), (Lines{"0 persist.b=2"}));

    EXPECT_EQ(property_set("persist.b", "4"), 0);
    EXPECT_EQ(Database(store).value("SELECT value FROM properties"), "14");
    change(store, "DROP TABLE properties");
    EXPECT_EQ(property("persist.a"), "") << "another failure, of another kind";
    EXPECT_EQ(platform::closeProperties(), error);
    EXPECT_EQ(platform::propertyFileError(), std::nullopt) << "it is the closed file's";
}

TEST_F(PropertyStoreTest, AStoreThatIsDeletedOrReplacedIsAnError) {
    const std::string store = mFolder / "store";
    const std::string other = mFolder / "other";
    const std::function<void()> kDeeds[] = {
            [&] { fs::remove(store); },
            [&] { fs::remove(store), write(store, ""); },
            [&] { fs::remove(store), fs::copy(other, store); },
            [&] { fs::rename(other, store); },
            [&] { fs::remove(store), fs::create_symlink(other, store); },
            [&] { write(store, ""); },
            [&] { write(store, std::string(5000, 'x')); },
    };
    for (const auto& replace : kDeeds) {
        SCOPED_TRACE(&replace - kDeeds);
        makeStore("store");
        makeStore("other");
        ASSERT_EQ(platform::openProperties(store), std::nullopt);
        replace();
        EXPECT_EQ(platform::closeProperties(), store + kReason + kReplaced);
    }
}

TEST_F(PropertyStoreTest, APinnedFileIsTheOnlyOneThatItsPathMayName) {
    const std::string store = mFolder / "store";
    ASSERT_EQ(platform::pinPropertyFile(store), std::nullopt);
    EXPECT_EQ(files(), (std::map<std::string, std::string>{{"store", ""}}));
    expectStore(store, "");
    EXPECT_EQ(platform::pinPropertyFile(store), std::nullopt);
    fs::remove(store);
    makeStore("store");
    const std::string error = store + kReason + kReplaced;
    EXPECT_EQ(platform::openProperties(store), error);
    EXPECT_EQ(platform::pinPropertyFile(store), error);
    EXPECT_EQ(platform::openProperties(makeStore("other")), std::nullopt) << "which is not pinned";
}

TEST_F(PropertyStoreTest, OtherProgramsLongerValuesAreCut) {
    const std::string store = makeStore("store");
    change(store, "UPDATE properties SET value = '" + std::string(200, 'v') + "';" +
                          "INSERT INTO properties VALUES ('persist.b', '" + std::string(91, 'w') +
                          "'), ('persist.c', 5)");
    ASSERT_EQ(platform::openProperties(store), std::nullopt);
    char value[PROP_VALUE_MAX + 1];
    value[PROP_VALUE_MAX] = '!';
    const auto get = [&](const char* name) { return property_get(name, value, "default"); };
    EXPECT_EQ(get("persist.a"), 91);
    EXPECT_EQ(value, std::string(91, 'v'));
    EXPECT_EQ(get("persist.b"), 91);
    EXPECT_EQ(value, std::string(91, 'w'));
    EXPECT_EQ(value[PROP_VALUE_MAX], '!');
    EXPECT_EQ(get("persist.c"), 1);
    EXPECT_STREQ(value, "5");
}

}  // namespace
