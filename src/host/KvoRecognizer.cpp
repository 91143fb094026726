#include "KVO/KvoRecognizer.h"

#include <cstdlib>
#include <cstring>
#include <exception>
#include <memory>
#include <new>

#include "ZT/error.h"
#include "ZT/filepath.h"
#include "ZT/image_sgi.h"

#include "core/joined_text.h"
#include "core/write_text.h"

namespace {
constexpr int not_configured = -1;
constexpr int type_by_name = 3;

// The picture's path; null when there is no memory.
std::unique_ptr<char[]> path_of(const char* dir, const char* file)
{
    if (!dir || *file == '/')
        return zt_core::joined_text({file});
    return zt_core::joined_text({dir, "/", file});
}

// The thumbnail of the picture at `path`; null if it has no pixels.
std::unique_ptr<ZtImageSGI> thumbnail(const char* path)
{
    constexpr int width = KvoRecognizerTarget::thumbnail_width;
    constexpr int height = KvoRecognizerTarget::thumbnail_height;
    std::unique_ptr<ZtImageSGI> image(new (std::nothrow)
                                          ZtImageSGI(path, type_by_name));
    if (!image || !image->pixels || image->width < 1 || image->height < 1)
        return nullptr;
    image->Resize(width, height);
    if (image->width != width || image->height != height)
        return nullptr;
    return image;
}

// What `factory` makes, null if it throws. What was thrown is the plug-in's
// own and is gone before this returns.
KvoRecognizer* made_by(KvoRecognizerFactory& factory, const char* name)
{
    try {
        return factory.MakeRecognizer();
    } catch (const std::exception& fault) {
        ZtError("Recognizer %s cannot be made: %s\n", name, fault.what());
    } catch (...) {
        ZtError("Recognizer %s cannot be made\n", name);
    }
    return nullptr;
}
} // namespace

KvoRecognizerFactory::KvoRecognizerFactory() = default;

KvoRecognizerFactory::~KvoRecognizerFactory() = default;

const char* KvoRecognizerFactory::AddPlugin(void* catalog, const char* name,
                                            KvoRecognizerFactory* factory)
{
    if (!catalog)
        return nullptr;
    auto* plugs = static_cast<ZtPlugCatalog*>(catalog);
    plugs->AddPlug(name, factory);
    return plugs->Directory();
}

KvoRecognizerCatalog::KvoRecognizerCatalog() : ZtPlugCatalog(plug_name) {}

KvoRecognizerCatalog::~KvoRecognizerCatalog() = default;

const char* KvoRecognizerCatalog::Extension()
{
    return "r";
}

KvoRecognizer* KvoRecognizerCatalog::FetchRecognizer(const char* name)
{
    Plug* plug = FindPlug(name);
    if (!plug)
        return nullptr;
    auto* factory = dynamic_cast<KvoRecognizerFactory*>(plug->object);
    return factory ? made_by(*factory, name) : nullptr;
}

KvoRecognizerTarget::KvoRecognizerTarget(const char* target_name)
    : name(strdup(target_name ? target_name : "")), configured(not_configured),
      picture_name(nullptr), picture(nullptr), user_data(nullptr)
{}

KvoRecognizerTarget::~KvoRecognizerTarget()
{
    std::free(name);
    std::free(picture_name);
    delete picture;
}

void KvoRecognizerTarget::LoadPicture(const char* dir, const char* file)
{
    if (!file)
        return;
    // `file` may be the present name itself, so that one goes last.
    const auto path = path_of(dir, file);
    char* former_name = picture_name;
    picture_name = strdup(file);
    std::free(former_name);
    delete picture;
    picture = path ? thumbnail(path.get()).release() : nullptr;
}

void KvoRecognizerTarget::WritePictureFilename(std::ostream& os,
                                               const char* head) const
{
    if (!picture_name)
        return;
    if (const char* trimmed = ZtFilePath(picture_name).TrimHead(head))
        zt_core::write_text(os, trimmed);
}

KvoRecognizer::KvoRecognizer() = default;

KvoRecognizer::~KvoRecognizer() = default;

void KvoRecognizer::Reset()
{
    results.Clear();
}

int KvoRecognizer::IdMatches()
{
    return 0;
}

KvoRecognizerTarget* KvoRecognizer::FindTarget(const char* name) const
{
    if (!name)
        return nullptr;
    for (const KvoList::Link* link = targets.head; link; link = link->next) {
        auto* target = static_cast<KvoRecognizerTarget*>(link->item);
        if (target && target->name && std::strcmp(target->name, name) == 0)
            return target;
    }
    return nullptr;
}

int KvoRecognizer::Configured() const
{
    for (const KvoList::Link* link = targets.head; link; link = link->next) {
        const auto* target = static_cast<KvoRecognizerTarget*>(link->item);
        if (target && target->configured == not_configured)
            return 0;
    }
    return 1;
}
