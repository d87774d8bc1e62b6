// The file API must keep exact positions, give data-root and in-memory files
// alike, and fail exactly where a fault was injected.
#include <cstdio>
#include <filesystem>
#include <fstream>
#include <string>

#include "EngineFixture.h"

namespace {

std::string ReadAll(HostFileApi* files, HostFile* file, int64_t chunk)
{
    std::string text;
    char buffer[64];
    for (;;) {
        int64_t got = files->FileRead(buffer, chunk, file);
        if (got <= 0)
            return text;
        text.append(buffer, static_cast<size_t>(got));
    }
}

}  // namespace

class FileStoreTest : public EngineTest {
protected:
    void SetUp() override
    {
        EngineTest::SetUp();
        files = table->files;
        engine.Files().AddMemoryFile("mem/data.txt", "0123456789");
    }
    HostFileApi* files = nullptr;
};

TEST_F(FileStoreTest, ReadsSeeksAndTellsExactly)
{
    // Catches positions that drift after short reads at the end or after seeks.
    HostFile* file = files->FileOpen("mem/data.txt", "rb");
    ASSERT_NE(file, nullptr);
    EXPECT_EQ(file->size, 10);

    struct Step {
        const char* name;
        int64_t seekTo;  // -1: no seek
        int32_t origin;
        int64_t readCount;
        const char* expected;
        int64_t positionAfter;
    } steps[] = {
        {"read 4 from start", -1, 0, 4, "0123", 4},
        {"read 1", -1, 0, 1, "4", 5},
        {"seek to 8, read past end", 8, 0, 5, "89", 10},
        {"read at end", -1, 0, 3, "", 10},
        {"seek back to 2", 2, 0, 2, "23", 4},
        {"seek from position", 3, 1, 1, "7", 8},
        {"seek from end", 0, 2, 1, "", 10},
        {"read zero bytes", 0, 0, 0, "", 0},
    };
    for (const Step& step : steps) {
        SCOPED_TRACE(step.name);
        if (step.seekTo >= 0) {
            ASSERT_EQ(files->FileSeek(file, step.seekTo, step.origin), 0);
        }
        char buffer[16] = {};
        int64_t got = files->FileRead(buffer, step.readCount, file);
        EXPECT_EQ(std::string(buffer, static_cast<size_t>(got)), step.expected);
        EXPECT_EQ(files->FileTell(file), step.positionAfter);
    }
    EXPECT_EQ(files->FileSeek(file, -1, 0), -1);
    EXPECT_EQ(files->FileTell(file), 0);
    files->FileClose(file);
    EXPECT_EQ(engine.Files().OpenFileCount(), 0);
}

TEST_F(FileStoreTest, OpensFilesUnderTheDataRoot)
{
    // Catches engine paths resolved against the working folder instead of the root.
    std::filesystem::path root =
        std::filesystem::temp_directory_path() /
        ("simengine_files_" + std::to_string(::testing::UnitTest::GetInstance()->random_seed()));
    std::filesystem::create_directories(root / "leaderboards");
    std::ofstream(root / "leaderboards" / "board.xml", std::ios::binary) << "<root/>\n";
    engine.Paths().SetDataRoot(root.string());

    HostFile* file = files->FileOpen("leaderboards/board.xml", "r");
    ASSERT_NE(file, nullptr);
    EXPECT_EQ(file->size, 8);
    EXPECT_EQ(ReadAll(files, file, 3), "<root/>\n");
    files->FileClose(file);

    EXPECT_EQ(files->FileOpen("leaderboards/missing.xml", "r"), nullptr);
    EXPECT_EQ(files->FileOpen("leaderboards", "r"), nullptr) << "a folder is not a file";
    std::filesystem::remove_all(root);

    std::vector<simengine::FileOpenCall> opens = engine.Records().All().FileOpens();
    ASSERT_EQ(opens.size(), 3u);
    EXPECT_TRUE(opens[0].opened);
    EXPECT_FALSE(opens[0].inMemory);
    EXPECT_EQ(opens[0].mode, "r");
    EXPECT_FALSE(opens[1].opened);
}

TEST_F(FileStoreTest, InjectedFaultsHitOnlyTheirPath)
{
    // Catches faults that leak to other files or a short read that still delivers everything.
    engine.Files().AddMemoryFile("other.txt", "abc");
    engine.Files().InjectOpenFailure("mem/data.txt");
    EXPECT_EQ(files->FileOpen("mem/data.txt", "rb"), nullptr);
    HostFile* other = files->FileOpen("other.txt", "rb");
    ASSERT_NE(other, nullptr);
    files->FileClose(other);

    engine.Files().ClearFaults();
    engine.Files().InjectShortRead("mem/data.txt", 6);
    HostFile* shortFile = files->FileOpen("mem/data.txt", "rb");
    ASSERT_NE(shortFile, nullptr);
    EXPECT_EQ(shortFile->size, 10) << "the size still tells the full length";
    char buffer[16];
    EXPECT_EQ(files->FileRead(buffer, 4, shortFile), 4);
    EXPECT_EQ(files->FileRead(buffer, 4, shortFile), 2);
    EXPECT_EQ(files->FileRead(buffer, 4, shortFile), 0);
    EXPECT_EQ(files->FileTell(shortFile), 6);
    files->FileClose(shortFile);

    engine.Files().InjectReadFailure("mem/data.txt");
    HostFile* failing = files->FileOpen("mem/data.txt", "rb");
    ASSERT_NE(failing, nullptr);
    EXPECT_EQ(files->FileRead(buffer, 4, failing), -1);
    EXPECT_EQ(files->FileTell(failing), 0);
    files->FileClose(failing);
}

TEST_F(FileStoreTest, MisuseIsJournaledNotCrashed)
{
    // Catches a double close freeing twice, or a write mode silently accepted.
    expectFaults = true;
    HostFile* file = files->FileOpen("mem/data.txt", "rb");
    ASSERT_NE(file, nullptr);
    files->FileClose(file);
    files->FileClose(file);
    char byte;
    EXPECT_EQ(files->FileRead(&byte, 1, file), -1);
    EXPECT_EQ(files->FileOpen("mem/data.txt", "wb"), nullptr);
    EXPECT_EQ(engine.Records().All().Faults().size(), 3u);
}
