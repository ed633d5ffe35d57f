#include "fleet/ship/Packer.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

namespace {

using fleet::InputEvent;
using fleet::Packer;
using fleet::Parcel;
using Kind = capture::Item::Kind;

const fleet::ParcelHead head{{"london", "h1", "0", "1"}, "pri1", "nfas-a", false};
const capture::Interface net5{"pri1", capture::Variant::net5};
const capture::Interface ni2{"pri1", capture::Variant::ni2};
const std::vector<std::uint8_t> octets{0x00, 0x01, 0x7f};

InputEvent frame(std::uint64_t run, std::uint64_t number, const capture::Interface& interface = net5) {
    InputEvent event;
    event.run = run;
    event.number = number;
    event.item.frame.octets = octets;
    event.item.frame.interface = &interface;
    event.item.frame.clock = capture::Clock::absolute;
    event.item.frame.time = 1001;
    return event;
}

InputEvent note(std::uint64_t run, std::uint64_t number, Kind kind, std::string_view text = {}) {
    InputEvent event = frame(run, number);
    event.item.kind = kind;
    event.item.frame.octets = {};
    event.item.text = text;
    return event;
}

// Each parcel's id, its frames' notes in brackets.
std::string idsOf(Packer& packer) {
    std::string all;
    for (const Parcel& parcel : packer.parcels()) {
        EXPECT_EQ(fleet::parcelIn(toText(parcel)), parcel);
        all += parcel.id().substr(parcel.id().find("/0/") + 3);
        for (const fleet::ParcelFrame& each : parcel.frames)
            all += each.before.empty() ? "" : "[" + std::to_string(each.before.size()) + "]";
        all += ";";
    }
    packer.parcels().clear();
    return all;
}

std::string packed(const std::vector<InputEvent>& events) {
    Packer packer(head);
    for (const InputEvent& event : events)
        packer.take(event);
    packer.close();
    return idsOf(packer);
}

TEST(Packer, FramesThatFollowEachOtherShareAParcelWhichIsClosedInAPause) {
    Packer packer(head);
    packer.take(frame(7, 1));
    packer.take(frame(7, 2));
    EXPECT_EQ(idsOf(packer), "");
    packer.close();
    packer.close();
    EXPECT_EQ(idsOf(packer), "1/7/1/2;");
    packer.take(frame(7, 3));
    packer.close();
    EXPECT_EQ(idsOf(packer), "1/7/3/1;");
}

TEST(Packer, ARunAVariantAndAHoleBeginAParcel) {
    EXPECT_EQ(packed({frame(7, 1), frame(8, 1), frame(8, 2, ni2), frame(8, 5, ni2)}),
              "1/7/1/1;1/8/1/1;1/8/2/1;1/8/5/1;");
}

TEST(Packer, WhatTheRecorderSaysGoesWithTheFrameBehindIt) {
    EXPECT_EQ(packed({frame(7, 1), note(7, 2, Kind::lost), note(7, 2, Kind::restart), frame(7, 2)}),
              "1/7/1/2[2];");
    EXPECT_EQ(packed({frame(7, 1), note(7, 2, Kind::lost)}), "1/7/1/1;") << "until that frame comes";
}

TEST(Packer, OldFramesAreLeftOut) {
    InputEvent old = frame(7, 1);
    old.isOld = true;
    EXPECT_EQ(packed({old, frame(7, 2)}), "1/7/2/1;");
}

TEST(Packer, GapsAndEndsAreParcelsOfTheirOwn) {
    InputEvent gap;
    gap.kind = InputEvent::Kind::gap;
    gap.run = 7;
    gap.number = 2;
    gap.gap = fleet::ParcelGap{2, 4, "why"};
    InputEvent end;
    end.kind = InputEvent::Kind::end;
    end.run = 7;
    end.number = 6;
    EXPECT_EQ(packed({frame(7, 1), gap, frame(7, 5), end}), "1/7/1/1;1/7/5/0/gap;1/7/5/1;1/7/6/0/end;");
    end.gap = fleet::ParcelGap{6, std::nullopt, "why"};
    EXPECT_EQ(packed({note(7, 6, Kind::lost), end}), "1/7/6/0/gap/end;");
}

TEST(Packer, AParcelIsClosedBeforeItIsTooLarge) {
    const std::vector<std::uint8_t> longest(Parcel::mostOctets);
    const std::string text(5000, '\x01');  // six characters each in JSON
    Packer packer(head);
    for (std::uint64_t number = 1; number <= 3; ++number) {
        for (int i = 0; i < 1200; ++i)
            packer.take(note(7, number, Kind::unproved, text));
        InputEvent event = frame(7, number);
        event.item.frame.octets = longest;
        packer.take(event);
    }
    for (const Parcel& parcel : packer.parcels()) {
        EXPECT_LE(toText(parcel).size(), Parcel::largest);
        EXPECT_LE(parcel.frames[0].before.size(), Parcel::mostNotes);
    }
    EXPECT_EQ(packer.parcels().size(), 3U);
}

TEST(Packer, AFrameThatNoParcelCanHoldIsOneWithoutOctets) {
    const std::vector<std::uint8_t> tooLong(Parcel::mostOctets + 1);
    InputEvent event = frame(7, 1);
    event.item.frame.octets = tooLong;
    const fleet::ParcelItem item = fleet::parcelItem(event.item, 7, 1);
    EXPECT_EQ(item.kind, Kind::oversized);
    EXPECT_TRUE(item.octets.empty());
}

// Otherwise a frame that is sent again could belong to another day.
// The store refuses the whole parcel for one value that it cannot hold.
TEST(Packer, AValueThatNoParcelMayHoldIsLeftOutOrReduced) {
    InputEvent damaged = frame(1, 1);
    damaged.item.frame.written = Parcel::latest + 1;
    InputEvent before = note(1, 1, Kind::lost, std::string_view("\0\xff", 2));
    before.item.frame.written = -1;
    before.item.count = Parcel::mostNumber + 1;
    EXPECT_EQ(packed({before, damaged}), "1/1/1/1[1];");
}

TEST(Packer, AFrameWithoutADateHasATimeThatDependsOnTheRunAndTheFrameAlone) {
    InputEvent event = frame(7, 1);
    const std::uint64_t run = 1'795'260'333'000'001;
    EXPECT_EQ(fleet::parcelItem(event.item, run, 5).time, 1001);
    event.item.frame.clock = capture::Clock::relative;
    EXPECT_EQ(fleet::parcelItem(event.item, run, 5).time, 1'795'260'333'000'002'001);
    event.item.frame.clock = capture::Clock::none;
    EXPECT_EQ(fleet::parcelItem(event.item, run, 5).time, 1'795'260'333'000'001'005);
    event.item.frame.clock = capture::Clock::absolute;
    event.item.frame.time = -5;
    EXPECT_EQ(fleet::parcelItem(event.item, run, 5).time, 0);
}

}  // namespace
