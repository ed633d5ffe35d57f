-- What a fleet has recorded. Every table is in the schema "lapd", which belongs to the role that runs the migrations.
CREATE SCHEMA lapd;

CREATE TABLE lapd.trunks (
    trunk     integer GENERATED ALWAYS AS IDENTITY PRIMARY KEY,
    site      text NOT NULL,
    host      text NOT NULL,
    board     text NOT NULL,
    dchannel  text NOT NULL,
    name      text NOT NULL,             -- as commands show it
    nfas      text NOT NULL DEFAULT '',  -- the NFAS group, whose D channels share their calls; empty: none
    partition smallint NOT NULL,
    redacted  boolean NOT NULL,          -- numbers and names are pseudonyms
    UNIQUE (site, host, board, dchannel)
);

-- A run is what was read of one log: its frames are numbered from 1. Runs of a trunk grow with time.
CREATE TABLE lapd.runs (
    trunk     integer NOT NULL REFERENCES lapd.trunks,
    run       bigint NOT NULL,
    assembled bigint NOT NULL DEFAULT 1,       -- frames below this number are in the calls and findings
    ended     bigint,                          -- the number behind its last frame; null: it may go on
    behind    jsonb,                           -- what the recorder said behind that frame
    finished  boolean NOT NULL DEFAULT false,  -- it has ended, and all of it is in the calls and findings
    PRIMARY KEY (trunk, run)
);
CREATE INDEX runs_unfinished ON lapd.runs (trunk, run) WHERE NOT finished;

CREATE TABLE lapd.frames (
    trunk    integer NOT NULL,
    run      bigint NOT NULL,
    number   bigint NOT NULL,
    day      date NOT NULL,     -- of `time`, in UTC
    time     bigint NOT NULL,   -- nanoseconds since 1970, as the recorder has it
    sent     boolean NOT NULL,  -- by the side that records
    role     smallint NOT NULL, -- of that side: 0 unknown, 1 user, 2 network
    ticks    bigint,            -- of the board, 4 ms each
    written  bigint,            -- the second since 1970 in which the recorder wrote it
    variant  text NOT NULL,     -- of the trunk: "net5"; empty if it is not known
    octets   bytea,             -- null: the frame was too long for its recorder
    before   jsonb,             -- what the recorder said in front of it
    PRIMARY KEY (trunk, run, number, day)
) PARTITION BY RANGE (day);
-- Days for which lapd.make_day makes no partition: long past, or to come.
CREATE TABLE lapd.frames_other PARTITION OF lapd.frames DEFAULT;

-- The columns that `lapdread calls --csv` prints, and what a call is known by: its trunk, run and first frame.
CREATE TABLE lapd.calls (
    trunk             integer NOT NULL REFERENCES lapd.trunks,
    run               bigint NOT NULL,
    first_frame       bigint NOT NULL,
    last_frame        bigint NOT NULL,
    began             timestamptz,       -- null where the frames have no date
    ended             timestamptz,       -- null while it is open
    last_at           timestamptz,       -- of its last frame
    tei               smallint NOT NULL,
    callref           text NOT NULL,
    origin            text NOT NULL,
    dir               text NOT NULL,
    kind              text NOT NULL,
    calling           text NOT NULL,
    called            text NOT NULL,
    redirecting       text NOT NULL,
    connected         text NOT NULL,
    bearer            text NOT NULL,
    channel_asked     text NOT NULL,
    exclusive         boolean,
    channel           text NOT NULL,
    first_response_ms bigint,
    progress_ms       bigint,
    alerting_ms       bigint,
    connect_ms        bigint,
    duration_ms       bigint,
    outcome           text NOT NULL,
    ended_by          text NOT NULL,
    cleared_by        text NOT NULL,
    cause             smallint,
    location          text NOT NULL,
    made              text NOT NULL,
    cause_before      smallint,
    causes            text NOT NULL,
    flags             text NOT NULL,
    failed            boolean NOT NULL,
    PRIMARY KEY (trunk, run, first_frame)
);
-- Every call to or from this number in the last week; its last digits are found through the reversed number.
CREATE INDEX calls_called ON lapd.calls (called text_pattern_ops, began);
CREATE INDEX calls_called_end ON lapd.calls (reverse(called) text_pattern_ops, began);
CREATE INDEX calls_calling ON lapd.calls (calling text_pattern_ops, began);
CREATE INDEX calls_calling_end ON lapd.calls (reverse(calling) text_pattern_ops, began);
-- Where a cause rises; what failed; what is open.
CREATE INDEX calls_cause ON lapd.calls (cause, began);
CREATE INDEX calls_began ON lapd.calls (began);
CREATE INDEX calls_failed ON lapd.calls (began) WHERE failed;
CREATE INDEX calls_open ON lapd.calls (trunk) WHERE ended IS NULL;

CREATE TABLE lapd.findings (
    trunk      integer NOT NULL REFERENCES lapd.trunks,
    run        bigint NOT NULL,
    frame      bigint NOT NULL,
    kind       text NOT NULL,
    ordinal    integer NOT NULL,  -- of several of one kind at one frame, from 1
    severity   smallint NOT NULL, -- 0 note, 1 warning, 2 error
    at         timestamptz,
    first_frame bigint,           -- of the call that it is about
    count      bigint NOT NULL,
    sentence   text NOT NULL,
    PRIMARY KEY (trunk, run, frame, kind, ordinal)
);
-- Which links flapped last night.
CREATE INDEX findings_kind ON lapd.findings (kind, at);
CREATE INDEX findings_at ON lapd.findings (at);

-- Frames that nobody will ever have, as the shipper says.
CREATE TABLE lapd.gaps (
    trunk  integer NOT NULL REFERENCES lapd.trunks,
    run    bigint NOT NULL,
    first  bigint NOT NULL,
    last   bigint,         -- null: all from `first` on
    reason text NOT NULL,
    PRIMARY KEY (trunk, run, first)
);

-- How far each partition of the stream is in the tables.
CREATE TABLE lapd.positions (
    partition smallint PRIMARY KEY,
    sequence  bigint NOT NULL,
    at        timestamptz NOT NULL DEFAULT now()
);

-- What could not be understood, and why; the stream of dead letters has the whole message.
CREATE TABLE lapd.dead_letters (
    sequence bigint PRIMARY KEY,  -- in the stream of parcels
    subject  text NOT NULL,
    reason   text NOT NULL,
    at       timestamptz NOT NULL DEFAULT now()
);
