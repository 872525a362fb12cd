# bash completion for nimbo-transit(1)

# Runs nimbo-transit with the folders of the line that is being completed and prints the first word of each line.
_nimbo_transit_names() {
  local folders=() i
  for ((i = 1; i < COMP_CWORD - 1; i++)); do
    case ${COMP_WORDS[i]} in
      --config | --state) folders+=("${COMP_WORDS[i]}" "${COMP_WORDS[i + 1]}") ;;
    esac
  done
  "${COMP_WORDS[0]}" "${folders[@]}" "$@" 2>/dev/null
}

_nimbo_transit() {
  local cur prev words cword
  # Names of lines hold colons.
  _init_completion -n : || return

  local command="" i
  for ((i = 1; i < cword; i++)); do
    case ${words[i]} in
      --config | --state | --static | --alerts | --mirror | --from | --key | --key-file | --header | --static-header | \
        --alerts-header | --maximum-age | --format | --now | --virtual-time | --size | --scale | --text-size | --locale) ((i++)) ;;
      -*) ;;
      *)
        case $command in
          "") command=${words[i]} ;;
          feed | favorite | settings | "settings "*) command+=" ${words[i]}" ;;
        esac
        ;;
    esac
  done

  case $prev in
    --config | --state) _filedir -d; return ;;
    --static | --alerts | --key-file) _filedir; return ;;
    --text-size)
      COMPREPLY=($(compgen -W "extraSmall small medium large extraLarge extraExtraLarge extraExtraExtraLarge
        accessibilityMedium accessibilityLarge accessibilityExtraLarge accessibilityExtraExtraLarge
        accessibilityExtraExtraExtraLarge" -- "$cur"))
      return
      ;;
    --format) COMPREPLY=($(compgen -W "text json waybar i3bar line" -- "$cur")); return ;;
    --from)
      COMPREPLY=($(compgen -W "$(_nimbo_transit_names feed find "" | cut -d ' ' -f 1)" -- "$cur"))
      return
      ;;
    --mirror | --key | --header | --static-header | --alerts-header | --maximum-age | \
      --now | --virtual-time | --size | --scale | --locale) return ;;
  esac

  local options="--help --config --state" names=""
  case $command in
    "") options+=" --version" names="status update render script feed lines favorite settings analytics decode" ;;
    status) options+=" --expanded --lines --planned --saved --json --format --exit-code --now --waybar --watch --notify" ;;
    update) options+=" --notify" ;;
    render) options+=" --expanded --size --scale --text-size --dark --locale --now" ;;
    script) options+=" --virtual-time" ;;
    analytics | lines | "feed list" | "favorite list") options+=" --json" ;;
    feed) names="find add edit remove list check" ;;
    "feed find") options+=" --json" ;;
    "feed add" | "feed edit")
      options+=" --static --alerts --mirror --key --key-file --header --static-header --alerts-header --combined
        --no-combined --minor-alerts --no-minor-alerts --maximum-age --force"
      ;;&
    "feed add") options+=" --from" ;;
    "feed edit") options+=" --no-keys" ;;&
    "feed edit" | "feed remove" | "feed check") names=$(_nimbo_transit_names feed list | sed -n 's/^\([^ ]*\)$/\1/p') ;;
    favorite) names="add remove move list" ;;
    "favorite add") names=$(_nimbo_transit_names lines | cut -d ' ' -f 1) ;;
    "favorite remove" | "favorite move") names=$(_nimbo_transit_names favorite list | sed -n 's/^\([^ ]*:[^ ]*\).*/\1/p') ;;
    settings) names="get set unset" ;;
    "settings "*" "*" "*) ;;
    "settings set notify") names="on off severe" ;;
    "settings set "Nimbo.*) names="true false" ;;
    "settings "*" "*) ;;
    "settings "*)
      names="notify quietHours quietDays refreshSeconds Nimbo.TransitWidget.analytics.disabled Nimbo.TransitWidget.internal.injectFakeIncidents
        Nimbo.TransitWidget.internal.randomNumberIncidents"
      ;;
  esac
  if [[ $cur == -* ]]; then
    COMPREPLY=($(compgen -W "$options" -- "$cur"))
  elif [[ $command == render ]]; then
    _filedir png
  elif [[ $command == script || $command == decode ]]; then
    _filedir
  else
    COMPREPLY=($(compgen -W "$names" -- "$cur"))
    __ltrim_colon_completions "$cur"
  fi
}

complete -F _nimbo_transit nimbo-transit
