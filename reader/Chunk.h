// Some items on their way through the pipeline, with copies of everything that the reader owns and will
// reuse.
#ifndef READER_CHUNK_H
#define READER_CHUNK_H

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include "capture/Batch.h"
#include "reader/Seen.h"

namespace reader {

// The text that was composed for one item that passed the filters.
struct Piece {
    std::size_t item = 0;       // index of the item in the chunk
    std::size_t end = 0;        // where its text ends in the chunk's text
    std::size_t deltaAt = 0;    // where the time since the piece before is to be written
    std::size_t deltaSize = 0;  // the size of that place; 0 if the pieces have none
    Instant instant;            // the item's time
};

// Used by one thread at a time. clear() keeps the memory, so that a chunk that is used again allocates
// nothing.
class Chunk {
  public:
    // Both copy octets and text. The interface and the file's name are not copied; they must outlive the
    // chunk. What they return is valid until the next call; the second leaves it to be filled in.
    Seen& add(const Seen& seen);
    Seen& add(const capture::Item& item);
    // Ends the adding. From now on views of the items are valid, until clear(). May be called again.
    void seal();
    // Moves all items from index `from` on to `other`. This chunk must be sealed, and `other` must not be.
    void split(std::size_t from, Chunk& other);
    void clear();
    // Forgets the first pieces and their text; the items stay.
    void dropPieces(std::size_t count);

    bool empty() const { return seen_.empty(); }
    std::size_t size() const { return seen_.size(); }
    std::vector<Seen>& seen() { return seen_; }

    std::string text;           // the texts of all pieces, one after another
    std::vector<Piece> pieces;  // in the order of the items

  private:
    capture::Batch batch_;
    std::vector<Seen> seen_;
};

}  // namespace reader

#endif
