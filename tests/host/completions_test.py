#!/usr/bin/python3
"""Completions as the shells make them. usage: completions_test.py bash|zsh|fish NIMBO_TRANSIT DATA_FOLDER
Exits with 77, which skips the test, where the shell is missing."""
import os
import pathlib
import re
import shutil
import subprocess
import sys
import tempfile

from cities import publish

shell, command_line, data = sys.argv[1:]
data = pathlib.Path(data, "completions")
KEY = "Nimbo.TransitWidget.analytics.disabled"

# What is typed, and what is offered; "..." stands for more.
CASES = {
    "nimbo-transit upd": ["update"],
    "nimbo-transit status --exp": ["--expanded"],
    "nimbo-transit status --format js": ["json"],
    "nimbo-transit feed add --from 160": ["1603", "..."],
    "nimbo-transit feed remove ": ["other", "town"],
    "nimbo-transit --config CITY feed check ": ["sole"],
    "nimbo-transit favorite add town:": ["town:m1", "town:m2", "town:m3"],
    "nimbo-transit favorite remove ": ["town:m2"],
    "nimbo-transit settings se": ["set"],
    "nimbo-transit settings set Nimbo.TransitWidget.ana": [KEY],
    f"nimbo-transit settings set {KEY} ": ["false", "true"],
    "nimbo-transit settings set notify ": ["off", "on", "severe"],
    "nimbo-transit settings set quietHours ": [],
    f"nimbo-transit settings unset {KEY} ": [],
    "nimbo-transit-layer --layer o": ["overlay"],
}

BASH = """
source /usr/share/bash-completion/bash_completion
for file in "$1"/*.bash; do source "$file"; done
while IFS= read -r COMP_LINE; do
  IFS=$'\\t' read -r -a COMP_WORDS
  # The last word may be empty, which bash does not read.
  [[ $COMP_LINE != *" " ]] || COMP_WORDS+=("")
  COMP_POINT=${#COMP_LINE} COMP_CWORD=$((${#COMP_WORDS[@]} - 1)) COMP_TYPE=9 COMPREPLY=()
  function=$(complete -p "${COMP_WORDS[0]}" | sed 's/.*-F \\([^ ]*\\) .*/\\1/')
  "$function" "${COMP_WORDS[0]}" "${COMP_WORDS[COMP_CWORD]}" "${COMP_WORDS[COMP_CWORD - 1]}"
  [[ ${#COMPREPLY[@]} -eq 0 ]] || printf '%s\\n' "${COMPREPLY[@]}"
  echo .
done
"""

# An interactive zsh at a terminal of its own, which keeps what is offered to the line editor.
ZSH_INSIDE = """
PS1= PS2= fpath=($DATA $fpath)
autoload -Uz compinit && compinit -u -D
compadd() {
  # Those that look for matches alone offer none.
  if (( ! ${argv[(I)-[AOD]]} )); then
    local -a offered
    builtin compadd -O offered "$@"
    (( ! $#offered )) || print -rl -- $offered >>$OFFERS
  fi
  builtin compadd "$@"
}
zle -C offer complete-word _main_complete
offer-all() { zle offer; BUFFER=; print -r -- . >>$OFFERS; zle -M the''-end; }
zle -N offer-all && bindkey '^I' offer-all
print all''-set
"""
ZSH = """
zmodload zsh/zpty || exit 77
zpty terminal zsh -f -i
zpty -w terminal 'source $INSIDE'
zpty -r terminal seen '*all-set*' || exit 1
while IFS= read -r line; do
  zpty -w -n terminal $line$'\\t'
  zpty -r terminal seen '*the-end*' || exit 1
done
"""

FISH = """
for file in $DATA/*.fish; source $file; end
while read -l line
  complete -C "$line" | string replace -r '\\t.*' ''
  echo .
end
"""


def offered(home, lines):
    """What the shell offers for each of the lines."""
    def run(*command, typed):
        done = subprocess.run(command, input=typed, text=True, stdout=subprocess.PIPE, timeout=120)
        if done.returncode:
            sys.exit(done.returncode)
        return done.stdout

    typed = "".join(line + "\n" for line in lines)
    os.environ["DATA"] = str(data)
    if shell == "bash":
        # Bash takes colons and equals signs for words of their own.
        words = ["\t".join(re.findall(r"[^\s:=]+|[:=]+", line)) for line in lines]
        text = run("bash", "--norc", "-c", BASH, "bash", data,
                   typed="".join(f"{line}\n{split}\n" for line, split in zip(lines, words)))
    elif shell == "zsh":
        os.environ["INSIDE"], os.environ["OFFERS"] = home + "/inside", home + "/offers"
        pathlib.Path(home, "inside").write_text(ZSH_INSIDE)
        run("zsh", "-f", "-c", ZSH, typed=typed)
        text = pathlib.Path(home, "offers").read_text()
    else:
        text = run("fish", "--no-config", "-c", FISH, typed=typed)
    answers = text.split(".\n")
    assert len(answers) == len(lines) + 1, text
    return [sorted(set(answer.split())) for answer in answers[:-1]]


if not shutil.which(shell) or shell == "bash" and not os.path.exists("/usr/share/bash-completion/bash_completion"):
    print(f"{shell} with its completion is not installed: tools/setup.sh test installs it")
    sys.exit(77)
with tempfile.TemporaryDirectory() as home:
    city = pathlib.Path(home, "city")
    publish(city, [])
    os.environ.update(HOME=home, LC_ALL="C.UTF-8", TERM="dumb", XDG_CONFIG_HOME=home + "/config",
                      XDG_STATE_HOME=home + "/state", XDG_DATA_HOME=home + "/share", XDG_CACHE_HOME=home + "/cache",
                      PATH=os.pathsep.join([os.path.dirname(command_line), os.environ["PATH"]]))
    for arguments in (["feed", "add", "town"], ["feed", "add", "other"], ["--config", str(city), "feed", "add", "sole"]):
        subprocess.run([command_line, *arguments, "--static", city, "--alerts", city / "alerts.pb"], check=True,
                       stdout=subprocess.DEVNULL)
    subprocess.run([command_line, "favorite", "add", "town:m2"], check=True)
    faults = []
    for (line, wanted), found in zip(CASES.items(), offered(home, [line.replace("CITY", str(city)) for line in CASES])):
        if shell == "bash" and ":" in line:
            found = ["town:" + name for name in found]  # bash keeps what stands before the colon
        if not line.split(" ")[-1].startswith("-"):
            found = [name for name in found if not name.startswith("-")]  # zsh offers options where nothing else may stand
        rest = [name for name in wanted if name != "..."]
        if not (set(rest) <= set(found) if rest != wanted else found == rest):
            faults.append(f"{line!r}: {found} instead of {wanted}")
    sys.exit("\n".join(faults) or None)
