# Completion of transcode's command line in bash.

_transcode() {
  local word=${COMP_WORDS[COMP_CWORD]} previous=${COMP_WORDS[COMP_CWORD - 1]}
  # bash makes three words of --from=utf-8
  [ "$word" != = ] || word=
  [ "$previous" != = ] || previous=${COMP_WORDS[COMP_CWORD - 2]}
  local words
  case $previous in
  -f | --from | -t | --to) words='utf-8 utf-16 utf-16le utf-16be utf-32 utf-32le utf-32be latin1 ascii' ;;
  --bom) words='keep strip add' ;;
  --line-endings) words='lf crlf' ;;
  -o | --output) ;;
  *) [[ $word != -* ]] || words='--from --to --list --output --report --replace --drop --check --bom --line-endings
--quiet --help --version' ;;
  esac
  if [ -n "$words" ]; then
    mapfile -t COMPREPLY < <(compgen -W "$words" -- "$word")
  else
    COMPREPLY=()
    compopt -o default # files
  fi
}

complete -F _transcode transcode
