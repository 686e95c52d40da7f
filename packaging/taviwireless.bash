# SPDX-License-Identifier: MIT
# shellcheck shell=bash
# Completion of taviwireless for bash. The program itself knows what its words may be.
_taviwireless() {
    # Words as a person sees them: bash divides them at "=" and ":" as well, and replaces what is behind the last.
    local i word divided='' words=()
    for ((i = 1; i <= COMP_CWORD; i++)); do
        word=${COMP_WORDS[i]}
        if ((i > 1)) && [[ $word == [=:]* || ${COMP_WORDS[i - 1]} == *[=:] ]]; then
            divided=${words[-1]}$word
            divided=${divided%"${divided##*[=:]}"}
            words[-1]+=$word
        else
            divided=''
            words+=("$word")
        fi
    done

    COMPREPLY=()
    while IFS= read -r word; do
        [[ $word != *= ]] || compopt -o nospace
        word=${word#"$divided"}
        case ${COMP_WORDS[COMP_CWORD]} in
        \"*)
            word=${word//\\/\\\\}
            word=${word//\"/\\\"}
            word=${word//\$/\\\$}
            COMPREPLY+=("${word//\`/\\\`}")
            ;;
        \'*) COMPREPLY+=("${word//\'/\'\\\'\'}") ;;
        *) COMPREPLY+=("$([[ $word == *= ]] && echo "$word" || printf %q "$word")") ;;
        esac
    done < <("${COMP_WORDS[0]}" complete-words -- "${words[@]}" 2>/dev/null)
}
complete -F _taviwireless taviwireless
