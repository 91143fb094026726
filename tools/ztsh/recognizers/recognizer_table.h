#ifndef ZTSH_RECOGNIZERS_RECOGNIZER_TABLE_H
#define ZTSH_RECOGNIZERS_RECOGNIZER_TABLE_H

/// \file
/// The recognizers that scripts hold by name, with their targets.

#include "picture_recognizer.h"

#include <map>
#include <memory>
#include <string>
#include <vector>

namespace ztsh {

/// A recognizer, its targets and where it came from.
class HeldRecognizer
{
public:
    /// Owner: this object.
    ///
    /// Requires: `fetched` is a PictureRecognizer.
    HeldRecognizer(std::unique_ptr<KvoRecognizer> fetched,
                   std::string plug_name);

    HeldRecognizer(const HeldRecognizer&) = delete;
    HeldRecognizer& operator=(const HeldRecognizer&) = delete;

    PictureRecognizer& Get() const { return *recognizer; }
    const std::string& Plug() const { return plug; }

    /// Puts a target into the recognizer's list, in the place of one of the
    /// same name.
    ///
    /// The results of the latest run are dropped, which may be of the former
    /// target.
    void Add(std::unique_ptr<KvoRecognizerTarget> target);

private:
    std::string plug;
    std::vector<std::unique_ptr<KvoRecognizerTarget>> targets;
    std::unique_ptr<KvoRecognizer> owner; ///< Goes before its targets.
    PictureRecognizer* recognizer;        ///< The same.
};

/// Recognizers by name. They go before the catalog that they come from.
using RecognizerTable = std::map<std::string, std::unique_ptr<HeldRecognizer>>;

/// Fetches the recognizer of a plug.
///
/// Returns: null, with `why` set, if there is no such plug, or its recognizer
///          is not run by searching pictures.
std::unique_ptr<KvoRecognizer>
FetchPictureRecognizer(KvoRecognizerCatalog& catalog, const std::string& plug,
                       std::string& why);

} // namespace ztsh

#endif
