#include <KVO/KvoStatement.h>

#include <iostream>
#include <sstream>

// Takes a script apart without carrying it out: what the reader makes of
// quotes, comments and several statements on a line.
int main()
{
    std::istringstream script("Load shot \"my pictures/a.rgb\"; Info shot\n"
                              "# a comment\n"
                              "Resize shot 320 \\\n"
                              "  240   # and another\n");
    KvoStatement statement;
    for (statement.Read(script); script; statement.Read(script)) {
        std::cout << statement.Count() << " words:";
        for (int i = 0; i < statement.Count(); ++i)
            std::cout << " [" << statement.ArgText(i) << "]";
        std::cout << "\n";
    }
}
