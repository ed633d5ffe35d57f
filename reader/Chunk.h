// Some items on their way through the pipeline, with copies of all that their reader only lends.
#ifndef READER_CHUNK_H
#define READER_CHUNK_H

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include "capture/Item.h"
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
    void clear();

    bool empty() const { return seen_.empty(); }
    std::size_t size() const { return seen_.size(); }
    std::vector<Seen>& seen() { return seen_; }

    std::string text;           // composed for the pieces, one after another
    std::vector<Piece> pieces;  // in the order of the items

  private:
    struct Span {
        std::size_t start;
        std::size_t size;
    };

    std::vector<capture::Item> items_;
    std::vector<Seen> seen_;
    std::vector<Span> octetSpans_;
    std::vector<Span> textSpans_;
    std::vector<std::uint8_t> octets_;
    std::string texts_;
};

}  // namespace reader

#endif
