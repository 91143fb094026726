#ifndef ZT_PLUG_H
#define ZT_PLUG_H

/// \file
/// Plug-ins: shared objects that a catalog finds by scanning directories, and
/// what a plug-in exports so that it is found.
///
/// A file is loaded to be looked at: the code of every file whose name fits
/// runs in this process, also that of a file whose id turns out to be wrong.
/// Scan only directories whose owners you trust.

#include <KVO/KvoObjList.h>
#include <KVO/KvoObject.h>
#include <KVO/KvoSkipList.h>

class ZtDirective;
class ZtDispatcher;
class ZtPlugCatalog;

/// What every plug-in exports; `ZT_PLUGIN` below defines both. The library
/// itself has neither.
extern "C" {
/// Points at the text that says which kind of plug-in this is, and for which
/// version of that kind it was built: "Recognizer:2.1". It is a pointer; an
/// array of that name is not accepted.
ZT_API extern const char* KvoPluginIDString;

/// Registers the plug-in's plugs with `ZtPlugCatalog::AddPlug`.
ZT_API void KvoInitializePlugin(ZtPlugCatalog* catalog);
}

/// Defines what a plug-in exports. Stands once in a plug-in, before the braces
/// of the function that registers its plugs; `id` is a text, `catalog` the
/// name that the catalog has within the braces:
///
///     ZT_PLUGIN("Recognizer:2.1", catalog)
///     {
///         catalog->OfferPlug("Edge", new EdgeFactory);
///     }
#define ZT_PLUGIN(id, catalog)                                                 \
    extern "C" {                                                               \
    ZT_API const char* KvoPluginIDString = (id);                               \
    }                                                                          \
    extern "C" ZT_API void KvoInitializePlugin(                                \
        ZtPlugCatalog* catalog) // NOLINT(bugprone-macro-parentheses): a name

/// Finds plug-ins of one kind, keeps them loaded and answers for the named
/// objects, the plugs, that they brought.
///
/// With ZT_PLUGIN_TRACE=1 in the environment a scan writes one line for each
/// file that it considers to standard error: path, id, id wanted, verdict.
/// With ZT_PLUGIN_BIND_NOW=1 a plug-in that refers to a function that is not
/// there is refused when it is opened, instead of ending the process when it
/// calls the function.
///
/// Context: one thread; two catalogs must not scan at the same time, though
///          plug-ins may scan while they are being registered.
class ZT_API ZtPlugCatalog : public KvoObject
{
public:
    /// A named object that a plug-in brought.
    class ZT_API Plug : public KvoNamedObject
    {
    public:
        /// Names the plug with a copy of `plug_name`; null is the empty name.
        ///
        /// Owner: the plug, which deletes `plug_object`.
        Plug(const char* plug_name, KvoObject* plug_object);

        Plug(const Plug&) = delete;
        Plug& operator=(const Plug&) = delete;

        /// Deletes the object and frees the path.
        ~Plug() override;

        KvoObject* object; ///< What was registered, owned; may be null.
        char* path;        ///< The directory it is from, owned; may be null.
    };

    /// One open shared object.
    class ZT_API DSONode : public KvoObject
    {
    public:
        /// Owner: the node, which closes `open_handle`.
        explicit DSONode(void* open_handle);

        DSONode(const DSONode&) = delete;
        DSONode& operator=(const DSONode&) = delete;

        /// Closes the shared object.
        ~DSONode() override;

        void* handle; ///< What the loader gave.
    };

    /// Makes an empty catalog for plug-ins that say `catalog_id`: a name, a
    /// colon, a number, a point and a number. Null is the empty text.
    explicit ZtPlugCatalog(const char* catalog_id);

    ZtPlugCatalog(const ZtPlugCatalog&) = delete;
    ZtPlugCatalog& operator=(const ZtPlugCatalog&) = delete;

    /// Deletes the plugs with their objects, then closes the shared objects,
    /// the one that was kept last first.
    ///
    /// Requires: whatever a plug-in's objects have made is deleted before, and
    ///           nothing calls into the plug-ins any more.
    ~ZtPlugCatalog() override;

    /// Registers an object; what a plug-in calls from its entry.
    ///
    /// If there is a plug of that name, gives it and does nothing else.
    /// Otherwise makes one, with the directory that was last given to
    /// `ScanOneDir` as its path (null before the first), and hands it to
    /// `InitializePlug`.
    ///
    /// Requires: `object` comes from `new`, or is null.
    /// Owner:    the plug, if it was made; otherwise the caller, as before.
    /// Returns:  the plug of that name; null when there is no memory.
    Plug* AddPlug(const char* name, KvoObject* object);

    /// Registers an object as `AddPlug` does, or deletes it where that leaves
    /// it to the caller.
    ///
    /// Requires: `object` comes from `new`, or is null.
    /// Owner:    the catalog, in every case.
    /// Returns:  the plug of that name; null when there is no memory.
    Plug* OfferPlug(const char* name, KvoObject* object);

    /// Scans the directories of `path`, parted by ":", from left to right. An
    /// empty one, also the only or last one, is the current directory; null
    /// is, too.
    ///
    /// Reports: as `ScanOneDir`.
    void ScanDirectory(const char* path);

    /// Loads every file of directory `dir` whose name is longer than, and ends
    /// with, a point, `Extension()` and ".so", in the directory's own order.
    /// Null and the empty text are the current directory.
    ///
    /// A file stays loaded if its id matches and its entry has registered at
    /// least one plug; otherwise it is closed without a word. FIFOs, devices
    /// and sockets, and a plug-in whose entry is running, are passed over.
    ///
    /// Reports:   what the loader cannot load, straight to standard error, in
    ///            the loader's words; a warning if an entry throws, after
    ///            which the file stays if it had registered something.
    /// By design: a plug-in that scans from its entry leaves its directory as
    ///            the one that later plugs are said to be from
    ///            (ZtPlugCatalog.AScanFromAnEntryLeavesItsDirectory).
    void ScanOneDir(const char* dir);

    /// Loads the one file at `file`, whatever its name, as a scan would.
    ///
    /// Reports: as `ScanOneDir`.
    /// Returns: 1 if the file stays loaded, else 0.
    int ScanFile(const char* file);

    /// Gives the directory that is being scanned, or was scanned last.
    ///
    /// Owner:   the catalog, until the next scan.
    /// Returns: null before the first scan.
    const char* Directory() const { return directory; }

    /// Finds the plug of that name; null is the empty name.
    ///
    /// Cursor:  of the names, on it; if there is none, before its place.
    /// Returns: null if there is none.
    Plug* FindPlug(const char* name);

    /// Gives the first name, in the order of their bytes.
    ///
    /// Cursor:  on it.
    /// Owner:   the plug.
    /// Returns: null if there is none.
    const char* HeadKey();

    /// Gives the name behind the cursor.
    ///
    /// Cursor:  on it.
    /// Owner:   the plug.
    /// Returns: null at the end.
    const char* NextKey();

    /// Gives the directory that the plug is from.
    ///
    /// Owner:   the plug.
    /// Returns: null if there is no such plug, or it is from none.
    const char* FindPlugPath(const char* name);

    /// Finds the help file of a plug: `name`, given `Extension()` and
    /// `extension` unless it has them; either may be null for none.
    ///
    /// The help directory is QUARN_PLUGIN_HELP, or "Help". If it begins with a
    /// slash only that is searched; otherwise that one within the plug's
    /// directory, then the plug's directory itself.
    ///
    /// Owner:     a temporary string, which lives through 99 further ones.
    /// Returns:   the path; null if there is no such plug or no such file.
    /// By design: paths are made with ZtFilePath, which loses blanks, so there
    ///            is no help in a directory with a blank in its name
    ///            (PlugHelp.IsNotFoundInADirectoryWithABlank).
    const char* FindPlugHelpFilename(const char* name, const char* extension);

    /// Does something about a plug that has just been added; the base does
    /// nothing.
    virtual void InitializePlug(Plug* plug);

    /// Gives the extension of this kind, without points: "r" for files that
    /// end in ".r.so".
    ///
    /// By design: the base gives ".so", so that its files end in "..so.so"
    ///            (ZtPlugCatalog.TheBaseClassLooksForADoubledSuffix).
    virtual const char* Extension();

    int exact_version; ///< Not 0: the first numbers must be equal too; 1.
                       ///< 0: a plug-in's may be less.

protected:
    /// Takes an id apart: the name before the first ":", and behind it the two
    /// numbers before and behind the first ".", 0 where there is none.
    ///
    /// Owner:   a temporary string, which lives through 99 further ones.
    /// Returns: the name, never null.
    static const char* parse_id(const char* id, int& first, int& second);

    /// Tells whether a plug-in of that id belongs to this catalog.
    ///
    /// Returns: 1 or 0; 0 for null.
    int plug_id_matches(const char* plug_id) const;

private:
    struct Candidate;

    bool load(const char* file);
    void open(Candidate& candidate);
    bool adopt(Candidate& candidate);
    void keep(void* handle);
    bool set_directory(const char* dir);

    KvoObjList shared_objects; ///< Of `DSONode`, the newest first, owned.
    KvoSkipList plugs;         ///< Of `Plug`, owned.
    char* own_id;
    char* directory;    ///< Being scanned, or scanned last; null before.
    Candidate* running; ///< The plug-in whose entry runs, or null.
};

/// A catalog of plug-ins that bring command words: files that end in ".d.so".
///
/// Their entries register a `ZtDirective` under the word that it is for. A
/// plug is handed to the dispatcher when it is added, and withdrawn before it
/// is deleted.
class ZT_API ZtDirectiveCatalog : public ZtPlugCatalog
{
public:
    static constexpr const char* plug_name = "Directive:1.0"; ///< The id.

    /// Makes an empty catalog whose words go to `home_dispatcher`.
    ///
    /// Requires: the dispatcher outlives the catalog.
    explicit ZtDirectiveCatalog(ZtDispatcher& home_dispatcher);

    /// Withdraws the words from the dispatcher, then deletes them and closes
    /// the plug-ins.
    ///
    /// Requires: none of the words is being carried out.
    ~ZtDirectiveCatalog() override;

    /// Hands the plug's directive to the dispatcher. Where a word is there
    /// already, that one is found first and goes on acting.
    ///
    /// Owner:   the plug. The dispatcher is made to forget it in time.
    /// Reports: a warning if the plug holds anything but a directive.
    void InitializePlug(Plug* plug) override;

    /// Gives "d".
    const char* Extension() override;

private:
    ZtDispatcher& dispatcher;
};

#endif
