#include <KVO/KvoSkipList.h>

#include <iostream>

// Objects that a list keeps in the order of their keys, and class information
// that tells at run time what an object is.
class Light : public KvoNamedObject
{
public:
    Light(const char* light_name, int light_watts)
        : KvoNamedObject(light_name), watts(light_watts)
    {}

    KVO_DECLARE_CLASS_INFO();

    int watts;
};

KVO_DEFINE_CLASS_INFO(Light, &KvoNamedObject::classInfo);

int main()
{
    KvoSkipList scene;
    scene.Insert(new KvoNamedObject("table"));
    scene.Insert(new Light("lamp", 60));
    scene.Insert(new Light("candle", 2));
    scene.Insert(new KvoNamedObject("chair"));

    for (KvoObject* object = scene.Head(); object; object = scene.Next()) {
        object->Write(std::cout);
        if (auto* light = static_cast<Light*>(Light::classInfo.Cast(object)))
            std::cout << ", a light of " << light->watts << " W";
        std::cout << "\n";
    }
    // Either the object of that key, or where it would stand.
    scene.SearchAlmost("dog");
    std::cout << "behind a dog stands " << scene.Next()->ClassName() << "\n";
    scene.DeleteContents();
}
