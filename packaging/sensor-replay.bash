# bash completion for sensor-replay

_sensor_replay() {
    local word=${COMP_WORDS[COMP_CWORD]}
    COMPREPLY=()
    [[ ${COMP_WORDS[COMP_CWORD - 1]} != --jobs ]] || return
    if [[ $word == -* ]]; then
        local options='--help --version --log --json --all --merge --print-trace --check --jobs
            --properties --timeline --page --uses --since-charge --baseline --list-calls'
        mapfile -t COMPREPLY < <(compgen -W "$options" -- "$word")
    else
        compopt -o filenames
        mapfile -t COMPREPLY < <(compgen -f -- "$word")
    fi
} && complete -F _sensor_replay sensor-replay
