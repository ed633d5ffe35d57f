-- The D channels of an NFAS group share their calls, and a D channel whose run ends may begin another one. lapd.calls has
-- a row for each part of such a call: what one D channel has shown of it in one run. Here the parts are joined.
CREATE INDEX calls_reference ON lapd.calls (trunk, lpad(callref, 4, '0'), began);
CREATE INDEX calls_unended ON lapd.calls (began) WHERE ended_by IN ('open', 'link');
CREATE INDEX calls_continued ON lapd.calls (began) WHERE flags LIKE 'before-trace%';

-- A D channel, with itself and the others of its group.
CREATE VIEW lapd.peers AS
    SELECT a.trunk, b.trunk AS peer FROM lapd.trunks a
    JOIN lapd.trunks b ON b.trunk = a.trunk OR (b.site = a.site AND b.nfas = a.nfas AND a.nfas <> '');

-- The next and the previous call with the same reference on a D channel and its peers; all columns are null if there is
-- none.
CREATE FUNCTION lapd.call_after(c lapd.calls) RETURNS lapd.calls LANGUAGE sql STABLE AS $$
    SELECT o.* FROM lapd.peers p JOIN lapd.calls o ON o.trunk = p.peer
    WHERE p.trunk = c.trunk AND lpad(o.callref, 4, '0') = lpad(c.callref, 4, '0') AND o.began >= c.began
      AND o.tei = c.tei AND o.origin = c.origin
      AND (o.began, o.trunk, o.run, o.first_frame) > (c.began, c.trunk, c.run, c.first_frame)
    ORDER BY o.began, o.trunk, o.run, o.first_frame LIMIT 1
$$;
CREATE FUNCTION lapd.call_before(c lapd.calls) RETURNS lapd.calls LANGUAGE sql STABLE AS $$
    SELECT o.* FROM lapd.peers p JOIN lapd.calls o ON o.trunk = p.peer
    WHERE p.trunk = c.trunk AND lpad(o.callref, 4, '0') = lpad(c.callref, 4, '0') AND o.began <= c.began
      AND o.tei = c.tei AND o.origin = c.origin
      AND (o.began, o.trunk, o.run, o.first_frame) < (c.began, c.trunk, c.run, c.first_frame)
    ORDER BY o.began DESC, o.trunk DESC, o.run DESC, o.first_frame DESC LIMIT 1
$$;

-- Whether a row is a further part of a call whose parts so far have ended so, the last of them on this D channel: the row
-- began before its own trace, and the call had not ended by then, except with the link of another D channel.
CREATE FUNCTION lapd.goes_on(ended_by text, ended timestamptz, trunk integer, n lapd.calls) RETURNS boolean
LANGUAGE sql IMMUTABLE AS $$
    SELECT coalesce(n.flags LIKE 'before-trace%' AND (ended_by = 'open' OR (n.trunk <> trunk AND (ended_by = 'link' OR
                                                                                            ended > n.began))), false)
$$;

-- Whether a row is a further part of a call, and not its first one. Only the first part tells how far the call goes, so
-- the parts are followed from there.
CREATE FUNCTION lapd.is_continued(c lapd.calls) RETURNS boolean LANGUAGE plpgsql STABLE AS $$
DECLARE
    first lapd.calls := c;
    earlier lapd.calls;
    part lapd.calls;
    ended_by text;
    ended timestamptz;
BEGIN
    WHILE first.flags LIKE 'before-trace%' LOOP
        earlier := lapd.call_before(first);
        EXIT WHEN NOT lapd.goes_on(earlier.ended_by, earlier.ended, earlier.trunk, first);
        first := earlier;
    END LOOP;
    part := first;
    ended_by := part.ended_by;
    ended := part.ended;
    WHILE (part.trunk, part.run, part.first_frame) <> (c.trunk, c.run, c.first_frame) LOOP
        earlier := part;
        part := lapd.call_after(earlier);
        IF lapd.goes_on(ended_by, ended, earlier.trunk, part) THEN
            IF ended_by IN ('open', 'link') OR part.last_at > ended THEN
                ended_by := part.ended_by;
                ended := part.ended;
            END IF;
        ELSE
            first := part;
            ended_by := part.ended_by;
            ended := part.ended;
        END IF;
    END LOOP;
    RETURN (first.trunk, first.run, first.first_frame) <> (c.trunk, c.run, c.first_frame);
END $$;

-- The call of which this row is the first part; for other rows the result means nothing.
CREATE FUNCTION lapd.whole_call(c lapd.calls, OUT whole lapd.calls, OUT parts integer, OUT last_trunk integer,
                                OUT last_run bigint)
LANGUAGE plpgsql STABLE AS $$
DECLARE
    part lapd.calls := c;
    following lapd.calls;
    is_replaced boolean;
    was_answered boolean := c.outcome = 'answered' OR c.connect_ms IS NOT NULL;
    ended_badly boolean;
BEGIN
    whole := c;
    parts := 1;
    LOOP
        following := lapd.call_after(part);
        EXIT WHEN NOT lapd.goes_on(whole.ended_by, whole.ended, part.trunk, following);
        parts := parts + 1;
        part := following;
        whole.calling := coalesce(nullif(whole.calling, ''), part.calling);
        whole.called := coalesce(nullif(whole.called, ''), part.called);
        whole.redirecting := coalesce(nullif(whole.redirecting, ''), part.redirecting);
        whole.connected := coalesce(nullif(whole.connected, ''), part.connected);
        whole.bearer := coalesce(nullif(whole.bearer, ''), part.bearer);
        whole.channel := coalesce(nullif(whole.channel, ''), part.channel);
        was_answered := was_answered OR part.outcome = 'answered';
        CONTINUE WHEN whole.ended_by NOT IN ('open', 'link') AND part.last_at <= whole.ended;
        whole.outcome := part.outcome;
        whole.ended_by := part.ended_by;
        whole.ended := part.ended;
        whole.last_at := part.last_at;
        whole.last_frame := part.last_frame;
        whole.duration_ms := part.duration_ms;
        whole.cause_before := coalesce(whole.cause_before, part.cause_before);
        IF whole.cleared_by IN ('unknown', 'nobody') THEN
            whole.cleared_by := part.cleared_by;
            whole.cause := part.cause;
            whole.location := part.location;
            whole.made := part.made;
            whole.causes := part.causes;
        ELSE  -- the clearing began before
            whole.causes := concat_ws(' ', nullif(whole.causes, ''), part.cause, nullif(part.causes, ''));
        END IF;
        whole.flags := array_to_string(ARRAY(
            SELECT word FROM (SELECT word, min(place) AS place FROM unnest(
                array_remove(string_to_array(nullif(whole.flags, ''), ' '), 'open')
                || array_remove(string_to_array(nullif(part.flags, ''), ' '), 'before-trace'))
                WITH ORDINALITY AS words (word, place) GROUP BY word) words ORDER BY place), ' ');
    END LOOP;
    last_trunk := part.trunk;
    last_run := part.run;
    -- Its reference was used for a new call.
    is_replaced := whole.ended_by = 'open' AND following.trunk IS NOT NULL;
    IF is_replaced THEN
        whole.ended_by := 'replaced';
        whole.ended := following.began;
        whole.last_at := following.began;
        whole.outcome := 'other';
        whole.cleared_by := CASE WHEN whole.cleared_by = 'unknown' THEN 'nobody' ELSE whole.cleared_by END;
        whole.flags := array_to_string(array_remove(string_to_array(whole.flags, ' '), 'open'), ' ');
        last_trunk := following.trunk;
        last_run := following.run;
        whole.last_frame := following.first_frame;
    END IF;
    IF parts = 1 AND NOT is_replaced THEN
        RETURN;
    END IF;
    IF was_answered THEN
        whole.outcome := 'answered';
    ELSIF whole.outcome = 'other' AND whole.cleared_by = whole.origin AND whole.flags NOT LIKE 'before-trace%' THEN
        whole.outcome := 'abandoned';
    END IF;
    IF whole.duration_ms IS NULL AND whole.ended IS NOT NULL THEN
        whole.duration_ms := extract(epoch FROM whole.ended - whole.began) * 1000 - whole.connect_ms;
    END IF;
    ended_badly := whole.ended_by IN ('link', 'restart') OR coalesce(whole.cause NOT IN (16, 31), false);
    whole.failed := CASE
        WHEN whole.outcome = 'answered' THEN whole.ended_by <> 'open' AND ended_badly
        WHEN whole.outcome IN ('open', 'busy', 'no-answer', 'abandoned', 'rejected') THEN false
        ELSE (whole.kind = 'call' AND whole.flags NOT LIKE 'before-trace%') OR ended_badly END;
END $$;

-- A call is one row, whatever D channels of its group it passed. `trunk`, `run` and `first_frame` are those of its first
-- part; `last_frame` is a number of the run `last_run` of `last_trunk`. A call that ended on its first D channel is as that
-- one has it. Columns that do not change are those of the table, so that questions for a time or a trunk use its indexes.
CREATE VIEW lapd.joined_calls AS
    SELECT c.*, 1 AS parts, c.trunk AS last_trunk, c.run AS last_run FROM lapd.calls c
    WHERE c.ended_by NOT IN ('open', 'link')
      AND (c.flags NOT LIKE 'before-trace%' OR NOT lapd.is_continued(c))
    UNION ALL
    SELECT
        c.trunk, c.run, c.first_frame, (w.whole).last_frame, c.began, (w.whole).ended, (w.whole).last_at, c.tei,
        c.callref, c.origin, c.dir, c.kind, (w.whole).calling, (w.whole).called, (w.whole).redirecting,
        (w.whole).connected, (w.whole).bearer, c.channel_asked, c.exclusive, (w.whole).channel, c.first_response_ms,
        c.progress_ms, c.alerting_ms, c.connect_ms, (w.whole).duration_ms, (w.whole).outcome, (w.whole).ended_by,
        (w.whole).cleared_by, (w.whole).cause, (w.whole).location, (w.whole).made, (w.whole).cause_before,
        (w.whole).causes, (w.whole).flags, (w.whole).failed, w.parts, w.last_trunk, w.last_run
    FROM lapd.calls c, LATERAL lapd.whole_call(c) w
    WHERE c.ended_by IN ('open', 'link') AND (c.flags NOT LIKE 'before-trace%' OR NOT lapd.is_continued(c));

-- Findings without those that say that a D channel has lost a call which went on over another one.
CREATE VIEW lapd.joined_findings AS
    SELECT f.* FROM lapd.findings f
    WHERE f.kind NOT IN ('mass-clear', 'stuck-channel')
       OR NOT EXISTS (SELECT FROM lapd.calls c
                      WHERE c.trunk = f.trunk AND c.run = f.run AND c.ended_by IN ('open', 'link')
                        AND (c.first_frame = f.first_frame OR (f.first_frame IS NULL AND c.began <= f.at))
                        AND lapd.goes_on(c.ended_by, c.ended, c.trunk, lapd.call_after(c))
                        AND (f.first_frame IS NOT NULL OR (lapd.call_after(c)).began >= f.at));

GRANT SELECT ON lapd.peers, lapd.joined_calls, lapd.joined_findings TO lapd_reader, lapd_writer;

-- Rows of calls that nobody has heard of for so long go as well, ended or not. A call that ends later makes its row anew.
CREATE OR REPLACE FUNCTION lapd.forget_before(oldest date) RETURNS integer
LANGUAGE plpgsql SET search_path = lapd, pg_temp AS $$
DECLARE
    name text;
    gone integer := 0;
BEGIN
    PERFORM pg_advisory_xact_lock(hashtext('lapd.forget_before'));  -- the tables of days go once
    FOR name IN
        SELECT c.relname FROM pg_inherits i JOIN pg_class c ON c.oid = i.inhrelid
        WHERE i.inhparent = 'lapd.frames'::regclass AND c.relname ~ '^frames_[0-9]{8}$'
          AND to_date(substr(c.relname, 8), 'YYYYMMDD') < oldest
        ORDER BY c.relname
    LOOP
        EXECUTE format('DROP TABLE lapd.%I', name);
        gone := gone + 1;
    END LOOP;
    DELETE FROM frames_other WHERE day < oldest;
    DELETE FROM calls WHERE last_at < oldest;
    DELETE FROM findings WHERE at < oldest;
    DELETE FROM dead_letters WHERE at < oldest;
    RETURN gone;
END $$;
