-- As before, but no further back than 16 parts, which show whether the row is a part of the call before it. Otherwise each row
-- of a long chain would be followed from the chain's beginning.
CREATE OR REPLACE FUNCTION lapd.is_continued(c lapd.calls) RETURNS boolean LANGUAGE plpgsql STABLE AS $$
DECLARE
    first lapd.calls := c;
    earlier lapd.calls;
    part lapd.calls;
    ended_by text;
    ended timestamptz;
    parts integer := 0;
BEGIN
    WHILE first.flags LIKE 'before-trace%' AND parts < 16 LOOP
        earlier := lapd.call_before(first);
        EXIT WHEN NOT lapd.goes_on(earlier.ended_by, earlier.ended, earlier.trunk, first);
        first := earlier;
        parts := parts + 1;
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
