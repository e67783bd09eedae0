# Completion for gatewayctl: options, commands, and the names of interfaces, which the gateway tells.
_gatewayctl() {
    local word=${COMP_WORDS[COMP_CWORD]} before=${COMP_WORDS[COMP_CWORD - 1]}
    local commands="status calls call history recorded interfaces peers registrations top trace stats drop block unblock drain resume
        reload shutdown help"
    local i command="" options=()
    for ((i = 1; i < COMP_CWORD; i++)); do
        case ${COMP_WORDS[i]} in
        -s | --socket) options=(--socket "${COMP_WORDS[++i]}") ;;
        -*) ;;
        *) [[ -n $command ]] || command=${COMP_WORDS[i]} ;;
        esac
    done
    COMPREPLY=()
    case $before in
    -s | --socket) mapfile -t COMPREPLY < <(compgen -f -- "$word") && return ;;
    --older | --graceful | --rows) return ;;
    --sort) mapfile -t COMPREPLY < <(compgen -W "age rate quality" -- "$word") && return ;;
    trace) mapfile -t COMPREPLY < <(compgen -W "on off" -- "$word") && return ;;
    block | unblock | --interface)
        mapfile -t COMPREPLY < <(compgen -W "$(gatewayctl "${options[@]}" --json interfaces 2>/dev/null |
            sed -n 's/^{"interface":"\([^"]*\)".*/\1/p')" -- "$word")
        return
        ;;
    esac
    case $command in
    "") mapfile -t COMPREPLY < <(compgen -W "$commands --socket --json --help" -- "$word") ;;
    calls) mapfile -t COMPREPLY < <(compgen -W "--older --interface --json" -- "$word") ;;
    top) mapfile -t COMPREPLY < <(compgen -W "--sort --rows --json" -- "$word") ;;
    shutdown) mapfile -t COMPREPLY < <(compgen -W "--graceful" -- "$word") ;;
    *) mapfile -t COMPREPLY < <(compgen -W "--json" -- "$word") ;;
    esac
}
complete -F _gatewayctl gatewayctl
