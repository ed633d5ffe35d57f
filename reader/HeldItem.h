// A copy of an item that owns its memory, for items that are written later.
#ifndef READER_HELDITEM_H
#define READER_HELDITEM_H

#include <string>

#include "capture/Item.h"
#include "capture/octets.h"

namespace reader {

// The interface and the name of the file are not copied; they must outlive the copy.
struct HeldItem {
    explicit HeldItem(const capture::Item& of)
        : bare(of), octets(capture::textOf(of.frame.octets)), text(of.text) {
        bare.frame.octets = {};
        bare.text = {};
    }
    // A view of the copy, valid as long as this object.
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
