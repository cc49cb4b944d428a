# bash completion for volume-road
_volume_road() {
    local word=${COMP_WORDS[COMP_CWORD]} options=
    if ((COMP_CWORD == 1)); then
        COMPREPLY=($(compgen -W "make-series run measure list export send serve header --help --help-all --version" \
            -- "$word"))
        return
    fi
    if [[ $word != -* ]]; then
        COMPREPLY=($(compgen -f -- "$word"))
        return
    fi
    case ${COMP_WORDS[1]} in
    make-series) options="--nifti --phantom --volume" ;;
    run) options="--series --volume --threshold --timeout --http --derived" ;;
    measure) options="--series --volume --threshold --json" ;;
    list) options="--json" ;;
    export) options="--series --volume --describe" ;;
    send) options="--series --volume --threshold --timeout" ;;
    serve) options="--listen --timeout" ;;
    header) options="--json --diff" ;;
    esac
    COMPREPLY=($(compgen -W "$options --help" -- "$word"))
}
complete -o filenames -F _volume_road volume-road
