#!/usr/bin/env bash
# tables, schema, index, lint, sync, doctor, dump and load.
source "$(dirname "$0")/Check.sh"
make_shop

expect 0 'table    records
-------  -------
product        3' '' -- tables shop.db --counts
expect 0 '[{"table":"product"}]' '' -- tables shop.db --json
expect 0 'CREATE TABLE "product" ("id" INTEGER PRIMARY KEY, "name" TEXT NOT NULL, "price" REAL DEFAULT 0.5, "tags" TEXT, "on" INTEGER);' \
    '' -- schema shop.db product
expect 0 '' 'CREATE INDEX "product_name" ON "product" ("name" COLLATE BINARY)' -- \
    index shop.db product name
expect 0 '' 'there already: CREATE INDEX "product_name" ON "product" ("name" COLLATE BINARY)' -- \
    index shop.db product name
expect 0 '[{"index":"product_name","unique":false,"members":["name"]}]' '' -- \
    index shop.db product --json
expect 0 'index         unique  members
------------  ------  -------
product_name  false   name' '' -- index shop.db product
expect 0 'product_name  false  name' '' -- index shop.db product --no-headers
sqlite3 comma.db 'CREATE TABLE t ("a,b", c); CREATE UNIQUE INDEX i ON t ("a,b", c); CREATE INDEX j ON t (c + 1)'
expect 0 '[{"index":"i","unique":true,"members":["a,b","c"]},
 {"index":"j","unique":false,"members":["(expression)"]}]' '' -- index comma.db t --json
expect 0 'i,true,"a,b, c"
j,false,(expression)' '' -- index comma.db t --format csv --no-headers
expect 0 '{"create":"CREATE TABLE IF NOT EXISTS \"u\" (\"a\" INTEGER)","definition":{"u":{"member":{"a":{"cpptype":"int"}}}}}' \
    '' -- init comma.db u a:int --dry-run --json
expect 0 'SELECT "product"."id" FROM "product" WHERE "product"."price" IS ?
  SCAN product
warning: all records are looked at, which an index spares on "price"; create one by vornjsondb index, where the table is or gets large' \
    '' -- explain shop.db product price=5 --members id
expect 0 '' 'no findings' -- lint shop.db
echo '{"product": {"key": "id", "member": {"id": {"cpptype": "int"}, "size": {"cpptype": "int"}, "name": {"cpptype": "string", "unique": true}}}}' >grown.def
"$VORNJSONDB" lint shop.db product --def grown.def --format tsv >found 2>&1
same 'lint names subcommands' "$(cut -f 2,3,6 found | grep -v extra-column)" 'severity	code	remedy
error	missing-column	vornjsondb sync adds it
warning	missing-unique	vornjsondb sync adds a unique index'
without='no column named size; vornjsondb sync adds the column (nothing is stored)'
expect 2 '' 'error: shop.db: cannot read records of table "product": no such column: product.size; vornjsondb sync adds the column' \
    -- list shop.db product --def grown.def
echo '{"id": 9, "size": 1, "name": "x"}' >one.json
expect 3 '' "error: one.json:1: cannot load record 1 into table \"product\": table product has $without" \
    -- insert shop.db product one.json --def grown.def
expect 0 '' 'nothing to do' -- sync shop.db product
expect 0 'check         result
------------  ------
integrity     ok
foreign keys  ok
journal mode  delete
encoding      UTF-8
pages         5
free pages    0' '' -- doctor shop.db

# A key of a form that cannot be checked is what doctor finds.
sqlite3 keys.db 'CREATE TABLE p (a); CREATE TABLE c (x REFERENCES p (a)); INSERT INTO c VALUES (1)'
expect 3 'check         result
------------  ------------------------------------------
integrity     ok
foreign keys  foreign key mismatch - "c" referencing "p"
journal mode  delete
encoding      UTF-8
pages         3
free pages    0' '' -- doctor keys.db

# Every value comes back with its type and bits.
sqlite3 shop.db "CREATE TABLE odd (a, b);
    INSERT INTO odd VALUES (1, 1.0), (-0.0, 5e-324), (9e999, -9e999), (x'00ff', ''), (NULL, 0.1),
        (-9223372036854775808, 1.7976931348623157e308), ('a' || char(0) || 'b', cast(x'ff41' AS TEXT));
    DELETE FROM odd WHERE rowid = 5;"
for table in product odd; do
    "$VORNJSONDB" dump shop.db $table >dump
    expect 0 '' "loaded $([[ $table == odd ]] && echo 6 || echo 3) rows into table \"$table\"" -- load other.db dump
    "$VORNJSONDB" dump other.db $table >again
    same "dump of $table" "$(cmp dump again 2>&1)" ''
done
all="SELECT rowid, typeof(a), hex(a), quote(a), typeof(b), hex(b), b FROM odd"
same 'odd values' "$(sqlite3 other.db "$all")" "$(sqlite3 shop.db "$all")"
same 'indexes' "$(sqlite3 other.db .schema\ product)" "$(sqlite3 shop.db .schema\ product)"

# What is in UTF-16 comes back in UTF-8.
sqlite3 wide.db "PRAGMA encoding = 'UTF-16'; CREATE TABLE odd (a, b);
    INSERT INTO odd VALUES ('漢😀', x'00ff'), ('a' || char(0) || 'b', 1.5)"
"$VORNJSONDB" dump wide.db odd >dump.wide
expect 0 '' 'loaded 2 rows into table "odd"' -- load narrow.db dump.wide
same 'values in UTF-8' "$(sqlite3 narrow.db 'SELECT typeof(a), hex(a), typeof(b), hex(b) FROM odd')" \
    $'text|E6BCA2F09F9880|blob|00FF\ntext|610062|real|312E35'
expect 0 'table
-----
odd' '' -- tables wide.db
expect 0 'CREATE TABLE odd (a, b);' '' -- schema wide.db odd
expect 5 '' 'error: wide.db: there is no table "od"; did you mean "odd"?' -- schema wide.db od
# All that works on records says how to get there.
other='error: wide.db: its texts are in UTF-16le, not in UTF-8; copy its tables by vornjsondb dump wide.db TABLE | vornjsondb load COPY'
for words in 'schema --json' list count 'update 1 a=1' 'delete --all --yes' 'upsert a=1' index explain lint sync; do
    read -r subcommand rest <<<"$words"
    # shellcheck disable=SC2086  # several words
    expect 3 '' "$other" -- "$subcommand" wide.db odd $rest
done
expect 3 '' "$other" -- init wide.db new a:int
echo '{"a": 1}' >wide.json
expect 3 '' "$other (nothing is stored)" -- insert wide.db odd wide.json
expect 3 '' "$other" -- insert wide.db odd wide.json --dry-run

"$VORNJSONDB" init shop.db single a:int --quiet && "$VORNJSONDB" insert shop.db single - --quiet <<<'{"a": 1}'
"$VORNJSONDB" dump shop.db single >single.dump
expect 0 '' 'loaded 1 row into table "single"' -- load other.db single.dump
sqlite3 shop.db ANALYZE
expect 5 '' 'error: shop.db: there is no table "sqlite_stat1" that can be dumped; see vornjsondb tables' -- \
    dump shop.db sqlite_stat1
head -n 2 dump >cut
expect 3 '' 'error: cut:3: the end is missing; dump the table again' -- load third.db cut
same 'no file is left' "$(ls third.db 2>/dev/null)" ''
sed 's/,1\.0\]/,2.0]/' dump >changed
expect 3 '' 'error: changed:8: count or checksum differ from what is above; dump the table again' -- \
    load fourth.db changed
sed '1s/CREATE TABLE odd (a, b)/CREATE TABLE odd (b, a)/' dump >turned
expect 3 '' 'error: turned:8: count or checksum differ from what is above; dump the table again' -- load third.db turned
sed '1s/{/{"definition":5,/' dump >defined
expect 3 '' 'error: defined:1: the definition is no object; dump the table again' -- load fifth.db defined
# Rows that no dump has.
row() {
    printf '%s\n%b\n' "$(head -n 1 dump)" "$2" >rows
    expect 3 '' "error: rows:2: $1; dump the table again" -- load third.db rows
}
for values in 5 '[1]' '[1,2,3,4]' '[]'; do
    row 'a row has not 3 values' "$values"
done
for value in true '[1]' 18446744073709551616; do
    row 'a value is of a kind that no dump has' "[1,2,$value]"
done
for value in '{}' '{"$real":"nan"}' '{"$base64":true}' '{"$base64":true,"encoded":"!"}' '{"encoded":"AA=="}' \
    '{"$text":{},"encoded":"AA=="}' '{"$x":true,"encoded":"AA=="}' '{"$text":true,"encoded":null}'; do
    row 'a value has an unknown form' "[1,2,$value]"
done
row 'a row has bytes that no dump has' '[1,2,"\0377"]'
row 'a row has bytes that no dump has' '[1,2,"a\tb"]'
row 'a number is greater than any double' '[1,2,1e999]'
row 'a text has no end quote' '[1,2,"'
row 'something follows the value' '[1,2,3] x'
sed '1s/"table":"odd"/"table":"even"/' dump >even
expect 3 '' 'error: third.db: no such table: even; dump the table again, or load it where SQLite knows all of this' -- \
    load third.db even
same 'no file of them is left' "$(ls third.db 2>/dev/null)" ''

# Names that an index has, and those that are no text, which no definition could keep.
sqlite3 names.db 'CREATE TABLE a (x); CREATE INDEX taken ON a (x)'
taken='names.db: an index of table "a" has the name "Taken"; give the new table another name, or drop the index first'
expect 4 '' "error: $taken" -- init names.db Taken x:int
echo '{"x": 1}' >x.json
expect 4 '' "error: $taken (nothing is stored)" -- insert names.db Taken x.json
"$VORNJSONDB" init has.db taken x:int --quiet && "$VORNJSONDB" dump has.db taken >taken.dump
expect 4 '' "error: ${taken//Taken/taken}" -- load names.db taken.dump
sqlite3 has.db 'DROP TABLE taken; CREATE TABLE b (x); CREATE INDEX taken ON b (x)'
"$VORNJSONDB" dump has.db b >b.dump
expect 4 '' 'error: names.db: index taken already exists; drop or rename what is there, or take another database' -- \
    load names.db b.dump
expect 2 '' 'error: "\xff": the name is no UTF-8; take another' -- init names.db $'\xff' x:int
expect 2 '' 'error: "\xff": the name is no UTF-8; take another' -- init names.db b $'\xff:int'
printf '{"b": {"member": {"\xff": {"cpptype": "int"}}}}' >ff.def
expect 3 '' 'error: ff.def: byte 0xFF is no UTF-8; convert the input with iconv' -- init names.db b --def ff.def
sqlite3 names.db $'CREATE TABLE "\xff" (x)'
expect 3 '' 'error: names.db: what creates table "\xff" is no UTF-8, which a dump cannot hold; rename what is in it' -- \
    dump names.db $'\xff'
sqlite3 names.db 'CREATE VIEW v AS SELECT x FROM a'
expect 2 '' 'error: names.db: cannot create an index on table "v": views may not be indexed; create the index on the table that it reads' \
    -- index names.db v x
expect 2 '' 'error: names.db: cannot update records of table "v": cannot modify v because it is a view; change the table that it reads, or give the view INSTEAD OF triggers' \
    -- update names.db v --where '{"x": 1}' x=2

cat single.dump dump >both
expect 3 '' 'error: both:4: something follows the dump of a table; load each dump by itself' -- load third.db both
sed '1s/"columns":\[/&{},/' dump >named
expect 3 '' 'error: named:1: a column has no name; dump the table again' -- load fifth.db named
sed '1s/{/{"sequence":"x",/' dump >counted
expect 3 '' 'error: counted:1: the counter is no number; dump the table again' -- load fifth.db counted

# What cannot be done is an error of sync's, too.
sqlite3 bare.db 'CREATE TABLE bare (a TEXT)'
echo '{"bare": {"key": "id", "member": {"id": {"cpptype": "int"}, "b": {"cpptype": "string"}}}}' >bare.def
"$VORNJSONDB" sync bare.db bare --def bare.def --dry-run >found
same 'the exit where a key is missing' $? 3
same 'what can be done' "$(head -n 1 found)" 'ALTER TABLE "bare" ADD COLUMN "b" TEXT;'
"$VORNJSONDB" sync bare.db bare --def bare.def --dry-run --json >found
same 'the same in JSON' $? 3

# A sync that leaves warnings only says that it had nothing to do.
sqlite3 warned.db 'CREATE TABLE t (id INTEGER PRIMARY KEY, a TEXT)'
echo '{"t": {"key": "id", "member": {"id": {"cpptype": "int"}, "a": {"cpptype": "int"}}}}' >warned.def
"$VORNJSONDB" sync warned.db t --def warned.def >out 2>err
same 'sync with warnings' "$(cut -d : -f 1 out) $(cat err)" 'warning nothing to do'

# A process stands in one row, whatever it holds.
cat >wal.py <<'END'
import sqlite3, subprocess, sys
database = sqlite3.connect('warned.db', isolation_level=None)
database.executescript("PRAGMA journal_mode = wal; BEGIN IMMEDIATE; INSERT INTO t VALUES (1, 'x');")
database.execute('SELECT * FROM t').fetchone()
print(subprocess.run([sys.argv[1], 'doctor', 'link.db'], capture_output=True, text=True).stdout)
END
ln -s warned.db link.db
python3 wal.py "$VORNJSONDB" | grep process | sed 's/[0-9][0-9]*/N/' >out
same 'processes' "$(wc -l <out)" 1
same 'what it does' "$(sed 's/.*) //' out | tr -d , | tr ' ' '\n' | sort | xargs)" 'reads writes'

# As many columns as SQLite has.
columns=$(seq -s , -f 'c%.0f' 2000)
sqlite3 widest.db "CREATE TABLE w ($columns); INSERT INTO w (c1, c2000) VALUES (1, 'x'), (2, 'y')"
"$VORNJSONDB" dump widest.db w >w.dump
expect 0 '' 'loaded 2 rows into table "w"' -- load copy.db w.dump
same 'the widest table' "$(sqlite3 copy.db 'SELECT c1, c2, c2000 FROM w')" $'1||x\n2||y'
finish
