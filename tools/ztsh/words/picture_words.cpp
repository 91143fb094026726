#include "words/picture_words.h"

#include "common/png_file.h"
#include "pictures/best_scale.h"
#include "pictures/picture_drawing.h"
#include "pictures/picture_files.h"
#include "pictures/terminal_picture.h"
#include "system/terminal.h"
#include "words/picture_size.h"

#include <ZT/error.h>

#include <iostream>

namespace ztsh {

namespace {

enum Selector : int {
    Load,
    InfoWord,
    Resize,
    ResizeBest,
    ScaleBestWord,
    Store,
    Png,
    Show,
    Copy,
    PasteWord,
    Free,
    Pictures
};

constexpr int output_descriptor = 1;

const std::vector<Word> words = {
    {"Load", "NAME FILE [sgi|yuv|pix|auto]",
     "Loads FILE and calls the picture NAME. Without a kind, or with auto,\n"
     "the extension tells: .sgi and .rgb are SGI pictures, .yuv and .qtl\n"
     "video frames, all others pix pictures.",
     2, 3},
    {"Info", "NAME", "Says how large a picture is and where it came from.", 1,
     1},
    {"Resize", "NAME WIDTH HEIGHT",
     "Scales a picture by taking the nearest pixel for each.", 3, 3},
    {"ResizeBest", "NAME WIDTH HEIGHT",
     "Scales a picture by averaging areas as the library does, which leaves\n"
     "red at 0. See ScaleBest for all channels.",
     3, 3},
    {"ScaleBest", "NAME WIDTH HEIGHT",
     "Scales a picture by averaging areas, all four channels.", 3, 3},
    {"Store", "NAME FILE", "Writes a picture as an SGI picture without alpha.",
     2, 2},
    {"Png", "NAME FILE", "Writes a picture as a PNG file.", 2, 2},
    {"Show", "NAME", "Shows a picture in the terminal, as large as fits.", 1,
     1},
    {"Copy", "FROM TO", "Makes a second picture TO like FROM.", 2, 2},
    {"Paste", "FROM INTO X Y",
     "Puts the picture FROM into INTO, its lower left corner X pixels from "
     "the\n"
     "left and Y from the bottom; what does not fit is left out.",
     4, 4},
    {"Free", "NAME", "Forgets a picture.", 1, 1},
    {"Pictures", "", "Lists the pictures.", 0, 0},
};

void write_line(const std::string& name, const Picture& picture)
{
    std::cout << name << ": " << picture.image.width << " x "
              << picture.image.height << " pixels, from " << picture.origin
              << "\n";
}

/// Scales as the word of `selector` says.
///
/// Returns: false if there was no memory.
bool scale(ZtImageSGI& image, int selector, int width, int height)
{
    if (selector == ScaleBestWord)
        return ScaleBest(image, width, height);
    if (selector == Resize)
        image.Resize(width, height);
    else
        image.ResizeBest(width, height);
    return image.width == width && image.height == height;
}

} // namespace

PictureWords::PictureWords(Runner& script_runner, PictureTable& picture_table)
    : WordDirector(script_runner.dispatcher, words), runner(script_runner),
      pictures(picture_table)
{}

void PictureWords::Do(KvoStatement& statement, int selector)
{
    const char* first = statement.ArgText(1);
    switch (selector) {
    case Load:
        load(statement);
        break;
    case InfoWord:
        info(first);
        break;
    case Resize:
    case ResizeBest:
    case ScaleBestWord:
        resize(statement, selector);
        break;
    case Store:
    case Png:
        write(statement, selector);
        break;
    case Show:
        show(first);
        break;
    case Copy:
        copy(first, statement.ArgText(2));
        break;
    case PasteWord:
        paste(statement);
        break;
    case Free:
        if (find(words[Free].name, first))
            pictures.Remove(first);
        break;
    case Pictures:
        list();
        break;
    default:
        break;
    }
}

/// Finds a picture for the word `word` and reports if there is none.
const Picture* PictureWords::find(const char* word, const char* name)
{
    const Picture* picture = pictures.Find(name);
    if (picture)
        return picture;
    std::string known;
    for (const auto& entry : pictures.All())
        known += (known.empty() ? "" : ", ") + entry.first;
    ZtError("%s: no picture is named %s; there %s\n", word, name,
            known.empty() ? "are none" : ("are: " + known).c_str());
    return nullptr;
}

void PictureWords::load(KvoStatement& statement)
{
    const char* name = statement.ArgText(1);
    const char* file = statement.ArgText(2);
    const char* kind_word = statement.ArgText(3);
    PictureKind kind = Auto;
    if (kind_word && !KindOf(kind_word, kind)) {
        Expected(Load);
        return;
    }
    std::string why;
    std::shared_ptr<Picture> picture = LoadPicture(file, kind, why);
    if (picture)
        pictures.Put(name, std::move(picture));
    else
        ZtError("Load: cannot load %s: %s\n", file, why.c_str());
}

void PictureWords::info(const char* name)
{
    if (const Picture* picture = find(words[InfoWord].name, name))
        write_line(name, *picture);
}

void PictureWords::resize(KvoStatement& statement, int selector)
{
    const char* word = words[static_cast<std::size_t>(selector)].name;
    const char* name = statement.ArgText(1);
    PictureSize size = {};
    if (!TakePictureSize(word, statement.ArgText(2), statement.ArgText(3),
                         size) ||
        !find(word, name))
        return;
    Picture* picture = pictures.FindToChange(name);
    if (!picture || !scale(picture->image, selector, size.width, size.height))
        ZtError("%s: not enough memory for %d x %d pixels\n", word, size.width,
                size.height);
}

void PictureWords::write(KvoStatement& statement, int selector)
{
    const char* word = words[static_cast<std::size_t>(selector)].name;
    const Picture* picture = find(word, statement.ArgText(1));
    if (!picture)
        return;
    const char* file = statement.ArgText(2);
    std::string why = selector == Store
                          ? StorePicture(picture->image, file)
                          : zt_tools::WritePng(picture->image, file);
    if (why.empty())
        return;
    ZtError("%s: cannot write %s: %s\n", word, file, why.c_str());
    runner.outcome.Note(ExitCannotWrite);
}

void PictureWords::show(const char* name)
{
    const Picture* picture = find(words[Show].name, name);
    if (!picture)
        return;
    const ZtImageSGI& image = picture->image;
    if (image.width < 1 || image.height < 1) {
        write_line(name, *picture);
        return;
    }
    if (!IsTerminal(output_descriptor)) {
        std::cout << name << ": " << image.width << " x " << image.height
                  << " pixels, not shown: standard output is no terminal\n";
        return;
    }
    WindowSize window = SizeOfWindow(output_descriptor);
    // The last line is left to the prompt.
    PictureSize fit = FitIntoCells({image.width, image.height}, window.columns,
                                   window.rows > 1 ? window.rows - 1 : 1);
    ZtImageSGI shown(image);
    bool smaller = fit.width <= image.width && fit.height <= image.height;
    if (scale(shown, smaller ? ScaleBestWord : Resize, fit.width, fit.height))
        WriteHalfBlocks(shown, std::cout);
    else
        ZtError("Show: not enough memory\n");
}

void PictureWords::copy(const char* from, const char* to)
{
    if (find(words[Copy].name, from))
        pictures.Copy(from, to);
}

void PictureWords::paste(const KvoStatement& statement)
{
    constexpr long most = 65535;
    const char* word = words[PasteWord].name;
    const char* into = statement.ArgText(2);
    long x = 0;
    long y = 0;
    if (!ReadNumber(statement.ArgText(3), -most, most, x) ||
        !ReadNumber(statement.ArgText(4), -most, most, y)) {
        ZtError("%s: expected a place of -%ld to %ld pixels, not %s and %s\n",
                word, most, most, statement.ArgText(3), statement.ArgText(4));
        return;
    }
    const Picture* from = find(word, statement.ArgText(1));
    if (!from || !find(word, into))
        return;
    // A picture may be put into itself.
    const ZtImageSGI pasted(from->image);
    Picture* picture = pictures.FindToChange(into);
    if (picture && (pasted.pixels || !from->image.pixels))
        Paste(picture->image, pasted, static_cast<int>(x), static_cast<int>(y));
    else
        ZtError("%s: not enough memory\n", word);
}

void PictureWords::list()
{
    for (const auto& [name, picture] : pictures.All())
        write_line(name, *picture);
}

} // namespace ztsh
