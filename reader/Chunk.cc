#include "reader/Chunk.h"

namespace reader {

void Chunk::add(const Seen& seen) {
    const capture::Item& item = *seen.item;
    items_.push_back(item);
    seen_.push_back(seen);
    octetSpans_.push_back({octets_.size(), item.frame.octets.size()});
    octets_.insert(octets_.end(), item.frame.octets.begin(), item.frame.octets.end());
    textSpans_.push_back({texts_.size(), item.text.size()});
    texts_ += item.text;
}

void Chunk::seal() {
    for (std::size_t i = 0; i < items_.size(); ++i) {
        capture::Item& item = items_[i];
        item.frame.octets = {octets_.data() + octetSpans_[i].start, octetSpans_[i].size};
        item.text = std::string_view(texts_).substr(textSpans_[i].start, textSpans_[i].size);
        seen_[i].item = &item;
    }
}

void Chunk::clear() {
    items_.clear();
    seen_.clear();
    octetSpans_.clear();
    textSpans_.clear();
    octets_.clear();
    texts_.clear();
    text.clear();
    pieces.clear();
}

}  // namespace reader
