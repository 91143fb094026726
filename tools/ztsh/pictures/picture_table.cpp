#include "pictures/picture_table.h"

namespace ztsh {

const Picture* PictureTable::Find(const std::string& name) const
{
    auto found = pictures.find(name);
    return found == pictures.end() ? nullptr : found->second.get();
}

Picture* PictureTable::FindToChange(const std::string& name)
{
    auto found = pictures.find(name);
    if (found == pictures.end())
        return nullptr;
    std::shared_ptr<Picture>& picture = found->second;
    if (picture.use_count() > 1) {
        auto own = std::make_shared<Picture>(*picture);
        if (!own->image.pixels && picture->image.pixels)
            return nullptr;
        picture = std::move(own);
    }
    return picture.get();
}

void PictureTable::Put(const std::string& name,
                       std::shared_ptr<Picture> picture)
{
    pictures[name] = std::move(picture);
}

void PictureTable::Copy(const std::string& from, const std::string& to)
{
    pictures[to] = pictures.at(from);
}

bool PictureTable::Remove(const std::string& name)
{
    return pictures.erase(name) > 0;
}

} // namespace ztsh
