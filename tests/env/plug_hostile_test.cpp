#include "ZT/plug.h"

#include <algorithm>
#include <csignal>
#include <fcntl.h>
#include <fstream>
#include <iostream>
#include <sys/resource.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <gtest/gtest.h>

#include "ZT/signals.h"
#include "ZT/timer.h"
#include "env/plugin_tests.h"
#include "platform/dynlib.h"
#include "support/CapturedStderr.h"
#include "support/ErrorTrap.h"
#include "support/FailingMemory.h"
#include "support/FakeAlarm.h"
#include "support/FakeClock.h"

namespace {

std::string ErrorsOfScanning(ZtPlugCatalog& catalog, const std::string& dir)
{
    CapturedStderr err;
    catalog.ScanOneDir(dir.c_str());
    return err.Text();
}

std::string BytesOf(const std::string& path)
{
    std::ifstream in(path, std::ios::binary);
    return {std::istreambuf_iterator<char>(in),
            std::istreambuf_iterator<char>()};
}

std::size_t LinesIn(const std::string& text)
{
    return static_cast<std::size_t>(std::count(text.begin(), text.end(), '\n'));
}

/// The system's loader, with faults of the test's choice.
class FaultyLoader : public zt_platform::Dynlib
{
public:
    FaultyLoader() : before(install(nullptr)), system(current())
    {
        install(this);
    }
    ~FaultyLoader() { install(before); }

    void* open(const char* path, zt_platform::Binding binding) override
    {
        bindings.push_back(binding);
        void* const handle = opens_fail ? nullptr : system.open(path, binding);
        open_count += handle ? 1 : 0;
        return handle;
    }
    void* symbol(void* handle, const char* name) override
    {
        return system.symbol(handle, name);
    }
    bool is_variable(const void* address, std::size_t& bytes) override
    {
        return system.is_variable(address, bytes);
    }
    void close(void* handle) override
    {
        --open_count;
        system.close(handle);
    }
    const char* error_text() override
    {
        return opens_fail ? "x.so: Too many open files" : system.error_text();
    }
    bool is_special_file(const char* path) override
    {
        return system.is_special_file(path);
    }
    bool list_directory(const char* path, bool (*wanted)(const char*),
                        zt_platform::NameList& names) override
    {
        return !lists_fail && system.list_directory(path, wanted, names);
    }

    bool opens_fail = false;
    bool lists_fail = false;
    int open_count = 0;
    std::vector<zt_platform::Binding> bindings;

private:
    zt_platform::Dynlib* before;
    zt_platform::Dynlib& system;
};

/// A catalog that takes no memory of its own for what is added.
class PlainCatalog : public ZtPlugCatalog
{
public:
    PlainCatalog() : ZtPlugCatalog("Test:2.1") {}
    const char* Extension() override { return "t"; }
};

/// No descriptor is free while it lives.
class NoDescriptors
{
public:
    NoDescriptors()
    {
        const int lowest = ::open("/dev/null", O_RDONLY);
        ::close(lowest);
        getrlimit(RLIMIT_NOFILE, &before);
        rlimit none = before;
        none.rlim_cur = static_cast<rlim_t>(lowest);
        setrlimit(RLIMIT_NOFILE, &none);
    }
    ~NoDescriptors() { setrlimit(RLIMIT_NOFILE, &before); }
    NoDescriptors(const NoDescriptors&) = delete;
    NoDescriptors& operator=(const NoDescriptors&) = delete;

private:
    rlimit before;
};

} // namespace

// --- files that are no plug-ins --------------------------------------------

TEST(HostilePlugIns, ATextFileIsToldInTheLoadersWords)
{
    PluginDir dir("good");
    dir.Write("text.t.so", "int main() { return 0; }, and so on and so on\n");
    TestCatalog catalog;

    const std::string errors = ErrorsOfScanning(catalog, dir.Dir());

    EXPECT_EQ(errors.find(dir.Path("text.t.so") + ": "), 0U) << errors;
    EXPECT_EQ(LinesIn(errors), 1U);
    EXPECT_EQ(catalog.Names(), (Names{"good"}));
}

TEST(HostilePlugIns, AnEmptyFileIsToldInTheLoadersWords)
{
    PluginDir dir;
    dir.Write("empty.t.so", "");
    TestCatalog catalog;

    EXPECT_EQ(ErrorsOfScanning(catalog, dir.Dir()),
              dir.Path("empty.t.so") + ": file too short\n");
}

TEST(HostilePlugIns, ALinkToNothingIsToldInTheLoadersWords)
{
    PluginDir dir;
    std::filesystem::create_symlink("nothing", dir.Path("broken.t.so"));
    TestCatalog catalog;

    EXPECT_EQ(ErrorsOfScanning(catalog, dir.Dir())
                  .find(dir.Path("broken.t.so") + ": cannot open"),
              0U);
}

TEST(HostilePlugIns, ADirectoryIsToldInTheLoadersWords)
{
    PluginDir dir("good");
    std::filesystem::create_directory(dir.Path("directory.t.so"));
    TestCatalog catalog;

    EXPECT_EQ(ErrorsOfScanning(catalog, dir.Dir()),
              dir.Path("directory.t.so") +
                  ": cannot read file data: Is a directory\n");
    EXPECT_EQ(catalog.Names(), (Names{"good"}));
}

TEST(HostilePlugIns, PipesAndDevicesArePassedOverSilently)
{
    PluginDir dir("good");
    ASSERT_EQ(mkfifo(dir.Path("fifo.t.so").c_str(), 0600), 0);
    std::filesystem::create_symlink("/dev/zero", dir.Path("zeros.t.so"));
    std::filesystem::create_symlink("fifo.t.so", dir.Path("link.t.so"));
    TestCatalog catalog;

    EXPECT_EQ(ErrorsOfScanning(catalog, dir.Dir()), "");
    EXPECT_EQ(catalog.Names(), (Names{"good"}));
}

TEST(HostilePlugIns, AFifoIsTracedAsNoRegularFile)
{
    SetVariable trace("ZT_PLUGIN_TRACE", "1");
    PluginDir dir;
    ASSERT_EQ(mkfifo(dir.Path("fifo.t.so").c_str(), 0600), 0);
    TestCatalog catalog;

    EXPECT_EQ(ErrorsOfScanning(catalog, dir.Dir()),
              dir.Path("fifo.t.so") +
                  ": id none, wanted Test:2.1: no regular file\n");
}

TEST(HostilePlugIns, AFileThatWasCutShortIsTold)
{
    const std::string whole = BytesOf(ZT_TEST_PLUGINS "/good.so");
    for (std::size_t bytes : {std::size_t{40}, std::size_t{1000},
                              std::size_t{9000}, whole.size() / 4}) {
        PluginDir dir;
        dir.Write("cut.t.so", whole.substr(0, bytes));
        TestCatalog catalog;

        EXPECT_EQ(ErrorsOfScanning(catalog, dir.Dir()),
                  dir.Path("cut.t.so") + ": file too short\n")
            << bytes;
    }
}

TEST(HostilePlugIns, NoLengthOfAFileEndsTheProcess)
{
    const std::string whole = BytesOf(ZT_TEST_PLUGINS "/good.so");
    for (std::size_t bytes = 0; bytes < whole.size();
         bytes += whole.size() / 97 + 1) {
        PluginDir dir;
        dir.Write("cut.t.so", whole.substr(0, bytes));
        TestCatalog catalog;
        ErrorsOfScanning(catalog, dir.Dir());
        TakeTold();
    }
}

TEST(HostilePlugIns, AMissingVariableIsToldInTheLoadersWords)
{
    PluginDir dir("missing_data");
    dir.Add("good");
    TestCatalog catalog;

    const std::string errors = ErrorsOfScanning(catalog, dir.Dir());

    EXPECT_NE(errors.find("undefined symbol: data_that_is_nowhere"),
              std::string::npos)
        << errors;
    EXPECT_EQ(LinesIn(errors), 1U);
    EXPECT_EQ(catalog.Names(), (Names{"good"}));
}

// --- very many, very long --------------------------------------------------

TEST(HostilePlugIns, AThousandPlugInsLeaveNoDescriptorOpen)
{
    PluginDir dir;
    for (int i = 0; i < 1000; ++i)
        std::filesystem::create_hard_link(
            i == 0 ? dir.Add("good", "first") : dir.Path("first"),
            dir.Path(std::to_string(i) + ".t.so"));
    TestCatalog catalog;
    const int before = OpenDescriptors();

    EXPECT_EQ(ErrorsOfScanning(catalog, dir.Dir()), "");

    EXPECT_EQ(OpenDescriptors(), before);
    EXPECT_EQ(catalog.Names(), (Names{"good"}));
}

TEST(HostilePlugIns, AHundredSharedObjectsLeaveNoDescriptorOpen)
{
    PluginDir dir;
    for (int i = 0; i < 50; ++i) {
        dir.Add("two_plugs", "kept" + std::to_string(i) + ".t.so");
        dir.Add("registers_nothing", "closed" + std::to_string(i) + ".t.so");
    }
    const int before = OpenDescriptors();
    FaultyLoader loader;
    {
        TestCatalog catalog;

        EXPECT_EQ(ErrorsOfScanning(catalog, dir.Dir()), "");

        EXPECT_EQ(OpenDescriptors(), before);
        EXPECT_EQ(loader.open_count, 1);
    }
    EXPECT_EQ(loader.open_count, 0);
}

TEST(HostilePlugIns, TenThousandFilesAreAllLookedAt)
{
    PluginDir dir;
    for (int i = 0; i < 10000; ++i)
        dir.Write(std::to_string(i) + ".t.so", "");
    dir.Add("good");
    TestCatalog catalog;

    EXPECT_EQ(LinesIn(ErrorsOfScanning(catalog, dir.Dir())), 10000U);
    EXPECT_EQ(catalog.Names(), (Names{"good"}));
}

TEST(HostilePlugIns, APathOfFourThousandBytesIsTheLoadersToTell)
{
    PluginDir dir;
    std::filesystem::create_directory(dir.Path("d"));
    dir.Add("good", "d/good.t.so");
    std::string path = dir.Path("d");
    while (path.size() + 2 <= 4095)
        path += "/.";
    while (path.size() < 4095)
        path += "/";
    TestCatalog catalog;

    // The directory can be listed; with a name behind it the path is longer
    // than the system's paths are.
    const std::string errors = ErrorsOfScanning(catalog, path);

    EXPECT_EQ(errors.find(path + "/good.t.so: cannot open"), 0U);
    EXPECT_NE(errors.find("File name too long"), std::string::npos);
    EXPECT_EQ(catalog.HeadKey(), nullptr);
}

TEST(HostilePlugIns, APathLongerThanAnyIsSilent)
{
    TestCatalog catalog;

    EXPECT_EQ(ErrorsOfScanning(catalog, std::string(70000, 'p')), "");
    catalog.ScanDirectory(std::string(20000, ':').c_str());

    EXPECT_STREQ(catalog.AddPlug("plug", nullptr)->path, ".");
}

// --- faults of the system --------------------------------------------------

TEST(HostilePlugIns, WithoutADescriptorTheListingFailsSilently)
{
    PluginDir dir("good");
    TestCatalog catalog;
    CapturedStderr err;
    {
        NoDescriptors none;
        catalog.ScanOneDir(dir.Dir().c_str());
    }
    EXPECT_EQ(err.Text(), "");
    EXPECT_EQ(catalog.HeadKey(), nullptr);
    catalog.ScanOneDir(dir.Dir().c_str());
    EXPECT_EQ(catalog.Names(), (Names{"good"}));
}

TEST(HostilePlugIns, WithoutADescriptorTheLoaderTells)
{
    PluginDir dir("good");
    TestCatalog catalog;
    CapturedStderr err;
    {
        NoDescriptors none;
        EXPECT_EQ(catalog.ScanFile(dir.Path("good.t.so").c_str()), 0);
    }
    EXPECT_NE(err.Text().find("Too many open files"), std::string::npos);
    EXPECT_EQ(catalog.ScanFile(dir.Path("good.t.so").c_str()), 1);
}

TEST(HostilePlugIns, FaultsOfTheLoaderAreToldOnePerFile)
{
    PluginDir dir("good");
    dir.Add("two_plugs");
    TestCatalog catalog;
    FaultyLoader loader;

    loader.opens_fail = true;
    EXPECT_EQ(ErrorsOfScanning(catalog, dir.Dir()),
              "x.so: Too many open files\nx.so: Too many open files\n");
    loader.opens_fail = false;
    loader.lists_fail = true;
    EXPECT_EQ(ErrorsOfScanning(catalog, dir.Dir()), "");

    EXPECT_EQ(catalog.HeadKey(), nullptr);
    EXPECT_EQ(loader.bindings, (std::vector<zt_platform::Binding>(
                                   2, zt_platform::Binding::Lazy)));
}

TEST(HostilePlugIns, MemoryThatRunsOutLeavesACatalogThatWorks)
{
    PluginDir dir;
    dir.Add("two_plugs");
    const std::string path = dir.Dir();
    int times = 0;
    for (bool failed = true; failed; ++times) {
        CapturedStderr err;
        ErrorTrap reports;
        PlainCatalog catalog;
        {
            FailingMemory none(times, 1);
            const ZtPlugCatalog::Plug* const made =
                catalog.AddPlug("host", nullptr);
            EXPECT_EQ(made, catalog.FindPlug("host")) << times;
            catalog.ScanDirectory(path.c_str());
            catalog.FindPlugHelpFilename("host", "txt");
            failed = FailingMemory::Failed();
        }
        catalog.ScanOneDir(path.c_str());
        EXPECT_NE(catalog.FindPlug("second"), nullptr) << times;
        ASSERT_LT(times, 200);
    }
    EXPECT_GT(times, 10);
    TakeTold();
}

// --- what plug-ins must not do ---------------------------------------------

// The other compiler makes no unique symbols.
#ifndef __clang__
TEST(HostilePlugIns, AUniqueSymbolKeepsASharedObjectInMemory)
{
    PluginDir dir("unique_symbol");
    TakeTold();
    TestCatalog catalog;

    catalog.ScanOneDir(dir.Dir().c_str());

    EXPECT_EQ(catalog.HeadKey(), nullptr);
    EXPECT_TRUE(IsLoaded(dir.Path("unique_symbol.t.so")));
}
#endif

TEST(HostilePlugIns, AThreadThatIsLeftBehindEndsTheProcess)
{
    PluginDir dir("starts_thread");

    EXPECT_DEATH(
        {
            TestCatalog catalog;
            catalog.ScanOneDir(dir.Dir().c_str());
            for (int tick = 0; tick < 5000; ++tick)
                usleep(1000);
            _exit(0);
        },
        "");
}

TEST(HostilePlugIns, AnExitHookThatIsLeftBehindRunsWhenTheCodeGoes)
{
    PluginDir dir("leaves_exit_hook");
    TakeTold();
    TestCatalog catalog;

    catalog.ScanOneDir(dir.Dir().c_str());

    EXPECT_FALSE(IsLoaded(dir.Path("leaves_exit_hook.t.so")));
    EXPECT_EQ(TakeTold(), (Names{"exit hook"}));
}

TEST(HostilePlugIns, ASignalHookThatIsLeftBehindEndsTheProcess)
{
    PluginDir dir("leaves_signal_hook");

    EXPECT_DEATH(
        {
            TestCatalog catalog;
            catalog.ScanOneDir(dir.Dir().c_str());
            std::raise(SIGUSR1);
            _exit(0);
        },
        "");
}

TEST(HostilePlugIns, ATimerCallbackThatIsLeftBehindEndsTheProcess)
{
    PluginDir dir("leaves_timer_callback");
    const auto is_crash = [](int status) {
        // By a signal, or by what watches memory; a name that the loader does
        // not find would end it with another code.
        return WIFSIGNALED(status) || WEXITSTATUS(status) == 1;
    };

    EXPECT_EXIT(
        {
            FakeClock clock;
            FakeAlarm alarm(clock);
            ZtTimerBeat::start();
            ZtTimer own(0, KvoTime::FOREVER);
            TestCatalog catalog;
            catalog.ScanOneDir(dir.Dir().c_str());
            if (!IsLoaded(dir.Path("leaves_timer_callback.t.so")))
                std::cerr << "it is closed" << std::endl;
            for (int beat = 0; beat < 10; ++beat)
                alarm.Step();
            _exit(0);
        },
        is_crash, "it is closed");
}
