# Completion of transcode's command line in bash.

_transcode() {
  local word=${COMP_WORDS[COMP_CWORD]} previous=${COMP_WORDS[COMP_CWORD - 1]}
  # bash makes three words of --from=utf-8
  [ "$word" != = ] || word=
  [ "$previous" != = ] || previous=${COMP_WORDS[COMP_CWORD - 2]}
  local words
  case $previous in
  -f | --from) words='utf-8 utf-16le utf-16be ascii' ;;
  -t | --to) words='utf-8 utf-16le utf-16be' ;;
  -o | --output) ;;
  *) [[ $word != -* ]] || words='--from --to --output --report --replace --check --quiet --help --version' ;;
  esac
  if [ -n "$words" ]; then
    mapfile -t COMPREPLY < <(compgen -W "$words" -- "$word")
  else
    COMPREPLY=()
    compopt -o default # files
  fi
}

complete -F _transcode transcode
