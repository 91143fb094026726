#include "platform/dynlib.h"

#include <cerrno>
#include <cstdint>
#include <cstring>
#include <string>
#include <sys/stat.h>
#include <vector>

#include <gtest/gtest.h>

#include "support/FailingMalloc.h"
#include "support/FaultyFiles.h"
#include "support/TempDir.h"

namespace {

using zt_platform::Dynlib;
using zt_platform::NameList;
using zt_platform::object_extent;
using zt_platform::ObjectExtent;

std::vector<std::string> NamesOf(const NameList& list)
{
    std::vector<std::string> names;
    for (const char* name = list.first(); name; name = list.next(name))
        names.emplace_back(name);
    return names;
}

bool any(const char*)
{
    return true;
}

bool ends_in_so(const char* name)
{
    const std::size_t length = std::strlen(name);
    return length > 3 && std::strcmp(name + length - 3, ".so") == 0;
}

/// The beginning of a shared object with one loaded segment, spelled out for
/// either word size and byte order.
class Object
{
public:
    Object(bool wide_words, bool big_endian)
        : wide(wide_words), big(big_endian), bytes(wide ? 64 : 52, '\0')
    {
        bytes.replace(0, 4,
                      "\x7f"
                      "ELF");
        bytes[4] = wide ? 2 : 1;
        bytes[5] = big ? 2 : 1;
        Put(wide ? 32 : 28, bytes.size(), wide ? 8 : 4); // the table is next
        Put(wide ? 54 : 42, SegmentBytes(), 2);
        Put(wide ? 56 : 44, 1, 2);
        bytes.resize(bytes.size() + SegmentBytes());
        Segment(1, 0, bytes.size());
    }

    std::size_t SegmentBytes() const { return wide ? 56 : 32; }

    void Segment(std::uint32_t type, std::uint64_t offset, std::uint64_t size)
    {
        const std::size_t at = wide ? 64 : 52;
        Put(at, type, 4);
        Put(at + (wide ? 8 : 4), offset, wide ? 8 : 4);
        Put(at + (wide ? 32 : 16), size, wide ? 8 : 4);
    }

    void Put(std::size_t at, std::uint64_t value, std::size_t size)
    {
        for (std::size_t i = 0; i < size; ++i) {
            const std::size_t place = big ? size - 1 - i : i;
            bytes[at + place] = static_cast<char>(value >> (8 * i));
        }
    }

    const bool wide;
    const bool big;
    std::string bytes;
};

ObjectExtent ExtentOf(const std::string& bytes)
{
    TempDir dir;
    return object_extent(dir.Write("object.so", bytes).c_str());
}

template <typename Change>
void ExpectForAllKinds(ObjectExtent extent, Change change)
{
    for (const bool wide : {false, true})
        for (const bool big : {false, true}) {
            Object object(wide, big);
            change(object);
            EXPECT_EQ(ExtentOf(object.bytes), extent)
                << "wide " << wide << ", big " << big;
        }
}

} // namespace

// --- extent ----------------------------------------------------------------

TEST(ObjectExtent, IsWholeWhenEverySegmentIsInsideTheFile)
{
    ExpectForAllKinds(ObjectExtent::Whole, [](Object&) {});
    ExpectForAllKinds(ObjectExtent::Whole, [](Object& object) {
        object.Segment(1, object.bytes.size(), 0);
    });
    EXPECT_EQ(object_extent("/proc/self/exe"), ObjectExtent::Whole);
}

TEST(ObjectExtent, IsCutWhenASegmentEndsBehindTheFile)
{
    ExpectForAllKinds(ObjectExtent::Cut, [](Object& object) {
        object.Segment(1, 0, object.bytes.size() + 1);
    });
    ExpectForAllKinds(ObjectExtent::Cut, [](Object& object) {
        object.Segment(1, object.bytes.size() + 1, 0);
    });
    ExpectForAllKinds(ObjectExtent::Cut, [](Object& object) {
        object.Segment(1, 1, object.bytes.size());
    });
}

TEST(ObjectExtent, IsCutWhenTheEndOfASegmentIsBeyondAllNumbers)
{
    for (const std::uint64_t most : {~std::uint64_t{0}, ~std::uint64_t{0} - 1})
        ExpectForAllKinds(ObjectExtent::Cut, [most](Object& object) {
            object.Segment(1, 8, most);
        });
    ExpectForAllKinds(ObjectExtent::Cut, [](Object& object) {
        object.Segment(1, ~std::uint64_t{0}, 1);
    });
}

TEST(ObjectExtent, SegmentsThatAreNotLoadedMayEndAnywhere)
{
    ExpectForAllKinds(ObjectExtent::Whole, [](Object& object) {
        object.Segment(4, 0, ~std::uint64_t{0});
    });
}

TEST(ObjectExtent, IsCutWhenTheSegmentTableEndsBehindTheFile)
{
    ExpectForAllKinds(ObjectExtent::Cut, [](Object& object) {
        object.Put(object.wide ? 56 : 44, 2, 2);
    });
    ExpectForAllKinds(ObjectExtent::Cut, [](Object& object) {
        object.Put(object.wide ? 56 : 44, 0xFFFF, 2);
    });
    ExpectForAllKinds(ObjectExtent::Cut, [](Object& object) {
        object.Put(object.wide ? 32 : 28, ~std::uint64_t{0},
                   object.wide ? 8 : 4);
    });
}

TEST(ObjectExtent, IsCutWhenTheHeaderIs)
{
    for (std::size_t bytes : {4U, 5U, 15U, 16U, 51U})
        ExpectForAllKinds(ObjectExtent::Cut, [bytes](Object& object) {
            object.bytes.resize(bytes);
        });
}

TEST(ObjectExtent, IsUnknownForWhatIsNoSharedObject)
{
    EXPECT_EQ(ExtentOf(""), ObjectExtent::Unknown);
    EXPECT_EQ(ExtentOf("\x7f"
                       "EL"),
              ObjectExtent::Unknown);
    EXPECT_EQ(ExtentOf(std::string(4096, 'E')), ObjectExtent::Unknown);
    EXPECT_EQ(object_extent("/nowhere"), ObjectExtent::Unknown);
    EXPECT_EQ(object_extent("/tmp"), ObjectExtent::Unknown);
    EXPECT_EQ(object_extent(nullptr), ObjectExtent::Unknown);
}

TEST(ObjectExtent, IsUnknownForWordsOrTablesOfAnUnknownKind)
{
    ExpectForAllKinds(ObjectExtent::Unknown,
                      [](Object& object) { object.bytes[4] = 3; });
    ExpectForAllKinds(ObjectExtent::Unknown,
                      [](Object& object) { object.bytes[4] = 0; });
    ExpectForAllKinds(ObjectExtent::Unknown,
                      [](Object& object) { object.bytes[5] = 3; });
    ExpectForAllKinds(ObjectExtent::Unknown, [](Object& object) {
        object.Put(object.wide ? 54 : 42, object.SegmentBytes() + 1, 2);
    });
}

TEST(ObjectExtent, SurvivesFaultsOfTheDisk)
{
    TempDir dir;
    Object object(true, false);
    const std::string path = dir.Write("object.so", object.bytes);
    FaultyFiles files;

    files.most_at_once = 1;
    files.interrupts = true;
    EXPECT_EQ(object_extent(path.c_str()), ObjectExtent::Whole);
    files.read_ends = 70;
    EXPECT_EQ(object_extent(path.c_str()), ObjectExtent::Unknown);
    files.opens_fail = true;
    EXPECT_EQ(object_extent(path.c_str()), ObjectExtent::Unknown);

    EXPECT_EQ(files.open_count, 0);
}

// --- names -----------------------------------------------------------------

TEST(NameList, KeepsNamesInOrder)
{
    NameList list;
    EXPECT_EQ(list.first(), nullptr);
    std::vector<std::string> model;
    for (int i = 0; i < 3000; ++i) {
        model.push_back(std::string(static_cast<std::size_t>(i % 70), 'n') +
                        std::to_string(i));
        ASSERT_TRUE(list.add(model.back().c_str()));
    }

    EXPECT_EQ(NamesOf(list), model);
}

TEST(NameList, KeepsAnEmptyNameAndALongOne)
{
    NameList list;
    const std::string name(70000, 'n');

    EXPECT_TRUE(list.add(""));
    EXPECT_TRUE(list.add(name.c_str()));
    EXPECT_TRUE(list.add(""));

    EXPECT_EQ(NamesOf(list), (std::vector<std::string>{"", name, ""}));
}

TEST(NameList, IsAsItWasWhenThereIsNoMemory)
{
    NameList list;
    list.add("first");
    const std::string name(5000, 'n');
    bool added = true;
    {
        FailingMalloc none(0);
        added = list.add(name.c_str());
    }
    EXPECT_FALSE(added);
    EXPECT_EQ(NamesOf(list), (std::vector<std::string>{"first"}));
}

// --- directories and files -------------------------------------------------

TEST(Dynlib, ListsTheNamesThatAreWanted)
{
    TempDir dir;
    for (const char* name : {"a.so", "b.txt", ".so", "c.so.bak"})
        dir.Write(name, "");
    NameList wanted;
    NameList all;

    ASSERT_TRUE(Dynlib::current().list_directory(dir.Path("").c_str(),
                                                 ends_in_so, wanted));
    ASSERT_TRUE(
        Dynlib::current().list_directory(dir.Path("").c_str(), any, all));

    EXPECT_EQ(NamesOf(wanted), (std::vector<std::string>{"a.so"}));
    EXPECT_EQ(NamesOf(all).size(), 6U); // with . and ..
}

TEST(Dynlib, ListsNoDirectoryThatIsNone)
{
    TempDir dir;
    NameList names;

    EXPECT_FALSE(Dynlib::current().list_directory("/nowhere", any, names));
    EXPECT_EQ(errno, ENOENT);
    EXPECT_FALSE(Dynlib::current().list_directory(dir.Write("file", "").c_str(),
                                                  any, names));
    EXPECT_EQ(errno, ENOTDIR);
    EXPECT_EQ(names.first(), nullptr);
}

TEST(Dynlib, KnowsWhatMustNotBeOpened)
{
    TempDir dir;
    ASSERT_EQ(mkfifo(dir.Path("fifo").c_str(), 0600), 0);

    EXPECT_TRUE(Dynlib::current().is_special_file(dir.Path("fifo").c_str()));
    EXPECT_TRUE(Dynlib::current().is_special_file("/dev/null"));
    EXPECT_FALSE(Dynlib::current().is_special_file(dir.Path("").c_str()));
    EXPECT_FALSE(
        Dynlib::current().is_special_file(dir.Write("file", "").c_str()));
    EXPECT_FALSE(Dynlib::current().is_special_file("/nowhere"));
}

// --- loading ---------------------------------------------------------------

TEST(Dynlib, OpensLooksUpAndCloses)
{
    Dynlib& loader = Dynlib::current();
    for (const auto binding :
         {zt_platform::Binding::Lazy, zt_platform::Binding::Now}) {
        void* handle = loader.open("libm.so.6", binding);
        ASSERT_NE(handle, nullptr);

        EXPECT_NE(loader.symbol(handle, "cos"), nullptr);
        EXPECT_EQ(loader.symbol(handle, "no_such_name"), nullptr);

        loader.close(handle);
    }
}

TEST(Dynlib, KnowsVariablesAndTheirSizes)
{
    Dynlib& loader = Dynlib::current();
    void* handle = loader.open("libc.so.6", zt_platform::Binding::Lazy);
    ASSERT_NE(handle, nullptr);
    const char* variable =
        static_cast<const char*>(loader.symbol(handle, "environ"));
    std::size_t bytes = 0;

    EXPECT_TRUE(loader.is_variable(variable, bytes));
    EXPECT_EQ(bytes, sizeof(char*));
    EXPECT_FALSE(loader.is_variable(variable + 1, bytes));
    EXPECT_EQ(bytes, 0U);
    EXPECT_FALSE(loader.is_variable(loader.symbol(handle, "puts"), bytes));
    EXPECT_FALSE(loader.is_variable(&bytes, bytes));
    EXPECT_FALSE(loader.is_variable(nullptr, bytes));

    loader.close(handle);
}

TEST(Dynlib, TellsWhyItFailedOnce)
{
    Dynlib& loader = Dynlib::current();

    EXPECT_EQ(loader.open("/nowhere/x.so", zt_platform::Binding::Lazy),
              nullptr);

    EXPECT_EQ(std::string(loader.error_text()),
              "/nowhere/x.so: cannot open shared object file: "
              "No such file or directory");
    EXPECT_STREQ(loader.error_text(), "unknown error of the loader");
}
