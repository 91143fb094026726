#include <KVO/KvoStatement.h>
#include <KVO/KvoTime.h>
#include <KVO/KvoVec.h>
#include <ZT/directive.h>
#include <ZT/error.h>
#include <ZT/image_sgi.h>

#include <iostream>
#include <sstream>

// A little of everything that a host takes from the library: a class of the
// host's own derived from one of the library's, objects, inline formulas,
// plain functions and a report.
namespace {

class Adder : public ZtDirector
{
public:
    explicit Adder(ZtDispatcher& host) : ZtDirector(host)
    {
        AddDirective(0, "Add");
    }
    void Act(KvoStatement* statement, int) override
    {
        sum = sum + KvoTime(statement->ArgText(1));
    }

    KvoTime sum;
};

} // namespace

int main()
{
    ZtDispatcher dispatcher;
    Adder adder(dispatcher);
    std::istringstream script("Add 0:0:1:12; Add 0:0:0:20\n");
    KvoStatement statement;
    for (statement.Read(script); script; statement.Read(script))
        dispatcher.Delegate(&statement);

    KvoVec3 turned = KvoVec3(1, 0, 0) * KvoMat().InitZrot(90);
    int width = 0;
    int height = 0;
    ZtError("no picture: %d\n", sizeofimage("/nowhere", width, height));

    adder.sum.Write(std::cout);
    std::cout << " " << turned.y << " C++" << __cplusplus / 100 % 100 << "\n";
}
