# Completes the arguments of kolvane, in bash.

_kolvane_options() {
  case $1 in
    translate) echo --dictionary --default-dictionary --encoding --nul --trace --plugin ;;
    compile) echo -o --output --format --values --encoding ;;
    dump) echo --json --sort --utf-16 --encoding ;;
    convert) echo -o --output --to --encoding ;;
    check)
      echo --reference --encoding --format --disable --baseline --fail-on -W --info --no-snippet \
        --color -q --list-rules
      ;;
    stats) echo --reference --encoding --format --fail-under ;;
  esac
}

# The values of an option; fails where the option has none but files.
_kolvane_values() {
  case "$1 $2" in
    *' --encoding') echo auto image utf-8 ;;
    'compile --format') echo 1.5 1.0 ;;
    'compile --values') echo utf-16 utf-8 code-page ;;
    'convert --to') echo utf-8 utf-16le utf-16be code-page ;;
    'check --format') echo text json sarif github ;;
    'check --disable') kolvane check --list-rules 2>/dev/null | cut -d ' ' -f 1 ;;
    'check --fail-on') echo error warning info ;;
    'check --color') echo auto always never ;;
    'stats --format') echo text json csv html ;;
    'stats --fail-under') ;;
    *) return 1 ;;
  esac
}

_kolvane() {
  local commands='translate compile dump convert check stats help'
  local command=${COMP_WORDS[1]} word=${COMP_WORDS[COMP_CWORD]} option=${COMP_WORDS[COMP_CWORD - 1]}
  local words
  # `--option=value` comes as three words.
  if [[ $word == = ]]; then
    word=
  elif [[ $option == = ]]; then
    option=${COMP_WORDS[COMP_CWORD - 2]}
  fi

  if ((COMP_CWORD == 1)); then
    words="$commands --help --version"
  elif [[ $command == help ]]; then
    words=$commands
  elif ! words=$(_kolvane_values "$command" "$option"); then
    [[ $word == -* ]] || return
    words="$(_kolvane_options "$command") --help"
  fi
  mapfile -t COMPREPLY < <(compgen -W "$words" -- "$word")
}

complete -o bashdefault -o default -F _kolvane kolvane
