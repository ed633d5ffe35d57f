#include "reader/TextConsumer.h"

#include <string>

#include "reader/text.h"

namespace reader {

void TextConsumer::take(Chunk& chunk, std::size_t count) {
    if (chunk.pieces.front().deltaSize != 0) {
        takeWithTimes(chunk, count);
        return;
    }
    const std::string_view text = std::string_view(chunk.text).substr(0, chunk.pieces[count - 1].end);
    if (!harmless_) {
        out_.write(text);
        return;
    }
    std::string shown;
    appendForTerminal(shown, text);
    out_.write(shown);
}

void TextConsumer::takeWithTimes(const Chunk& chunk, std::size_t count) {
    const std::string_view text = chunk.text;
    std::size_t start = 0;
    for (std::size_t i = 0; i < count; ++i) {
        const Piece& piece = chunk.pieces[i];
        out_.write(text.substr(start, piece.deltaAt - start));
        std::string delta;
        if (piece.instant.clock != capture::Clock::none) {
            const bool comparable = before_.clock == piece.instant.clock;
            appendSeconds(delta, comparable ? piece.instant.time - before_.time : 0);
            before_ = piece.instant;
        }
        padTo(delta, 0, piece.deltaSize, true);
        out_.write(delta);
        start = piece.deltaAt + piece.deltaSize;
        out_.write(text.substr(start, piece.end - start));
        start = piece.end;
    }
}

}  // namespace reader
