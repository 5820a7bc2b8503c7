# SPDX-License-Identifier: MIT OR GPL-2.0-only
# Completion of pmxboard for bash. The tool itself says what there is: sub-commands and options in its --help, the words
# of the scenario language by `pmxboard complete LINE`.

# What the tool's help lists: names two columns in, or the options that begin there.
_pmxboard_subcommands()
{
    "$1" --help 2>/dev/null | sed -n '/^Subcommands:/,/^$/s/^  \([a-z][a-z-]*\).*/\1/p'
}

_pmxboard_options()
{
    "$1" ${2:+"$2"} --help 2>/dev/null | sed -n '/^Options:/,/^$/s/^  \(-[^ ]*\).*/\1/p' | tr ',' '\n'
}

# The values of an option that has a few: "--color,--colour auto|always|never".
_pmxboard_values()
{
    "$1" "$2" --help 2>/dev/null | sed -n 's/^  \(-[^ ]*\) \([a-z]*|[a-z|]*\).*/,\1, \2/p' | grep -e ",$3," |
        sed 's/.* //' | tr '|' '\n'
}

# Functions of the layer alone: the words of the language with a capital letter that may begin a line.
_pmxboard_operations()
{
    "$1" complete "" 2>/dev/null | grep '[A-Z]'
}

# Takes those that begin with the current word, of which earlier items of a list keep their place.
_pmxboard_take()
{
    local word=$1 earlier='' candidate
    if [[ ${2-} == list && $word == *,* ]]
    then
        earlier=${word%,*},
        word=${word##*,}
    fi
    while IFS= read -r candidate
    do
        [[ $candidate == "$word"* ]] && COMPREPLY+=("$earlier$candidate")
    done
}

_pmxboard_files()
{
    local word=$1 pattern=$2 file
    while IFS= read -r file
    do
        # shellcheck disable=SC2053 # the pattern is one
        [[ -d $file || $file == $pattern ]] && COMPREPLY+=("$file")
    done < <(compgen -f -- "$word")
    compopt -o filenames 2>/dev/null
}

_pmxboard_argument()
{
    local tool=$1 sub=$2 word=$3
    case $sub in
    run | report) _pmxboard_files "$word" '*.pmx' ;;
    status) _pmxboard_files "$word" '*.json' ;;
    state)
        _pmxboard_files "$word" '*.json'
        _pmxboard_take "$word" < <("$tool" complete "state $word" 2>/dev/null) ;;
    ops) _pmxboard_take "$word" < <(_pmxboard_operations "$tool"; "$tool" complete "fault $word" 2>/dev/null) ;;
    modes) _pmxboard_take "$word" < <("$tool" complete "poke ucMode $word" 2>/dev/null) ;;
    decode | record | replay) _pmxboard_files "$word" '*' ;;
    '') _pmxboard_take "$word" < <(_pmxboard_subcommands "$tool") ;;
    esac
}

_pmxboard()
{
    local tool=${COMP_WORDS[0]} word=${COMP_WORDS[COMP_CWORD]} previous=${COMP_WORDS[COMP_CWORD - 1]} sub='' i
    COMPREPLY=()
    for ((i = 1; i < COMP_CWORD; i++))
    do
        [[ ${COMP_WORDS[i]} == -* ]] && continue
        sub=${COMP_WORDS[i]}
        break
    done
    case $previous in
    --op) _pmxboard_take "$word" list < <(_pmxboard_operations "$tool") ;;
    --only) _pmxboard_take "$word" list < <("$tool" complete "fault ${word##*,}" 2>/dev/null) ;;
    --board)
        _pmxboard_take "$word" < <("$tool" complete "power-on $word" 2>/dev/null)
        _pmxboard_files "$word" '*.toml' ;;
    --against) _pmxboard_files "$word" '*.pmx' ;;
    --trace-file | --junit | -o | --output) _pmxboard_files "$word" '*' ;;
    --trace-format | --color | --colour | --graphics)
        _pmxboard_take "$word" < <(_pmxboard_values "$tool" "$sub" "$previous") ;;
    *)
        if [[ $word == -* ]]
        then
            _pmxboard_take "$word" < <(_pmxboard_options "$tool" "$sub")
        else
            _pmxboard_argument "$tool" "$sub" "$word"
        fi ;;
    esac
}

complete -F _pmxboard pmxboard
