# bash completion for quimbel: its commands, their options, and the files each takes.
_quimbel_files() {
  # Folders, and the files whose suffix (in any letter case) is one of the words given.
  local pattern="" suffix letter i
  for suffix in "$@"; do
    local word=""
    for ((i = 0; i < ${#suffix}; i++)); do
      letter=${suffix:i:1}
      word+="[${letter,}${letter^}]"
    done
    pattern+="${pattern:+|}$word"
  done
  local IFS=$'\n'
  COMPREPLY+=($(compgen -d -- "$cur"))
  COMPREPLY+=($(shopt -s extglob && compgen -f -X "!*.@($pattern)" -- "$cur"))
}

_quimbel() {
  local cur=${COMP_WORDS[COMP_CWORD]} prev=${COMP_WORDS[COMP_CWORD - 1]}
  local commands="list find number unnumber indent numindent config tasks favorites lsp"
  local command="" i
  for ((i = 1; i < COMP_CWORD; i++)); do
    if [[ " $commands " == *" ${COMP_WORDS[i]} "* ]]; then
      command=${COMP_WORDS[i]}
      break
    fi
  done
  COMPREPLY=()
  if [[ -z $command ]]; then
    COMPREPLY=($(compgen -W "$commands --help --version" -- "$cur"))
    return
  fi

  local inputs="--exclude --encoding --help"
  local transform="--module --procedure --check --diff --stdin-filename $inputs"
  local options=""
  case $command in
    list) options="--tsv --json $inputs" ;;
    find) options="-w --whole-word -s --match-case -i --ignore-case --pattern --module -q --quiet --tsv --json $inputs" ;;
    number) options="--start --interval --file-lines --numindent --no-numindent $transform" ;;
    unnumber) options="--numindent --no-numindent $transform" ;;
    indent) options="--tabs --spaces --numindent --no-numindent $transform" ;;
    numindent) options="--start --interval --tabs --spaces --remove --file-lines $transform" ;;
    config) options="--start --interval --tabs --spaces --numindent --no-numindent --help" ;;
    tasks) options="--json --help" ;;
    favorites) options="--json --help" ;;
    lsp) options="--stdio --help" ;;
  esac

  case $prev in
    --encoding)
      COMPREPLY=($(compgen -W "ansi utf-8" -- "$cur"))
      return
      ;;
    --start | --interval | --spaces | --module | --procedure | --exclude | --text) return ;;
    --stdin-filename)
      _quimbel_files bas cls frm ctl pag dob dsr
      return
      ;;
  esac
  if [[ $cur == -* || $command == lsp ]]; then
    COMPREPLY=($(compgen -W "$options" -- "$cur"))
  elif [[ $command == tasks && $prev == *.[vV][bB][pP] ]]; then
    COMPREPLY=($(compgen -W "add done undone remove" -- "$cur"))
  elif [[ $command == tasks || $command == favorites ]]; then
    _quimbel_files vbp
  elif [[ $command == config ]]; then
    _quimbel_files bas cls frm ctl pag dob dsr
  else
    _quimbel_files vbg vbp bas cls frm ctl pag dob dsr
  fi
}
complete -o filenames -F _quimbel quimbel
