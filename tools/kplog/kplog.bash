# bash completion for kplog
_kplog() {
    local word=${COMP_WORDS[COMP_CWORD]} before=${COMP_WORDS[COMP_CWORD - 1]}
    case $before in
    -l | --level) COMPREPLY=($(compgen -W "D I W E C" -- "$word")) ;;
    --color) COMPREPLY=($(compgen -W "auto always never" -- "$word")) ;;
    -m | --module | --since | --until) COMPREPLY=() ;;
    *)
        if [[ $word == -* ]]; then
            COMPREPLY=($(compgen -W "--level --module --since --until --chunks --follow --check --color --json --help
                                     --version" -- "$word"))
        else
            COMPREPLY=($(compgen -f -- "$word"))
        fi
        ;;
    esac
}
complete -o filenames -F _kplog kplog
