#include "prompt/quote_state.h"

namespace ztsh {

void QuoteState::Add(std::string_view text)
{
    for (char character : text) {
        continued = escaped && character == '\n';
        if (quote != '\0') {
            if (character == quote)
                quote = '\0';
        } else if (escaped) {
            escaped = false;
        } else if (character == '\\') {
            escaped = true;
        } else if (character == '"' || character == '\'') {
            quote = character;
        }
    }
}

} // namespace ztsh
