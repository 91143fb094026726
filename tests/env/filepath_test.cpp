#include "ZT/filepath.h"

#include <limits>
#include <random>
#include <sstream>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "ZT/util.h"
#include "platform/files.h"
#include "support/FailingMemory.h"
#include "support/OtherLocale.h"
#include "support/TempDir.h"

namespace {

std::vector<std::string> PartsOf(const ZtFilePath& path)
{
    std::vector<std::string> parts;
    for (int part = 0; part < path.Count(); ++part)
        parts.emplace_back(path.ArgText(part));
    return parts;
}

using Parts = std::vector<std::string>;

std::string Full(const char* text)
{
    return ZtFilePath(text).FullPath();
}

std::string Head(const char* text)
{
    return ZtFilePath(text).Head();
}

std::string Tail(const char* text)
{
    return ZtFilePath(text).Tail();
}

std::string Root(const char* text)
{
    return ZtFilePath(text).Root();
}

std::string Extension(const char* text)
{
    return ZtFilePath(text).Extension();
}

int Number(const char* text)
{
    return ZtFilePath(text).Number();
}

std::string Trimmed(const char* text, const char* head)
{
    return ZtFilePath(text).TrimHead(head);
}

std::string WithExtension(const char* text, const char* extension)
{
    ZtFilePath path(text);
    path.SetExtension(extension);
    return path.FullPath();
}

std::string WithAdded(const char* text, const char* extension,
                      ZtFilePath::ForceType force)
{
    ZtFilePath path(text);
    path.AddExtension(extension, force);
    return path.FullPath();
}

std::string WithHead(const char* text, const char* head)
{
    ZtFilePath path(text);
    path.ReplaceHead(head);
    return path.FullPath();
}

std::string Written(ZtFilePath& path, int parts)
{
    std::ostringstream out;
    path.Write(out, parts);
    return out.str();
}

/// Answers access questions as told and remembers the last one.
class AskedFiles : public zt_platform::Files
{
public:
    AskedFiles() : before(install(this)) {}
    ~AskedFiles() { install(before); }

    bool accessible(const char* path, zt_platform::Access mode) override
    {
        asked = path;
        access = mode;
        return answer;
    }
    int open_input(const char*, std::uint64_t&) override { return -1; }
    std::ptrdiff_t read_at(int, void*, std::size_t, std::uint64_t) override
    {
        return -1;
    }
    int open_output(const char*) override { return -1; }
    std::ptrdiff_t write_at(int, const void*, std::size_t,
                            std::uint64_t) override
    {
        return -1;
    }
    std::ptrdiff_t write_next(int, const void*, std::size_t) override
    {
        return -1;
    }
    zt_platform::FileKind kind(const char*) override
    {
        return zt_platform::FileKind::Nothing;
    }
    char* resolve(const char*) override { return nullptr; }
    int open_new(const char*, const char*) override { return -1; }
    bool move(const char*, const char*) override { return false; }
    bool remove(const char*) override { return false; }
    bool close(int) override { return false; }

    bool answer = true;
    std::string asked;
    zt_platform::Access access = zt_platform::Access::Execute;

private:
    Files* before;
};

/// Makes the next temporary string free `text`.
const char* AboutToBeFreed(const char* text)
{
    const char* oldest = ZtNewTempString(text);
    for (int made = 0; made < 99; ++made)
        ZtNewTempString("");
    return oldest;
}

} // namespace

// --- parts -----------------------------------------------------------------

TEST(ZtFilePath, TakesAPathApartAtItsSlashes)
{
    EXPECT_EQ(PartsOf(ZtFilePath("/usr/quarn/bin")),
              (Parts{"/", "usr", "/", "quarn", "/", "bin"}));
    EXPECT_EQ(PartsOf(ZtFilePath("dir/")), (Parts{"dir", "/"}));
    EXPECT_EQ(PartsOf(ZtFilePath("a//b")), (Parts{"a", "/", "/", "b"}));
    EXPECT_EQ(PartsOf(ZtFilePath("file")), (Parts{"file"}));
    EXPECT_EQ(PartsOf(ZtFilePath("/")), (Parts{"/"}));
}

TEST(ZtFilePath, OfNullIsTheCurrentDirectory)
{
    EXPECT_EQ(Full(nullptr), ".");
    EXPECT_EQ(PartsOf(ZtFilePath(nullptr)), (Parts{"."}));
}

TEST(ZtFilePath, LosesBlanks)
{
    EXPECT_EQ(Full("my file"), "myfile");
    EXPECT_EQ(PartsOf(ZtFilePath("my file")), (Parts{"my", "file"}));
    EXPECT_EQ(Full(" /a\t/ b\n"), "/a/b");
}

TEST(ZtFilePath, QuotesAndBackslashesKeepBlanksAndSlashes)
{
    EXPECT_EQ(PartsOf(ZtFilePath("/\"my file\"")), (Parts{"/", "my file"}));
    EXPECT_EQ(PartsOf(ZtFilePath("a\\ b/'c/d'")), (Parts{"a b", "/", "c/d"}));
    EXPECT_EQ(Full("/\"my file\".rgb"), "/my file.rgb");
}

TEST(ZtFilePath, CommentCharactersAndSemicolonsAreOrdinary)
{
    EXPECT_EQ(PartsOf(ZtFilePath("#a/!b;c")), (Parts{"#a", "/", "!b;c"}));
}

TEST(ZtFilePath, ACopyIsAPathOfItsOwn)
{
    ZtFilePath path("/a/b.rgb");

    ZtFilePath copy(path);
    copy.SetExtension("tif");

    EXPECT_STREQ(copy.FullPath(), "/a/b.tif");
    EXPECT_STREQ(path.FullPath(), "/a/b.rgb");
}

TEST(ZtFilePath, WritesAllPartsWithNothingBetween)
{
    ZtFilePath path("/usr/my file");
    std::ostringstream out;
    KvoTokenList& as_list = path;

    as_list.Write(out);

    EXPECT_EQ(out.str(), "/usr/myfile");
}

TEST(ZtFilePath, WritesTheFirstParts)
{
    ZtFilePath path("/usr/bin"); // four parts

    EXPECT_EQ(Written(path, 1), "/");
    EXPECT_EQ(Written(path, 2), "/usr");
    EXPECT_EQ(Written(path, 3), "/usr/");
    EXPECT_EQ(Written(path, 4), "/usr/bin");
    EXPECT_EQ(Written(path, 5), "/usr/bin");
    EXPECT_EQ(Written(path, 0), "/usr/bin");
    EXPECT_EQ(Written(path, std::numeric_limits<int>::max()), "/usr/bin");
}

TEST(ZtFilePath, WritesThatManyPartsFewer)
{
    ZtFilePath path("/usr/bin");

    EXPECT_EQ(Written(path, -1), "/usr/");
    EXPECT_EQ(Written(path, -3), "/");
    EXPECT_EQ(Written(path, -4), "");
    EXPECT_EQ(Written(path, -5), "");
    EXPECT_EQ(Written(path, std::numeric_limits<int>::min()), "");
}

TEST(ZtFilePath, WritesTheSameWhateverTheStreamIsSetTo)
{
    ZtFilePath path("a/b");
    std::ostringstream wide;
    wide.width(5);
    std::ostream broken(nullptr);
    EXPECT_THROW(broken.exceptions(std::ios::badbit), std::ios::failure);

    path.Write(wide);

    EXPECT_EQ(wide.str(), "a/b");
    EXPECT_NO_THROW(path.Write(broken));
    EXPECT_NO_THROW(path.Write(broken, 1));
    EXPECT_TRUE(broken.bad());
}

// --- accessors -------------------------------------------------------------

TEST(ZtFilePath, FullPathIsAllOfIt)
{
    EXPECT_EQ(Full("/usr/quarn/bin"), "/usr/quarn/bin");
    EXPECT_EQ(Full("a//b/"), "a//b/");
    EXPECT_EQ(Full(""), "");
}

TEST(ZtFilePath, HeadIsTheDirectory)
{
    EXPECT_EQ(Head("/usr/quarn/bin"), "/usr/quarn");
    EXPECT_EQ(Head("a/b"), "a");
    EXPECT_EQ(Head("a//b"), "a/");
}

TEST(ZtFilePath, HeadOfAPathThatEndsWithASlashIsAllBeforeIt)
{
    EXPECT_EQ(Head("dir/"), "dir");
    EXPECT_EQ(Head("/a/b/"), "/a/b");
    EXPECT_EQ(Head("//"), "/");
}

TEST(ZtFilePath, HeadOfANameAtTheRootIsEmpty)
{
    EXPECT_EQ(Head("/a"), "");
    EXPECT_EQ(Head("/"), "");
}

TEST(ZtFilePath, ABareNameIsItsOwnHead)
{
    EXPECT_EQ(Head("file"), "file");
    EXPECT_EQ(Head(nullptr), ".");
}

TEST(ZtFilePath, HeadCountsPartsNotSlashes)
{
    EXPECT_EQ(Head("my file"), ""); // two names, the last two parts
    EXPECT_EQ(Head("a b c"), "a");
}

TEST(ZtFilePath, AQuotedSlashAtTheEndCountsAsOne)
{
    EXPECT_EQ(Tail("a/'/b'"), "");
    EXPECT_EQ(Head("a/'/b'"), "a/");
    EXPECT_EQ(Head("'/b'"), "");
}

TEST(ZtFilePath, TailIsTheLastName)
{
    EXPECT_EQ(Tail("/usr/quarn/bin"), "bin");
    EXPECT_EQ(Tail("file"), "file");
    EXPECT_EQ(Tail("dir/"), "");
    EXPECT_EQ(Tail("/"), "");
    EXPECT_EQ(Tail("my file"), "file");
}

TEST(ZtFilePath, RootIsAllBeforeTheLastPoint)
{
    EXPECT_EQ(Root("/a/b.c.rgb"), "/a/b.c");
    EXPECT_EQ(Root("pic.0042.rgb"), "pic.0042");
    EXPECT_EQ(Root("/usr/quarn/bin"), "/usr/quarn/bin");
    EXPECT_EQ(Root("a.b/c"), "a.b/c");
    EXPECT_EQ(Root("a.b/"), "a.b/");
    EXPECT_EQ(Root(".cshrc"), "");
    EXPECT_EQ(Root("/a/."), "/a/");
}

TEST(ZtFilePath, ExtensionIsAllBehindTheLastPoint)
{
    EXPECT_EQ(Extension("pic.0042.rgb"), "rgb");
    EXPECT_EQ(Extension("/usr/quarn/bin"), "");
    EXPECT_EQ(Extension("a.b/c"), "");
    EXPECT_EQ(Extension("dir.x/"), "");
    EXPECT_EQ(Extension("shot."), "");
    EXPECT_EQ(Extension(".cshrc"), "cshrc");
}

TEST(ZtFilePath, NumberIsTheLastPieceOfDigits)
{
    EXPECT_EQ(Number("pic.0042.rgb"), 42);
    EXPECT_EQ(Number("shot.0012.rgb"), 12);
    EXPECT_EQ(Number("shot.0012"), 12);
    EXPECT_EQ(Number("shot.1.2.rgb.tif"), 2);
    EXPECT_EQ(Number("/a.7/shot.rgb"), 999999);
    EXPECT_EQ(Number("a.010"), 10);
}

TEST(ZtFilePath, NumberIsThereOnlyBehindAPoint)
{
    EXPECT_EQ(Number("shot12.rgb"), 999999);
    EXPECT_EQ(Number("12"), 999999);
    EXPECT_EQ(Number("12.rgb"), 999999);
    EXPECT_EQ(Number("shot.-5.rgb"), 999999);
    EXPECT_EQ(Number("shot.1a"), 999999);
    EXPECT_EQ(Number("dir.5/"), 999999);
}

TEST(ZtFilePath, AnEmptyPieceIsTheNumberZero)
{
    EXPECT_EQ(Number("shot."), 0);
    EXPECT_EQ(Number("."), 0);
    EXPECT_EQ(Number(".."), 0);
    EXPECT_EQ(Number("shot..rgb"), 0);
    EXPECT_EQ(Number("shot.7..rgb"), 0);
}

TEST(ZtFilePath, NumberStopsAtTheUpperEndOfInt)
{
    EXPECT_EQ(Number("a.2147483647"), 2147483647);
    EXPECT_EQ(Number("a.2147483648"), 2147483647);
    EXPECT_EQ(Number("a.99999999999999999999.rgb"), 2147483647);
}

TEST(ZtFilePath, TrimHeadTakesTheHeadAndOneSlashAway)
{
    EXPECT_EQ(Trimmed("/usr/quarn", "/usr"), "quarn");
    EXPECT_EQ(Trimmed("/usr/quarn", "/usr/"), "quarn");
    EXPECT_EQ(Trimmed("/usr//quarn", "/usr"), "/quarn");
    EXPECT_EQ(Trimmed("/usr/quarn", "/usr/quarn"), "");
}

TEST(ZtFilePath, TrimHeadLeavesAnotherPathAlone)
{
    EXPECT_EQ(Trimmed("/usr/quarn", "/var"), "/usr/quarn");
    EXPECT_EQ(Trimmed("/usr/quarn", "/usr/quarn/bin"), "/usr/quarn");
    EXPECT_EQ(Trimmed("/usr/quarn", "usr"), "/usr/quarn");
    EXPECT_EQ(Trimmed("/usr/quarn", ""), "/usr/quarn");
    EXPECT_EQ(Trimmed("/usr/quarn", nullptr), "/usr/quarn");
    EXPECT_EQ(Trimmed("", "/usr"), "");
}

TEST(ZtFilePath, TrimHeadComparesBytesNotNames)
{
    EXPECT_EQ(Trimmed("/usrlocal/x", "/usr"), "local/x");
}

TEST(ZtFilePath, APathWithoutPartsHasEmptyTexts)
{
    for (const char* text : {"", " \t "}) {
        EXPECT_EQ(ZtFilePath(text).Count(), 0);
        EXPECT_EQ(Full(text), "");
        EXPECT_EQ(Head(text), "");
        EXPECT_EQ(Tail(text), "");
        EXPECT_EQ(Root(text), "");
        EXPECT_EQ(Extension(text), "");
        EXPECT_EQ(Number(text), 999999);
        EXPECT_EQ(Trimmed(text, "/usr"), "");
    }
}

TEST(ZtFilePath, TextsAreTemporaryStrings)
{
    const ZtFilePath path("/a/b.rgb");
    const char* first = path.FullPath();
    const char* second = path.FullPath();

    for (int made = 0; made < 98; ++made)
        path.Tail();

    EXPECT_NE(first, second);
    EXPECT_STREQ(first, "/a/b.rgb");
}

// --- edits -----------------------------------------------------------------

TEST(ZtFilePath, SetExtensionReplacesTheLastExtension)
{
    EXPECT_EQ(WithExtension("a.b.rgb", "tif"), "a.b.tif");
    EXPECT_EQ(WithExtension("/x/a.rgb", "tif"), "/x/a.tif");
    EXPECT_EQ(WithExtension("a", "rgb"), "a.rgb");
    EXPECT_EQ(WithExtension("d.e/a", "rgb"), "d.e/a.rgb");
    EXPECT_EQ(WithExtension("a.", "rgb"), "a.rgb");
    EXPECT_EQ(WithExtension(".cshrc", "rgb"), ".rgb");
}

TEST(ZtFilePath, SetExtensionMakesANameWhereThereIsNone)
{
    EXPECT_EQ(WithExtension("dir/", "rgb"), "dir/.rgb");
    EXPECT_EQ(WithExtension("/", "rgb"), "/.rgb");
    EXPECT_EQ(WithExtension("", "rgb"), "/.rgb");
    EXPECT_EQ(WithExtension("d.e/", "rgb"), "d.e/.rgb");
}

TEST(ZtFilePath, SetExtensionTakesNullAsTheEmptyOne)
{
    EXPECT_EQ(WithExtension("a.rgb", nullptr), "a.");
    EXPECT_EQ(WithExtension("a.rgb", ""), "a.");
    EXPECT_EQ(WithExtension("", nullptr), "/.");
}

TEST(ZtFilePath, SetExtensionReplacesOnePart)
{
    ZtFilePath path("/x/a.rgb");

    path.SetExtension("tif");

    EXPECT_EQ(PartsOf(path), (Parts{"/", "x", "/", "a.tif"}));
}

TEST(ZtFilePath, ANewNameIsAPartOfItsOwn)
{
    ZtFilePath path("dir/");
    ZtFilePath none("");

    path.SetExtension("rgb");
    none.SetExtension("rgb");

    EXPECT_EQ(PartsOf(path), (Parts{"dir", "/", ".rgb"}));
    EXPECT_EQ(PartsOf(none), (Parts{"/", ".rgb"}));
}

TEST(ZtFilePath, AnEditedPartIsNoLongerQuoted)
{
    ZtFilePath path("'my file.rgb'");

    path.SetExtension("tif");

    EXPECT_STREQ(path.FullPath(), "my file.tif");
    EXPECT_EQ(path.Find(0)->Quote(), '\0');
}

TEST(ZtFilePath, AddExtensionLeavesTheSameOneAlone)
{
    EXPECT_EQ(WithAdded("a.rgb", "rgb", ZtFilePath::IfDifferent), "a.rgb");
    EXPECT_EQ(WithAdded("a.rgb", "RGB", ZtFilePath::IfDifferent), "a.rgb.RGB");
    EXPECT_EQ(WithAdded("a.tif", "rgb", ZtFilePath::IfDifferent), "a.tif.rgb");
    EXPECT_EQ(WithAdded("a", "rgb", ZtFilePath::IfDifferent), "a.rgb");
    EXPECT_EQ(WithAdded("a", "", ZtFilePath::IfDifferent), "a");
    EXPECT_EQ(WithAdded("a.", nullptr, ZtFilePath::IfDifferent), "a.");
}

TEST(ZtFilePath, AddExtensionAlwaysAddsWhenForced)
{
    EXPECT_EQ(WithAdded("a.rgb", "rgb", ZtFilePath::Always), "a.rgb.rgb");
    EXPECT_EQ(WithAdded("a", "rgb", ZtFilePath::Always), "a.rgb");
    EXPECT_EQ(WithAdded("a", nullptr, ZtFilePath::Always), "a.");
}

TEST(ZtFilePath, AddExtensionTakesANumberToo)
{
    ZtFilePath path("a.rgb");

    path.AddExtension("rgb", 0);
    const std::string kept = path.FullPath();
    path.AddExtension("rgb", 7);

    EXPECT_EQ(kept, "a.rgb");
    EXPECT_STREQ(path.FullPath(), "a.rgb.rgb");
}

TEST(ZtFilePath, AddExtensionMakesANameWhereThereIsNone)
{
    for (const auto force : {ZtFilePath::IfDifferent, ZtFilePath::Always}) {
        EXPECT_EQ(WithAdded("dir/", "rgb", force), "dir/.rgb");
        EXPECT_EQ(WithAdded("", "rgb", force), "/.rgb");
        EXPECT_EQ(WithAdded("", "", force), "/.");
    }
}

TEST(ZtFilePath, ReplaceHeadPutsTheTailIntoAnotherDirectory)
{
    EXPECT_EQ(WithHead("/usr/quarn/x.rgb", "/tmp"), "/tmp/x.rgb");
    EXPECT_EQ(WithHead("x.rgb", "/tmp/a"), "/tmp/a/x.rgb");
    EXPECT_EQ(WithHead("/usr/quarn/x.rgb", nullptr), "x.rgb");
    EXPECT_EQ(WithHead("/usr/quarn/x.rgb", ""), "/x.rgb");
    EXPECT_EQ(WithHead("/usr/quarn/", "/tmp"), "/tmp/");
    EXPECT_EQ(WithHead("/usr/quarn/", nullptr), "");
    EXPECT_EQ(WithHead("", "/tmp"), "/tmp/");
}

TEST(ZtFilePath, ReplaceHeadTakesTheNewPathApart)
{
    ZtFilePath path("/usr/x");

    path.ReplaceHead("/tmp/a b");

    EXPECT_EQ(PartsOf(path), (Parts{"/", "tmp", "/", "a", "b", "/", "x"}));
}

TEST(ZtFilePath, ReplaceHeadLosesQuotedBlanks)
{
    EXPECT_EQ(WithHead("/usr/'my file'", "/tmp"), "/tmp/myfile");
}

TEST(ZtFilePath, EditsTakeTemporaryStringsOfAnyAge)
{
    ZtFilePath path("/a/b.rgb");

    path.SetExtension(AboutToBeFreed("tif"));
    EXPECT_STREQ(path.FullPath(), "/a/b.tif");
    path.AddExtension(AboutToBeFreed("tif"), ZtFilePath::IfDifferent);
    EXPECT_STREQ(path.FullPath(), "/a/b.tif");
    path.AddExtension(AboutToBeFreed("tif"), ZtFilePath::Always);
    EXPECT_STREQ(path.FullPath(), "/a/b.tif.tif");
    path.ReplaceHead(AboutToBeFreed("/c"));
    EXPECT_STREQ(path.FullPath(), "/c/b.tif.tif");
    EXPECT_STREQ(path.TrimHead(AboutToBeFreed("/c")), "b.tif.tif");
}

TEST(ZtFilePath, EditsTakeTextsOfThePathItself)
{
    ZtFilePath path("/a/b.rgb");

    path.SetExtension(path.ArgText(3));
    EXPECT_STREQ(path.FullPath(), "/a/b.b.rgb");
    path.ReplaceHead(path.ArgText(1));
    EXPECT_STREQ(path.FullPath(), "a/b.b.rgb");
}

TEST(ZtFilePath, TakesPathsOfAnyLength)
{
    const std::string name(70000, 'x');
    ZtFilePath path(("/" + name + "/" + name + ".rgb").c_str());

    path.SetExtension(name.c_str());

    EXPECT_EQ(path.Head(), "/" + name);
    EXPECT_EQ(path.Tail(), name + "." + name);
}

// --- files -----------------------------------------------------------------

TEST(ZtFilePath, AsksAboutTheFullPath)
{
    AskedFiles files;
    const ZtFilePath path("/a/b.rgb");

    EXPECT_EQ(path.IsWritable(), 1);
    EXPECT_EQ(files.asked, "/a/b.rgb");
    EXPECT_EQ(files.access, zt_platform::Access::Write);
    EXPECT_EQ(path.IsReadable(), 1);
    EXPECT_EQ(files.asked, "/a/b.rgb");
    EXPECT_EQ(files.access, zt_platform::Access::Read);
    EXPECT_EQ(path.Exists(), 1);
    EXPECT_EQ(files.asked, "/a/b.rgb");
    EXPECT_EQ(files.access, zt_platform::Access::Exists);
}

TEST(ZtFilePath, AnswersZeroWhenTheSystemRefuses)
{
    AskedFiles files;
    files.answer = false;
    const ZtFilePath path("/a/b.rgb");

    EXPECT_EQ(path.IsWritable(), 0);
    EXPECT_EQ(path.IsReadable(), 0);
    EXPECT_EQ(path.IsExecutable(), 0);
    EXPECT_EQ(path.Exists(), 0);
    EXPECT_EQ(path.WouldWrite(), 0);
}

TEST(ZtFilePath, IsExecutableAsksForTheRightToRead)
{
    AskedFiles files;

    EXPECT_EQ(ZtFilePath("/a/b").IsExecutable(), 1);

    EXPECT_EQ(files.asked, "/a/b");
    EXPECT_EQ(files.access, zt_platform::Access::Read);
}

TEST(ZtFilePath, WouldWriteAsksAboutTheHeadAsItStands)
{
    AskedFiles files;

    EXPECT_EQ(ZtFilePath("/a/b").WouldWrite(), 1);
    EXPECT_EQ(files.asked, "/a");
    EXPECT_EQ(files.access, zt_platform::Access::Write);
    ZtFilePath("b").WouldWrite();
    EXPECT_EQ(files.asked, "b");
    ZtFilePath("/b").WouldWrite();
    EXPECT_EQ(files.asked, "");
}

TEST(ZtFilePath, KnowsTheFilesThatAreThere)
{
    TempDir directory;
    const std::string file = directory.Write("a.rgb", "x");
    const std::string missing = directory.Path("b.rgb");
    const std::string nowhere = directory.Path("no/b.rgb");

    EXPECT_EQ(ZtFilePath(file.c_str()).Exists(), 1);
    EXPECT_EQ(ZtFilePath(file.c_str()).IsReadable(), 1);
    EXPECT_EQ(ZtFilePath(file.c_str()).IsWritable(), 1);
    EXPECT_EQ(ZtFilePath(missing.c_str()).Exists(), 0);
    EXPECT_EQ(ZtFilePath(missing.c_str()).WouldWrite(), 1);
    EXPECT_EQ(ZtFilePath(nowhere.c_str()).WouldWrite(), 0);
    EXPECT_EQ(ZtFilePath("").Exists(), 0);
}

// --- all of it -------------------------------------------------------------

TEST(ZtFilePath, AgreesWithPlainTextOnThousandsOfPaths)
{
    std::mt19937 random(20260101);
    const char letters[] = "ab1.0/./";
    for (int round = 0; round < 5000; ++round) {
        std::string text(1 + random() % 12, ' ');
        for (char& c : text)
            c = letters[random() % (sizeof letters - 1)];
        const ZtFilePath path(text.c_str());
        const std::size_t slash = text.rfind('/');
        const std::string tail =
            slash == std::string::npos ? text : text.substr(slash + 1);
        const std::size_t point = tail.rfind('.');
        const bool pointed = point != std::string::npos;

        EXPECT_EQ(path.FullPath(), text);
        EXPECT_EQ(path.Tail(), tail);
        EXPECT_EQ(path.Extension(), pointed ? tail.substr(point + 1) : "")
            << text;
        EXPECT_EQ(path.Root(),
                  pointed ? text.substr(0, text.rfind('.')) : text);
        EXPECT_EQ(path.Head(),
                  slash == std::string::npos ? text : text.substr(0, slash))
            << text;
    }
}

TEST(ZtFilePath, IsTheSameInEveryLocale)
{
    OtherLocale german("de_DE");

    EXPECT_EQ(Number("a.0012.rgb"), 12);
    EXPECT_EQ(WithExtension("a.1,5", "tif"), "a.tif");
}

TEST(ZtFilePath, WithoutMemoryNothingThrows)
{
    ZtFilePath path("/a/b.rgb");
    {
        FailingMemory none;
        ZtFilePath other("/c/d.rgb");

        EXPECT_NE(path.FullPath(), nullptr);
        EXPECT_NE(path.Head(), nullptr);
        EXPECT_NE(path.Root(), nullptr);
        EXPECT_NE(path.TrimHead("/a"), nullptr);
        EXPECT_EQ(path.Number(), 999999);
        path.SetExtension("tif");
        path.AddExtension("tif", 1);
        path.ReplaceHead("/e");
        EXPECT_EQ(other.Exists(), 0);
    }

    EXPECT_STREQ(path.FullPath(), "/a/b.rgb");
}
