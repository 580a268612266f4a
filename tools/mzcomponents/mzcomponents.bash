# SPDX-License-Identifier: BSL-1.0
# Bash completion for mzcomponents: commands, options and file names.
_mzcomponents() {
  local current=${COMP_WORDS[COMP_CWORD]} previous=${COMP_WORDS[COMP_CWORD - 1]}
  local common="--path --cache --json --help" limits="--time-limit --memory-limit"
  local options word command= kind=
  for word in "${COMP_WORDS[@]:1:COMP_CWORD-1}"; do
    case $word in
    list | explain | scan | profile | types | import | show | graph | check | new | uid | help | disable | enable | bisect)
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
  --cache | --save | --output | --svg | --sample | --host | --suppress | --junit | --sarif)
    compopt -o filenames 2>/dev/null
    mapfile -t COMPREPLY < <(compgen -f -- "$current")
    return
    ;;
  --fail-on)
    mapfile -t COMPREPLY < <(compgen -W "error warning note" -- "$current")
    return
    ;;
  --time-limit | --memory-limit | --seed | --fuzz | --jobs | --reproduce | --explain | --extension | --runs | --reason | --repeat | --time)
    return
    ;;
  esac
  case $command in
  '') options="list explain scan profile types import show graph check new uid help disable enable bisect --help --version" ;;
  list) options="$common --host" ;;
  disable) options="--cache --reason --help" ;;
  enable) options="--cache --help" ;;
  bisect) options="$common $limits --repeat --time --running-is-good --ask" ;;
  explain) options="$common $limits --host --load" ;;
  scan) options="$common $limits --host --retry --jobs" ;;
  profile) options="$common $limits --runs --svg" ;;
  import) options="$common $limits --save --guarded" ;;
  graph) options="$common $limits --output --svg" ;;
  check)
    options="--path --host --sample --fail-on --suppress --seed --fuzz --reproduce --in-process"
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
  explain | import | show | check | disable | enable | bisect)
    if [[ $current != -* ]]; then
      compopt -o filenames 2>/dev/null
      mapfile -t COMPREPLY < <(compgen -f -- "$current")
    fi
    ;;
  esac
}
complete -F _mzcomponents mzcomponents
