#ifndef PLUGINS_PICTURE_RECOGNIZER_H
#define PLUGINS_PICTURE_RECOGNIZER_H

/// \file
/// What a host and the recognizer plug-ins that search pictures agree on: how
/// a recognizer is run, and what its results are.
///
/// The library leaves both open. Host and plug-in each compile these two
/// classes; neither links the other. They tell them by class information,
/// which goes by name: `PictureRecognizer::From` casts what a catalog fetched,
/// and gives null for a recognizer that keeps to something else. A change of
/// these classes gets a new class name, so that old plug-ins are not mistaken.

#include <KVO/KvoRecognizer.h>
#include <ZT/image_sgi.h>

#include <memory>

/// A target that was found.
class RecognizerResult : public KvoNamedObject
{
public:
    /// Makes a result with the target's name and no place.
    explicit RecognizerResult(KvoRecognizerTarget& found);

    KVO_DECLARE_CLASS_INFO();

    /// Casts a result, null for null and for what is none.
    static RecognizerResult* From(void* result);

    KvoRecognizerTarget* target; ///< Not owned.
    int x = 0;                   ///< The left column, in pixels from the left.
    int y = 0;                   ///< The lowest row, in pixels from the bottom.
    int width = 0;               ///< Pixels.
    int height = 0;              ///< Pixels.
    double score = 0.0;          ///< 0 to 1; 1 is a perfect match.
};

/// A recognizer that finds its targets in pictures.
///
/// `targets` stay the host's; it deletes them after the last `Recognize`, or
/// takes them out of the list first. `results` holds RecognizerResult objects
/// that belong to the recognizer, until `Reset` or the next `Recognize`.
class PictureRecognizer : public KvoRecognizer
{
public:
    PictureRecognizer();

    /// Deletes the results.
    ~PictureRecognizer() override;

    KVO_DECLARE_CLASS_INFO();

    /// Casts a recognizer, null for null and for one of another kind.
    static PictureRecognizer* From(KvoRecognizer* recognizer);

    /// Deletes the results.
    void Reset() override;

    /// Prepares the targets that are not configured yet. Those that it cannot
    /// work with, for lack of a picture say, stay as they are.
    ///
    /// Returns: as `Configured`.
    virtual int Configure() = 0;

    /// Looks for every configured target in `frame`, and makes a new list of
    /// results: in the order of the targets, and for each the best first.
    ///
    /// Units:   results have a score of at least `threshold`.
    /// Returns: how many results there are.
    /// Reports: an error for lack of memory; there are no results then.
    virtual int Recognize(const ZtImageSGI& frame) = 0;

    double threshold = 0.75; ///< The least score of a result.

protected:
    /// Appends a result to the list.
    ///
    /// Owner:   the recognizer, also if it fails.
    /// Returns: false if there is no memory.
    bool add_result(std::unique_ptr<RecognizerResult> result);
};

#endif
