#ifndef PLUGINS_EDGE_EDGE_RECOGNIZER_H
#define PLUGINS_EDGE_EDGE_RECOGNIZER_H

/// \file
/// The recognizer of this plug-in: it finds the targets' thumbnails in a frame
/// by normalised cross-correlation, whatever their brightness and contrast, at
/// half to twice their size, unturned.

#include "picture_recognizer.h"

namespace edge {

/// Finds thumbnails. A target is configured, with the number 1, once it has a
/// picture of more than one grey.
class EdgeRecognizer : public PictureRecognizer
{
public:
    int Configure() override;

    /// Targets that have lost their picture since are passed over.
    int Recognize(const ZtImageSGI& frame) override;

private:
    void search_all(const ZtImageSGI& frame);
};

} // namespace edge

#endif
