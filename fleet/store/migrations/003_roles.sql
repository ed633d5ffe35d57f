-- Two roles that nobody logs in as; operators grant them to the users of lapdstore and of people:
-- "GRANT lapd_writer TO lapdstore". Everything else is the owner's alone.
DO $$
BEGIN
    IF NOT EXISTS (SELECT FROM pg_roles WHERE rolname = 'lapd_writer') THEN
        CREATE ROLE lapd_writer NOLOGIN;
    END IF;
    IF NOT EXISTS (SELECT FROM pg_roles WHERE rolname = 'lapd_reader') THEN
        CREATE ROLE lapd_reader NOLOGIN;
    END IF;
END $$;

GRANT USAGE ON SCHEMA lapd TO lapd_writer, lapd_reader;
GRANT SELECT ON lapd.trunks, lapd.runs, lapd.frames, lapd.calls, lapd.findings, lapd.gaps, lapd.positions,
    lapd.dead_letters TO lapd_reader, lapd_writer;
GRANT SELECT ON lapd.migrations TO lapd_reader, lapd_writer;

-- A writer adds and never deletes; of frames, findings and gaps it changes nothing either.
GRANT INSERT ON lapd.frames, lapd.findings, lapd.gaps, lapd.dead_letters TO lapd_writer;
GRANT INSERT, UPDATE ON lapd.trunks, lapd.runs, lapd.calls, lapd.positions TO lapd_writer;
REVOKE EXECUTE ON FUNCTION lapd.make_day(date), lapd.forget_before(date) FROM PUBLIC;
GRANT EXECUTE ON FUNCTION lapd.make_day(date) TO lapd_writer;
