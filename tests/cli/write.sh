#!/usr/bin/env bash
# init, upsert, update, delete.
source "$(dirname "$0")/Check.sh"
make_shop

expect 4 '' 'error: shop.db: there is a table "product" already; extend it with vornjsondb sync' -- \
    init shop.db product id:int
expect 2 '' 'error: --key: there is no member "idd"; did you mean "id"?' -- init shop.db b id:int --key idd
expect 2 '' 'error: --key: there is no member "x"; name one of the new table'\''s' -- init shop.db b id:int --key x
expect 2 '' 'error: the member "id" is there twice; name it once' -- init shop.db b id:int id:string
expect 2 '' 'error: --default: "id" is not of the form member=value' -- init shop.db b id:int --default id
expect 2 '' 'error: --default "x": Line 1, Column 1: Syntax error: value, object or array expected.; it must be JSON' \
    -- init shop.db b id:int --default id=x
expect 0 '' 'updated 1 record' -- upsert shop.db product id=2 name=cup
expect 0 '{"id":2,"name":"cup","price":0.1}' '' -- get shop.db product 2
expect 3 '' 'error: shop.db: cannot save a record in table "product": NOT NULL constraint failed: product.name; vornjsondb schema shows what the table demands' \
    -- upsert shop.db product id=7

# Keys that SQLite does not keep apart, and other members that are unique.
sqlite3 shop.db 'CREATE TABLE heap (id INTEGER, code TEXT UNIQUE); INSERT INTO heap VALUES (1, 5)'
echo '[{"id": 2, "code": "5"}]' >heap.json
for mode in --skip --replace; do
    expect 3 '' 'error: shop.db: the table can hold several rows with one key; make it so by vornjsondb index shop.db heap id --unique (nothing is stored)' \
        -- insert shop.db heap heap.json --key id $mode
done
expect 4 '' 'shop.db: the table can hold several rows with one key; make it so by vornjsondb index shop.db heap id --unique, which spares looking at all records for each
error: heap.json:1: cannot load record 1 into table "heap": UNIQUE constraint failed: heap.code (code = "5"); correct it, or leave it out by --errors FILE (nothing is stored)' \
    -- insert shop.db heap heap.json --key id --upsert
"$VORNJSONDB" index shop.db heap id --unique --quiet
for mode in --skip --upsert; do
    expect 4 '' 'error: heap.json:1: cannot load record 1 into table "heap": UNIQUE constraint failed: heap.code (code = "5"); correct it, or leave it out by --errors FILE (nothing is stored)' \
        -- insert shop.db heap heap.json --key id $mode
done

# Bytes go in by insert alone; elsewhere they would become a text.
sqlite3 shop.db "CREATE TABLE file (id INTEGER PRIMARY KEY, bytes BLOB, note TEXT); INSERT INTO file VALUES (1, x'00ff', NULL)"
bytes='{"$base64":true,"encoded":"AQI="}'
said='error: member "bytes": bytes are written by insert alone; give it the record on standard input, with --upsert'
expect 2 '' "$said" -- update shop.db file 1 "bytes=$bytes"
expect 2 '' "$said" -- upsert shop.db file "{\"id\": 1, \"bytes\": $bytes}"
expect 0 '' 'updated 1 record' -- update shop.db file 1 "note=$bytes"
echo "{\"id\": 1, \"bytes\": $bytes}" >file.json
expect 0 '' '0 inserted, 1 replaced, 0 skipped, 0 failed (file.json: JSON)' -- insert shop.db file file.json --upsert
same 'the bytes' "$(sqlite3 shop.db 'SELECT hex(bytes), note FROM file')" "0102|$bytes"

# The key of one call is not that of the definition, which a null or a new member is noted in.
echo '{"id": 1, "code": "a", "n": 5}' >key.json
expect 0 '' '' -- insert key.db t key.json --key id --quiet
expect 0 '' '' -- index key.db t code --unique --quiet
echo '{"code": "a", "n": null, "m": 1}' >key.json
expect 0 '' '0 inserted, 1 replaced, 0 skipped, 0 failed (key.json: JSON)' -- \
    insert key.db t key.json --key code --upsert --add-members
expect 0 '{"id":1,"m":1,"n":null}' '' -- get key.db t 1 --members id,m,n

# What a table ignores is told, and left out when that is asked for; what the triggers of a view do is counted.
sqlite3 own.db "CREATE TABLE t (id INTEGER PRIMARY KEY, a TEXT UNIQUE ON CONFLICT IGNORE);
    CREATE TRIGGER no BEFORE INSERT ON t WHEN new.a = 'no' BEGIN SELECT RAISE(IGNORE); END;
    CREATE VIEW v AS SELECT id, a FROM t;
    CREATE TRIGGER i INSTEAD OF INSERT ON v BEGIN INSERT INTO t VALUES (new.id, new.a); END;
    CREATE TRIGGER u INSTEAD OF UPDATE ON v BEGIN UPDATE t SET a = new.a WHERE id = old.id; END;
    CREATE TRIGGER d INSTEAD OF DELETE ON v BEGIN DELETE FROM t WHERE id = old.id; END"
printf '{"id": %d, "a": "%s"}\n' 1 x 2 no 3 x 4 y >own.json
ignored='nothing was stored: a trigger or an ON CONFLICT clause of the table has ignored the record'
expect 3 '' "error: own.json:2: cannot load record 2 into table \"t\": $ignored; vornjsondb schema shows what the table demands (nothing is stored)" \
    -- insert own.db t own.json
expect 0 '' '2 inserted, 0 replaced, 2 skipped, 0 failed (own.json: JSON Lines)' -- insert own.db t own.json --skip
expect 3 '' "error: own.db: cannot save a record in table \"t\": $ignored; vornjsondb schema shows what the table demands" \
    -- upsert own.db t id=5 a=no
expect 0 2 '' -- count own.db t
sqlite3 own.db "CREATE TRIGGER keep BEFORE DELETE ON t WHEN old.id = 1 BEGIN SELECT RAISE(IGNORE); END"
clause='by a trigger or an ON CONFLICT clause; nothing was changed; vornjsondb schema shows them'
expect 3 '' "error: own.db: table \"t\" ignores the change of the record with the key \"1\", $clause" -- \
    delete own.db t 4 1
expect 3 '' "error: own.db: table \"t\" ignores the change of the record with the key \"4\", $clause" -- \
    update own.db t 4 a=x
expect 0 '' 'updated 0 records' -- update own.db t --where '{"id": 4}' a=x
sqlite3 own.db 'DROP TRIGGER keep'
expect 0 2 '' -- count own.db t
echo '{"id": 6, "a": "z"}' >own.json
expect 0 '' '1 inserted, 0 replaced, 0 skipped, 0 failed (own.json: JSON)' -- insert own.db v own.json
expect 0 '' 'updated 2 records' -- update own.db v --where '{"id": {"$gt": 1}}' a:=null
expect 0 '' 'deleted 1 record' -- delete own.db v --where '{"id": 1}'
expect 0 '' 'deleted 2 records' -- delete own.db v --all --yes
expect 0 0 '' -- count own.db t

# A table that removes records to make room for others says so by its counts.
sqlite3 room.db "CREATE TABLE t (id INTEGER PRIMARY KEY, a TEXT UNIQUE ON CONFLICT
    REPLACE, b TEXT); INSERT INTO t VALUES (1, 'x', 'REPLACE'), (2, 'y', ''), (3, 'z', '')"
gone='by the table'\''s own ON CONFLICT REPLACE'
printf '{"id": %d, "a": "%s"}\n' 11 x 12 y 13 new 14 new >room.json
expect 0 '' "4 inserted, 0 replaced, 0 skipped, 0 failed (room.json: JSON Lines); 3 other records are gone, $gone" -- \
    insert room.db t room.json --batch 1
expect 0 '' "updated 1 record; 1 other record is gone, $gone" -- update room.db t 3 a=x
expect 0 '{"gone":1,"updated":1}' '' -- update room.db t --where '{"id": 3}' a=y --json
expect 0 '' "inserted 1 record; 1 other record is gone, $gone" -- upsert room.db t id=4 a=y
expect 0 '' 'updated 1 record' -- upsert room.db t id=4 a=z
expect 0 '[{"id":4},
 {"id":14}]' '' -- list room.db t --members id --sort id
printf '[{"id": 15, "a": "z"}, {"id": 4, "a": "new"}]' >room.json
expect 0 '{"failed":0,"gone":2,"inserted":2,"replaced":0,"skipped":0}' '' -- insert room.db t room.json --json

# A key that is given twice is one record, and a default that does not fit is no default.
expect 0 '' 'updated 2 records' -- update shop.db product 1 2 1 price=1
expect 0 '' 'inserted 1 record' -- upsert shop.db product id=70 name=x
expect 0 '' 'deleted 1 record' -- delete shop.db product 70 70
expect 3 '' 'error: default of table "b": member "id" cannot be 1.5: expected is a whole number from -2147483648 to 2147483647; give one that the type can hold' \
    -- init shop.db b id:int --default id=1.5
expect 3 '' 'error: default of table "b": member "id" cannot be 1.5: expected is a whole number from -9223372036854775808 to 9223372036854775807; give one that the type can hold (nothing is stored)' \
    -- insert shop.db b heap.json --default id=1.5

expect 0 '{"updated":2}' '' -- update shop.db product 1 2 price=9.75 --json
expect 5 '' 'error: shop.db: table "product" has no record with the key "99"; nothing was changed' \
    -- update shop.db product 1 99 price=1
expect 0 2 '' -- count shop.db product price=9.75
expect 0 '' 'updated 1 record' -- update shop.db product --where '{"id": 2}' price:=null
expect 0 '{"id":2,"name":"cup"}' '' -- get shop.db product 2
expect 2 '' 'error: update takes keys or --where; give one of them' -- \
    update shop.db product price=1

expect 2 '' 'error: delete --all removes every record; add --yes if that is meant' -- \
    delete shop.db product --all
expect 0 '' '' -- delete shop.db product 2 --quiet
expect 0 '' 'deleted 1 record' -- delete shop.db product --where '{"id": {"$lt": 0}}'
expect 0 '' 'deleted 1 record' -- delete shop.db product --all --yes
expect 0 0 '' -- count shop.db product

# What JSON has no values for comes back all the same.
sqlite3 exact.db "CREATE TABLE t (id INTEGER PRIMARY KEY, a TEXT, b, c REAL);
    INSERT INTO t VALUES (1, cast(x'ff41' AS TEXT), cast(x'ff42' AS TEXT), 9e999), (2, 'x', -9e999, -9e999),
        (3, 'y', x'ff', 0.5)"
expect 0 '{"id":1,"a":{"$text":true,"encoded":"/0E="},"b":{"$text":true,"encoded":"/0I="},"c":{"$real":"inf"}}
{"id":2,"a":"x","b":{"$real":"-inf"},"c":{"$real":"-inf"}}
{"id":3,"a":"y","b":{"$base64":true,"encoded":"/w=="},"c":0.5}' '' -- list exact.db t --format jsonl
values='SELECT id, typeof(a), hex(a), typeof(b), hex(b), c FROM t'
"$VORNJSONDB" list exact.db t --format jsonl | "$VORNJSONDB" insert new.db t - --key id 2>err
same 'into a new table' "$(sqlite3 new.db "$values")" "$(sqlite3 exact.db "$values")"
"$VORNJSONDB" list exact.db t --format json >exact.json
sqlite3 exact.db 'DELETE FROM t'
"$VORNJSONDB" insert exact.db t exact.json --quiet
same 'into the same table' "$(sqlite3 exact.db "$values")" "$(sqlite3 new.db "$values")"
"$VORNJSONDB" list exact.db t --members id,c --format csv >exact.csv
"$VORNJSONDB" insert exact.db t exact.csv --upsert --quiet
same 'by CSV' "$(sqlite3 exact.db 'SELECT c FROM t')" $'Inf\n-Inf\n0.5'
expect 0 '[{"id":1}]' '' -- list exact.db t c=1e999 --members id
expect 0 '[{"id":2}]' '' -- list exact.db t b=-1e999 --members id
expect 0 '[{"id":2}]' '' -- list exact.db t --where '{"c": {"$in": [-1e999, 7]}, "a": {"$ne": "1e999"}}' --members id
echo '{"id": 4, "a": {"$text":true,"encoded":"!"}}' >wrong.json
expect 3 '' 'error: wrong.json:1: cannot load record 1 into table "t": member "a": its "encoded" is no base64; correct the record where it comes from (nothing is stored)' \
    -- insert exact.db t wrong.json
expect 2 '' 'error: member "b": bytes are written by insert alone; give it the record on standard input, with --upsert' -- \
    update exact.db t 1 'b={"$text":true,"encoded":"/0E="}'
finish
