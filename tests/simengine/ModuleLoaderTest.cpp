// The loader must load a module file as the engine does, explain what is
// missing, and unload so that the next load starts with fresh statics.
#include <string>

#include "EngineFixture.h"
#include "simengine/ModuleLoader.h"

using ModuleLoaderTest = EngineTest;

TEST_F(ModuleLoaderTest, ExplainsAMissingFileOrExport)
{
    // Catches a silent failure, or one that does not name the file or the export.
    struct Row {
        const char* name;
        std::string path;
        const char* mustMention;
    } rows[] = {
        {"missing file", "/nonexistent/libnothing.so", "cannot load module"},
        {"no export", NO_EXPORT_MODULE_PATH, "OB_GetExtensionModuleInterface"},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(row.name);
        simengine::ModuleLoader loader;
        EXPECT_FALSE(loader.Load(row.path));
        EXPECT_FALSE(loader.IsLoaded());
        EXPECT_EQ(loader.Module(), nullptr);
        EXPECT_NE(loader.Error().find(row.path), std::string::npos) << loader.Error();
        EXPECT_NE(loader.Error().find(row.mustMention), std::string::npos) << loader.Error();
    }
}

TEST_F(ModuleLoaderTest, UnloadJoinsThreadsAndGivesFreshStatics)
{
    // Catches dlclose while module threads still run, or a reload that reuses old statics.
    simengine::ModuleLoader loader;
    ASSERT_TRUE(loader.Load(FAKE_MODULE_PATH)) << loader.Error();
    ASSERT_NE(loader.Module(), nullptr);
    EXPECT_STREQ(loader.Module()->GetName(), "Fake");
    EXPECT_TRUE(loader.Module()->Initialize(table));
    EXPECT_FALSE(loader.Module()->Initialize(table)) << "statics persist while loaded";
    ASSERT_TRUE(engine.Time().WaitUntilSleeping("Fake_Worker"));

    EXPECT_TRUE(loader.Unload()) << loader.Error();
    EXPECT_EQ(engine.Threads().RunningCount(), 0);
    EXPECT_FALSE(loader.IsLoaded());

    engine.SetQuitting(false);
    ASSERT_TRUE(loader.Load(FAKE_MODULE_PATH)) << loader.Error();
    EXPECT_TRUE(loader.Module()->Initialize(table)) << "a reload must start from fresh statics";
}
