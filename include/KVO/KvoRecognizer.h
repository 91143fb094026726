#ifndef KVO_KVORECOGNIZER_H
#define KVO_KVORECOGNIZER_H

/// \file
/// Recognizers: plug-ins that find named targets in pictures.
///
/// A host scans for them with a KvoRecognizerCatalog, fetches a recognizer by
/// its plug's name and gives it targets, each with a reference picture. How a
/// recognizer is run and what its results are is not laid down here: host and
/// plug-in share a header for that. A recognizer's code is the plug-in's, so
/// recognizers are deleted before the catalog that they were fetched from.

#include <KVO/KvoList.h>
#include <KVO/KvoObject.h>
#include <ZT/plug.h>

#include <ostream>

class KvoRecognizer;
class ZtImageSGI;

/// What a plug-in registers for each kind of recognizer that it offers.
class ZT_API KvoRecognizerFactory : public KvoObject
{
public:
    KvoRecognizerFactory();
    ~KvoRecognizerFactory() override;

    /// Makes a recognizer.
    ///
    /// Owner: the caller, who deletes it before the catalog goes.
    virtual KvoRecognizer* MakeRecognizer() = 0;

    /// Registers `factory` under `name`; a plug-in calls this from
    /// `KvoInitializePlugin` with the catalog that it was given.
    ///
    /// Requires: `catalog` is a `ZtPlugCatalog*`, or null; `factory` comes
    ///           from `new`.
    /// Owner:    the catalog, unless `name` was taken already: the first one
    ///           stays, and `factory` is still the caller's. The plug that
    ///           `FindPlug` gives tells which.
    /// Returns:  the directory that is being scanned, as long as the scan
    ///           lasts; null before the first scan and for no catalog.
    static const char* AddPlugin(void* catalog, const char* name,
                                 KvoRecognizerFactory* factory);
};

/// The catalog of recognizer plug-ins: shared objects that are named `*.r.so`
/// and identify themselves as "Recognizer:2.1".
class ZT_API KvoRecognizerCatalog : public ZtPlugCatalog
{
public:
    /// The identification of recognizer plug-ins.
    static constexpr const char* plug_name = "Recognizer:2.1";

    /// Makes an empty catalog; `ScanDirectory` fills it.
    KvoRecognizerCatalog();

    ~KvoRecognizerCatalog() override;

    /// Gives "r".
    const char* Extension() override;

    /// Makes a recognizer of the plug `name`.
    ///
    /// Owner:   the caller, who deletes it before this catalog.
    /// Returns: null if there is no such plug, if what it registered is no
    ///          factory, and if the factory made nothing.
    /// Reports: an error if the factory throws.
    KvoRecognizer* FetchRecognizer(const char* name);
};

/// Something to look for, with a picture of it.
///
/// The picture is a thumbnail: whatever its proportions were, it is 160 pixels
/// wide and 121 high.
class ZT_API KvoRecognizerTarget
{
public:
    static constexpr int thumbnail_width = 160;  ///< Pixels.
    static constexpr int thumbnail_height = 121; ///< Pixels.

    /// Makes a target without a picture, not configured; a null name is the
    /// empty one.
    explicit KvoRecognizerTarget(const char* target_name);

    KvoRecognizerTarget(const KvoRecognizerTarget&) = delete;
    KvoRecognizerTarget& operator=(const KvoRecognizerTarget&) = delete;

    /// Frees the texts and the picture, not what `user_data` points at.
    ~KvoRecognizerTarget();

    /// Loads the picture `file` in the directory `dir` and reduces it to a
    /// thumbnail; its type goes by its extension, as for `ZtImageSGI`.
    ///
    /// An absolute `file`, and any if `dir` is null, is taken as it stands.
    /// The former picture and its name are dropped, also when there is nothing
    /// to load; only a null `file` changes nothing.
    ///
    /// Reports:   what loading the picture reports.
    /// By design: the name is kept without `dir`, and also if there is no such
    ///            picture: `picture` is then null
    ///            (KvoRecognizerTarget.TheNameIsKeptAlsoWithoutAPicture).
    void LoadPicture(const char* dir, const char* file);

    /// Writes the name of the picture without `head` and one slash behind it,
    /// as `ZtFilePath::TrimHead` does; nothing if there is no name.
    void WritePictureFilename(std::ostream& os, const char* head) const;

    char* name;          ///< From `strdup`; null only without memory.
    int configured;      ///< -1 until the recognizer says otherwise.
    char* picture_name;  ///< As given to `LoadPicture`; null until then.
    ZtImageSGI* picture; ///< The thumbnail, or null.
    void* user_data;     ///< For the recognizer's use; null at first.
};

/// The base of all recognizers: a list of targets and a list of results.
///
/// Neither list is owned here. Whoever makes targets deletes them; a derived
/// class says what its results are and who deletes those.
class ZT_API KvoRecognizer : public KvoObject
{
public:
    KvoRecognizer();
    KvoRecognizer(const KvoRecognizer&) = delete;
    KvoRecognizer& operator=(const KvoRecognizer&) = delete;

    /// Frees the links of both lists.
    ~KvoRecognizer() override;

    /// Empties the list of results, without deleting any.
    virtual void Reset();

    /// Tells whether the recognizer goes by the targets' identities. This one
    /// does not.
    ///
    /// Returns: 0.
    virtual int IdMatches();

    /// Finds a target by its exact name.
    ///
    /// Cursor:  that of `targets` stays.
    /// Returns: the first one in list order; null if there is none, also for a
    ///          null name.
    KvoRecognizerTarget* FindTarget(const char* name) const;

    /// Tells whether every target is configured.
    ///
    /// Cursor:  that of `targets` stays.
    /// Returns: 0 if one still has its -1; else 1, also without targets.
    int Configured() const;

    KvoList targets; ///< Of `KvoRecognizerTarget`.
    KvoList results; ///< Of whatever the recognizer makes.
};

#endif
