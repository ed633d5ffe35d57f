#include "reader/TextConsumer.h"

#include <string>
#include <string_view>

#include "reader/text.h"

namespace reader {

void TextConsumer::take(Chunk& chunk, std::size_t count) {
    if (chunk.pieces.front().deltaSize != 0)
        fillInTimes(chunk, count);
    const std::string_view text = std::string_view(chunk.text).substr(0, chunk.pieces[count - 1].end);
    if (!harmless_) {
        out_.write(text);
        return;
    }
    std::string shown;
    appendForTerminal(shown, text);
    out_.write(shown);
}

void TextConsumer::fillInTimes(Chunk& chunk, std::size_t count) {
    for (std::size_t i = 0; i < count; ++i) {
        Piece& piece = chunk.pieces[i];
        if (piece.instant.clock == capture::Clock::none)
            continue;
        const bool comparable = before_.clock == piece.instant.clock;
        const SecondsText text(comparable ? piece.instant.time - before_.time : 0);
        const std::string_view delta = text.view();
        before_ = piece.instant;
        if (delta.size() > piece.deltaSize)
            widen(chunk, i, delta.size() - piece.deltaSize);
        delta.copy(chunk.text.data() + piece.deltaAt + piece.deltaSize - delta.size(), delta.size());
    }
}

// Makes more room for the time between two lines, which is needed if it is more than a day.
void TextConsumer::widen(Chunk& chunk, std::size_t first, std::size_t more) {
    chunk.text.insert(chunk.pieces[first].deltaAt, more, ' ');
    chunk.pieces[first].deltaSize += more;
    for (std::size_t i = first; i < chunk.pieces.size(); ++i) {
        chunk.pieces[i].end += more;
        if (i > first)
            chunk.pieces[i].deltaAt += more;
    }
}

}  // namespace reader
