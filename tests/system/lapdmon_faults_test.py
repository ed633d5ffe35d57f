"""What the user sees when board or library do something wrong: a row for each fault.

Whatever the fault, the program ends with the status of its row, every buffer and queue goes back to the library, and the
log ends with a whole entry. Frames that the board sent in order stand in the log in order, each once.
"""

import re
import unittest

from harness import (MARK, RECEIVED, SOFTBOARD, TRANSMITTED, SystemTest, capture, time_of)

AT_ONCE = 32  # programs; most of their time they wait for a reply that does not come
FRAMES = 250

ADDRESS = r"{Node \w+ Board \w+ Processor \w+ Component \w+ Instance \w+}"
BANNER = r"\n\*{{44}}\nUnregisterd {}.*\n(?:.*\n){{1,}}?\*{{44}}\n\n"

# The commands of a trace, in order: what is asked, what answers.
COMMANDS = [(0x80003D, 0x800007), (0x80003D, 0x800007), (18, 19), (8, 9), (22, 23), (26, 27), (8, 9)]
START = 5  # of them; a start that fails ends the program

REFUSED = {  # what a wrong reply's message type is on the screen
    "reply-type-0": "0",
    "reply-general": "0x800001",
    "reply-error": "0",
}


def numbered(count):
    """So many frames; the board's time is their number, 4 ms each."""
    return [(TRANSMITTED if i % 3 == 0 else RECEIVED, bytes((2, 1, 1, i % 251))) for i in range(count)]


def shown(frames):
    """As they are found in a log."""
    return [("T" if direction == TRANSMITTED else "R", time_of(i), octets)
            for i, (direction, octets) in enumerate(frames)]


def with_wrong(wrong):
    """The frames with what a wrong event looks like before the first and each hundredth after it."""
    frames = shown(numbered(FRAMES))
    for i in range(FRAMES // 100 * 100, -1, -100):
        frames[i:i] = wrong(frames[i])
    return frames


def timeout(number):
    command, reply = COMMANDS[number - 1]
    return (rf"vela Exception caught\nAddressable::Timeout ObjSource: {{TgtDesc: {ADDRESS} HostDesc: {ADDRESS}"
            rf" CmdMsgType: {command:#x} RetMsgType: {reply:#x} Trans: {9999 + number} Timeout: 5000ms\n")


def unexpected(number, kind):
    return (rf"vela Exception caught\nAddressable::UnexpectedMsg ObjSource: {{TgtDesc: {ADDRESS} HostDesc: {ADDRESS}"
            rf" CmdMsgType {COMMANDS[number - 1][0]:#x} RespMsg: {{MsgType: {kind} .*}}\n")


FOREIGN = r"general Exception caught in lapdmon\(749\)\n"
GOODBYE = r"One moment. Program Exiting\n{}general Exception caught in lapdmon\(215\)\n"
MARKED = r"(?:Oversized frame, frame will not be interpreted\nFrame Error\n)"
DAY = capture(*numbered(FRAMES), MARK, interval=0.004)


class Row:
    """A run with faults, and what it is to show: a screen from the end of the head on, standard error, the log."""

    def __init__(self, *faults, status=0, screen="", errors="", log=None, marks=1, frames=DAY):
        self.faults = faults
        self.status = status
        self.marks = marks if status == 0 else 0
        if status == 0:
            screen = rf"{MARKED}{{{marks},}}" + GOODBYE.format(screen)
        self.screen = re.compile(rf"NET5 Switch\n{screen}\Z" if status == 0 else rf"{screen}\Z")
        self.errors = re.compile(rf"\A{errors}\Z")
        self.log = log if log is not None or status != 0 else shown(numbered(FRAMES))
        self.frames = frames


def reply_row(fault, number):
    command, reply = COMMANDS[number - 1]
    if fault == "reply-twice":
        # Answered by the first. The second finds nobody, or, at the very end, may find the queue gone.
        screen = ""
    elif fault in REFUSED:
        screen = unexpected(number, REFUSED[fault])
    else:
        screen = timeout(number)
    source, kind = BANNER.format("Source sent to MsgQueue"), BANNER.format(f"MsgType {reply}\n")
    errors = ""
    if fault in REFUSED and number == 2:
        errors = "lapdmon: board 1 found no D channel 1\n"
    elif fault == "reply-other-source":
        errors = source
    elif fault in ("reply-wrong-transaction", "reply-twice"):
        errors = source if number < 4 else f"(?:{source}|{kind})"
    elif fault == "reply-late" and number == START + 1:
        errors = kind
    elif fault == "reply-late" and number in (START - 1, START):
        errors = source if number < START else kind  # it comes while the start is undone
    if number in (4, len(COMMANDS)) and fault == "reply-twice":
        errors = f"(?:{errors})?"
    starts = number > START or fault == "reply-twice"
    return Row(f"{fault}={number}", status=0 if starts else 1, screen=screen, errors=errors)


REPLIES = [reply_row(fault, number)
           for fault in ("reply-lost", "reply-late", "reply-twice", *REFUSED, "reply-other-source",
                         "reply-wrong-transaction")
           for number in range(1, len(COMMANDS) + 1)]

CALLS = [
    # Each command has a message of its own; what comes after them only wakes readers.
    *[Row(f"allocate-fails={n}", status=1, screen=FOREIGN) for n in range(1, START + 1)],
    Row("allocate-fails=6"),
    *[Row(f"allocate-fails={n}", screen=FOREIGN) for n in (7, 8)],
    *[Row(f"allocate-fails={n}") for n in (9, 10)],
    # Once: tried again. Twice: given up, for the board's queue and for the D channel's.
    Row("open-fails=1"),
    Row("open-fails=2"),
    Row("open-fails=1", "open-fails=2", status=1, screen=FOREIGN),
    Row("open-fails=2", "open-fails=3", status=1, screen=FOREIGN),
    Row("bind-fails=1"),
    Row("bind-fails=2"),
    Row("bind-fails=1", "bind-fails=2", status=1, screen=FOREIGN),
    Row("bind-fails=2", "bind-fails=3", status=1, screen=FOREIGN),
    Row("offset-stays-0"),
]


def event_row(fault, wrong=lambda frame: [], errors=""):
    return Row(fault, log=with_wrong(wrong), errors=3 * errors)


def group(number):
    return BANNER.format(f"EventGroup {number}\n")


EVENTS = [
    # What is missing of an event is 0, and so is its length.
    event_row("event-truncated=0", errors=group(0)),
    event_row("event-truncated=3", errors=group(0)),
    event_row("event-truncated=4", lambda frame: [("R", "0.0", b"")]),
    event_row("event-truncated=8", lambda frame: [(frame[0], "0.0", b"")]),
    event_row("event-truncated=12", lambda frame: [(frame[0], frame[1], b"")]),
    event_row("event-truncated=17", lambda frame: [(frame[0], frame[1], frame[2][:1])]),
    # What follows the frame is not shown.
    event_row("event-overlong=1", lambda frame: [frame]),
    event_row("event-overlong=100000", lambda frame: [frame]),
    # A length below 0 is 0, one beyond what there is means what there is.
    event_row("event-length=0", lambda frame: [(frame[0], frame[1], b"")]),
    event_row("event-length=4294967295", lambda frame: [(frame[0], frame[1], b"")]),
    event_row("event-length=2", lambda frame: [(frame[0], frame[1], frame[2][:2])]),
    event_row("event-length=257", lambda frame: [frame]),
    Row("event-length=258", marks=4),
    event_row("event-label=3", errors=group(3)),
    event_row("event-type=999", errors=BANNER.format("MsgType 999\n")),
    event_row("event-source=99", errors=BANNER.format("Source sent to MsgQueue")),
]

MANY = numbered(10000)

LOADS = [
    Row("burst=101"),
    Row("burst=10000", log=shown(MANY), frames=capture(*MANY, MARK, interval=0.004)),
    Row("never-waits"),
    # The last event comes again, before the program has ended and after.
    Row("events-while-stopping=100", screen=f"{MARKED}*"),
    # Here the mark is the last that comes; then two commands find no answer.
    Row("silent=100", screen=timeout(6) + timeout(7), log=shown(numbered(99)),
        frames=capture(*numbered(99), MARK, *numbered(50), interval=0.004)),
]


class Faults(SystemTest):
    def entries(self, log):
        """The frames of a log that is whole, with what else there is between them taken out."""
        head, _, rest = log.partition("NET5 Switch \n")
        self.assertTrue(head.startswith("\nOrvane KV9 ISDN Trace Utility\n"), head)
        frame = re.compile(r"\n *DATE\n *(?P<way>[RT])X Frame: Time = (?P<time>\S+)\n"
                           r"(?:(?P<over> *Oversized frame, frame will not be interpreted \n *Frame Error \n)|"
                           r"(?:(?! *Hex Dump).*\n)*? *Hex Dump: \n(?P<dump>(?: *(?:[0-9a-f]{2} )+\n)* *\n?))")
        at, found = 0, []
        while at < len(rest):
            entry = frame.match(rest, at)
            self.assertIsNotNone(entry, "no whole entry: " + rest[at:at + 500])
            # The empty line of an empty dump may be the next entry's.
            at = entry.end()
            if not rest.startswith("\n", at) and at < len(rest):
                at -= 1
            if entry["over"] is None:
                found.append((entry["way"], entry["time"], bytes.fromhex(entry["dump"])))
        return found

    def check(self, row, program, log):
        for _ in range(row.marks and 1):
            program.screen.wait("Frame Error", times=row.marks)
            program.types("q")
        program.ends(status=row.status, errors=row.errors)
        self.assertRegex(program.screen.text(), row.screen)
        self.assertEqual(program.journal.lines()[-1], "buffers outstanding 0, queues open 0")
        text = program.log(log)
        self.assertTrue(text.endswith("\n"))
        if row.log is None:
            self.assertNotIn("Frame: Time", text)
        else:
            self.assertEqual(self.entries(text), row.log)

    def run_rows(self, rows):
        for at in range(0, len(rows), AT_ONCE):
            running = []
            for number, row in enumerate(rows[at:at + AT_ONCE], at):
                words = [word for fault in row.faults for word in ("--fault", fault)]
                name = f"{number}.log"
                running.append((row, name, self.on_board("--rate", "max", *words, run=("lapdmon", "-b1", "-f", name),
                                                         frames=row.frames)))
            for row, name, program in running:
                with self.subTest(" ".join(row.faults)):
                    self.check(row, program, name)

    def test_every_fault_has_a_row(self):
        _, _, listed = self.run_tool(SOFTBOARD, "--help").partition("\nFaults ")
        rows = [fault.partition("=")[0] for row in REPLIES + CALLS + EVENTS + LOADS for fault in row.faults]
        self.assertEqual(set(rows), set(re.findall(r"^  ([a-z][a-z0-9-]+)[= ]", listed.partition("\n\n")[0], re.M)))

    def test_replies(self):
        self.run_rows(REPLIES)

    def test_calls_of_the_library(self):
        self.run_rows(CALLS)

    def test_events(self):
        self.run_rows(EVENTS)

    def test_loads_and_silence(self):
        self.run_rows(LOADS)


if __name__ == "__main__":
    unittest.main()
