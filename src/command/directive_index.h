#ifndef ZT_COMMAND_DIRECTIVE_INDEX_H
#define ZT_COMMAND_DIRECTIVE_INDEX_H

/// \file
/// A guess at the directive that a command word names, proved before it is
/// used.
///
/// Finding a word in the ordered list means a dozen comparisons, each of them a
/// surprise to the processor. The index maps words to places in the list; the
/// object there is the one that the list would find if it compares equal to the
/// word and the one before it compares less. Objects are asked anew each time,
/// so that a name that was changed in place counts at once.

#include <KVO/KvoArray.h>
#include <KVO/KvoObjArr.h>
#include <KVO/KvoSkipList.h>

namespace zt_command {
/// Maps command words, case aside, to the directives of one list.
class DirectiveIndex
{
public:
    DirectiveIndex();

    /// Finds what `list.Search(word)` would find, without moving its cursor.
    ///
    /// The index is built when as many words were looked for since the list
    /// last changed as it has directives, so that building it never costs more
    /// than the searches did.
    ///
    /// Requires: `Forget` was called after every change of the list; its
    ///           objects are named.
    /// Returns:  null when the list itself must be asked.
    KvoObject* Find(const KvoSkipList& list, const char* word);

    /// Forgets the list's objects, for it has changed.
    void Forget();

private:
    enum class State { Waiting, Built, Useless };

    void build(const KvoSkipList& list);
    int& place_of(const char* word);

    State state;
    int searches;         ///< Since the list changed.
    KvoObjArray in_order; ///< The list's objects.
    KvoIntArray places;   ///< By hash: a place in `in_order` plus 1, 0 if none.
};
} // namespace zt_command

#endif
