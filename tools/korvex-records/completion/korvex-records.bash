# Completion of korvex-records in bash: verbs, options, files, and keys from the record file.
# shellcheck shell=bash

# Reads the line as the shell does, but expands nothing: into the caller's array words, unquoted,
# and quote, the quote that is still open.
_korvex_records_read() {
    local text=$1 char='' word='' inside=''
    words=() quote=
    while [[ -n $text ]]; do
        char=${text:0:1} text=${text:1}
        if [[ -z $quote && $char == [[:space:]] ]]; then
            [[ -z $inside ]] || words+=("$word")
            word='' inside=
            continue
        fi
        inside=1
        if [[ $char == \\ && $quote != \' ]]; then
            word+=${text:0:1} text=${text:1}
        elif [[ -n $quote && $char == "$quote" ]]; then
            quote=
        elif [[ -z $quote && $char == [\'\"] ]]; then
            quote=$char
        else
            word+=$char
        fi
    done
    words+=("$word")
}

# The key as it has to be typed after what the caller's variable quote has opened.
_korvex_records_quoted() {
    case $quote in
        '') printf -v key %q "$key" ;;
        \') key=${key//\'/\'\\\'\'} ;;
        \") key=${key//\\/\\\\} key=${key//\"/\\\"} key=${key//\$/\\\$} key=${key//\`/\\\`} ;;
    esac
}

# Keys that begin with $3 in the file $2, by the tool $1. What a former word break has cut off, $4,
# stays on the line, so it is no part of them. Reading waits for nobody and changes nothing.
_korvex_records_keys() {
    local tool=$1 file=$2 prefix=$3 before=$4 key
    tool=${tool/#\~\//$HOME/} file=${file/#\~\//$HOME/}
    while IFS= read -r -d '' key; do
        [[ $key != -* || -n $ended ]] || continue # would pass for an option
        key=${key#"$before"}
        _korvex_records_quoted
        COMPREPLY+=("$key")
    done < <("$tool" ${file:+-f "$file"} list -0 -- "$prefix" 2> /dev/null)
    # The shell itself closes the quotes of file names only.
    [[ ${#COMPREPLY[@]} -ne 1 ]] || COMPREPLY[0]+=$quote
}

_korvex_records_files() {
    compopt -o filenames
    mapfile -t COMPREPLY < <(compgen -f -- "$1")
}

_korvex_records() {
    local words quote verb='' file='' ended='' i count=0
    _korvex_records_read "${COMP_LINE:0:COMP_POINT}"
    local -a typed=("${words[@]}")
    local last=$((${#typed[@]} - 1))
    local current=${typed[last]} open=$quote
    COMPREPLY=()
    for ((i = 1; i < last; i++)); do
        case $ended${typed[i]} in
            --) ended=1 ;;
            -f | --file | -i | --input | -o | --output | --value | --wait)
                if ((++i == last)); then
                    [[ ${typed[i - 1]} == --[vw]* ]] || _korvex_records_files "$2"
                    return
                fi
                [[ ${typed[i - 1]} != -*f* ]] || file=${typed[i]}
                ;;
            --file=*) file=${typed[i]#*=} ;;
            -f?*) file=${typed[i]#-f} ;;
            -?*) ;;
            *)
                [[ -n $verb ]] && ((++count))
                verb=${verb:-${typed[i]}}
                ;;
        esac
    done
    _korvex_records_read "${COMP_LINE:0:COMP_POINT-${#2}}"
    local before=${words[-1]}
    quote=$open

    if [[ -z $ended && $current =~ ^--(file|input|output)= ]]; then
        _korvex_records_files "$2"
    elif [[ -z $ended && $current == -* ]]; then
        mapfile -t COMPREPLY < <(compgen -W '--file --long --null --hex --input --value --print
            --json --replace --keep --dry-run --output --key-escaped --create --wait --any-version
            --verbose --version --help' -- "$2")
    elif [[ -z $verb ]]; then
        mapfile -t COMPREPLY < <(compgen -W 'list get put remove dump load batch check diff stats
            salvage help' -- "$2")
    else
        case $verb$count in
            load0 | batch0 | diff0) _korvex_records_files "$2" ;;
            list0 | get0 | put0 | dump0 | stats0 | remove*)
                _korvex_records_keys "$1" "$file" "$current" "$before"
                ;;
        esac
    fi
} && complete -F _korvex_records korvex-records
