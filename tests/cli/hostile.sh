#!/usr/bin/env bash
# Input that is wrong, huge or odd: what is said of it, and that nothing is stored of it.
source "$(dirname "$0")/Check.sh"

# broken LINE REASON BYTES [OPTION...]: an insert of these bytes ends with the reason in that line.
broken() {
    local line=$1 reason=$2 bytes=$3
    shift 3
    [[ $reason == *'; '* ]] || reason+='; correct the input'
    printf '%b' "$bytes" >in
    expect 3 '' "error: in:$line: $reason (nothing is stored)" -- insert bad.db t in "$@"
    same "no database after: $bytes" "$(ls bad.db 2>/dev/null)" ''
}

# The same, where it is one record that is bad.
bad() {
    local reason=$2
    [[ $reason == *'; '* ]] || reason+='; correct it, or leave it out by --errors FILE'
    broken "$1" "$reason" "${@:3}"
}

# good OUTPUT BYTES [OPTION...]: these bytes come back as JSON Lines.
good() {
    local output=$1 bytes=$2
    shift 2
    rm -f good.db
    printf '%b' "$bytes" >in
    expect 0 '' '' -- insert good.db t in --quiet "$@"
    expect 0 "$output" '' -- list good.db t --format jsonl
}

# repeat TEXT COUNT
repeat() {
    head -c "$2" /dev/zero | sed "s/\x0/$1/g"
}

no_utf8='a text is no UTF-8; convert the input with iconv'
half='\u gives half of a surrogate pair'
no_value='no value can begin like this'
escape='a text has an escape that JSON has not, or a control character that must be escaped'

# Texts.
bad 1 "$no_utf8" '[{"a": "\0377"}]'
bad 1 "$no_utf8" '[{"a": "\0355\0240\0200"}]'
bad 1 "$no_utf8" '[{"a": "\0300\0257"}]'
bad 2 "$no_utf8" '[{"a": 1},\n{"\0360\0237": 1}]'
broken 1 "$half" '[{"a": "\\ud800"}]'
bad 1 "$half" '[{"a": "\\udc00"}]'
broken 1 "$half" '[{"a": ["\\udc00\\ud800"]}]'
broken 1 "$escape" '[{"a": "x\ny"}]'
broken 1 "$escape" '[{"a": "\\x"}]'
broken 1 '\u needs four hexadecimal digits' '[{"a": "\\u12"}]'
broken 1 'there is a NUL byte' '[{"a": "x\0000y"}]'
broken 1 'there is a NUL byte' '[{"a": 1}\0000]'
bad 1 'there is a NUL byte' '{"a": 1}\0000\n{"a": 2}\n'
good '{"a":"x\u0000y😀"}' '[{"a": "x\\u0000y\\ud83d\\ude00"}]'
good '{"a":1}' '\0357\0273\0277[{"a": 1}]'
bad 1 'the input is UTF-16; convert it with iconv -f UTF-16 -t UTF-8' '\0377\0376[\0000{\0000'
for encoding in UTF-16LE UTF-16BE UTF-32LE UTF-32BE; do
    for text in '[{"a": 1}]\n' '{"a": 1}\n{"a": 2}\n' 'a,b\n1,2\n'; do
        # shellcheck disable=SC2059
        printf "$text" | iconv -f UTF-8 -t $encoding >in
        expect 3 '' "error: in:1: the input is $encoding; convert it with iconv -f $encoding -t UTF-8 (nothing is stored)" \
            -- insert bad.db t in
    done
done
bad 1 'the input is UTF-32; convert it with iconv -f UTF-32 -t UTF-8' '\0377\0376\0000\0000[\0000\0000\0000'

# Numbers.
broken 1 'a number is greater than any double' '[{"a": 1e400}]'
broken 1 'a number is greater than any double' '[{"a": [-1e400]}]'
broken 1 'a comma or } is missing after a member' '[{"a": 01}]'
broken 1 'a number has no digit after the point' '[{"a": 1.}]'
broken 1 'a number has no digit in the exponent' '[{"a": 1e}]'
for number in .5 - +1 NaN Infinity; do
    broken 1 "$no_value" "[{\"a\": $number}]"
done
good '{"a":9223372036854775807}
{"a":-9223372036854775808}' '{"a": 9223372036854775807}\n{"a": -9223372036854775808}\n'
good '{"a":5e-324}
{"a":1.7976931348623157e+308}
{"a":0.0}
{"a":0.1}' '{"a": 5e-324}\n{"a": 1.7976931348623157e308}\n{"a": -0}\n{"a": 1.0e-1}\n'
good '{"a":[18446744073709551615,-9223372036854775808]}' '[{"a": [18446744073709551615, -9223372036854775808]}]'
for number in 18446744073709551616 -9223372036854775809; do
    bad 1 "in the member \"a\" the number $number has more than 64 bits; write it as a text" "[{\"a\": {\"x\": $number}}]"
done
bad 1 'the record is a list, not an object' '[[[18446744073709551616]]]'
printf '{"a": 18446744073709551616}\n{"a": 5}\n' >in
expect 0 '' 'member "a": numbers beyond 64 bits are kept as texts
member "a": values of several kinds
2 inserted, 0 replaced, 0 skipped, 0 failed (in: JSON Lines)' -- insert wide.db t in
expect 0 '{"a":"18446744073709551616"}
{"a":5}' '' -- list wide.db t --format jsonl

# Structure.
bad 1 'the member "a" is there twice' '[{"a": 1, "a": 2}]'
bad 2 'in an object of the member "a" the name "x" is there twice' '{"a": 1}\n{"a": [{"x": {"x": 1}, "\\u0078": 2}]}\n'
good '{"a":{"b":{"x":2},"c":[{"x":3},{"x":4}],"x":1}}' '{"a": {"x": 1, "b": {"x": 2}, "c": [{"x": 3}, {"x": 4}]}}'
broken 2 'the input ends inside of record 2' '[{"a": 1},\n{"a": 2'
broken 1 'the input ends inside of record 1' '[{"a": "xy'
broken 1 'the input ends inside of the list, after record 1' '[{"a": 1}'
broken 1 "$no_value" '[{"a": 1},]'
broken 1 'a comma or ] is missing after an element' '[{"a": 1} {"a": 2}]'
broken 1 "a colon is missing after a member's name" '[{"a" 1}]'
broken 1 "a member's name in quotes is missing" "[{'a': 1}]"
broken 2 'something follows the list' '[{"a": 1}]\n[{"a": 2}]'
bad 1 'the record is a number, not an object' '[1]'
bad 2 'the line ends inside of the record' '{"a": 1}\n{"a":\n{"a": 3}\n'
deep='lists and objects are nested more than 1000 levels deep'
broken 1 "$deep" "$(repeat '[' 100000)"
broken 1 "$deep" "$(repeat '{"a":' 100000)"
broken 1 "$deep" "[{\"a\": $(repeat '[' 100000)$(repeat ']' 100000)}]"
good "{\"a\":$(repeat '[' 999)$(repeat ']' 999)}" "{\"a\": $(repeat '[' 999)$(repeat ']' 999)}"
(
    printf '[{"a": "'
    head -c 17000000 /dev/zero | tr '\0' x
) >in
expect 3 '' 'error: in:1: record 1 is longer than 16777216 bytes; correct the input (nothing is stored)' -- insert bad.db t in
# Blanks between records are none of them.
(
    printf '{"a": 1}\n{'
    head -c 17000000 /dev/zero | tr '\0' ' '
    echo '"a": 2}'
) >in
expect 3 '' 'error: in:2: record 2 is longer than 16777216 bytes; correct the input (nothing is stored)' -- insert bad.db t in --format json
(
    printf '{"a": 1} {"a": 3}'
    head -c 17000000 /dev/zero | tr '\0' ' '
    echo '{"a": 2}'
    head -c 17000000 /dev/zero | tr '\0' '\n'
) >in
expect 0 '' '3 inserted, 0 replaced, 0 skipped, 0 failed (in: JSON)' -- insert good.db blanks in --format json
for text in '' '  \n ' '[]'; do
    printf '%b' "$text" >in
    "$VORNJSONDB" insert bad.db t in 2>err
    same "exit of an insert of nothing: $text" $? 3
    same "an insert of nothing: $text" "$(sed 's/: JSON\( Lines\)\?:/:/' err)" \
        'error: in: there are no records to make a table from (nothing is stored)'
done
printf '[{}]' >in
expect 3 '' 'error: in: JSON: no record has a member to make a table from (nothing is stored)' -- \
    insert bad.db t in

# CSV.
bad 3 'the row has 1 cell, but there are 2 columns' 'a,b\n1,2\n3\n'
bad 2 'the row has 2 cells, but there is 1 column' 'a\n1,2\n'
bad 3 'the row has 3 cells, but there are 2 columns' 'a,b\n1,2\n"x\ny",3,4\n'
broken 2 'the quotes that begin in this row never end' 'a,b\n1,"x\n'
quote='a quote stands inside of a cell that is not in quotes, or a cell goes on after its end quote;'
quote+=' double the quotes, or use --quote none'
bad 2 "$quote" 'a,b\n1,x"y\n'
bad 2 "$quote" 'a,b\n1,"x"y\n'
bad 1 'columns 1 and 2 have the same name "A"; letter case makes no difference' 'a,A\n1,2\n'
bad 1 'column 2 has no name; --no-header is for input without names' 'a,,b\n1,2,3\n'
bad 2 'member "a": byte 0xE9 is no UTF-8; convert the input with iconv' 'a,b\n\0351,2\n'
bad 1 'the name of column 1: byte 0xE9 is no UTF-8; convert the input with iconv' '\0351,b\n1,2\n'
(
    printf 'a,b\n"'
    head -c 17000000 /dev/zero | tr '\0' x
) >in
expect 3 '' 'error: in:2: a cell is longer than 16777216 bytes; do its quotes end? (nothing is stored)' -- \
    insert bad.db t in
good '{"a":"1\u0000x","b":2}' 'a,b\n1\0000x,2\n'
good '{"a":"l1\nl2","b":"c\r\nd"}' 'a,b\n"l1\nl2","c\r\nd"\n'
good '{"a":" 1","b":" x "}' '\0357\0273\0277"a",b\n 1, x \n'
good '{"a":"007","b":"1,5","c":"08E123"}
{"a":null,"b":"","c":"x"}' 'a;b;c\r\n007;1,5;08E123\r\n;"";x\r\n'

# A long text makes a long line of a table, in a time that grows with it.
{
    printf 'id,a\n1,'
    head -c 4000000 /dev/zero | tr '\0' x
} >in
expect 0 '' '' -- insert good.db long in --quiet
same 'a long line' "$("$VORNJSONDB" list good.db long --format table --no-headers | wc -c)" 4000004

# Columns.
seq -s , -f 'm%g' 2001 >in && seq -s , 2001 >>in
expect 3 '' 'error: the records have 2001 different members, and a table has at most 2000 columns (nothing is stored)' \
    -- insert bad.db t in
seq -s , -f 'm%g' 2000 >in && seq -s , 2000 >>in
expect 0 '' '' -- insert good.db wide in --quiet
expect 0 1 '' -- count good.db wide m2000=2000
(
    seq -s , -f 'm%.0f' 200000
    seq -s , 200000
) >in
for option in --format=csv --no-header; do
    expect 3 '' 'error: in:1: the records have more different members than the 32767 that a table can have columns; correct the input (nothing is stored)' \
        -- insert bad.db t in $option
done
broken 1 'the records have more different members than the 32767 that a table can have columns' \
    "[{\"a\": 1$(seq -s '' -f ', "m%g": 1' 40000)}]"

# Names of members.
printf '%s' '[{"a b": 1, "c\"d": 2, "select": 3, "it'\''s": 4, "a.b": 5, "[0]": 6, "x=y": 7, "-f": 8,
    "\n": 9, "ü,b": 10, "%s": 11, "": 12, " ": 13, "rowid": 14, "a:b": 15, "NULL": 16}]' >in
expect 0 '' '' -- insert names.db "it's \"t\"" in --quiet
table="it's \"t\""
for word in 'a b=1' 'c"d=2' select=3 "it's=4" a.b=5 '[0]=6' x=y=7 $'\n=9' 'ü,b=10' %s=11 =12 ' =13' \
    rowid=14 a:b=15 a:b:=15 NULL=16; do
    expect 0 1 '' -- count names.db "$table" "$word"
done
expect 0 1 '' -- count names.db "$table" --where '{"-f": 8}'
expect 0 '' 'updated 1 record' -- update names.db "$table" --where '{"%s": 11}' 'c"d=20' x=y=-7
expect 0 '[{"c\"d":20,"x=y":-7,"-f":8}]' '' -- list names.db "$table" --members 'c"d,x=y,-f'
expect 0 'a b,"c""d",select,it'\''s,a.b,[0],x=y,-f,"
","ü,b",%s,"", ,rowid,a:b,NULL
1,20,3,4,5,6,-7,8,9,10,11,12,13,14,15,16' '' -- list names.db "$table" --format csv
case_error='error: bad.db: cannot make a statement for table "t": "a" is another member'\''s column: letter case makes no difference; give one of the two another name (nothing is stored)'
printf '[{"a": 1, "A": 2}]' >in
expect 3 '' "$case_error" -- insert bad.db t in
printf '[{"$x": 1}]' >in
expect 3 '' 'error: bad.db: cannot make a statement for table "t": "$x" cannot be a member: it begins with $ or holds a NUL byte; rename it, or give a definition without it by --def (nothing is stored)' \
    -- insert bad.db t in

# Bad records are left out and kept where that is asked for.
printf '{"a": 1}\n{"a":\n5\n\377\n{"a": 1} {"a": 3}\n{"a": 2' >in
expect 3 '' '3 inserted, 0 replaced, 0 skipped, 4 failed (in: JSON Lines)' -- \
    insert some.db t in --errors errors
same 'bad records' "$(cat errors)" \
    '{"file":"in","line":2,"record":2,"reason":"the line ends inside of the record","text":"{\"a\":"}
{"file":"in","line":3,"record":3,"reason":"the record is a number, not an object","text":"5"}
{"file":"in","line":4,"record":4,"reason":"no value can begin like this","text":"�"}
{"file":"in","line":6,"record":7,"reason":"the line ends inside of the record","text":"{\"a\": 2"}'

printf '[123, "x\\"y", null, [1, 2], {"a": 1}]' >in
expect 3 '' '1 inserted, 0 replaced, 0 skipped, 4 failed (in: JSON)' -- insert list.db t in --errors errors
same 'texts of bad records' "$(sed 's/.*"text"://' errors)" '"123"}
"\"x\\\"y\""}
"null"}
"[1, 2]"}'

# A column declared JSON holds whatever its maker put there.
sqlite3 other.db "CREATE TABLE t (j JSON);
    INSERT INTO t VALUES ('no json'), (' [1,
1e2] '), ('1'), ('[1] x'), (CAST(x'ff' AS TEXT)), (char(34, 10, 34));"
expect 0 '{"j":"no json"}
{"j": [1, 1e2] }
{"j":1}
{"j":"[1] x"}
{"j":{"$text":true,"encoded":"/w=="}}
{"j":"\"\n\""}' '' -- list other.db t --format jsonl
finish
