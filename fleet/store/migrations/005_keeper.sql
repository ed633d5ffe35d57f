-- Who lets old rows go, and may do nothing else: "GRANT lapd_keeper TO keeper".
DO $$
BEGIN
    IF NOT EXISTS (SELECT FROM pg_roles WHERE rolname = 'lapd_keeper') THEN
        CREATE ROLE lapd_keeper NOLOGIN;
    END IF;
END $$;

ALTER FUNCTION lapd.forget_before(date) SECURITY DEFINER;
GRANT USAGE ON SCHEMA lapd TO lapd_keeper;
GRANT EXECUTE ON FUNCTION lapd.forget_before(date) TO lapd_keeper;
