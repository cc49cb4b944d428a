# bash completion for kpmsg
_kpmsg() {
    local word=${COMP_WORDS[COMP_CWORD]} command=${COMP_WORDS[1]}
    if ((COMP_CWORD == 1)); then
        COMPREPLY=($(compgen -W "dump diff tap --help --help-all --version" -- "$word"))
    elif [[ $word == -* ]]; then
        local options="--json --help"
        [[ $command == tap ]] && options+=" --connections" || options+=" --as"
        COMPREPLY=($(compgen -W "$options" -- "$word"))
    else
        COMPREPLY=($(compgen -f -- "$word"))
    fi
}
complete -o filenames -F _kpmsg kpmsg
