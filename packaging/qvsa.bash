# Completion for qvsa. The words come from the help of the command that stands so far.
_qvsa() {
  local word command=(qvsa)
  for word in "${COMP_WORDS[@]:1:COMP_CWORD-1}"; do
    case $word in
      -*) ;;
      *) "${command[@]}" "$word" --help >/dev/null 2>&1 && command+=("$word") ;;
    esac
  done
  local help
  help=$("${command[@]}" --help 2>/dev/null)
  local words
  words=$(awk '/^[A-Z].*:$/ { part = $0 }
    part ~ /^Subcommands/ && /^  [a-z]/ { print $1 }
    /^  -/ { n = split($1, names, ","); for (i = 1; i <= n; ++i) if (names[i] ~ /^--/) print names[i] }' <<<"$help")
  mapfile -t COMPREPLY < <(compgen -W "$words" -- "${COMP_WORDS[COMP_CWORD]}")
}
complete -o default -F _qvsa qvsa
