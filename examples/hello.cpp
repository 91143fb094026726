#include <KVO/KvoStatement.h>
#include <ZT/dircom.h>
#include <ZT/directive.h>

#include <iostream>

class Greeter : public ZtDirector
{
public:
    explicit Greeter(ZtDispatcher& host) : ZtDirector(host)
    {
        AddDirective(0, "Greet");
    }
    void Act(KvoStatement* statement, int) override
    {
        const char* name = statement->ArgText(1);
        std::cout << "Hello, " << (name ? name : "world") << "\n";
    }
};

int main()
{
    ZtDispatcher dispatcher;
    ZtCommonDirectives common(dispatcher);
    Greeter greeter(dispatcher);

    common.Include("-");
}
