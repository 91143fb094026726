#ifndef ZTSH_WORDS_WIRE_WORDS_H
#define ZTSH_WORDS_WIRE_WORDS_H

/// \file
/// The words that make wire frames and draw them into pictures.

#include "geometry/expression.h"
#include "geometry/geometry.h"
#include "pictures/picture_table.h"
#include "script/runner.h"
#include "words/word_director.h"

namespace ztsh {

/// Shape makes shapes, Canvas a picture of one colour, and Wire draws a shape
/// into a picture.
class WireWords : public WordDirector
{
public:
    /// Requires: all that is given outlives the director.
    WireWords(Runner& script_runner, Geometry& named_geometry,
              PictureTable& picture_table);

protected:
    void Do(KvoStatement& statement, int selector) override;

private:
    struct Order;

    void shape(const KvoStatement& statement);
    void change_shape(const std::string& name, ExpressionReader& reader);
    void canvas(const KvoStatement& statement);
    void wire(const KvoStatement& statement);
    void draw(const Order& order);
    void list();
    std::shared_ptr<const Shape> find(const char* word,
                                      const std::string& name);

    Geometry& geometry;
    PictureTable& pictures;
};

} // namespace ztsh

#endif
