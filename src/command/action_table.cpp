#include "KVO/KvoToken.h"

#include <cstring>
#include <new>

KvoToken::ActionTable::ActionTable(const char* special_characters)
    : KvoNamedObject(special_characters), actions(), vector_stops(),
      vector_scannable(true)
{
    for (int control = 0; control < ' '; ++control)
        actions[control] = Blank;
    const auto add = [this](const char* characters, int action) {
        for (; *characters; ++characters) {
            unsigned char& bits =
                actions[static_cast<unsigned char>(*characters)];
            bits = static_cast<unsigned char>(bits | action);
        }
    };
    add(Blanks(), Blank);
    add(special_characters ? special_characters : "", Special);
    add("\"'\\", QuoteOrEscape);
    note_vector_stops();
}

void KvoToken::ActionTable::note_vector_stops()
{
    constexpr int rows = sizeof vector_stops / sizeof vector_stops[0];
    std::memset(vector_stops, '"', sizeof vector_stops);
    int used = 0;
    for (int code = 1; code < 256; ++code) {
        if ((actions[code] & (Special | QuoteOrEscape)) != Special)
            continue;
        if (used == rows) {
            vector_scannable = false;
            return;
        }
        std::memset(vector_stops[used++], code, sizeof vector_stops[0]);
    }
}

// Built on first use, since tokens are made before `main` too, and never
// destroyed, since they may be made after it.
KvoSkipList& KvoToken::action_tables()
{
    static KvoSkipList& list = *new KvoSkipList;
    return list;
}

KvoSkipList& KvoToken::actionList = KvoToken::action_tables();

// Finds or makes the table for `special_characters`. When there is no memory
// for a new one, a table without specials that needs none stands in.
const KvoToken::ActionTable*
KvoToken::action_table(const char* special_characters)
{
    KvoSkipList& tables = action_tables();
    const char* specials = special_characters ? special_characters : "";
    if (KvoObject* known = tables.Search(specials))
        return static_cast<ActionTable*>(known);
    auto* made = new (std::nothrow) ActionTable(specials);
    if (made && std::strcmp(made->name, specials) == 0 &&
        tables.InsertUnique(made))
        return made;
    delete made;
    alignas(ActionTable) static unsigned char place[sizeof(ActionTable)];
    static const ActionTable* stand_in = new (place) ActionTable("");
    return stand_in;
}
