-- Makes the partition of a day. Writers may call it; they own no tables. Days that nobody records now stay in
-- frames_other, so that a sender with a wrong clock cannot make thousands of tables.
CREATE FUNCTION lapd.make_day(wanted date) RETURNS void
LANGUAGE plpgsql SECURITY DEFINER SET search_path = lapd, pg_temp AS $$
DECLARE
    name text := 'frames_' || to_char(wanted, 'YYYYMMDD');
BEGIN
    IF wanted < current_date - 400 OR wanted > current_date + 2 OR to_regclass('lapd.' || name) IS NOT NULL THEN
        RETURN;
    END IF;
    -- Two writers may meet a day at once.
    PERFORM pg_advisory_xact_lock(hashtext('lapd.make_day'));
    IF to_regclass('lapd.' || name) IS NULL
       AND NOT EXISTS (SELECT FROM frames_other WHERE day = wanted) THEN
        EXECUTE format('CREATE TABLE lapd.%I PARTITION OF lapd.frames FOR VALUES FROM (%L) TO (%L)',
                       name, wanted, wanted + 1);
    END IF;
END $$;

-- Forgets what is older than `oldest`. A day's partition goes as a whole. Returns how many partitions went.
CREATE FUNCTION lapd.forget_before(oldest date) RETURNS integer
LANGUAGE plpgsql SET search_path = lapd, pg_temp AS $$
DECLARE
    name text;
    gone integer := 0;
BEGIN
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
    DELETE FROM calls WHERE ended IS NOT NULL AND last_at < oldest;
    DELETE FROM findings WHERE at < oldest;
    DELETE FROM dead_letters WHERE at < oldest;
    RETURN gone;
END $$;
