#ifndef ZTSH_WORDS_GEOMETRY_WORDS_H
#define ZTSH_WORDS_GEOMETRY_WORDS_H

/// \file
/// The words that compute with vectors, matrices and quaternions.

#include "geometry/expression.h"
#include "geometry/geometry.h"
#include "script/runner.h"
#include "words/word_director.h"

namespace ztsh {

/// Vec, Mat and Quat hold values by name, Calc shows or keeps what an
/// expression gives.
class GeometryWords : public WordDirector
{
public:
    /// Requires: `script_runner` and `named_geometry` outlive the director.
    GeometryWords(Runner& script_runner, Geometry& named_geometry);

protected:
    void Do(KvoStatement& statement, int selector) override;

private:
    void act_on(const KvoStatement& statement, int selector);
    void look(const KvoStatement& statement, int selector);
    void make(const std::string& name, ExpressionReader& reader, int selector);
    void combine(const std::string& name, ExpressionReader& reader,
                 bool before);
    void calculate(const KvoStatement& statement);
    void list(int selector);
    const Value* find(const std::string& name, int selector);
    bool takes_name(const std::string& name, int selector);
    void set_variable(const char* word, const std::string& name,
                      const Value& value);

    Runner& runner;
    ValueTable& values;
};

} // namespace ztsh

#endif
