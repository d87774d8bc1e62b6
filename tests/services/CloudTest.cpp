// Cloud files: whole-file reads handed to the engine in its own buffer, all or nothing.
#include <gtest/gtest.h>

#include <cstring>

#include "ModuleHarness.h"
#include "services/cloud/CloudImplementation.h"

namespace {

class Cloud : public ModuleTest {
protected:
    void StartCloud()
    {
        ASSERT_TRUE(Start());
        cloud = ServiceAt<CloudImplementation>(1);
        ASSERT_NE(cloud, nullptr);
        ASSERT_TRUE(cloud->Initialize());
    }

    CloudImplementation* cloud = nullptr;
};

TEST_F(Cloud, InitializeTurnsTheCloudOnEachTime)
{
    StartCloud();
    EXPECT_EQ(world.CloudEnabledForApp(), true);
    EXPECT_TRUE(cloud->Initialize());
    EXPECT_EQ(PlatformCalls("SetCloudEnabledForApp"), 2u);
    world.SetInterfaceAvailable(simclient::Interface::RemoteStorage, false);
    EXPECT_FALSE(cloud->Initialize());
    EXPECT_TRUE(cloud->IsAvailable());  // does not tell this case apart
}

TEST_F(Cloud, WriteReadDeleteRoundTrip)
{
    StartCloud();
    const char bytes[] = {'s', 0, 'v', '\xff'};
    EXPECT_TRUE(cloud->WriteFile("save.bin", bytes, 4));
    HostBuffer* buffer = cloud->ReadFile("save.bin");
    ASSERT_NE(buffer, nullptr);
    EXPECT_EQ(buffer->size, 4u);
    EXPECT_EQ(std::memcmp(buffer->data, bytes, 4), 0);
    engine.Table()->ReleaseBuffer(buffer);
    EXPECT_TRUE(cloud->DeleteFile("save.bin"));
    EXPECT_FALSE(cloud->DeleteFile("save.bin"));
    EXPECT_EQ(cloud->ReadFile("save.bin"), nullptr);
}

TEST_F(Cloud, ReadsThatGiveNothing)
{
    StartCloud();
    // Missing: no buffer is ever made.
    EXPECT_EQ(cloud->ReadFile("absent"), nullptr);
    EXPECT_EQ(engine.Memory().BuffersCreated(), 0);

    // Short: the buffer goes back to the engine.
    world.PutFile("short", {1, 2, 3, 4, 5});
    world.InjectFault("FileRead", simclient::Fault::ShortRead(3));
    EXPECT_EQ(cloud->ReadFile("short"), nullptr);
    EXPECT_EQ(engine.Memory().BuffersCreated(), 1);
    EXPECT_EQ(engine.Memory().LiveBufferCount(), 0);
}

TEST_F(Cloud, EmptyFileGivesAnEmptyBufferNotNull)
{
    StartCloud();
    world.PutFile("empty", {});
    HostBuffer* buffer = cloud->ReadFile("empty");
    ASSERT_NE(buffer, nullptr);
    EXPECT_EQ(buffer->size, 0u);
    EXPECT_EQ(world.GetJournal()
                  .Calls("FileRead")
                  .at(0)
                  .args.substr(world.GetJournal().Calls("FileRead").at(0).args.size() - 1),
              "0");
    engine.Table()->ReleaseBuffer(buffer);
}

TEST_F(Cloud, FailedWriteReportsFalse)
{
    StartCloud();
    world.InjectFault("FileWrite", simclient::Fault::Fail());
    EXPECT_FALSE(cloud->WriteFile("x", "y", 1));
    EXPECT_FALSE(world.File("x").has_value());
}

}  // namespace
