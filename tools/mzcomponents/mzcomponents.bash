# SPDX-License-Identifier: BSL-1.0
# Bash completion for mzcomponents: commands, options and file names.
_mzcomponents() {
  local current=${COMP_WORDS[COMP_CWORD]} previous=${COMP_WORDS[COMP_CWORD - 1]}
  local common="--path --cache --json --help" limits="--time-limit --memory-limit"
  local options word command= kind=
  for word in "${COMP_WORDS[@]:1:COMP_CWORD-1}"; do
    case $word in
    list | explain | scan | profile | types | import | show | graph | check | new | uid | help)
      command=${command:-$word}
      ;;
    component | importer | host) [ "$command" != new ] || kind=${kind:-$word} ;;
    esac
  done
  case $previous in
  --path | --directory)
    compopt -o filenames 2>/dev/null
    mapfile -t COMPREPLY < <(compgen -d -- "$current")
    return
    ;;
  --cache | --save | --output | --svg | --sample | --suppress | --junit | --sarif)
    compopt -o filenames 2>/dev/null
    mapfile -t COMPREPLY < <(compgen -f -- "$current")
    return
    ;;
  --fail-on)
    mapfile -t COMPREPLY < <(compgen -W "error warning note" -- "$current")
    return
    ;;
  --time-limit | --memory-limit | --seed | --fuzz | --jobs | --reproduce | --explain | --extension | --runs)
    return
    ;;
  esac
  case $command in
  '') options="list explain scan profile types import show graph check new uid help --help --version" ;;
  list) options=$common ;;
  explain) options="$common $limits --load" ;;
  scan) options="$common $limits --retry" ;;
  profile) options="$common $limits --runs --svg" ;;
  import) options="$common $limits --save --guarded" ;;
  graph) options="$common $limits --output --svg" ;;
  check)
    options="--path --sample --fail-on --suppress --seed --fuzz --reproduce --in-process"
    options+=" --thread-safe --jobs --explain --json --junit --sarif --help $limits"
    ;;
  new)
    case $kind in
    '') options="component importer host --help" ;;
    importer) options="--directory --extension --help" ;;
    *) options="--directory --help" ;;
    esac
    ;;
  uid) options="--words --help" ;;
  help) options="--help" ;;
  *) options="$common $limits" ;;
  esac
  mapfile -t COMPREPLY < <(compgen -W "$options" -- "$current")
  case $command in
  explain | import | show | check)
    if [[ $current != -* ]]; then
      compopt -o filenames 2>/dev/null
      mapfile -t COMPREPLY < <(compgen -f -- "$current")
    fi
    ;;
  esac
}
complete -F _mzcomponents mzcomponents
