// An item with memory of its own, for those that are written later.
#ifndef READER_HELDITEM_H
#define READER_HELDITEM_H

#include <string>

#include "capture/Item.h"
#include "capture/octets.h"

namespace reader {

// The interface and the name of the file stay with whoever owns them.
struct HeldItem {
    explicit HeldItem(const capture::Item& of)
        : bare(of), octets(capture::textOf(of.frame.octets)), text(of.text) {
        bare.frame.octets = {};
        bare.text = {};
    }
    // Valid as long as this object.
    capture::Item item() const {
        capture::Item item = bare;
        item.frame.octets = capture::octetsOf(octets);
        item.text = text;
        return item;
    }

    capture::Item bare;  // without octets and text
    std::string octets;
    std::string text;
};

}  // namespace reader

#endif
