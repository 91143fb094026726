#include "words/wire_words.h"

#include "geometry/wire_frame.h"
#include "words/picture_size.h"

#include <ZT/error.h>

#include <algorithm>
#include <iostream>

namespace ztsh {

namespace {

enum Selector : int { ShapeWord, Canvas, Wire };

constexpr int most_words = 1000;
constexpr int name_position = 1;
constexpr int action_position = 2;

const std::vector<Word> words = {
    {"Shape", "[NAME [= ACTION ... | ACTION ... | free]]",
     "Makes the wire frame NAME, behind = anew, changes it, forgets it, or "
     "says\n"
     "how large it is; lists all without NAME. Several actions may follow "
     "each\n"
     "other.\n"
     "  cube pyramid axes grid sphere\n"
     "                     adds one of these, at the origin, of radius 1\n"
     "  point X Y Z        adds a point; they are counted from 0\n"
     "  edge FROM TO       adds an edge between two points\n"
     "  transform MATRIX   moves all points that are there\n"
     "  colour RRGGBB      gives all edges that are there a colour",
     0, most_words},
    {"Canvas", "NAME WIDTH HEIGHT [RRGGBB]",
     "Makes a picture of one colour, black unless one is given.", 3, 4},
    {"Wire",
     "PICTURE SHAPE [by MATRIX] [view MATRIX] [through MATRIX] "
     "[colour RRGGBB]",
     "Draws a shape into a picture: by moves it, view is where it is seen\n"
     "from (lookat, polarview), through how (perspective, window, ortho).\n"
     "Each is an expression as Mat takes it, the identity if it is not there.\n"
     "What they take to the cube from -1 to 1 is seen. The colour, white if\n"
     "there is none, is for edges that have none of their own.",
     2, most_words},
};

constexpr ZtPixel white = 0xFFFFFFFF;
constexpr ZtPixel black = 0x000000FF;

/// Reads a colour behind its word.
///
/// Returns: false with `why` set.
bool read_colour(ExpressionReader& reader, ZtPixel& colour, std::string& why)
{
    const std::string text = reader.TakeAny();
    std::optional<ZtPixel> read = ReadColour(text);
    if (read)
        colour = *read;
    else
        why = "expected a colour as in ff8000" +
              (text.empty() ? "" : ", not " + text);
    return read.has_value();
}

bool read_matrix(ExpressionReader& reader, KvoMat& matrix, std::string& why)
{
    std::optional<Value> read = reader.Read(ValueKind::Matrix);
    if (read)
        matrix = std::get<KvoMat>(*read);
    else
        why = reader.Why();
    return read.has_value();
}

bool add_point(Shape& shape, ExpressionReader& reader, std::string& why)
{
    std::optional<KvoVec3> read = reader.ReadVector3();
    if (read)
        shape.points.push_back(*read);
    else
        why = reader.Why();
    return read.has_value();
}

bool add_edge(Shape& shape, ExpressionReader& reader, std::string& why)
{
    const std::string from_text = reader.TakeAny();
    const std::string to_text = reader.TakeAny();
    const long last = static_cast<long>(shape.points.size()) - 1;
    long from = 0;
    long to = 0;
    if (!ReadNumber(from_text.c_str(), 0, last, from) ||
        !ReadNumber(to_text.c_str(), 0, last, to)) {
        why = "expected two points behind edge, " +
              (last < 0 ? "but there are none"
                        : "by their numbers from 0 to " + std::to_string(last));
        return false;
    }
    shape.edges.push_back(
        {static_cast<std::size_t>(from), static_cast<std::size_t>(to), {}});
    return true;
}

void append(Shape& shape, const Shape& other)
{
    const std::size_t first = shape.points.size();
    shape.points.insert(shape.points.end(), other.points.begin(),
                        other.points.end());
    for (Edge edge : other.edges) {
        edge.from += first;
        edge.to += first;
        shape.edges.push_back(edge);
    }
}

bool transform(Shape& shape, ExpressionReader& reader, std::string& why)
{
    KvoMat matrix;
    if (!read_matrix(reader, matrix, why))
        return false;
    Transform(shape, matrix);
    return true;
}

bool paint(Shape& shape, ExpressionReader& reader, std::string& why)
{
    ZtPixel colour = white;
    if (!read_colour(reader, colour, why))
        return false;
    for (Edge& edge : shape.edges)
        edge.colour = colour;
    return true;
}

/// Reads one action and does it.
///
/// Returns: false with `why` set.
bool act(Shape& shape, ExpressionReader& reader, std::string& why)
{
    const std::string action = reader.TakeAny();
    if (action == "point")
        return add_point(shape, reader, why);
    if (action == "edge")
        return add_edge(shape, reader, why);
    if (action == "transform")
        return transform(shape, reader, why);
    if (action == "colour")
        return paint(shape, reader, why);
    std::optional<Shape> known = KnownShape(action);
    if (known)
        append(shape, *known);
    else
        why = "no action is " + action + "; see Help Shape";
    return known.has_value();
}

void write_line(const std::string& name, const Shape& shape)
{
    std::cout << name << ": " << shape.points.size() << " points, "
              << shape.edges.size() << " edges\n";
}

} // namespace

/// What `Wire` is asked for.
struct WireWords::Order
{
    std::string picture;
    std::shared_ptr<const Shape> shape;
    KvoMat by;
    KvoMat view;
    KvoMat through;
    ZtPixel colour = white;

    /// Reads what stands behind the two names.
    ///
    /// Returns: false with `why` set.
    bool Read(ExpressionReader& reader, std::string& why)
    {
        while (!reader.AtEnd()) {
            bool right =
                reader.Take("by")        ? read_matrix(reader, by, why)
                : reader.Take("view")    ? read_matrix(reader, view, why)
                : reader.Take("through") ? read_matrix(reader, through, why)
                : reader.Take("colour")  ? read_colour(reader, colour, why)
                                         : reader.Ended();
            if (!right) {
                why = why.empty() ? reader.Why() : why;
                return false;
            }
        }
        return true;
    }
};

WireWords::WireWords(Runner& script_runner, Geometry& named_geometry,
                     PictureTable& picture_table)
    : WordDirector(script_runner.dispatcher, words), geometry(named_geometry),
      pictures(picture_table)
{}

void WireWords::Do(KvoStatement& statement, int selector)
{
    if (selector == ShapeWord)
        shape(statement);
    else if (selector == Canvas)
        canvas(statement);
    else
        wire(statement);
}

void WireWords::shape(const KvoStatement& statement)
{
    const char* name = statement.ArgText(name_position);
    if (!name) {
        list();
        return;
    }
    ExpressionReader reader(statement, action_position, geometry.values);
    bool shows = reader.AtEnd();
    bool forgets = reader.Take("free");
    if (!shows && !forgets) {
        change_shape(name, reader);
        return;
    }
    if (!reader.Ended()) {
        ZtError("Shape: %s\n", reader.Why().c_str());
        return;
    }
    std::shared_ptr<const Shape> found = find(words[ShapeWord].name, name);
    if (found && shows)
        write_line(name, *found);
    else if (found)
        geometry.shapes.erase(name);
}

/// Does all actions, or none if one of them is wrong.
void WireWords::change_shape(const std::string& name, ExpressionReader& reader)
{
    Shape changed;
    if (!reader.Take("=")) {
        std::shared_ptr<const Shape> found = find(words[ShapeWord].name, name);
        if (!found)
            return;
        changed = *found;
    }
    std::string why;
    while (!reader.AtEnd())
        if (!act(changed, reader, why)) {
            ZtError("Shape: %s\n", why.c_str());
            return;
        }
    geometry.shapes[name] = std::make_shared<const Shape>(std::move(changed));
}

void WireWords::canvas(const KvoStatement& statement)
{
    const char* name = statement.ArgText(name_position);
    const char* colour_text = statement.ArgText(4);
    PictureSize size = {};
    if (!TakePictureSize(words[Canvas].name, statement.ArgText(2),
                         statement.ArgText(3), size))
        return;
    auto colour = colour_text ? ReadColour(colour_text) : std::optional(black);
    if (!colour) {
        ZtError("Canvas: expected a colour as in ff8000, not %s\n",
                colour_text);
        return;
    }
    ZtImageSGI image(size.width, size.height, nullptr);
    if (!image.pixels) {
        ZtError("Canvas: not enough memory for %d x %d pixels\n", size.width,
                size.height);
        return;
    }
    std::fill_n(image.pixels,
                static_cast<std::size_t>(size.width) *
                    static_cast<std::size_t>(size.height),
                *colour);
    pictures.Put(name, std::make_shared<Picture>(Picture{image, "a canvas"}));
}

void WireWords::wire(const KvoStatement& statement)
{
    const char* word = words[Wire].name;
    Order order;
    order.picture = statement.ArgText(name_position);
    if (!pictures.Find(order.picture)) {
        ZtError("Wire: no picture is named %s; there %s\n",
                order.picture.c_str(), ThereAre(pictures.All()).c_str());
        return;
    }
    order.shape = find(word, statement.ArgText(2));
    if (!order.shape)
        return;
    ExpressionReader reader(statement, 3, geometry.values);
    std::string why;
    if (order.Read(reader, why))
        draw(order);
    else
        ZtError("Wire: %s\n", why.c_str());
}

void WireWords::draw(const Order& order)
{
    Picture* picture = pictures.FindToChange(order.picture);
    if (!picture || !picture->image.pixels) {
        ZtError("Wire: not enough memory\n");
        return;
    }
    std::size_t lost =
        DrawShape(picture->image, *order.shape,
                  order.by * order.view * order.through, order.colour);
    if (lost > 0)
        ZtWarning("Wire: %zu of %zu edges are not drawn, they end at points "
                  "that are infinite or no numbers\n",
                  lost, order.shape->edges.size());
}

void WireWords::list()
{
    for (const auto& [name, shape] : geometry.shapes)
        write_line(name, *shape);
}

/// Finds a shape for the word `word`.
///
/// Reports: an error if there is none.
std::shared_ptr<const Shape> WireWords::find(const char* word,
                                             const std::string& name)
{
    auto found = geometry.shapes.find(name);
    if (found != geometry.shapes.end())
        return found->second;
    ZtError("%s: no shape is named %s; there %s\n", word, name.c_str(),
            ThereAre(geometry.shapes).c_str());
    return nullptr;
}

} // namespace ztsh
