#include <ZT/error.h>
#include <ZT/image_sgi.h>

#include <iostream>

// Reports go to the handler on top of a stack. This one counts them and passes
// on what is worse than a warning; the handler at the bottom prints it.
class Counter : public ZtErrHandler
{
public:
    void Handle(ZtErr* error) override
    {
        ++count;
        if (error->level > warning_level)
            ZtErrHandler::Handle(error);
        else
            delete error;
    }

    static constexpr int warning_level = 3;
    int count = 0;
};

int main()
{
    ZtWarning("nobody has caught me yet\n");
    {
        Counter counter;
        ZtWarning("this is only counted\n");
        ZtError("this is counted and printed\n");

        // A handler may also hold reports back for somebody to look at.
        counter.Hold();
        ZtError("of %d reports this one is thrown away\n", 3);
        delete counter.Pop();
        std::cout << counter.count << " reports were handled" << std::endl;
    }
    ZtWarning("and nobody catches me any more\n");
}
