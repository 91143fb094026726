#include "ZT/plug.h"

#include <cstdlib>
#include <cstring>
#include <memory>
#include <new>
#include <string>

#include "ZT/filepath.h"
#include "ZT/util.h"

#include "core/joined_text.h"
#include "env/plug_candidate.h"
#include "env/plug_id.h"
#include "platform/dynlib.h"

namespace {

using Text = std::unique_ptr<char[]>;

const char* or_empty(const char* text)
{
    return text ? text : "";
}

// The file that `path` means once it has its extensions; null if there is
// none.
const char* existing(const Text& path, const char* first, const char* second)
{
    ZtFilePath file(or_empty(path.get()));
    for (const char* extension : {first, second})
        if (extension)
            file.AddExtension(extension, ZtFilePath::IfDifferent);
    return file.Exists() ? file.FullPath() : nullptr;
}

} // namespace

ZtPlugCatalog::Plug::Plug(const char* plug_name, KvoObject* plug_object)
    : KvoNamedObject(plug_name), object(plug_object), path(nullptr)
{}

ZtPlugCatalog::Plug::~Plug()
{
    delete object;
    delete[] path;
}

ZtPlugCatalog::DSONode::DSONode(void* open_handle) : handle(open_handle) {}

ZtPlugCatalog::DSONode::~DSONode()
{
    if (handle)
        zt_platform::Dynlib::current().close(handle);
}

ZtPlugCatalog::ZtPlugCatalog(const char* catalog_id)
    : exact_version(1), own_id(ZtNewString(catalog_id)), directory(nullptr),
      running(nullptr)
{}

// The objects' code is in the shared objects, so the objects go first. They go
// one by one, out of the list before they are deleted: a destructor may still
// ask the catalog.
ZtPlugCatalog::~ZtPlugCatalog()
{
    while (KvoObject* const plug = plugs.Head()) {
        plugs.Remove(plug);
        delete plug;
    }
    while (void* const node = shared_objects.Pop())
        delete static_cast<DSONode*>(node);
    delete[] own_id;
    delete[] directory;
}

ZtPlugCatalog::Plug* ZtPlugCatalog::AddPlug(const char* name, KvoObject* object)
{
    if (Plug* const there = FindPlug(name)) {
        if (running && !running->taken)
            running->taken = there->name;
        return there;
    }
    Plug* const plug = new (std::nothrow) Plug(name, object);
    if (!plug)
        return nullptr;
    const bool whole = std::strcmp(or_empty(plug->name), or_empty(name)) == 0;
    if (!whole || !plugs.InsertUnique(plug)) {
        plug->object = nullptr;
        delete plug;
        return nullptr;
    }
    plug->path = directory ? ZtNewString(directory) : nullptr;
    InitializePlug(plug);
    return plug;
}

ZtPlugCatalog::Plug* ZtPlugCatalog::OfferPlug(const char* name,
                                              KvoObject* object)
{
    Plug* const plug = AddPlug(name, object);
    if (!plug || plug->object != object)
        delete object;
    return plug;
}

ZtPlugCatalog::Plug* ZtPlugCatalog::FindPlug(const char* name)
{
    return static_cast<Plug*>(plugs.Search(name));
}

const char* ZtPlugCatalog::HeadKey()
{
    const auto* const plug = static_cast<Plug*>(plugs.Head());
    return plug ? plug->name : nullptr;
}

const char* ZtPlugCatalog::NextKey()
{
    const auto* const plug = static_cast<Plug*>(plugs.Next());
    return plug ? plug->name : nullptr;
}

const char* ZtPlugCatalog::FindPlugPath(const char* name)
{
    const Plug* const plug = FindPlug(name);
    return plug ? plug->path : nullptr;
}

const char* ZtPlugCatalog::FindPlugHelpFilename(const char* name,
                                                const char* extension)
{
    using zt_core::joined_text;
    const Plug* const plug = FindPlug(name);
    if (!plug)
        return nullptr;
    const char* const own = Extension();
    const char* help = std::getenv("QUARN_PLUGIN_HELP");
    if (!help)
        help = "Help";
    name = or_empty(name);
    if (*help == '/')
        return existing(joined_text({help, "/", name}), own, extension);
    if (!plug->path)
        return nullptr;
    const char* const found = existing(
        joined_text({plug->path, "/", help, "/", name}), own, extension);
    if (found)
        return found;
    return existing(joined_text({plug->path, "/", name}), own, extension);
}

void ZtPlugCatalog::InitializePlug(Plug*) {}

const char* ZtPlugCatalog::Extension()
{
    return ".so";
}

const char* ZtPlugCatalog::parse_id(const char* id, int& first, int& second)
{
    const zt_env::PlugId parts = zt_env::split_id(id);
    first = parts.first;
    second = parts.second;
    const Text name = zt_core::joined_text({parts.name});
    return ZtNewTempString(name.get());
}

int ZtPlugCatalog::plug_id_matches(const char* plug_id) const
{
    if (!plug_id)
        return 0;
    const zt_env::PlugId theirs = zt_env::split_id(plug_id);
    const zt_env::PlugId ours = zt_env::split_id(own_id);
    const bool first_fits =
        exact_version ? theirs.first == ours.first : theirs.first <= ours.first;
    return theirs.name == ours.name && theirs.second == ours.second &&
           first_fits;
}
