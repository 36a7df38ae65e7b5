-- Schemas as browsers, mail readers and phones make them, and all that SQLite stores in a column.
CREATE TABLE moz_origins (id INTEGER PRIMARY KEY, prefix TEXT NOT NULL, host TEXT NOT NULL,
    frecency INTEGER NOT NULL, UNIQUE (prefix, host));
CREATE TABLE moz_places (id INTEGER PRIMARY KEY, url LONGVARCHAR, title LONGVARCHAR,
    rev_host LONGVARCHAR, visit_count INTEGER DEFAULT 0, hidden INTEGER DEFAULT 0 NOT NULL,
    last_visit_date INTEGER, guid TEXT, url_hash INTEGER DEFAULT 0 NOT NULL,
    origin_id INTEGER REFERENCES moz_origins(id));
CREATE INDEX moz_places_url_hashindex ON moz_places (url_hash);
CREATE INDEX moz_places_visited ON moz_places (last_visit_date) WHERE visit_count > 0;
CREATE UNIQUE INDEX moz_places_guid ON moz_places (guid);
CREATE TRIGGER moz_places_hidden AFTER UPDATE OF hidden ON moz_places WHEN new.hidden = 1
BEGIN
    UPDATE moz_places SET visit_count = 0 WHERE id = new.id;
END;
INSERT INTO moz_origins VALUES (1, 'https://', 'example.org', -1);
INSERT INTO moz_places VALUES (1, 'https://example.org/?q=100%25&r=''x''', 'It''s "here"', 'gro.', 3, 0,
    1700000000000000, 'aaaaaaaaaaaa', 9223372036854775807, 1);
INSERT INTO moz_places VALUES (7, 'https://example.org/ü', NULL, NULL, 0, 0, NULL, NULL,
    -9223372036854775808, 1);

CREATE TABLE "message's ""parts""" ("order" INTEGER, "group by" TEXT COLLATE NOCASE, "[x]" BLOB, "a.b",
    "select" REAL, "" TEXT, " " TEXT, PRIMARY KEY ("group by", "order")) WITHOUT ROWID;
INSERT INTO "message's ""parts""" VALUES (1, 'a', x'00ff', 5, 0.1, '', ' ');
INSERT INTO "message's ""parts""" VALUES (2, 'A%', x'', '5', 1e308, NULL, 'x');
INSERT INTO "message's ""parts""" VALUES (3, '', NULL, 5.0, 5e-324, 'null', '');
INSERT INTO "message's ""parts""" VALUES (4, 'z', zeroblob(3), x'35', 9e999, '-9e999', NULL);

CREATE TABLE counted (id INTEGER PRIMARY KEY AUTOINCREMENT, name TEXT DEFAULT (lower('X')),
    doubled TEXT GENERATED ALWAYS AS (name || name) VIRTUAL, kept INT AS (length(name)) STORED,
    CHECK (length(name) < 100));
INSERT INTO counted (id, name) VALUES (5, 'five'), (900, 'gone');
DELETE FROM counted WHERE id = 900;

CREATE TABLE loose (value);
INSERT INTO loose VALUES (NULL), (0), (-0.0), (1.0), (1), ('1'), (x'31'), (9e999), (-9e999), (1e-310),
    (123456789012345680.0), (9007199254740993), (''), (x''), ('a' || char(0) || 'b'),
    (CAST(x'c3286162' AS TEXT)), (CAST(x'eda080' AS TEXT)), (char(0x10ffff)), (char(0xfffe)), (char(8)),
    (char(10) || char(13)), ('{"a": [1, 2.50]}'), ('[1,'), ('  true ');
DELETE FROM loose WHERE rowid IN (2, 5);

CREATE TABLE typed (id INT PRIMARY KEY, t TEXT NOT NULL, r REAL, b BLOB, a ANY) STRICT;
INSERT INTO typed VALUES (1, 'x', 5, x'01', 5), (2, '5', 5.5, NULL, '5'), (3, '', NULL, x'', 5.0);

CREATE TABLE days (day DATE, at DATETIME, price DECIMAL(10,2), yes BOOLEAN, tags JSON, n NUMERIC,
    long_text VARCHAR(20));
INSERT INTO days VALUES ('2024-02-29', '2024-02-29 23:59:60', '12.50', 1, '{"a":[1,null,1e2]}', '0012', 12);
INSERT INTO days VALUES (20240229, 1709164800.5, 12.505, 'true', 'no json', 'n', NULL);
INSERT INTO days VALUES (NULL, NULL, NULL, 2, '[]', 1e300, 'x');

CREATE TABLE oid (rowid TEXT, _rowid_ TEXT, value INT);
INSERT INTO oid VALUES ('r', 's', 1);
CREATE TABLE ROWIDS (rowid TEXT, _rowid_ TEXT, oid INT);
INSERT INTO ROWIDS VALUES ('r', 's', 1);
CREATE TABLE empty (a, b);
CREATE VIEW known AS SELECT url, title FROM moz_places WHERE title IS NOT NULL;
