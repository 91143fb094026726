#include "ZT/recognizer.h"

#include <cstddef>
#include <cstdlib>
#include <cstring>
#include <sstream>
#include <stdexcept>
#include <string>
#include <type_traits>

#include <gtest/gtest.h>

#include "ZT/image_sgi.h"
#include "support/CapturedStderr.h"
#include "support/ErrorTrap.h"
#include "support/FailingMalloc.h"
#include "support/FailingMemory.h"
#include "support/SlotOf.h"
#include "support/TempDir.h"

namespace {

static_assert(!std::is_polymorphic_v<KvoRecognizerTarget>);
static_assert(offsetof(KvoRecognizerTarget, name) == 0);
static_assert(offsetof(KvoRecognizerTarget, name) <
              offsetof(KvoRecognizerTarget, configured));
static_assert(offsetof(KvoRecognizerTarget, configured) <
              offsetof(KvoRecognizerTarget, picture_name));
static_assert(offsetof(KvoRecognizerTarget, picture_name) <
              offsetof(KvoRecognizerTarget, picture));
static_assert(offsetof(KvoRecognizerTarget, picture) <
              offsetof(KvoRecognizerTarget, user_data));
static_assert(!std::is_copy_constructible_v<KvoRecognizerTarget>);
static_assert(!std::is_copy_assignable_v<KvoRecognizerTarget>);
static_assert(std::is_base_of_v<KvoObject, KvoRecognizer>);
static_assert(std::has_virtual_destructor_v<KvoRecognizer>);
static_assert(std::is_abstract_v<KvoRecognizerFactory>);
static_assert(std::is_base_of_v<KvoObject, KvoRecognizerFactory>);
static_assert(std::is_base_of_v<ZtPlugCatalog, KvoRecognizerCatalog>);

class NamedRecognizer : public KvoRecognizer
{
public:
    explicit NamedRecognizer(std::string its_origin)
        : origin(std::move(its_origin))
    {}

    std::string origin;
};

class NamingFactory : public KvoRecognizerFactory
{
public:
    explicit NamingFactory(std::string what) : text(std::move(what)) {}
    ~NamingFactory() override { ++destroyed; }
    KvoRecognizer* MakeRecognizer() override
    {
        ++made;
        return new NamedRecognizer(text);
    }

    static inline int destroyed = 0;
    int made = 0;
    std::string text;
};

class ThrowingFactory : public KvoRecognizerFactory
{
public:
    explicit ThrowingFactory(bool a_number) : number(a_number) {}
    KvoRecognizer* MakeRecognizer() override
    {
        if (number)
            throw 1;
        throw std::runtime_error("no camera");
    }

    bool number;
};

class EmptyFactory : public KvoRecognizerFactory
{
public:
    KvoRecognizer* MakeRecognizer() override { return nullptr; }
};

/// What a fetched recognizer says of its factory.
std::string OriginOf(KvoRecognizer* recognizer)
{
    auto* named = dynamic_cast<NamedRecognizer*>(recognizer);
    return named ? named->origin : "none";
}

/// Writes a picture file of one colour and gives its path.
std::string WritePicture(const TempDir& directory, const std::string& name,
                         int width, int height, ZtPixel pixel)
{
    ZtImageSGI image(width, height, nullptr);
    for (int i = 0; i < width * height; ++i)
        image.pixels[i] = pixel;
    std::string path = directory.Path(name);
    image.Store(path.c_str());
    return path;
}

/// The first pixel of the target's picture; zero if it has none.
ZtPixel FirstPixel(const KvoRecognizerTarget& target)
{
    return target.picture ? target.picture->pixels[0] : 0;
}

/// What `WritePictureFilename` writes.
std::string Written(const KvoRecognizerTarget& target, const char* head)
{
    std::ostringstream out;
    target.WritePictureFilename(out, head);
    return out.str();
}

constexpr ZtPixel red = 0xC80000FF;
constexpr ZtPixel green = 0x00C800FF;

TEST(KvoRecognizerCatalog, IsForRecognizersOfTheirVersion)
{
    KvoRecognizerCatalog catalog;

    EXPECT_STREQ(KvoRecognizerCatalog::plug_name, "Recognizer:2.1");
    EXPECT_STREQ(catalog.Extension(), "r");
    EXPECT_EQ(catalog.exact_version, 1);
    EXPECT_EQ(catalog.HeadKey(), nullptr);
}

TEST(KvoRecognizerCatalog, FetchingMakesANewRecognizerEachTime)
{
    KvoRecognizerCatalog catalog;
    auto* factory = new NamingFactory("eye");
    catalog.AddPlug("eye", factory);
    catalog.AddPlug("ear", new NamingFactory("ear"));

    KvoRecognizer* first = catalog.FetchRecognizer("eye");
    KvoRecognizer* second = catalog.FetchRecognizer("eye");
    KvoRecognizer* other = catalog.FetchRecognizer("ear");

    EXPECT_EQ(OriginOf(first), "eye");
    EXPECT_EQ(OriginOf(second), "eye");
    EXPECT_EQ(OriginOf(other), "ear");
    EXPECT_NE(first, second);
    EXPECT_EQ(factory->made, 2);
    delete first;
    delete second;
    delete other;
}

TEST(KvoRecognizerCatalog, AnUnknownNameFetchesNull)
{
    KvoRecognizerCatalog catalog;
    catalog.AddPlug("eye", new NamingFactory("eye"));

    EXPECT_EQ(catalog.FetchRecognizer("nose"), nullptr);
    EXPECT_EQ(catalog.FetchRecognizer("Eye"), nullptr);
    EXPECT_EQ(catalog.FetchRecognizer(""), nullptr);
    EXPECT_EQ(catalog.FetchRecognizer(nullptr), nullptr);
}

TEST(KvoRecognizerCatalog, APlugThatIsNoFactoryFetchesNull)
{
    KvoRecognizerCatalog catalog;
    catalog.AddPlug("object", new KvoNamedObject("object"));
    catalog.AddPlug("recognizer", new NamedRecognizer("itself"));
    catalog.AddPlug("nothing", nullptr);

    EXPECT_EQ(catalog.FetchRecognizer("object"), nullptr);
    EXPECT_EQ(catalog.FetchRecognizer("recognizer"), nullptr);
    EXPECT_EQ(catalog.FetchRecognizer("nothing"), nullptr);
}

TEST(KvoRecognizerCatalog, AFactoryThatMakesNothingFetchesNull)
{
    KvoRecognizerCatalog catalog;
    catalog.AddPlug("empty", new EmptyFactory);
    ErrorTrap reports;

    EXPECT_EQ(catalog.FetchRecognizer("empty"), nullptr);
    EXPECT_EQ(reports.Text(), "");
}

TEST(KvoRecognizerCatalog, AFactoryThatThrowsIsReportedAndFetchesNull)
{
    KvoRecognizerCatalog catalog;
    catalog.AddPlug("text", new ThrowingFactory(false));
    catalog.AddPlug("number", new ThrowingFactory(true));
    ErrorTrap reports;

    EXPECT_EQ(catalog.FetchRecognizer("text"), nullptr);
    EXPECT_EQ(catalog.FetchRecognizer("number"), nullptr);

    EXPECT_EQ(reports.Text(),
              "Error: Recognizer text cannot be made: no camera\n"
              "Error: Recognizer number cannot be made\n");
}

TEST(KvoRecognizerFactory, MakingIsItsFirstOperationAfterThoseOfAnObject)
{
    const std::ptrdiff_t last = SlotOf(&KvoObject::ClassInfo);

    EXPECT_EQ(SlotOf(&KvoRecognizerFactory::MakeRecognizer), last + 1);
}

TEST(KvoRecognizerFactory, AddPluginRegistersTheFactoryUnderItsName)
{
    KvoRecognizerCatalog catalog;
    auto* factory = new NamingFactory("eye");

    const char* directory =
        KvoRecognizerFactory::AddPlugin(&catalog, "eye", factory);

    EXPECT_EQ(directory, nullptr);
    ASSERT_NE(catalog.FindPlug("eye"), nullptr);
    EXPECT_EQ(catalog.FindPlug("eye")->object, factory);
}

TEST(KvoRecognizerFactory, AddPluginTellsTheDirectoryBeingScanned)
{
    TempDir directory;
    std::string path = directory.Path("");
    KvoRecognizerCatalog catalog;
    catalog.ScanOneDir(path.c_str());

    const char* told = KvoRecognizerFactory::AddPlugin(
        &catalog, "eye", new NamingFactory("eye"));

    EXPECT_STREQ(told, path.c_str());
    EXPECT_STREQ(catalog.FindPlugPath("eye"), path.c_str());
}

TEST(KvoRecognizerFactory, ANameThatIsTakenLeavesTheFactoryToTheCaller)
{
    TempDir directory;
    std::string path = directory.Path("");
    KvoRecognizerCatalog catalog;
    KvoRecognizerFactory::AddPlugin(&catalog, "eye", new NamingFactory("one"));
    catalog.ScanOneDir(path.c_str());
    NamingFactory second("two");

    const char* told =
        KvoRecognizerFactory::AddPlugin(&catalog, "eye", &second);

    EXPECT_STREQ(told, path.c_str());
    KvoRecognizer* fetched = catalog.FetchRecognizer("eye");
    EXPECT_EQ(OriginOf(fetched), "one");
    delete fetched;
}

TEST(KvoRecognizerFactory, AddPluginWithoutACatalogDoesNothing)
{
    NamingFactory factory("eye");

    EXPECT_EQ(KvoRecognizerFactory::AddPlugin(nullptr, "eye", &factory),
              nullptr);
}

TEST(KvoRecognizerFactory, TheCatalogDeletesTheFactory)
{
    int before = NamingFactory::destroyed;
    {
        KvoRecognizerCatalog catalog;
        KvoRecognizerFactory::AddPlugin(&catalog, "eye",
                                        new NamingFactory("eye"));
    }
    EXPECT_EQ(NamingFactory::destroyed, before + 1);
}

TEST(KvoRecognizerTarget, BeginsWithItsNameOnly)
{
    char text[] = "door";

    KvoRecognizerTarget target(text);
    text[0] = 'm';

    EXPECT_STREQ(target.name, "door");
    EXPECT_EQ(target.configured, -1);
    EXPECT_EQ(target.picture_name, nullptr);
    EXPECT_EQ(target.picture, nullptr);
    EXPECT_EQ(target.user_data, nullptr);
}

TEST(KvoRecognizerTarget, FieldsStandInTheirOrder)
{
    using Target = KvoRecognizerTarget;

    EXPECT_EQ(offsetof(Target, name), 0U);
    EXPECT_LT(offsetof(Target, name), offsetof(Target, configured));
    EXPECT_LT(offsetof(Target, configured), offsetof(Target, picture_name));
    EXPECT_LT(offsetof(Target, picture_name), offsetof(Target, picture));
    EXPECT_LT(offsetof(Target, picture), offsetof(Target, user_data));
}

TEST(KvoRecognizerTarget, ANullNameIsTheEmptyOne)
{
    KvoRecognizerTarget target(nullptr);

    EXPECT_STREQ(target.name, "");
}

// The texts come from malloc: a recognizer may replace them by its own.
TEST(KvoRecognizerTarget, TheNameIsFreedWithFree)
{
    KvoRecognizerTarget target("door");

    std::free(target.name);
    target.name = strdup("gate");

    EXPECT_STREQ(target.name, "gate");
}

TEST(KvoRecognizerTarget, ALoadedPictureIsAlways160By121)
{
    TempDir directory;
    for (auto [width, height] :
         {std::pair{1, 1}, {160, 121}, {7, 500}, {640, 3}, {320, 242}}) {
        std::string path = WritePicture(directory, "a.rgb", width, height, red);
        KvoRecognizerTarget target("door");

        target.LoadPicture(nullptr, path.c_str());

        ASSERT_NE(target.picture, nullptr);
        EXPECT_EQ(target.picture->width, 160);
        EXPECT_EQ(target.picture->height, 121);
        EXPECT_EQ(target.picture->pixels[0], red);
        EXPECT_EQ(target.picture->pixels[160 * 121 - 1], red);
    }
}

// The nearest pixels are taken, all four channels of them.
TEST(KvoRecognizerTarget, ThePictureIsReducedAsResizeDoes)
{
    TempDir directory;
    ZtImageSGI image(37, 400, nullptr);
    for (int i = 0; i < 37 * 400; ++i)
        image.pixels[i] = static_cast<ZtPixel>(i) << 8 | 0xFF;
    std::string path = directory.Path("a.sgi");
    image.Store(path.c_str());
    KvoRecognizerTarget target("door");

    target.LoadPicture(nullptr, path.c_str());
    image.Resize(160, 121);

    ASSERT_NE(target.picture, nullptr);
    EXPECT_EQ(std::memcmp(target.picture->pixels, image.pixels,
                          160 * 121 * sizeof(ZtPixel)),
              0);
}

TEST(KvoRecognizerTarget, ARelativeFileIsReadFromTheDirectory)
{
    TempDir directory;
    WritePicture(directory, "a.rgb", 2, 2, red);
    KvoRecognizerTarget target("door");

    target.LoadPicture(directory.Path("").c_str(), "a.rgb");

    EXPECT_EQ(FirstPixel(target), red);
    EXPECT_STREQ(target.picture_name, "a.rgb");
}

TEST(KvoRecognizerTarget, AnAbsoluteFileIsReadWhereItIs)
{
    TempDir directory;
    TempDir other;
    std::string path = WritePicture(directory, "a.rgb", 2, 2, red);
    WritePicture(other, "a.rgb", 2, 2, green);
    KvoRecognizerTarget target("door");

    target.LoadPicture(other.Path("").c_str(), path.c_str());

    EXPECT_EQ(FirstPixel(target), red);
    EXPECT_STREQ(target.picture_name, path.c_str());
}

TEST(KvoRecognizerTarget, WithoutADirectoryTheFileIsReadWhereItIs)
{
    TempDir directory;
    std::string path = WritePicture(directory, "a.rgb", 2, 2, green);
    KvoRecognizerTarget target("door");

    target.LoadPicture(nullptr, path.c_str());

    EXPECT_EQ(FirstPixel(target), green);
    EXPECT_STREQ(target.picture_name, path.c_str());
}

// The directory and the file are joined by a slash whatever they are: an empty
// directory is the root.
TEST(KvoRecognizerTarget, AnEmptyDirectoryIsTheRoot)
{
    TempDir directory;
    std::string path = WritePicture(directory, "a.rgb", 2, 2, red);
    KvoRecognizerTarget target("door");

    target.LoadPicture("", path.substr(1).c_str());

    EXPECT_EQ(FirstPixel(target), red);
    EXPECT_EQ(target.picture_name, path.substr(1));
}

TEST(KvoRecognizerTarget, APathMayBeLongerThan256Characters)
{
    TempDir directory;
    WritePicture(directory, "a.rgb", 2, 2, red);
    std::string around;
    while (around.size() < 2000)
        around += "././././";
    KvoRecognizerTarget target("door");

    target.LoadPicture(directory.Path("").c_str(), (around + "a.rgb").c_str());

    EXPECT_EQ(FirstPixel(target), red);
    EXPECT_EQ(target.picture_name, around + "a.rgb");
}

// An SGI image whose name does not say so is read as a pix file, in vain.
TEST(KvoRecognizerTarget, TheTypeGoesByTheExtension)
{
    TempDir directory;
    std::string path = WritePicture(directory, "a.pix", 2, 2, red);
    KvoRecognizerTarget target("door");

    target.LoadPicture(nullptr, path.c_str());

    EXPECT_EQ(target.picture, nullptr);
    EXPECT_STREQ(target.picture_name, path.c_str());
}

TEST(KvoRecognizerTarget, TheNameIsKeptAlsoWithoutAPicture)
{
    TempDir directory;
    directory.Write("text.rgb", "no picture");
    KvoRecognizerTarget target("door");

    for (const char* file : {"none.rgb", "text.rgb", ""}) {
        target.LoadPicture(directory.Path("").c_str(), file);

        EXPECT_EQ(target.picture, nullptr);
        EXPECT_STREQ(target.picture_name, file);
    }
}

TEST(KvoRecognizerTarget, APictureWithoutPixelsIsNone)
{
    TempDir directory;
    std::string header(512, '\0');
    header.replace(0, 12,
                   std::string("\x01\xDA\x00\x01\x00\x03"
                               "\x00\x00\x00\x05\x00\x03",
                               12));
    std::string path = directory.Write("flat.rgb", header);
    KvoRecognizerTarget target("door");

    target.LoadPicture(nullptr, path.c_str());

    EXPECT_EQ(target.picture, nullptr);
}

TEST(KvoRecognizerTarget, AVideoFrameThatCannotBeOpenedIsSaidAndAllZeros)
{
    TempDir directory;
    std::string path = directory.Path("none.yuv");
    KvoRecognizerTarget target("door");
    CapturedStderr printed;

    target.LoadPicture(nullptr, path.c_str());

    EXPECT_EQ(printed.Text(), "Couldn't open yuv file [" + path + "]\n");
    ASSERT_NE(target.picture, nullptr);
    EXPECT_EQ(target.picture->width, 160);
    EXPECT_EQ(target.picture->height, 121);
    EXPECT_EQ(FirstPixel(target), 0U);
}

TEST(KvoRecognizerTarget, ASecondPictureReplacesTheFirst)
{
    TempDir directory;
    std::string first = WritePicture(directory, "a.rgb", 2, 2, red);
    std::string second = WritePicture(directory, "b.rgb", 2, 2, green);
    KvoRecognizerTarget target("door");
    target.LoadPicture(nullptr, first.c_str());

    target.LoadPicture(nullptr, second.c_str());

    EXPECT_EQ(FirstPixel(target), green);
    EXPECT_STREQ(target.picture_name, second.c_str());
}

TEST(KvoRecognizerTarget, AMissingSecondPictureDropsTheFirst)
{
    TempDir directory;
    std::string first = WritePicture(directory, "a.rgb", 2, 2, red);
    std::string none = directory.Path("none.rgb");
    KvoRecognizerTarget target("door");
    target.LoadPicture(nullptr, first.c_str());

    target.LoadPicture(nullptr, none.c_str());

    EXPECT_EQ(target.picture, nullptr);
    EXPECT_STREQ(target.picture_name, none.c_str());
}

TEST(KvoRecognizerTarget, ANullFileChangesNothing)
{
    TempDir directory;
    std::string path = WritePicture(directory, "a.rgb", 2, 2, red);
    KvoRecognizerTarget target("door");
    target.LoadPicture(nullptr, path.c_str());
    ZtImageSGI* picture = target.picture;

    target.LoadPicture(directory.Path("").c_str(), nullptr);

    EXPECT_EQ(target.picture, picture);
    EXPECT_STREQ(target.picture_name, path.c_str());
}

TEST(KvoRecognizerTarget, ItsOwnPictureNameMayBeLoadedAgain)
{
    TempDir directory;
    std::string path = WritePicture(directory, "a.rgb", 2, 2, red);
    KvoRecognizerTarget target("door");
    target.LoadPicture(nullptr, path.c_str());
    WritePicture(directory, "a.rgb", 2, 2, green);

    target.LoadPicture(nullptr, target.picture_name);

    EXPECT_EQ(FirstPixel(target), green);
    EXPECT_STREQ(target.picture_name, path.c_str());
}

TEST(KvoRecognizerTarget, LoadingLeavesTheRestAsItIs)
{
    TempDir directory;
    std::string path = WritePicture(directory, "a.rgb", 2, 2, red);
    KvoRecognizerTarget target("door");
    target.configured = 7;
    target.user_data = &directory;

    target.LoadPicture(nullptr, path.c_str());

    EXPECT_STREQ(target.name, "door");
    EXPECT_EQ(target.configured, 7);
    EXPECT_EQ(target.user_data, &directory);
}

TEST(KvoRecognizerTarget, WithoutMemoryThereIsNoPicture)
{
    TempDir directory;
    std::string path = WritePicture(directory, "a.rgb", 2, 2, red);
    for (long spared = 0;; ++spared) {
        KvoRecognizerTarget target("door");
        bool failed = false;
        {
            FailingMemory memory(spared);
            target.LoadPicture("x", path.c_str());
            failed = FailingMemory::Failed();
        }
        EXPECT_STREQ(target.picture_name, path.c_str());
        if (!failed) {
            EXPECT_EQ(FirstPixel(target), red);
            EXPECT_GT(spared, 1);
            break;
        }
        EXPECT_TRUE(!target.picture || FirstPixel(target) == red);
    }
}

TEST(KvoRecognizerTarget, WithoutMemoryNoPictureOfAnotherSizeIsKept)
{
    TempDir directory;
    const std::string path = WritePicture(directory, "a.rgb", 2, 2, red);
    KvoRecognizerTarget target("door");

    const int failures = WithEveryRequestFailing(
        [&] { target.LoadPicture(nullptr, path.c_str()); },
        [&] {
            if (!target.picture)
                return;
            EXPECT_EQ(target.picture->width, 160);
            EXPECT_EQ(target.picture->height, 121);
        });

    EXPECT_GT(failures, 3);
    EXPECT_EQ(FirstPixel(target), red);
}

TEST(KvoRecognizerTarget, ThePictureNameIsWrittenWithoutItsHead)
{
    KvoRecognizerTarget target("door");
    target.LoadPicture(nullptr, "/pics/doors/a.rgb");

    EXPECT_EQ(Written(target, "/pics"), "doors/a.rgb");
    EXPECT_EQ(Written(target, "/pics/"), "doors/a.rgb");
    EXPECT_EQ(Written(target, "/pics/doors"), "a.rgb");
    EXPECT_EQ(Written(target, "/other"), "/pics/doors/a.rgb");
    EXPECT_EQ(Written(target, ""), "/pics/doors/a.rgb");
    EXPECT_EQ(Written(target, nullptr), "/pics/doors/a.rgb");
}

TEST(KvoRecognizerTarget, WithoutAPictureNameNothingIsWritten)
{
    KvoRecognizerTarget target("door");

    EXPECT_EQ(Written(target, "/pics"), "");
}

TEST(KvoRecognizerTarget, ThePictureNameIsWrittenAsItStands)
{
    KvoRecognizerTarget target("door");
    target.LoadPicture(nullptr, "a.rgb");
    std::ostringstream out;
    out.width(12);
    out.fill('.');

    target.WritePictureFilename(out, "/pics");

    EXPECT_EQ(out.str(), "a.rgb");
}

TEST(KvoRecognizer, BeginsWithoutTargetsAndResults)
{
    KvoRecognizer recognizer;

    EXPECT_EQ(recognizer.targets.count, 0);
    EXPECT_EQ(recognizer.results.count, 0);
}

TEST(KvoRecognizer, FindsTheFirstTargetOfAName)
{
    KvoRecognizerTarget door("door");
    KvoRecognizerTarget gate("gate");
    KvoRecognizerTarget second_gate("gate");
    KvoRecognizer recognizer;
    for (KvoRecognizerTarget* target : {&door, &gate, &second_gate})
        recognizer.targets.PushTail(target);

    EXPECT_EQ(recognizer.FindTarget("door"), &door);
    EXPECT_EQ(recognizer.FindTarget("gate"), &gate);
    recognizer.targets.Sink(&gate);
    EXPECT_EQ(recognizer.FindTarget("gate"), &second_gate);
}

TEST(KvoRecognizer, FindsNoTargetButByItsExactName)
{
    KvoRecognizerTarget door("door");
    KvoRecognizer recognizer;

    EXPECT_EQ(recognizer.FindTarget("door"), nullptr);
    recognizer.targets.PushTail(&door);

    EXPECT_EQ(recognizer.FindTarget("Door"), nullptr);
    EXPECT_EQ(recognizer.FindTarget("doo"), nullptr);
    EXPECT_EQ(recognizer.FindTarget("doors"), nullptr);
    EXPECT_EQ(recognizer.FindTarget(""), nullptr);
    EXPECT_EQ(recognizer.FindTarget(nullptr), nullptr);
}

TEST(KvoRecognizer, IsConfiguredOnceNoTargetIsAtItsFirstNumber)
{
    KvoRecognizerTarget door("door");
    KvoRecognizerTarget gate("gate");
    KvoRecognizer recognizer;
    EXPECT_EQ(recognizer.Configured(), 1);
    recognizer.targets.PushTail(&door);
    recognizer.targets.PushTail(&gate);

    EXPECT_EQ(recognizer.Configured(), 0);
    door.configured = 1;
    EXPECT_EQ(recognizer.Configured(), 0);
    gate.configured = 0;
    EXPECT_EQ(recognizer.Configured(), 1);
    door.configured = -2;
    EXPECT_EQ(recognizer.Configured(), 1);
}

TEST(KvoRecognizer, LookingAtTheTargetsLeavesTheirCursor)
{
    KvoRecognizerTarget door("door");
    KvoRecognizerTarget gate("gate");
    KvoRecognizer recognizer;
    recognizer.targets.PushTail(&door);
    recognizer.targets.PushTail(nullptr);
    recognizer.targets.PushTail(&gate);
    recognizer.targets.Head();

    EXPECT_EQ(recognizer.FindTarget("gate"), &gate);
    EXPECT_EQ(recognizer.Configured(), 0);

    EXPECT_EQ(recognizer.targets.Next(), nullptr);
    EXPECT_EQ(recognizer.targets.Next(), &gate);
}

TEST(KvoRecognizer, ResetEmptiesTheResultsAndDeletesNone)
{
    KvoRecognizerTarget door("door");
    KvoNamedObject result("here");
    KvoRecognizer recognizer;
    recognizer.targets.PushTail(&door);
    recognizer.results.PushTail(&result);

    recognizer.Reset();
    recognizer.Reset();

    EXPECT_EQ(recognizer.results.count, 0);
    EXPECT_STREQ(result.name, "here");
    EXPECT_EQ(recognizer.targets.count, 1);
}

TEST(KvoRecognizer, IdsDoNotMatchInTheBase)
{
    KvoRecognizer recognizer;

    EXPECT_EQ(recognizer.IdMatches(), 0);
}

TEST(KvoRecognizer, ADerivedClassSaysWhatResetAndIdsDo)
{
    class Derived : public KvoRecognizer
    {
    public:
        void Reset() override { results.PushTail(this); }
        int IdMatches() override { return 1; }
    };
    Derived derived;
    KvoRecognizer& recognizer = derived;

    recognizer.Reset();

    EXPECT_EQ(recognizer.results.count, 1);
    EXPECT_EQ(recognizer.IdMatches(), 1);
}

} // namespace
