#include "env/plugins/casts.h"

KVO_DEFINE_CLASS_INFO(Shape, &KvoNamedObject::classInfo);

namespace {
/// A class that the test program has never heard of.
class Circle : public Shape
{
public:
    Circle() : Shape("circle") {}
    double Area() override { return 3; }
    KVO_DECLARE_CLASS_INFO();
};
KVO_DEFINE_CLASS_INFO(Circle, &Shape::classInfo);

/// Is given objects of the test program.
class Judge : public KvoObject
{
public:
    int Compare(void* object) override
    {
        KvoObject* shape =
            Shape::classInfo.Cast(static_cast<KvoObject*>(object));
        return shape ? static_cast<int>(static_cast<Shape*>(shape)->Area())
                     : -1;
    }
};
} // namespace

ZT_PLUGIN("Test:2.1", catalog)
{
    catalog->AddPlug("circle", new Circle);
    catalog->AddPlug("judge", new Judge);
}
