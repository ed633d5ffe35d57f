"""stats: whoever counts again from the frames gets the same figures: times, hours, channels, traffic."""

import collections
import datetime
import json
import math
import random
import unittest

from lapdread_harness import EXAMPLES, Folder, output

ANSWERS = {"SETUP ACKNOWLEDGE", "CALL PROCEEDING", "ALERTING", "CONNECT"}
CLEARING = {"DISCONNECT", "RELEASE", "RELEASE COMPLETE"}
ORDINARY = {17, 18, 19, 20, 21}  # the called party decided
BEGIN = datetime.datetime(2001, 5, 14, 7, 40, tzinfo=datetime.timezone.utc)


def rows(path, name):
    told = [json.loads(line) for line in output("stats", "--quiet", "--jsonl", path).splitlines()]
    return [row for row in told if row["table"] == name]


class Line:
    """Writes the frames of two healthy ends as lines of hexadecimal digits."""

    def __init__(self):
        self.lines, self.sent = [], {"TX": 0, "RX": 0}

    def message(self, at, way, kind, reference, flag, elements=b""):
        other = "RX" if way == "TX" else "TX"
        address = b"\x00\x01" if way == "TX" else b"\x02\x01"
        header = bytes((self.sent[way] % 128 << 1, self.sent[other] % 128 << 1, 0x08, 0x02, (0x80 if flag else 0) | reference >> 8,
                        reference & 255, kind))
        self.sent[way] += 1
        self.add(at, way, address + header + elements)
        self.add(at + 0.004, other, address + bytes((0x01, self.sent[way] % 128 << 1)))

    def add(self, at, way, octets):
        time = BEGIN + datetime.timedelta(milliseconds=round(at * 1000))
        self.lines.append(f"{way} {time:%Y-%m-%dT%H:%M:%S.%f}Z {octets.hex()}")


def trunk(seed, calls):
    """Hex lines of so many calls of both sides, over some hours, answered or not."""
    chance, events = random.Random(seed), []
    free = [0.0] * 31  # when each channel is free again
    for reference in range(1, calls + 1):
        at = reference * 30 + chance.random() * 20
        number = next(each for each in range(1, 31) if each != 16 and free[each] < at)
        caller, callee = chance.choice((("TX", "RX"), ("RX", "TX")))
        channel = bytes((0x18, 0x03, 0xA9, 0x83, 0x80 | number))
        call = [(at, caller, 0x05, False, bytes.fromhex("04038090a3") + channel + b"\x70\x05\x814021")]
        at += chance.uniform(0.02, 0.2)
        call.append((at, callee, 0x02, True, channel))
        at += chance.uniform(0.3, 4)
        fate = chance.choice(("answered", "answered", "busy", "rings", "full"))
        if fate in ("answered", "rings"):
            call.append((at, callee, 0x01, True, b""))
            at += chance.uniform(1, 40)
        if fate == "answered":
            call += [(at, callee, 0x07, True, b""), (at + 0.02, caller, 0x0F, False, b"")]
            at += chance.choice((chance.uniform(1, 90), chance.uniform(600, 5000)))
        first, then, cause = {"answered": (caller, callee, 16), "rings": (callee, caller, 19),
                              "busy": (callee, caller, 17), "full": (callee, caller, 34)}[fate]
        call += [(at, first, 0x45, first == callee, bytes((0x08, 0x02, 0x82, 0x80 | cause))),
                 (at + 0.02, then, 0x4D, then == callee, b""), (at + 0.04, first, 0x5A, first == callee, b"")]
        free[number] = at + 2
        events += [(*event, reference) for event in call]
    line = Line()
    for at, way, kind, flag, elements, reference in sorted(events, key=lambda event: event[0]):
        line.message(at, way, kind, reference, flag, elements)
    return "\n".join(line.lines) + "\n"


class Call:
    def __init__(self, frame):
        self.side = {"tx": "us", "rx": "peer"}[frame["dir"]]
        self.way, self.begin, self.day = frame["dir"], frame["seconds"], frame["time"]
        self.times, self.cause, self.end, self.uses, self.channel = {}, None, None, [], None
        self.asked = self.channel_in(frame)

    @staticmethod
    def elements(frame, name, field):
        return [part["value"] for each in frame["elements"] if each["name"] == name for part in each["fields"] if part["name"] == field]

    def channel_in(self, frame):
        return next(iter(self.elements(frame, "CHANNEL IDENTIFICATION", "channel number")), None)

    def hear(self, frame):
        at, kind = frame["seconds"], frame["message"]
        if frame["dir"] != self.way:
            self.times.setdefault("first response", at - self.begin)
            if kind not in CLEARING:
                self.channel = self.channel or self.channel_in(frame)
        if kind in ("ALERTING", "CONNECT"):
            self.times.setdefault(kind.lower(), at - self.begin)
        if kind in CLEARING and self.cause is None:
            self.cause = next(iter(self.elements(frame, "CAUSE", "cause value")), 0)
            if "connect" in self.times:
                self.times["conversation"] = at - self.begin - self.times["connect"]
        takes = kind in ANSWERS and frame["dir"] != self.way or kind == "RETRIEVE ACKNOWLEDGE"
        if takes and self.cause is None and not (self.uses and self.uses[-1][1] is None) and (self.channel or self.asked):
            self.uses.append([frame, None])
        if (kind == "HOLD ACKNOWLEDGE" or kind == "RELEASE COMPLETE") and self.uses and self.uses[-1][1] is None:
            self.uses[-1][1] = at
        if kind == "RELEASE COMPLETE":
            self.end = at
            if "conversation" in self.times:
                self.times["clearing"] = at - self.begin - self.times["connect"] - self.times["conversation"]


def recount(path):
    """The calls of a trace in which each has a SETUP and a RELEASE COMPLETE, and for how long it was heard."""
    frames = [json.loads(line) for line in output("convert", "--quiet", "--to", "jsonl", path).splitlines()]
    alive, calls = {}, []
    for frame in frames:
        if not frame.get("accepted") or frame.get("pd") != 8 or not frame["callref"]["value"]:
            continue
        toward = frame["callref"]["flag"]
        key = frame["callref"]["value"], {"tx": "rx", "rx": "tx"}[frame["dir"]] if toward else frame["dir"]
        if frame["message"] == "SETUP":
            alive[key] = Call(frame)
            calls.append(alive[key])
        else:
            alive[key].hear(frame)
    return calls, frames[-1]["seconds"] - frames[0]["seconds"]


def quantile(values, share):
    return sorted(values)[math.ceil(share * len(values)) - 1]


def hour(time):
    return time[:13]


class Recount(Folder):
    @classmethod
    def setUpClass(cls):
        cls.traces = {seed: trunk(seed, 250) for seed in (1, 2)}

    def setUp(self):
        super().setUp()
        self.paths = []
        for seed, text in self.traces.items():
            self.paths.append(self.folder / f"trunk{seed}.hex")
            self.paths[-1].write_text(text)

    def test_gives_the_same_times(self):
        for path in [*self.paths, EXAMPLES["4ess"]]:
            calls, _ = recount(path)
            told = {(row["measure"], row["from"]): row for row in rows(path, "times")}
            for measure in ("first response", "alerting", "connect", "conversation", "clearing"):
                for side in ("us", "peer"):
                    values = [round(call.times[measure], 3) for call in calls if call.side == side and measure in call.times]
                    row = told.pop((measure, side), None)
                    self.assertEqual(row["count"] if row else 0, len(values), (path, measure, side))
                    if not values:
                        continue
                    self.assertAlmostEqual(row["worst_s"], max(values), delta=0.0011)
                    self.assertAlmostEqual(row["mean_s"], sum(values) / len(values), delta=0.0021)
                    for name, share in (("median_s", 0.5), ("p95_s", 0.95)):
                        exact = quantile(values, share)
                        self.assertLessEqual(row[name], exact + 0.0011, (path, measure, side, name))
                        self.assertGreaterEqual(row[name], exact * 0.998 - 0.0011, (path, measure, side, name))

    def test_gives_the_same_traffic(self):
        for path in self.paths:
            calls, _ = recount(path)
            told = {row["figure"]: row for row in rows(path, "traffic")}
            for side in ("us", "peer"):
                own = [call for call in calls if call.side == side]
                answered = [call for call in own if "connect" in call.times]
                reached = answered + [call for call in own if call not in answered and call.cause in ORDINARY]
                self.assertEqual((told["seizures"][side], told["answered"][side]), (len(own), len(answered)))
                self.assertAlmostEqual(told["answer-seizure ratio %"][side], 100 * len(answered) / len(own), delta=0.051)
                self.assertAlmostEqual(told["network effectiveness ratio %"][side], 100 * len(reached) / len(own), delta=0.051)
                self.assertEqual(told["congestion"][side], sum(call.cause == 34 for call in own))
                self.assertEqual(told["failed"][side], sum(call.cause == 34 for call in own))

    def test_gives_the_same_hours(self):
        for path in self.paths:
            calls, _ = recount(path)
            seizures, answered, used = (collections.Counter() for _ in range(3))
            for call in calls:
                seizures[hour(call.day), call.side] += 1
                answered[hour(call.day), call.side] += "connect" in call.times
                for frame, end in call.uses:
                    at, day = frame["seconds"], datetime.datetime.fromisoformat(frame["time"])
                    while at < end:
                        left = 3600 - (day - day.replace(minute=0, second=0, microsecond=0)).total_seconds()
                        part = min(left, end - at)
                        used[f"{day:%Y-%m-%dT%H}"] += part
                        at, day = at + part, day + datetime.timedelta(seconds=part, microseconds=1)
            told = rows(path, "hours")
            self.assertGreater(len(told), 2)
            self.assertEqual({hour(row["hour"]) for row in told}, {key[0] for key in seizures} | set(used))
            for row in told:
                key = hour(row["hour"])
                for side in ("us", "peer"):
                    self.assertEqual((row[f"seizures_{side}"], row[f"answered_{side}"]), (seizures[key, side], answered[key, side]))
                self.assertAlmostEqual(row["erlangs"], used[key] / 3600, delta=0.0011)

    def test_gives_the_same_use_of_channels(self):
        for path in self.paths:
            calls, heard = recount(path)
            used, count, steps = collections.Counter(), collections.Counter(), []
            for call in calls:
                number = str(call.channel or call.asked)
                count[number] += len(call.uses)
                for frame, end in call.uses:
                    used[number] += end - frame["seconds"]
                    steps += [(frame["seconds"], 1, frame["time"]), (end, -1, "")]
            for row in rows(path, "channels"):
                self.assertEqual(row["calls"], count[row["channel"]])
                self.assertAlmostEqual(row["used_s"], used[row["channel"]], delta=0.002 * count[row["channel"]] + 0.001)
                self.assertAlmostEqual(row["erlangs"], used[row["channel"]] / heard, delta=0.0011)
            in_use, most, at = 0, 0, ""
            for _, step, time in sorted(steps):
                in_use += step
                if in_use > most:
                    most, at = in_use, time
            row, = rows(path, "trunks")
            self.assertAlmostEqual(row["heard_s"], heard, delta=0.0011)
            self.assertEqual((row["peak"], row["peak_at"]), (most, at))
            self.assertAlmostEqual(row["erlangs"], sum(used.values()) / heard, delta=0.0011)


if __name__ == "__main__":
    unittest.main()
