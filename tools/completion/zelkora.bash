# bash completion for zelkora: the program itself tells what can follow.

_zelkora() {
  local words
  mapfile -t words < <("$1" --complete "${COMP_WORDS[@]:1:COMP_CWORD}" 2>/dev/null)
  COMPREPLY=()
  local word
  for word in "${words[@]}"; do
    if [ "$word" = FILE ]; then
      compopt -o filenames
      mapfile -t COMPREPLY -O "${#COMPREPLY[@]}" < <(compgen -f -- "$2")
    else
      [[ $word != *= ]] || compopt -o nospace
      COMPREPLY+=("$word")
    fi
  done
}
complete -F _zelkora zelkora
