#ifndef ZTSH_PICTURES_PICTURE_TABLE_H
#define ZTSH_PICTURES_PICTURE_TABLE_H

/// \file
/// The pictures that scripts hold by name.

#include <ZT/image_sgi.h>

#include <map>
#include <memory>
#include <string>
#include <utility>

namespace ztsh {

/// A picture and where it came from.
struct Picture
{
    ZtImageSGI image;
    std::string origin; ///< As `Info` tells it.
};

/// Pictures by name. Copies of the table share their pictures until one of
/// them changes its own, so that a copy costs nearly nothing.
class PictureTable
{
public:
    /// Gives the picture `name`, null if there is none.
    ///
    /// Owner: this table, until the name is put or removed.
    const Picture* Find(const std::string& name) const;

    /// Gives the picture `name` to be changed; nobody else sees the changes.
    ///
    /// Owner:   this table, until the name is put or removed.
    /// Returns: null if there is none, or no memory for one of its own.
    Picture* FindToChange(const std::string& name);

    /// Puts `picture` in the table, in the place of one of the same name.
    void Put(const std::string& name, std::shared_ptr<Picture> picture);

    /// Gives the picture `from` the second name `to`.
    ///
    /// Requires: there is a picture `from`.
    void Copy(const std::string& from, const std::string& to);

    /// Takes the picture `name` out.
    ///
    /// Returns: false if there is none.
    bool Remove(const std::string& name);

    /// Gives the names in order, each with its picture.
    const std::map<std::string, std::shared_ptr<Picture>>& All() const
    {
        return pictures;
    }

private:
    std::map<std::string, std::shared_ptr<Picture>> pictures;
};

} // namespace ztsh

#endif
