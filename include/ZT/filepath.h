#ifndef ZT_FILEPATH_H
#define ZT_FILEPATH_H

/// \file
/// Paths taken apart: directory, name, extension and frame number, and edits
/// of them.
///
/// A path is read by the tokenizer of the command language: blanks part its
/// pieces and are lost, quotes and backslashes act as they do in statements.
/// `my file` is written back as `myfile`; quote what must keep its blanks.

#include <KVO/KvoToken.h>
#include <ZT/common.h>

#include <iosfwd>
#include <memory>
#include <string_view>

/// A path as the list of its names and of the slashes between them.
///
/// /usr/bin has the four parts slash, usr, slash, bin. All texts that are
/// handed out are temporary strings: they live through 99 further ones and are
/// copied if they are to be kept. None is ever null.
class ZT_API ZtFilePath : public KvoTokenList
{
public:
    /// When `AddExtension` adds; any number but 0 means always.
    enum ForceType : int { IfDifferent = 0, Always = 1 };

    /// Takes `path` apart; null is the current directory, ".".
    explicit ZtFilePath(const char* path);

    ~ZtFilePath() override;

    /// Writes all parts, with nothing between them.
    void Write(std::ostream& out) override;

    /// Writes the first parts only.
    ///
    /// Units: `parts` from 1 counts them; below 0 is that many fewer than all,
    ///        nothing if none is left; 0, or more than there are, is all.
    void Write(std::ostream& out, int parts);

    /// Gives the whole path.
    const char* FullPath() const;

    /// Gives the directory: all parts up to the last slash, which is left out
    /// too.
    ///
    /// Returns:   the empty text for a name at the root and for no parts.
    /// By design: a bare name is its own head
    ///            (ZtFilePath.ABareNameIsItsOwnHead).
    const char* Head() const;

    /// Gives the last name.
    ///
    /// Returns: the empty text when a slash or nothing is last.
    const char* Tail() const;

    /// Gives the path without its extension and that one's point.
    const char* Root() const;

    /// Gives what stands behind the last point of the last part.
    ///
    /// Returns: the empty text if there is no point.
    const char* Extension() const;

    /// Gives the frame number: the last piece behind a point of the last part
    /// that is all digits. The empty piece is all digits too, and is 0.
    ///
    /// Units:   numbers beyond the range of int are its upper end.
    /// Returns: 999999 if there is none.
    int Number() const;

    /// Gives the path without `head` and one slash behind it.
    ///
    /// Returns:   the whole path if it does not begin with `head`, and for a
    ///            null or empty one.
    /// By design: bytes are compared, not names: /usr trims /usrlocal
    ///            (ZtFilePath.TrimHeadComparesBytesNotNames).
    const char* TrimHead(const char* head) const;

    /// Replaces the extension of the last name by `extension`, or adds it.
    ///
    /// When the path is empty or ends with a slash, a point and `extension`
    /// become a new name. Null is the empty extension.
    void SetExtension(const char* extension);

    /// Adds `extension` behind the last name. With `IfDifferent`, does nothing
    /// if that is the extension already.
    ///
    /// When the path is empty or ends with a slash, a point and `extension`
    /// become a new name. Null is the empty extension.
    void AddExtension(const char* extension, ForceType force);

    /// The same; not 0 adds always.
    void AddExtension(const char* extension, int force);

    /// Puts the last name into the directory `head`; null is no directory.
    ///
    /// By design: the new path is taken apart anew, so what was quoted before
    ///            loses its blanks (ZtFilePath.ReplaceHeadLosesQuotedBlanks).
    void ReplaceHead(const char* head);

    /// Returns: 1 if the file may be written, else 0.
    int IsWritable() const;

    /// Returns: 1 if the file may be read, else 0.
    int IsReadable() const;

    /// Tells whether the file may be read.
    ///
    /// Returns:   1 or 0.
    /// By design: it does not ask for the right to execute
    ///            (ZtFilePath.IsExecutableAsksForTheRightToRead).
    int IsExecutable() const;

    /// Returns: 1 if there is such a file, else 0.
    int Exists() const;

    /// Tells whether a file could be made in the path's directory, `Head()`.
    ///
    /// Returns:   1 or 0.
    /// By design: a bare name and a name at the root ask about their head as
    ///            it stands (ZtFilePath.WouldWriteAsksAboutTheHeadAsItStands).
    int WouldWrite() const;

private:
    bool ends_with_slash() const;
    void append_slash();
    void append_part(const char* name);
    const char* last_part() const;
    const char* extension_part() const;
    int parts_meant(int parts) const;
    std::unique_ptr<char[]> parts_joined(int parts) const;
    const char* text_of(int parts) const;
    void put_extension(std::string_view root, const char* extension);
    void read_text(const char* text);
};

#endif
