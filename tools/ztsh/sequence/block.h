#ifndef ZTSH_SEQUENCE_BLOCK_H
#define ZTSH_SEQUENCE_BLOCK_H

/// \file
/// Blocks of statements between "begin" and "end".

#include "script/source.h"

#include <vector>

namespace ztsh {

/// What came of reading a block.
enum class BlockRead {
    Whole,     ///< Up to and including its "end".
    NoBegin,   ///< The next statement, if there was one, is not "begin"; it is
               ///< the only one in the block.
    NoEnd,     ///< The input ended inside the block.
    Cancelled, ///< The user took the block back.
};

/// Tells whether the words of `statement` from position `first` on open a
/// block: the first is "begin"; or it is `Frames` and the last is "begin"; or
/// it is `Clock` and what stands behind its "do" opens one. "begin" and "do"
/// mind the case, command words do not.
bool OpensBlock(KvoStatement& statement, int first = 0);

/// Reads a block into `block`, without its "begin" and "end".
///
/// With `opened` false the next statement has to be its "begin". Blocks inside
/// the block are part of it. As with `ZtEatBeginEndBlock`, a statement whose
/// first word is "begin" opens one and one whose first word is "end" closes
/// one.
BlockRead ReadBlock(StatementSource& source, bool opened,
                    std::vector<StoredStatement>& block);

} // namespace ztsh

#endif
