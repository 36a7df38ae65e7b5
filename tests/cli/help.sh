#!/usr/bin/env bash
# Every subcommand and option has help, completion and its place in the manual.
source "$(dirname "$0")/Check.sh"

for shell in bash zsh fish man; do
    "$VORNJSONDB" completion $shell >script.$shell
done
same 'bash reads its script' "$(bash -n script.bash 2>&1)" ''
command -v zsh >/dev/null && same 'zsh reads its script' "$(zsh -n script.zsh 2>&1)" ''
command -v fish >/dev/null && same 'fish completes' \
    "$(fish -c 'source script.fish; complete -C "vornjsondb ini"')" $'init\tCreate a table'
command -v mandoc >/dev/null && same 'the manual is clean' \
    "$(mandoc -T lint -W style script.man 2>&1 | grep -v 'outdated mandoc.db')" ''

names=$("$VORNJSONDB" --help | sed -n '/^Subcommands/,/^$/s/^  \([a-z]*\) .*/\1/p')
same 'number of subcommands' "$(($(wc -w <<<"$names") >= 17))" 1
for name in $names; do
    "$VORNJSONDB" "$name" --help >help
    same "$name: examples first" "$(head -n 1 help)" Examples
    same "$name: in the manual" "$(grep -c "^\.Ss $name\$" script.man)" 1
    options=$(sed -n '/^Options/,$s/^  \(-., \|    \)\(--[a-z-]*\).*/\2/p' help)
    for option in $options; do
        same "$name $option: help" "$(grep -cE -- "$option( [^ ]+)?  +[^ ]" help)" 1
        same "$name $option: bash" "$(grep -cE -- " $name\) words=.*$option\b" script.bash)" 1
        same "$name $option: fish" \
            "$(grep -cE -- "from $name' -l ${option#--}( |\$)" script.fish)" 1
        same "$name $option: manual" \
            "$(($(grep -cF -- "Fl \\-${option#--}" <(sed 's/\\-/-/g; s/Fl -/Fl \\-/g' script.man)) > 0))" 1
    done
done
finish
