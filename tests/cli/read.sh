#!/usr/bin/env bash
# list, get and count in all formats.
source "$(dirname "$0")/Check.sh"
make_shop

expect 0 '[{"id":-3,"name":"漢字","price":0.5},
 {"id":1,"name":"tea, \"green\"","price":5.0,"tags":["a","b"],"on":true},
 {"id":2,"name":"","price":0.1}]' '' -- list shop.db product
expect 0 '[]' '' -- list shop.db product id=77
expect 0 'id,name,price,tags,on
-3,漢字,0.5,,
1,"tea, ""green""",5.0,"[""a"",""b""]",true
2,"",0.1,,' '' -- list shop.db product --format csv
expect 0 $'2\t""\t0.1\t\t' '' -- list shop.db product id=2 --format tsv --no-headers
expect 0 '{"name":"tea, \"green\"","id":1}' '' -- \
    list shop.db product on=true --members name,id --format jsonl
expect 0 '{"id":1,"name":"tea, \"green\"","price":5.0,"tags":["a","b"],"on":true}
{"id":-3,"name":"漢字","price":0.5,"tags":null,"on":null}' '' -- \
    list shop.db product --format jsonl --nulls keep --sort -price --limit 2
expect 0 '[{"id":1}]' '' -- list shop.db product --sort id --offset 1 --limit 1 --members id
expect 0 'id  name          price  tags       on
--  ------------  -----  ---------  ----
-3  漢字            0.5
 1  tea, "green"    5.0  ["a","b"]  true
 2                  0.1' '' -- list shop.db product --format table
expect 3 'on' \
    'error: standard output: one column with NULL cannot be written in this format; take --format jsonl, or more members' \
    -- list shop.db product --members on --format csv

expect 0 '{"id":-3,"name":"漢字","price":0.5}' '' -- get shop.db product -3
expect 5 '' 'error: shop.db: table "product" has no record with the key "9"' -- \
    get shop.db product 9

expect 0 3 '' -- count shop.db product
expect 0 2 '' -- count shop.db product --where '{"id": {"$gte": 1}}'

# Bytes go out and come in as they are, into a new table and into one that is there.
sqlite3 bytes.db "CREATE TABLE t (id INTEGER PRIMARY KEY, b); INSERT INTO t VALUES (1, x'00ff'), (2, x''), (3, 'x'), (4, 5)"
"$VORNJSONDB" list bytes.db t --format jsonl >bytes.jsonl
same 'bytes in JSON' "$(head -n 2 bytes.jsonl)" '{"id":1,"b":{"$base64":true,"encoded":"AP8="}}
{"id":2,"b":{"$base64":true,"encoded":""}}'
head -n 2 bytes.jsonl >only.jsonl
expect 0 '' '2 inserted, 0 replaced, 0 skipped, 0 failed (only.jsonl: JSON Lines)' -- insert only.db t only.jsonl
expect 0 '' '0 inserted, 4 replaced, 0 skipped, 0 failed (bytes.jsonl: JSON Lines)' -- \
    insert bytes.db t bytes.jsonl --upsert
values='SELECT id, quote(b) FROM t'
same 'bytes come back' "$(sqlite3 bytes.db "$values"; sqlite3 only.db "$values")" "1|X'00FF'
2|X''
3|'x'
4|5
1|X'00FF'
2|X''"
echo '{"id": 5, "b": {"$base64": true, "encoded": "A"}}' >odd.json
expect 3 '' 'error: odd.json:1: cannot load record 1 into table "t": member "b": its "encoded" is no base64; correct the record where it comes from (nothing is stored)' \
    -- insert bytes.db t odd.json
echo '{"id": 5, "b": {"$base64": true, "encoded": "AA==", "x": 1}}' >odd.json
"$VORNJSONDB" insert bytes.db t odd.json 2>err
same 'exit of bytes with something beside them' $? 3
sqlite3 bytes.db "CREATE VIRTUAL TABLE words USING fts5(title, body); INSERT INTO words VALUES ('a', 'b')"
expect 0 '[{"title":"a","body":"b"}]' '' -- list bytes.db words

# SQLite's own table of tables is read by either name, and never written to.
tables=$(printf '[{"type":"table","name":"t"},\n {"type":"table","name":"u"}]')
sqlite3 own.db 'CREATE TABLE t (a); CREATE TABLE u (a); CREATE INDEX i ON u (a)'
for name in sqlite_schema sqlite_master SQLite_Schema; do
    expect 0 "$tables" '' -- list own.db $name type=table --sort name --members type,name
    expect 0 3 '' -- count own.db $name
    for words in 'update 1 name=x' 'delete --all --yes' 'upsert name=x' 'index name' sync; do
        read -r subcommand rest <<<"$words"
        # shellcheck disable=SC2086  # several words
        expect 2 '' "error: table \"$name\" is SQLite's own and can only be read; tables are changed by init, sync and index" \
            -- "$subcommand" own.db $name $rest
    done
    expect 2 '' "error: table \"$name\" is SQLite's own and can only be read; tables are changed by init, sync and index" \
        -- insert own.db $name only.jsonl
done

# In columns that are not text a word is JSON where all of it is, and else a text.
sqlite3 any.db "CREATE TABLE ev (id INTEGER PRIMARY KEY, day DATE, at DATETIME, ver, ip NUMERIC);
    INSERT INTO ev VALUES (1, '2026-01-01', '12:00', '1.2.3', '192.168.0.1'), (2, 20260101, 5.5, '1.2', 1e3),
        (3, '007', '-', '1.', '1e')"
for word in day=2026-01-01 at=12:00 ver=1.2.3 ip=192.168.0.1; do
    expect 0 1 '' -- count any.db ev $word
done
for word in day=20260101 at=5.5 ip=1e3 ip=1000 ip=1.0E+3; do
    expect 0 '[{"id":2}]' '' -- list any.db ev $word --members id
done
for word in day=007 at=- ver=1. ip=1e; do
    expect 0 '[{"id":3}]' '' -- list any.db ev $word --members id
done
expect 0 '' 'updated 1 record' -- update any.db ev 1 day=2026-02-02 ver=10.0.0.1
expect 0 '{"id":1,"day":"2026-02-02","at":"12:00","ver":"10.0.0.1","ip":"192.168.0.1"}' '' -- get any.db ev 1
expect 2 '' 'error: ver: Line 1, Column 3: Missing '"','"' or '"']'"' in array declaration; it must be JSON' -- \
    count any.db ev 'ver=[1'
finish
