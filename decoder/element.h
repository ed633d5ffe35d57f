// The functions of which element decoders are made. A decoder reads like the octet table of the standard:
//
//     Element ie(id, rb);
//     ie.header("PROGRESS INDICATOR");
//     ie.length();
//     ie.octet("  3:  ", fixed)
//         .bits(7, 6, " Coding Standard")
//         .text("      ---0---- Spare")
//         .bits(4, 1, " Location");
//
// A line that only some trunks show names these first: .bits(ntt | net5, 6, 6, " Negotiation").
//
// Past the end of the frame, taking an octet yields the octet of the element that was taken last, which may
// be its length octet. A length octet that is missing is 0.
#ifndef DECODER_ELEMENT_H
#define DECODER_ELEMENT_H

#include "decoder/cursor.h"
#include "decoder/lines.h"
#include "decoder/state.h"
#include "decoder/trunks.h"

namespace decoder {

// What the extension line of an octet shows. fixed: always "1". asBit8: the value of bit 8. whenSet: "1" when
// bit 8 is set, and no line when it is clear.
enum Extension { fixed, asBit8, whenSet };

// Writes the header line. ie_id has already written its indent.
template <std::size_t N>
void header(const char (&name)[N], unsigned char id) {
    text("  1:           ", name, "(0x", hex(id), ")\n");
}

// One element that is being decoded. "Takes" means: reads the next octet through the cursor. "Counts" means:
// subtracts 1 from `ielength`, the number of octets that the element still announces.
class Element {
  public:
    Element(unsigned char id, RingBuffer* rb) : rb_(rb), id_(id) {}

    template <std::size_t N>
    void header(const char (&name)[N]) {
        decoder::header(name, id_);
    }

    // Takes the length octet into `ielength` and shows it.
    void length() {
        getblockchar(rb_, &octet_);
        ielength = octet_;
        line("  2:           IE Length(0x", hex(octet_), ")");
    }

    // ---- octets

    // Takes an octet, counts it and shows its extension line.
    template <std::size_t N>
    Element& octet(const char (&label)[N], Extension form) {
        return take().extension(label, form);
    }

    // Takes and counts an octet, and shows nothing.
    Element& take() {
        --ielength;
        return takeUncounted();
    }
    // Takes an octet without counting it.
    Element& takeUncounted() {
        getblockchar(rb_, &octet_);
        return *this;
    }

    // Counts, takes nothing, and shows the octet taken last under another label.
    template <std::size_t N>
    Element& again(const char (&label)[N], Extension form) {
        --ielength;
        return extension(label, form);
    }

    // Takes and counts the octets of a group and calls `show` after each. The group ends after the octet with
    // bit 8 set, or at the end of the frame.
    template <typename Show>
    void group(Show show) {
        while (getblockchar(rb_, &octet_)) {
            --ielength;
            show();
            if (!more())
                break;
        }
    }

    // Takes all octets that are still announced, without counting them, and calls show(i) after each, with i
    // from 0.
    template <typename Show>
    void rest(Show show) {
        for (int i = 0; i < ielength; ++i) {
            takeUncounted();
            show(i);
        }
    }

    // Takes all octets that are still announced and shows them as characters on one line, unchanged.
    template <std::size_t N>
    void characters(const char (&label)[N]) {
        output(flag);
        decoder::text("      ");
        rest([this](int) { decoder::text(static_cast<char>(octet_)); });
        decoder::text(label, "\n");
    }

    // ---- lines about the octet taken last

    template <std::size_t N>
    Element& extension(const char (&label)[N], Extension form) {
        if (form == fixed || !more())
            line(label, "1------- Extension Bit");
        else if (form == asBit8)
            line(label, "0------- Extension Bit");
        return *this;
    }

    // Shows the bits `high` to `low` at their places, and the label.
    template <std::size_t N>
    Element& bits(int high, int low, const char (&label)[N]) {
        bit_field = value() & maskOf(high, low);
        line(Bits{bit_field, high, low}, label);
        return *this;
    }

    // The same without a line end: the next text follows in the same line.
    template <typename Label>
    Element& bitsUnended(int high, int low, const Label& label) {
        bit_field = value() & maskOf(high, low);
        bitwise(bit_field, high, low);
        decoder::text(label);
        return *this;
    }

    // Writes a line that consists of these pieces.
    template <typename... Pieces>
    Element& text(Pieces&&... pieces) {
        line(pieces...);
        return *this;
    }

    // The same, but only on these trunks.
    template <std::size_t N>
    Element& extension(Trunks trunks, const char (&label)[N], Extension form) {
        return on(trunks) ? extension(label, form) : *this;
    }
    template <std::size_t N>
    Element& bits(Trunks trunks, int high, int low, const char (&label)[N]) {
        return on(trunks) ? bits(high, low, label) : *this;
    }
    template <typename... Pieces>
    Element& text(Trunks trunks, Pieces&&... pieces) {
        return on(trunks) ? text(pieces...) : *this;
    }

    // ---- questions

    // Whether bit 8 of the octet taken last is clear, which means that another octet of its group follows.
    bool more() const { return (octet_ & 0x80) == 0; }

    // Whether `ielength` is not zero. It is also true when more octets were counted than announced. Use it
    // for an optional octet.
    bool left() const { return ielength != 0; }

    // Whether octets are left to take. Use it for loops, which must also end below zero.
    bool anyLeft() const { return ielength > 0; }

    // The octet taken last; or its bits `high` to `low`, shifted down.
    int value() const { return octet_; }
    int value(int high, int low) const { return (octet_ & maskOf(high, low)) >> (low - 1); }

  private:
    static constexpr int maskOf(int high, int low) { return (1 << high) - (1 << (low - 1)); }

    RingBuffer* rb_;
    unsigned char id_;
    unsigned char octet_ = 0;
};

}  // namespace decoder

#endif
