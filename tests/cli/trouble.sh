#!/usr/bin/env bash
# Files that are none, permissions, a full disk, closed and broken outputs, locks and Ctrl-C.
source "$(dirname "$0")/Check.sh"
seq 2000 | sed 's/.*/{"id": &, "text": "abcdefghijklmnopqrstuvwxyz"}/' >lines
expect 0 '' '' -- insert all.db t lines --key id --quiet

# Not a database, or no longer one.
mkdir folder
mkfifo pipe
for file in folder pipe /dev/null; do
    for words in "list $file t" "insert $file t lines" "doctor $file"; do
        # shellcheck disable=SC2086  # several words
        expect 7 '' "error: $file: it is a folder, a pipe or a device; name the file of a database" -- $words
    done
done
expect 7 '' 'error: no/such.db: No such file or directory; check the folder' -- insert no/such.db t lines
expect 7 '' 'error: lines: file is not a database; name an SQLite database first' -- insert lines t lines
cp all.db cut.db && truncate -s 8192 cut.db
for subcommand in list count dump lint; do
    expect 7 '' 'error: cut.db: database disk image is malformed; restore it from a copy' -- \
        "$subcommand" cut.db t
done
cp all.db junk.db && printf '%40s' x | dd of=junk.db bs=1 seek=4096 conv=notrunc 2>/dev/null
expect 7 '' 'error: junk.db: cannot read records of table "t": database disk image is malformed; restore it from a copy' \
    -- list junk.db t
"$VORNJSONDB" doctor junk.db >out
same 'exit of doctor' $? 3
same 'doctor' "$(sed -n 3p out | cut -c 1-39)" 'integrity     *** in database main ***\'
: >empty
expect 5 '' 'error: empty: there is no table "t"; see vornjsondb tables' -- list empty t

# What a killed program left half done is undone, by who only reads, too.
cat >killed.py <<'END'
import os, sqlite3
database = sqlite3.connect('killed.db')
database.executescript("PRAGMA cache_size = 5; CREATE TABLE t (id INTEGER PRIMARY KEY, text);")
database.executemany("INSERT INTO t VALUES (?, ?)", [(i, 'x' * 200) for i in range(1000)])
database.commit()
database.execute("UPDATE t SET text = 'half done'")
os._exit(1)
END
for words in 'count t' 'list t' 'tables' 'doctor' 'dump t'; do
    rm -f killed.db && python3 killed.py
    read -r subcommand table <<<"$words"
    "$VORNJSONDB" "$subcommand" killed.db $table >out 2>err
    same "exit of $subcommand after a crash" $? 0
    same "$subcommand after a crash" "$(cat err; grep -c 'half done' out)" 0
done
same 'after a crash' "$(sqlite3 killed.db 'SELECT count(*), min(text) = max(text) FROM t')" '1000|1'

# Other files.
expect 7 '' 'error: none: No such file or directory; check name and permissions' -- insert all.db t none
expect 7 '' 'error: folder: Is a directory; check name and permissions' -- insert all.db t folder
expect 7 '' 'error: none: No such file or directory; check name and permissions' -- load all.db none
expect 7 '' 'error: none: No such file or directory; check the name' -- list all.db t --def none
: | TMPDIR=/none "$VORNJSONDB" insert new.db t - 2>err
same 'exit without a temporary folder' $? 7
same 'no temporary folder' "$(cat err)" \
    'error: standard input: cannot copy it to read it twice: No such file or directory; set TMPDIR to a folder with space (nothing is stored)'

# Standard input is read from where it stands, both times, and by nobody else.
{
    read -r _
    "$VORNJSONDB" insert rest.db t - --key id --quiet
} <lines
expect 0 '1999' '' -- count rest.db t
expect 0 0 '' -- count rest.db t id=1
expect 2 '' 'error: standard input is named more than once; give - once' -- insert new.db t - -
expect 2 '' 'error: standard input is named more than once; give - once' -- insert new.db t - --def -
"$VORNJSONDB" insert new.db t - <&- 2>err
same 'exit with a closed input' $? 7
same 'a closed input' "$(cat err)" 'error: standard input: Bad file descriptor; check name and permissions (nothing is stored)'

# --errors empties no file that the call needs.
echo '[{"id": 1}]' >one.json
ln -s one.json link.json
echo '{"t": {"key": "id", "member": {"id": {"cpptype": "int"}}}}' >t.def
cp all.db whole.db
cksum whole.db one.json t.def >sums
for file in whole.db one.json ./link.json t.def; do
    expect 2 '' "error: --errors: $file is read or written by this call itself; name another file (nothing is stored)" \
        -- insert whole.db t one.json --def t.def --errors "$file"
done
"$VORNJSONDB" insert whole.db t - --errors one.json <one.json 2>err
same 'exit with --errors into standard input' $? 2
same 'all files are what they were' "$(cksum whole.db one.json t.def)" "$(cat sums)"

# Permissions, which count for the superuser only without these two rights.
restricted=$VORNJSONDB
if [[ $(id -u) -eq 0 ]]; then
    printf '#!/bin/sh\nexec setpriv --bounding-set -dac_override,-dac_read_search %q "$@"\n' \
        "$VORNJSONDB" >restricted
    chmod +x restricted
    restricted=$PWD/restricted
fi
mkdir locked && cp all.db locked && chmod 555 locked
cp all.db readonly.db && chmod 444 readonly.db
original=$VORNJSONDB VORNJSONDB=$restricted
expect 0 2000 '' -- count readonly.db t
expect 7 '' 'error: readonly.db: Permission denied; check its permissions' -- update readonly.db t 1 text=x
expect 7 '' 'error: readonly.db: Permission denied; check its permissions' -- insert readonly.db t lines
expect 0 2000 '' -- count locked/all.db t
expect 7 '' 'error: locked/all.db: cannot remove records from table "t": attempt to write a readonly database; check the permissions of the file and of its folder' \
    -- delete locked/all.db t 1
expect 7 '' 'error: locked/new.db: Permission denied; check the folder' -- insert locked/new.db t lines
expect 7 '' 'error: locked/errors: Permission denied; name another file for --errors (nothing is stored)' \
    -- insert new.db t lines --errors locked/errors
# SQLite needs a file beside a database in WAL mode.
mkdir medium && cp all.db medium/wal.db
sqlite3 medium/wal.db 'PRAGMA journal_mode = wal' >out
chmod 444 medium/wal.db && chmod 555 medium
for words in 'list %s t' 'tables %s' 'doctor %s' 'dump %s t'; do
    # shellcheck disable=SC2059,SC2046  # the words have the place for the file
    expect 7 '' 'error: medium/wal.db: it is in WAL mode, in which SQLite writes beside the file even to read it, and its folder cannot be written to: Permission denied; copy it, with medium/wal.db-wal if there is one, to a folder that can be' \
        -- $(printf "$words" medium/wal.db)
done
ln -s medium/wal.db linked.db
expect 7 '' 'error: linked.db: it is in WAL mode, in which SQLite writes beside the file even to read it, and its folder cannot be written to: Permission denied; copy it, with linked.db-wal if there is one, to a folder that can be' \
    -- count linked.db t
chmod 000 readonly.db
expect 7 '' 'error: readonly.db: Permission denied; check its permissions' -- count readonly.db t
expect 7 '' 'error: readonly.db: Permission denied; check name and permissions' -- insert new.db t readonly.db
VORNJSONDB=$original
chmod -R u+w locked medium

# Outputs that take nothing, or no more.
written='cannot write: %s; what was written so far is not all'
"$VORNJSONDB" list all.db t --format jsonl 2>err | head -n 1 >out
same 'exit of a list into a closed pipe' "${PIPESTATUS[0]}" 141
same 'a list into a closed pipe' "$(cat out err)" '{"id":1,"text":"abcdefghijklmnopqrstuvwxyz"}'
for subcommand in list dump; do
    "$VORNJSONDB" "$subcommand" all.db t >&- 2>err
    same "exit of $subcommand with a closed output" $? 7
    # shellcheck disable=SC2059  # the text has the place for the reason
    same "$subcommand with a closed output" "$(cat err)" \
        "error: standard output: $(printf "$written" 'Bad file descriptor')"
done
"$VORNJSONDB" list all.db nope >&- 2>&- <&-
same 'exit with nothing open' $? 5
printf '{"id": 1}\nx\n' >bad
full='cannot write: No space left on device; free some space, or name another file for --errors'
expect 7 '' "error: /dev/full: $full (nothing is stored)" -- insert all.db t bad --replace --errors /dev/full
{
    echo '{"id": 2001}'
    cat bad
} >worse
expect 7 '' "error: /dev/full: $full (the first 2 records are dealt with and stay)" -- \
    insert new.db t worse --batch 2 --errors /dev/full
rm new.db
expect 2 '' 'error: --errors: - is no file; name one, such as /dev/stdout (nothing is stored)' -- \
    insert all.db t bad --replace --errors -
expect 3 '{"file":"bad","line":2,"record":2,"reason":"no value can begin like this","text":"x"}' \
    '0 inserted, 1 replaced, 0 skipped, 1 failed (bad: JSON Lines)' -- insert all.db t bad --replace --errors /dev/stdout
same 'the database is sound' "$(sqlite3 all.db 'PRAGMA integrity_check; SELECT count(*) FROM t')" \
    $'ok\n2000'

# A disk that takes no more than 40 kB.
small() {
    (
        ulimit -f 40
        "$VORNJSONDB" "$@" >out 2>err
    )
}
small insert new.db t lines
same 'exit with a full disk' $? 7
same 'a full disk' "$(cat err)" \
    "error: new.db: cannot commit a transaction: disk I/O error; the transaction is undone; check the disk and the shell's limits (nothing is stored)"
same 'no database is left' "$(ls new.db 2>/dev/null)" ''
for _ in {1..999}; do echo '{"id":'; done >broken.jsonl
small insert all.db t broken.jsonl --format jsonl --errors bad.jsonl
same 'exit where the bad records do not fit' $? 7
same 'bad records that do not fit' "$(cat err)" \
    'error: bad.jsonl: cannot write: File too large; free some space, or name another file for --errors (nothing is stored)'
same 'no line is cut' "$(stat -c %s bad.jsonl)" 0

# One that takes nothing at all, not even a journal.
"$VORNJSONDB" dump all.db t >all.dump
for words in 'init none.db t id:int' 'insert none.db t lines' 'load none.db all.dump'; do
    found=$(
        ulimit -f 0
        "$VORNJSONDB" $words 2>&1
    )
    same "exit of $words without any room" $? 7
    same "${words%% *} without any room" "${found% (nothing is stored)}" \
        "error: none.db: cannot begin a transaction: disk I/O error; check the disk and the shell's limits"
    same "${words%% *} leaves no database" "$(ls none.db 2>/dev/null)" ''
done
cp all.db before.db
small update all.db t --where '{"id": {"$gt": 0}}' "text=$(printf 'x%.0s' {1..200})"
same 'exit of an update with a full disk' $? 7
same 'nothing is updated' "$(sqlite3 all.db .dump | cksum)" "$(sqlite3 before.db .dump | cksum)"
small list all.db t
same 'exit of a list with a full disk' $? 7
# shellcheck disable=SC2059
same 'a list with a full disk' "$(cat err)" \
    "error: standard output: $(printf "$written" 'File too large')"

# What is stored when Ctrl-C comes: --batch says where the borders are. The input is a pipe that stays
# open, so that the command waits for more.
mkfifo feed
# interrupt COUNT OPTION...: Ctrl-C when all that was fed is read, and COUNT records are stored.
interrupt() {
    local count=$1
    shift
    sqlite3 all.db 'DELETE FROM t'
    "$VORNJSONDB" insert all.db t feed --format jsonl "$@" 2>err &
    local pid=$!
    exec 3>feed
    head -n 5 lines >&3
    until [[ $(sqlite3 -cmd '.timeout 5000' all.db 'SELECT count(*) FROM t') == "$count" &&
        $(cut -d ' ' -f 3 /proc/$pid/stat) == S && ! -s err ]]; do
        :
    done
    kill -INT "$pid"
    wait "$pid"
    same "exit after Ctrl-C with $*" $? 130
    exec 3>&-
}
interrupt 4 --batch 2
same 'Ctrl-C at a border' "$(cat err)" 'error: interrupted (the first 4 records are dealt with and stay)'
same 'what stays' "$(sqlite3 all.db 'SELECT group_concat(id) FROM t')" 1,2,3,4
interrupt 0
same 'Ctrl-C' "$(cat err)" 'error: interrupted (nothing is stored)'
same 'nothing stays' "$(sqlite3 all.db 'SELECT count(*) FROM t')" 0
# A shell's loop goes on unless the signal itself ended the command.
cat >interrupt.py <<'END'
import signal, subprocess, sys
command = subprocess.Popen(sys.argv[1:], stderr=subprocess.DEVNULL)
with open('feed', 'w') as feed:
    command.send_signal(signal.SIGINT)
    print(command.wait())
END
same 'ended by the signal' \
    "$(python3 interrupt.py "$VORNJSONDB" insert all.db t feed --format jsonl)" -2

# Between two batches others may write, however long the input is silent.
sqlite3 all.db 'DELETE FROM t'
"$VORNJSONDB" insert all.db t feed --format jsonl --batch 1 --quiet &
pid=$!
exec 3>feed
until_handles_interrupt "$pid"
for count in 1 2; do
    expect 0 '' 'deleted 0 records' -- delete all.db t --where '{"id": 7000}' --wait 0
    sed -n ${count}p lines >&3
    until [[ $(sqlite3 -cmd '.timeout 5000' all.db 'SELECT count(*) FROM t') == "$count" ]]; do :; done
done
expect 0 '' 'updated 2 records' -- update all.db t --where '{"id": {"$gt": 0}}' text=x
exec 3>&-
wait "$pid"
same 'exit of what was fed' $? 0
expect 0 '' 'deleted 2 records' -- delete all.db t --where '{"text": "x"}'

# So it does where load waits for more, and what load has made goes again.
"$VORNJSONDB" dump all.db t >t.dump
"$VORNJSONDB" load loaded.db feed 2>err &
pid=$!
exec 3>feed
head -n 3 t.dump >&3
until [[ -e loaded.db ]]; do sleep 0.01; done
kill -INT "$pid"
wait "$pid"
same 'exit of load after Ctrl-C' $? 130
exec 3>&-
same 'load after Ctrl-C' "$(cat err)" 'error: interrupted (nothing is stored)'
same 'load leaves' "$(ls | grep loaded)" ''

# Other signals that end it leave no more behind, and end it; nohup keeps it from hearing of the first.
cat >end.py <<'END'
import os, signal, subprocess, sys, time
ignored, number, words = sys.argv[1] == 'nohup', int(sys.argv[2]), sys.argv[3:]
command = subprocess.Popen(words, stderr=subprocess.PIPE, text=True,
    preexec_fn=lambda: signal.signal(signal.SIGHUP, signal.SIG_IGN if ignored else signal.SIG_DFL))
with open('feed', 'w') as feed:
    feed.write(''.join(open('t.dump' if 'load' in words else 'lines').readlines()[:3]))
    feed.flush()
    while not os.path.exists('ended.db'):
        time.sleep(0.01)
    command.send_signal(number)
    if not ignored:
        command.wait()
print(command.wait(), command.stderr.read(), end='')
END
for number in 1 15; do
    for words in 'insert ended.db t feed --key id --format jsonl' 'load ended.db feed'; do
        # shellcheck disable=SC2086  # several words
        same "signal $number in ${words%% *}" "$(python3 end.py - $number "$VORNJSONDB" $words)" \
            "-$number error: interrupted (nothing is stored)"
        same "what is left of signal $number in ${words%% *}" "$(ls | grep ended.db)" ''
    done
done
same 'nohup' "$(python3 end.py nohup 1 "$VORNJSONDB" insert ended.db t feed --type id=int --format jsonl)" \
    '0 3 inserted, 0 replaced, 0 skipped, 0 failed (feed: JSON Lines)'
rm ended.db
# Nor does a reader of the bad records who goes away, which is waited for.
mkfifo gone
{
    read -r <gone
    "$VORNJSONDB" insert ended.db t bad --type id=int --errors /dev/stdout 2>err
    echo $? >code
} | {
    exec <&-
    : >gone
}
same 'exit without a reader of bad records' "$(cat code)" 7
same 'without a reader of bad records' "$(cat err)" \
    'error: /dev/stdout: cannot write: Broken pipe; free some space, or name another file for --errors (nothing is stored)'
same 'what is left without a reader' "$(ls | grep ended.db)" ''

# A file that is new to one call may hold what another has stored since: the second waits for its input
# until then. It neither removes the file nor stores into a table that has other types.
mkfifo slow
"$VORNJSONDB" insert both.db t slow --key id 2>err &
pid=$!
exec 3>slow
echo '{"id": 1, "text": 5}' >&3
until [[ -e both.db ]]; do sleep 0.01; done
expect 0 '' '2000 inserted, 0 replaced, 0 skipped, 0 failed (lines: JSON Lines)' -- insert both.db t lines --key id
exec 3>&-
wait "$pid"
same 'exit of the second' $? 4
same 'the second' "$(cat err)" \
    'error: both.db: another program has just made the table "t"; try again, into that table (nothing is stored)'
expect 0 2000 '' -- count both.db t
echo '[{"id": 1}, {"id": null}' >broken.json
expect 3 '' 'error: broken.json:2: the input ends inside of the list, after record 2; correct the input (nothing is stored)' \
    -- insert fresh.db t broken.json
same 'no file is left' "$(ls fresh.db 2>/dev/null)" ''
# Nor is the link to a database that is not there yet.
ln -s real.db link.db
"$VORNJSONDB" insert link.db t broken.json 2>err
same 'a link stays, and leads to nothing' "$(readlink link.db; ls real.db 2>/dev/null)" real.db
expect 0 '' '2000 inserted, 0 replaced, 0 skipped, 0 failed (lines: JSON Lines)' -- insert link.db t lines
expect 0 2000 '' -- count real.db t

# What a failed call made is not removed while another program is about to store something there, and
# nothing is stored in a file that is gone.
begin_insert() {
    exec 3>&-
    "$VORNJSONDB" insert "$1" t slow --key id 2>err &
    pid=$!
    exec 3>slow
    echo '[{"id": 1}' >&3
    until [[ -e $1 ]]; do sleep 0.01; done
}
begin_insert held.db
mkfifo hold
# Neither may keep the input open.
{
    echo 'BEGIN IMMEDIATE; SELECT 1;'
    cat hold
} 3>&- | sqlite3 held.db >ready 3>&- &
until [[ -s ready ]]; do sleep 0.01; done
exec 3>&-
wait "$pid"
same 'exit of the first' $? 3
same 'the file' "$(ls held.db)" held.db
echo 'CREATE TABLE kept (a); COMMIT;' >hold
wait
same 'what the other stored' "$(sqlite3 held.db .tables)" kept
for instead in '' ': >gone.db'; do
    begin_insert gone.db
    rm gone.db
    eval "$instead"
    echo ']' >&3
    exec 3>&-
    wait "$pid"
    same 'exit without the file' $? 7
    same 'what is said' "$(cat err)" \
        'error: gone.db: another program has removed or replaced the file; try again (nothing is stored)'
    rm -f gone.db
done

# What a killed call leaves does not disturb the next one.
begin_insert dead.db
disown "$pid"
kill -KILL "$pid"
while kill -0 "$pid" 2>/dev/null; do sleep 0.01; done
same 'a killed insert leaves' "$(stat -c %s dead.db)" 0
expect 0 'table
-----' '' -- tables dead.db
expect 0 '' '2000 inserted, 0 replaced, 0 skipped, 0 failed (lines: JSON Lines)' -- insert dead.db t lines --key id

# What is written to a database that was moved away would be nowhere.
"$VORNJSONDB" init moved.db t id:int --quiet && cp moved.db other.db
mkfifo later
"$VORNJSONDB" insert moved.db t later --format jsonl 2>err &
pid=$!
exec 3>later
head -n 5 lines | cut -d , -f 1 | sed 's/$/}/' >&3
until [[ -e moved.db-journal ]]; do sleep 0.01; done
mv other.db moved.db
exec 3>&-
wait "$pid"
same 'exit where the database was replaced' $? 7
same 'a database that was replaced' "$(cat err)" \
    'error: moved.db: another program has removed or replaced the file; try again (nothing is stored)'

# What waits for a lock says how long, and a reader need not wait.
mkfifo go
(
    echo 'BEGIN IMMEDIATE; SELECT 1;'
    cat go
) | sqlite3 all.db >held &
until [[ -s held ]]; do sleep 0.01; done
locked='database is locked (waited 10 ms); try again, or wait longer with --wait MS'
expect 0 0 '' -- count all.db t
expect 6 '' "error: all.db: cannot begin a transaction: $locked (nothing is stored)" -- \
    insert all.db t lines --wait 10
expect 6 '' "error: all.db: cannot begin a transaction: $locked" -- update all.db t 1 text=x --wait 10
expect 6 '' "error: all.db: cannot begin a transaction: $locked" -- \
    upsert all.db t id=1 --wait 10
expect 6 '' "error: all.db: cannot create an index on table \"t\": $locked" -- index all.db t text --wait 10
"$VORNJSONDB" doctor all.db >out
same 'who holds it' "$(grep writes out | sed 's/[0-9]\+/N/')" 'lock          process N (sqlite3) writes, reads'
# Ctrl-C ends the waiting, and the whole time is what --wait says: another one that waits longer and began
# later is not the first to give up.
"$VORNJSONDB" insert all.db t lines --wait 600000 2>err &
pid=$!
until_handles_interrupt "$pid"
until [[ $(cut -d ' ' -f 3 /proc/$pid/stat) == S ]]; do sleep 0.01; done
kill -INT "$pid"
wait "$pid"
same 'exit after Ctrl-C while it waits' $? 130
same 'Ctrl-C while it waits' "$(cat err)" 'error: interrupted (nothing is stored)'
: >order
{
    "$VORNJSONDB" update all.db t 1 text=x --wait 2000 2>err
    echo first >>order
} &
pid=$!
sqlite3 -cmd '.timeout 3000' all.db 'BEGIN IMMEDIATE' 2>/dev/null
echo second >>order
wait "$pid"
same 'who gave up' "$(cat order)" $'first\nsecond'
: >go
wait
finish
