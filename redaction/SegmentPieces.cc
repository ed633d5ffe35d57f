#include "redaction/SegmentPieces.h"

#include <algorithm>
#include <utility>

namespace redaction {

SegmentPieces::Key SegmentPieces::keyOf(const Segment& segment) {
    const isdn::CallReference& reference = segment.message.callReference;
    return {segment.frame->interface, segment.tei, reference.value, reference.flag,
            segment.frame->transmitted};
}

SegmentPieces::Piece SegmentPieces::pieceOf(const Segment& segment) {
    const isdn::Octets octets = segment.octets;
    return {{segment.number, {octets.begin(), octets.end()}},
            segment.frame->time,
            octets.size() - segment.message.raw.size()};
}

bool SegmentPieces::keep(const Segment& segment, bool isFirst, std::vector<Rebuilt>& givenUp) {
    if (isFirst)
        giveUp(segment, givenUp);
    const auto known = pieces_.find(keyOf(segment));
    if (!isFirst && known == pieces_.end())
        return false;
    pieces_[keyOf(segment)].push_back(pieceOf(segment));
    return true;
}

void SegmentPieces::finish(const Segment& last, isdn::Octets whole, std::vector<Rebuilt>& done,
                           std::vector<std::uint8_t>& lastOctets) {
    Pieces pieces;
    if (const auto known = pieces_.find(keyOf(last)); known != pieces_.end()) {
        pieces = std::move(known->second);
        pieces_.erase(known);
    }
    pieces.push_back(pieceOf(last));
    std::size_t size = last.message.header.size();
    for (const Piece& piece : pieces)
        size += piece.frame.octets.size() - piece.at;
    if (size != whole.size()) {
        pieces.pop_back();
        blank(pieces, done);
        return;
    }
    isdn::Octets rest = whole.subspan(last.message.header.size());
    for (Piece& piece : pieces) {
        const std::size_t share = piece.frame.octets.size() - piece.at;
        std::copy_n(rest.begin(), share, piece.frame.octets.begin() + static_cast<std::ptrdiff_t>(piece.at));
        rest = rest.subspan(share);
    }
    lastOctets = std::move(pieces.back().frame.octets);
    pieces.pop_back();
    for (Piece& piece : pieces)
        done.push_back(std::move(piece.frame));
}

void SegmentPieces::giveUp(const Segment& segment, std::vector<Rebuilt>& givenUp) {
    const auto known = pieces_.find(keyOf(segment));
    if (known == pieces_.end())
        return;
    blank(known->second, givenUp);
    pieces_.erase(known);
}

void SegmentPieces::giveUpAll(std::vector<Rebuilt>& givenUp) {
    for (auto& [key, pieces] : pieces_)
        blank(pieces, givenUp);
    pieces_.clear();
}

void SegmentPieces::giveUpOlder(std::uint64_t number, std::int64_t time, std::vector<Rebuilt>& givenUp) {
    for (auto each = pieces_.begin(); each != pieces_.end();) {
        const Piece& first = each->second.front();
        if (first.frame.number >= number && first.time >= time) {
            ++each;
            continue;
        }
        blank(each->second, givenUp);
        each = pieces_.erase(each);
    }
}

void SegmentPieces::blank(Pieces& pieces, std::vector<Rebuilt>& givenUp) {
    for (Piece& piece : pieces) {
        std::fill(piece.frame.octets.begin() + static_cast<std::ptrdiff_t>(piece.at),
                  piece.frame.octets.end(), std::uint8_t{0});
        givenUp.push_back(std::move(piece.frame));
    }
}

}  // namespace redaction
