#!/usr/bin/env bash
# Every subcommand and option has help, completion and its place in the manual.
source "$(dirname "$0")/Check.sh"

for shell in bash zsh fish man; do
    "$VORNJSONDB" completion $shell >script.$shell
done
# The scripts ask the command itself for tables.
mkdir bin
ln -s "$VORNJSONDB" bin/vornjsondb
export PATH=$PWD/bin:$PATH
"$VORNJSONDB" init shop.db product id:int --quiet
"$VORNJSONDB" init shop.db price id:int --quiet

# in_bash WORD...: what bash offers for the last of them.
in_bash() {
    bash -c 'source script.bash; COMP_WORDS=("$@") COMP_CWORD=$(($# - 1)); _vornjsondb
        echo "${COMPREPLY[*]}"' bash "$@"
}
same 'bash: subcommands' "$(in_bash vornjsondb in)" 'insert init index'
same 'bash: tables' "$(in_bash vornjsondb list shop.db pr)" 'price product'
same 'bash: options' "$(in_bash vornjsondb list shop.db price --no)" '--no-headers'
same 'bash: choices' "$(in_bash vornjsondb list shop.db price --format js)" 'json jsonl'
same 'bash: shells' "$(in_bash vornjsondb completion f)" 'fish'

# What a table is called is never run: in a real bash, with a key on it that completes, and one that
# shows the line. No other keys begin with that one: after such a key the shells wait for the next.
sqlite3 evil.db 'CREATE TABLE "$(touch ran) a:b" (a); CREATE TABLE "`touch ran`" (a); CREATE TABLE "it'"'"'s" (a);
    CREATE TABLE "a ""b" (a); CREATE TABLE "plain" (a);' "CREATE TABLE \"x
\$(touch ran)\" (a)"
cp evil.db "a b.db"
cat >bash.py <<'END'
import os, pty, sys
pid, terminal = pty.fork()
if pid == 0:
    os.environ['PS1'] = ''
    os.environ['HISTFILE'] = ''
    os.environ['HOME'] = os.getcwd()
    os.execvp('bash', ['bash', '--norc', '-i'])
def send(text):
    os.write(terminal, text.encode())
def until(mark):
    seen = b''
    while not seen.endswith(mark):
        seen += os.read(terminal, 1)
    return seen
send("""bind 'set enable-bracketed-paste off'; bind 'set bell-style none'; source script.bash; shown() { printf '\\n<%s>%s\\n' "$READLINE_LINE" done; READLINE_LINE=; READLINE_POINT=0; }; bind -x '"\\C-t": shown'; PS1=$(printf 'rea%s' dy)\n""")
until(b'ready')  # the prompt: from now on keys are bash's own
send(sys.argv[1] + '\t\x14')
print(until(b'>done\r\n').decode().rsplit('\n<', 1)[1][:-7])
END
typed() {
    python3 bash.py "$1"
}
same 'bash: a name in $( )' "$(typed 'vornjsondb list evil.db \$')" 'vornjsondb list evil.db \$\(touch\ ran\)\ a\:b '
same 'bash: a name in backquotes' "$(typed 'vornjsondb list evil.db \`')" 'vornjsondb list evil.db \`touch\ ran\` '
same 'bash: all names' "$(in_bash vornjsondb list evil.db '' | tr -d '\n')" '\$\(touch\ ran\)\ a\:b \`touch\ ran\` a\ \"b it\'"'"'s plain'
same 'bash: within double quotes' "$(typed 'vornjsondb list evil.db "a ')" 'vornjsondb list evil.db "a \"b" '
same 'bash: within single quotes' "$(typed "vornjsondb list evil.db 'it")" "vornjsondb list evil.db 'it'\\''s' "
same 'bash: a database in quotes' "$(typed 'vornjsondb list "a b.db" pl')" 'vornjsondb list "a b.db" plain '
same 'bash: a database with a blank' "$(typed 'vornjsondb list a\ b.db pl')" 'vornjsondb list a\ b.db plain '
same 'bash: a database at home' "$(typed 'vornjsondb list ~/evil.db pl')" 'vornjsondb list ~/evil.db plain '
same 'bash: a database as file' "$(typed 'vornjsondb list sh')" 'vornjsondb list shop.db '
same 'bash: a dump as file' "$(typed 'vornjsondb load shop.db script.b')" 'vornjsondb load shop.db script.bash '
mkdir plain
same 'bash: a table called like a folder' "$(typed 'vornjsondb list evil.db pl')" 'vornjsondb list evil.db plain '
same 'it was not run' "$(ls ran 2>/dev/null)" ''

in_fish() {
    fish -c "source script.fish; complete -C '$1'"
}
same 'fish: subcommands' "$(in_fish 'vornjsondb ini')" $'init\tCreate a table'
same 'fish: tables' "$(in_fish 'vornjsondb list shop.db pri')" 'price'

same 'fish: options' "$(in_fish 'vornjsondb list shop.db price --no')" \
    $'--no-headers\tno line with the members\' names'
same 'fish: choices' "$(in_fish 'vornjsondb list shop.db price --format ts')" tsv
same 'fish: files' "$(in_fish 'vornjsondb list sh')" shop.db
same 'fish: an odd name' "$(in_fish 'vornjsondb list evil.db "$"')" '$(touch ran) a:b'
same 'fish: a database at home' "$(HOME=$PWD in_fish 'vornjsondb list ~/evil.db pl')" plain

# zsh completes on a terminal only: one is made, with a key on it that completes and shows the line.
# The function is loaded from the path, as it is from its installed place.
in_zsh() {
    zsh -f zsh.input "$1"
}
mkdir functions
cp script.zsh functions/_vornjsondb
cat >zsh.input <<'END'
zmodload zsh/zpty
export LINE=$1
zpty shell 'PS1= zsh -f -i'
zpty -w shell 'fpath=($PWD/functions $fpath); autoload -Uz compinit; compinit -u -d $PWD/zsh.dump'
zpty -w shell 'shown() { BUFFER=$LINE; CURSOR=$#LINE; zle expand-or-complete; print -r -- "<$BUFFER>"; BUFFER= }'
zpty -w shell 'zle -N shown; bindkey "^T" shown'
zpty -n -w shell $'\x14'
zpty -r shell text "*<vornjsondb*>*"
print -r -- ${${text##*<}%%>*}
zpty -d shell
END
same 'zsh: subcommands' "$(in_zsh 'vornjsondb ini')" 'vornjsondb init '
same 'zsh: tables' "$(in_zsh 'vornjsondb list shop.db pri')" 'vornjsondb list shop.db price '
same 'zsh: options' "$(in_zsh 'vornjsondb list shop.db price --no')" 'vornjsondb list shop.db price --no-headers '
same 'zsh: choices' "$(in_zsh 'vornjsondb list shop.db price --format ts')" 'vornjsondb list shop.db price --format tsv '
same 'zsh: files' "$(in_zsh 'vornjsondb list sho')" 'vornjsondb list shop.db '
same 'zsh: an odd name' "$(in_zsh 'vornjsondb list evil.db \$')" 'vornjsondb list evil.db \$\(touch\ ran\)\ a:b '
same 'zsh: a name in backquotes' "$(in_zsh 'vornjsondb list evil.db \`')" 'vornjsondb list evil.db \`touch\ ran\` '
same 'zsh: a database at home' "$(HOME=$PWD in_zsh 'vornjsondb list ~/evil.db pl')" 'vornjsondb list ~/evil.db plain '
same 'it was not run' "$(ls ran 2>/dev/null)" ''
same 'zsh: shells' "$(in_zsh 'vornjsondb completion z')" 'vornjsondb completion zsh '

# help is --help.
same 'help' "$("$VORNJSONDB" help)" "$("$VORNJSONDB" --help)"
same 'help of a subcommand' "$("$VORNJSONDB" help insert)" "$("$VORNJSONDB" insert --help)"
expect 2 '' 'error: unknown subcommand "insrt"; did you mean "insert"?' -- help insrt

# The table of exit codes: in the sources, in the manual and on the page.
root=$(dirname "$0")/../..
codes=$(sed -n 's/^    kExit[A-Za-z]* = \([0-9]*\),*$/\1/p' "$root/cli/Command.h")
documented=$(sed -n 's/^| \([0-9]*\) | \(.*\) |$/\1 \2/p' "$root/docs/command.md")
same 'exit codes: page' "$(cut -d ' ' -f 1 <<<"$documented")" "$codes"
same 'exit codes: manual' "$(sed -n '/^\.Sh EXIT/,/^\.El/p' script.man | sed 's/\\-/-/g' |
    sed -n '/^\.It/{N;s/^\.It //;s/\n/ /;p}')" "$documented"

same 'the manual is clean' \
    "$(mandoc -T lint -W style script.man 2>&1 | grep -v 'outdated mandoc.db')" ''

names=$("$VORNJSONDB" --help | sed -n '/^Subcommands/,/^$/s/^  \([a-z]*\) .*/\1/p')
same 'number of subcommands' "$(($(wc -w <<<"$names") >= 17))" 1
for name in $names; do
    "$VORNJSONDB" "$name" --help >help
    same "$name: examples first" "$(head -n 1 help)" Examples
    same "$name: on the page" "$(($(grep -cE "vornjsondb $name\b" "$root/docs/command.md") > 0))" 1
    same "$name: in the manual" "$(grep -c "^\.Ss $name\$" script.man)" 1
    options=$(sed -n '/^Options/,$s/^  \(-., \|    \)\(--[a-z-]*\).*/\2/p' help)
    for option in $options; do
        same "$name $option: help" "$(grep -cE -- "$option( [^ ]+)?  +[^ ]" help)" 1
        same "$name $option: completion" \
            "$("$VORNJSONDB" --complete "$name" shop.db "$option" | grep -c "^$option"$'\t.')" 1
        same "$name $option: manual" \
            "$(($(grep -cF -- "Fl \\-${option#--}" <(sed 's/\\-/-/g; s/Fl -/Fl \\-/g' script.man)) > 0))" 1
    done
done
finish
