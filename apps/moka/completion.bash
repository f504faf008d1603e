# Completes the commands, options and files of moka in bash.
_moka() {
    local cur prev words cword
    _init_completion || return
    local formats="png jpg jpeg webp mki" images="@(png|jpg|jpeg|webp|mki|PNG|JPG|JPEG|WEBP|MKI)"
    local command=${words[1]}
    if [ "$cword" -eq 1 ]; then
        mapfile -t COMPREPLY < <(compgen -W "convert draw gallery info --help --version" -- "$cur")
        return
    fi
    case $prev in
        --to) mapfile -t COMPREPLY < <(compgen -W "$formats" -- "$cur"); return ;;
        --out) _filedir -d; return ;;
        --only) mapfile -t COMPREPLY < <(compgen -W "$(moka gallery --list 2>/dev/null | awk '{print $1}')" -- "$cur"); return ;;
        -o) _filedir "$images"; return ;;
        --trace) _filedir; return ;;
        --jobs | --quality | --size | --max-texture) return ;;
    esac
    local options=
    case $command in
        convert) options="--help --to --out --jobs --quality --size --max-texture --quiet --verbose" ;;
        draw) options="--help -o --to --statistics --trace --watch --verbose" ;;
        gallery) options="--help --out --only --mki --list" ;;
        info) options="--help --device --verbose" ;;
        *) return ;;
    esac
    case $cur,$command in
        -*,*) mapfile -t COMPREPLY < <(compgen -W "$options" -- "$cur") ;;
        *,convert | *,info) _filedir "$images" ;;
        *,draw) _filedir json ;;
    esac
}
complete -F _moka moka
