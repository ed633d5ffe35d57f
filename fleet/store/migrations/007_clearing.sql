-- As before, but if the clearing began before the part that ends the call, the duration ends there as well.
CREATE OR REPLACE FUNCTION lapd.whole_call(c lapd.calls, OUT whole lapd.calls, OUT parts integer, OUT last_trunk integer,
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
        whole.cause_before := coalesce(whole.cause_before, part.cause_before);
        IF whole.cleared_by IN ('unknown', 'nobody') THEN
            whole.duration_ms := part.duration_ms;
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
