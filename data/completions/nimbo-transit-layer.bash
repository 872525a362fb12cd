# bash completion for nimbo-transit-layer(1)

_nimbo_transit_layer() {
  local cur prev words cword
  _init_completion || return
  case $prev in
    --layer) COMPREPLY=($(compgen -W "background bottom top overlay" -- "$cur")) ;;
    --anchor)
      COMPREPLY=($(compgen -W "top-left top top-right left center right bottom-left bottom bottom-right" -- "$cur"))
      ;;
    --config | --state) _filedir -d ;;
    --margin | --output | --width) ;;
    *)
      COMPREPLY=($(compgen -W "--layer --anchor --margin --output --width --expanded --config --state --help --version" \
        -- "$cur"))
      ;;
  esac
}

complete -F _nimbo_transit_layer nimbo-transit-layer
