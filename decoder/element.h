// The vocabulary of element decoders. With it a decoder reads like the octet table of the standard:
//
//     Element ie(id, rb);
//     ie.header("PROGRESS INDICATOR");
//     ie.length();
//     ie.octet("  3:  ", fixed)
//         .bits(7, 6, " Coding Standard")
//         .text("      ---0---- Spare")
//         .bits(4, 1, " Location");
//
// A line that only some trunks show names them first: .bits(ntt | net5, 6, 6, " Negotiation").
// Past the end of the frame the octet taken last is taken again, the length octet for one; a missing length
// octet is 0.
#ifndef DECODER_ELEMENT_H
#define DECODER_ELEMENT_H

#include "decoder/cursor.h"
#include "decoder/lines.h"
#include "decoder/state.h"
#include "decoder/trunks.h"

namespace decoder {

// The extension line of an octet: always with "1", with bit 8 as it is, or with "1" when it is set and not at
// all when it is clear.
enum Extension { fixed, asBit8, whenSet };

// The header line; its indent has been written with the identifier (ie_id).
template <std::size_t N>
void header(const char (&name)[N], unsigned char id) {
    text("  1:           ", name, "(0x", hex(id), ")\n");
}

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

    // Takes and counts only; or takes without counting.
    Element& take() {
        --ielength;
        return takeUncounted();
    }
    Element& takeUncounted() {
        getblockchar(rb_, &octet_);
        return *this;
    }

    // Counts once more and shows the octet taken last under another label.
    template <std::size_t N>
    Element& again(const char (&label)[N], Extension form) {
        --ielength;
        return extension(label, form);
    }

    // Repeats octets of a group up to the one with bit 8 set, or to the end of the frame.
    template <typename Show>
    void group(Show show) {
        while (getblockchar(rb_, &octet_)) {
            --ielength;
            show();
            if (!more())
                break;
        }
    }

    // Takes as many octets as are still announced, without counting them; i counts from 0.
    template <typename Show>
    void rest(Show show) {
        for (int i = 0; i < ielength; ++i) {
            takeUncounted();
            show(i);
        }
    }

    // Takes as many octets as are still announced and shows them as characters on one line.
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

    // The bits `high` to `low` at their places, and what they mean.
    template <std::size_t N>
    Element& bits(int high, int low, const char (&label)[N]) {
        bit_field = value() & maskOf(high, low);
        line(Bits{bit_field, high, low}, label);
        return *this;
    }

    // The same without a line end: what comes next stands on the same line.
    template <typename Label>
    Element& bitsUnended(int high, int low, const Label& label) {
        bit_field = value() & maskOf(high, low);
        bitwise(bit_field, high, low);
        decoder::text(label);
        return *this;
    }

    // A line as it stands.
    template <typename... Pieces>
    Element& text(Pieces&&... pieces) {
        line(pieces...);
        return *this;
    }

    // The same lines, on some trunks only.
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

    // Bit 8 of the octet taken last is clear: another octet of its group follows.
    bool more() const { return (octet_ & 0x80) == 0; }

    // Not as many octets taken as announced; true as well when more were taken than announced.
    bool left() const { return ielength != 0; }

    // For loops over the octets left: nothing is left below zero either.
    bool anyLeft() const { return ielength > 0; }

    // The octet taken last, whole or the bits `high` to `low` of it shifted down.
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
