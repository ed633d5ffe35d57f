#include "reader/Chunk.h"

namespace reader {

Seen& Chunk::add(const Seen& seen) {
    batch_.add(*seen.item);
    return seen_.emplace_back(seen);
}

Seen& Chunk::add(const capture::Item& item) {
    batch_.add(item);
    return seen_.emplace_back();
}

void Chunk::seal() {
    const std::span<const capture::Item> items = batch_.items();
    for (std::size_t i = 0; i < seen_.size(); ++i)
        seen_[i].item = &items[i];
}

void Chunk::split(std::size_t from, Chunk& other) {
    for (std::size_t i = from; i < seen_.size(); ++i)
        other.add(seen_[i]);
    seen_.resize(from);
}

void Chunk::clear() {
    batch_.clear();
    seen_.clear();
    text.clear();
    pieces.clear();
}

void Chunk::dropPieces(std::size_t count) {
    if (count == 0)
        return;
    const std::size_t end = pieces[count - 1].end;
    text.erase(0, end);
    pieces.erase(pieces.begin(), pieces.begin() + static_cast<std::ptrdiff_t>(count));
    for (Piece& piece : pieces) {
        piece.end -= end;
        if (piece.deltaSize != 0)
            piece.deltaAt -= end;
    }
}

}  // namespace reader
