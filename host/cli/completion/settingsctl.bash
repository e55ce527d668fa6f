# Completion of settingsctl in bash.

# The word $1 as the shell would take it, without running anything that stands in it.
_settingsctl_unquoted() {
    local word=$1
    case $word in
    \"*\" | \'*\') word=${word:1:-1} ;;
    \~/*) word=$HOME/${word:2} ;;
    *) word=${word//\\/} ;;
    esac
    printf %s "$word"
}

# The text $1 without the backslashes that keep its characters from meaning something else.
_settingsctl_unescaped() {
    local text=$1 index
    for ((index = 0; index < ${#text}; index++)); do
        [[ ${text:index:1} != \\ ]] || ((index++))
        printf %s "${text:index:1}"
    done
}

# Completes the word $1 to the lines that the command behind it prints. A row's name may hold
# anything: it is compared as it is meant, and completed as it has to be typed.
_settingsctl_rows() {
    local current=$1 typed row
    shift
    case $current in
    \'*) typed=${current:1} ;;
    \"*) typed=$(_settingsctl_unescaped "${current:1}") ;;
    *) typed=$(_settingsctl_unescaped "$current") ;;
    esac
    while IFS= read -r row; do
        [[ $row == "$typed"* ]] || continue
        case $current in
        \'*) row=${row//\'/\'\\\'\'} ;;
        \"*)
            row=${row//\\/\\\\}
            row=${row//\"/\\\"}
            row=${row//\$/\\\$}
            row=${row//\`/\\\`}
            ;;
        *)
            printf -v row %q "$row"
            # These end a word of the line.
            [[ $row == \$\'* ]] || { row=${row//:/\\:} && row=${row//=/\\=}; }
            ;;
        esac
        COMPREPLY+=("$row")
    done < <("$@" 2>/dev/null)
}

_settingsctl() {
    local current=${COMP_WORDS[COMP_CWORD]} previous=${COMP_WORDS[COMP_CWORD - 1]}
    local commands="list get set tap watch init play shell completion"
    local options="--root --locale --bundle --account --first-setup --version --help"
    COMPREPLY=()

    # What stands before the word: the command, how many arguments it has, and the options that
    # say which page is meant.
    local command="" place=0 index word
    local -a page=()
    for ((index = 1; index < COMP_CWORD; index++)); do
        word=${COMP_WORDS[index]}
        case $word in
        --root | --locale | --bundle | --account)
            page+=("$word" "$(_settingsctl_unquoted "${COMP_WORDS[index + 1]}")")
            ((index++))
            ;;
        --first-setup) page+=("$word") ;;
        --from | --keep) ((index++)) ;;
        -*) ;;
        *) if [[ -z $command ]]; then command=$word; else ((place++)); fi ;;
        esac
    done

    case $previous in
    --root | --bundle | --keep)
        compopt -o filenames 2>/dev/null
        mapfile -t COMPREPLY < <(compgen -d -- "$current")
        return
        ;;
    --from)
        compopt -o filenames 2>/dev/null
        mapfile -t COMPREPLY < <(compgen -f -- "$current")
        return
        ;;
    --locale)
        mapfile -t COMPREPLY < <(compgen -W "ar de-DE en-US fr-FR ja-JP" -- "$current")
        return
        ;;
    --account) return ;;
    esac

    if [[ $current == -* ]]; then
        case $command in
        list) options+=" --json" ;;
        tap) options+=" --yes" ;;
        init) options+=" --from" ;;
        play) options+=" --keep" ;;
        esac
        mapfile -t COMPREPLY < <(compgen -W "$options" -- "$current")
        return
    fi

    case $command:$place in
    :0) mapfile -t COMPREPLY < <(compgen -W "$commands" -- "$current") ;;
    get:0 | set:0 | tap:0)
        # By identifier where nothing is called like what was typed.
        local names
        for names in complete-rows complete-identifiers; do
            _settingsctl_rows "$current" "${COMP_WORDS[0]}" "${page[@]}" "$names"
            ((${#COMPREPLY[@]} == 0)) || break
        done
        ;;
    set:1) mapfile -t COMPREPLY < <(compgen -W "on off" -- "$current") ;;
    init:0)
        compopt -o filenames 2>/dev/null
        mapfile -t COMPREPLY < <(compgen -d -- "$current")
        ;;
    play:0)
        compopt -o filenames 2>/dev/null
        mapfile -t COMPREPLY < <(compgen -f -- "$current")
        ;;
    completion:0) mapfile -t COMPREPLY < <(compgen -W "bash zsh" -- "$current") ;;
    esac
}

complete -F _settingsctl settingsctl
