#include <ZT/property.h>

#include <iostream>

// Settings are kept as text and read as whatever is asked for. What was never
// set reads as zero, so a program needs no defaults for those.
int main()
{
    ZtPropList camera;
    camera.Set("name", "left eye");
    camera.Set("focal length", 35.5);
    camera.Set("frame", "240 of 1000");

    std::cout << camera.GetText("name") << "\n"
              << camera.GetFloat("focal length") * 2 << "\n"
              << camera.GetInt("frame") + 1 << "\n"
              << camera.GetInt("never set") << "\n";
}
