// Some items on their way through the pipeline, with copies of all that their reader only lends.
#ifndef READER_CHUNK_H
#define READER_CHUNK_H

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include "capture/Batch.h"
#include "reader/Seen.h"

namespace reader {

// What was composed for one item that passed the filters.
struct Piece {
    std::size_t item = 0;       // which item of the chunk it is about
    std::size_t end = 0;        // where its text ends
    std::size_t deltaAt = 0;    // where the place for the time since the piece before begins
    std::size_t deltaSize = 0;  // 0: there is none in any piece
    Instant instant;            // the time that counts for it
};

// Used by one thread at a time. Clearing keeps the memory, so that a chunk that is used again allocates
// nothing.
class Chunk {
  public:
    // Copies octets and text. The interface and the file's name stay with whoever owns them.
    void add(const Seen& seen);
    // No more is added: views of the items are valid from now on until clear().
    void seal();
    // Moves all items from this one on to another chunk. This one is sealed, the other is not.
    void split(std::size_t from, Chunk& other);
    void clear();

    bool empty() const { return seen_.empty(); }
    std::size_t size() const { return seen_.size(); }
    std::vector<Seen>& seen() { return seen_; }

    std::string text;           // composed for the pieces, one after another
    std::vector<Piece> pieces;  // in the order of the items

  private:
    capture::Batch batch_;
    std::vector<Seen> seen_;
};

}  // namespace reader

#endif
