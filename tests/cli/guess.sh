#!/usr/bin/env bash
# A table is made as all records together tell, wherever in the input they tell it. From a file the types
# are guessed by its first records; standard input is read whole before anything is made.
source "$(dirname "$0")/Check.sh"

# tells FILE OPTION...: the same from a file as from standard input: table, definition, rows, and what is said.
tells() {
    local file=$1 name input
    shift
    for name in guessed whole; do
        rm -f $name.db
        input=$file
        if [[ $name == whole ]]; then
            input=-
        fi
        "$VORNJSONDB" insert $name.db t $input "$@" <"$file" 2>said >/dev/null
        {
            echo $?
            sed "s/$file/F/; s/standard input/F/" said
            [[ ! -e $name.db ]] || sqlite3 $name.db .dump
        } >$name.all
    done
    same "what $file tells with $*" "$(diff guessed.all whole.all | head -n 6)" ''
}

# The first thousand are looked at; all together are longer than what is read at once.
long=$(printf 'x%.0s' {1..48})
lines=$(seq 1500 | sed "s/.*/{\"id\": &, \"a\": &, \"t\": \"$long\"}/")
# at LINE RECORD: these lines with another one.
at() {
    sed "$1s/.*/$2/" <<<"$lines"
}
names=0
for line in 500 1000 1001 1250 1500; do
    while read -r record; do
        names=$((names + 1))
        at $line "$record" >"lines$names"
        tells lines$names --key id
    done <<'END'
{"id": 1, "a": 1, "t": "x"}
{"id": 7001, "a": 1, "t": "x"}
{"id": 7001, "a": 1.5, "t": "x"}
{"id": 7001, "a": 9007199254740993, "t": "x"}
{"id": 7001, "a": 18446744073709551616, "t": "x"}
{"id": 7001, "a": "x", "t": "x"}
{"id": 7001, "a": true, "t": "x"}
{"id": 7001, "a": null, "t": "x"}
{"id": 7001, "a": [1], "t": {"$base64": true, "encoded": "AP8="}}
{"id": 7001, "t": 5}
{"id": 7001, "new": null}
{"id": 7001, "new": 5, "a": 1}
{"a": 1, "t": "x"}
{"id": 7001, "a": 1, "a": 2}
{"id": 7001,
[1]
END
done
same 'so many were tried' "$names" 80

# What the guessed types can hold, and all records together would not have told.
lines=$(seq 1500 | sed "s/.*/{\"id\": &, \"o\": {\"x\": \"$long\"}, \"d\": &.5}/")
for record in '{"id": 7001, "o": {"$base64": true, "encoded": "AP8="}}' '{"id": 7001, "d": 9007199254740992}' \
    '{"id": 7001, "d": 9007199254740993}' '{"id": 7001, "d": 18446744073709551616}' '{"id": 7001, "o": []}'; do
    names=$((names + 1))
    at 1250 "$record" >"lines$names"
    tells lines$names --key id
done

# Cells are texts unless all of them are numbers.
cells=$(seq 1500 | sed "s/.*/&,&,$long,,&.5/")
for line in 999 1002 1499; do
    for cells_there in 7001,007,y,,1 7001,A7,y,,1 7001,1.5,5,,1 7001,1,y,5,1 7001,1,y,x,1 '7001,"",y,,1' 7001,1,y,,x 7001,1,y; do
        names=$((names + 1))
        {
            echo id,a,t,n,r
            sed "${line}s/.*/$cells_there/" <<<"$cells"
        } >"cells$names"
        tells cells$names --key id
        tells cells$names --key id --type a=string --default r=1 --replace
    done
done

# Lists, in an object or not, behind a mark or not.
for file in lines3 lines28 lines81 lines84; do
    for around in '[ ]' '\xEF\xBB\xBF[ ]' '{"all":[ ]}'; do
        {
            printf "${around% *}"
            sed '$!s/$/,/' $file
            echo "${around#* }"
        } >list.json
        tells list.json --key id
    done
done

# Several files, in one format or in two.
at 1 '{"id": 7001, "a": 1, "z": 1}' >one
at 1 '{"id": 7002, "a": 1.5}' | sed 's/"id": /&1/' >two
sed 1d cells95 | sed 's/^/2/' | sed '1i id,a,t,n,r' >three
for files in 'one two' 'two one' 'one three' 'one cells95'; do
    for name in guessed whole; do
        rm -f $name.db
    done
    "$VORNJSONDB" insert guessed.db t $files --quiet 2>/dev/null
    "$VORNJSONDB" insert whole.db t $files --quiet --batch 0 2>/dev/null
    same "what $files tell" "$(sqlite3 guessed.db .dump | cksum)" "$(sqlite3 whole.db .dump | cksum)"
done
finish
