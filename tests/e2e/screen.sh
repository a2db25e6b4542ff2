#!/usr/bin/env bash
# What a person sees on a real terminal: the live view and the QR code of the page, in tmux.
#   screen.sh VELMORA
set -euo pipefail
velmora=$(realpath "$1")
name=velmora-screen-$$-0
views=0
folder=$(mktemp -d)
trap 'tmux -L "$name" kill-server 2>/dev/null || true; rm -rf "$folder"' EXIT
export STATE_DIRECTORY=$folder VELMORA_SETTINGS=$folder/settings.toml

fail() {
    echo "FAILED: $1"
    screen
    exit 1
}
begin() { # begin COLUMNS ROWS LOCALE COMMAND
    tmux -L "$name" kill-server 2>/dev/null || true
    name=velmora-screen-$$-$((++views))
    tmux -L "$name" -f /dev/null -u new-session -d -x "$1" -y "$2" \
        "env -u NO_COLOR TERM=screen-256color LC_ALL=$3 $4; echo ended with \$?; exec cat"
    tmux -L "$name" set-option -s escape-time 0
}
screen() { tmux -L "$name" capture-pane -p; }
state() { tmux -L "$name" display-message -p '#{alternate_on} #{cursor_flag}'; }
until_seen() { # until_seen PATTERN WHAT
    for _ in $(seq 200); do
        screen | grep -qE "$1" && return
        sleep 0.05
    done
    fail "$2"
}
stays() { screen | grep -qE "$1" || fail "$2"; }

live="$velmora --port 'sim:petrol-can11?instant' live"
for size in "80 24" "200 60"; do
    # shellcheck disable=SC2086
    begin $size C.UTF-8 "$live"
    until_seen '^Engine RPM +[0-9]+ rpm' "the table at $size"
    stays '[▀▄█]{3}' "big digits at $size"
    [[ $(screen | wc -l) -le ${size#* } ]] || fail "too many lines at $size"
done
tmux -L "$name" resize-window -x 60 -y 20
until_seen 'q quit' "the view after the window has shrunk"

tmux -L "$name" send-keys -H 1b
sleep 0.06
tmux -L "$name" send-keys -H 5b 42 # an arrow key in two pieces
tmux -L "$name" send-keys Escape
sleep 0.4
[[ $(state) == "1 0" ]] || fail "an arrow key in pieces or an Escape ended the view"
tmux -L "$name" send-keys h
until_seen 'Held' "hold"
tmux -L "$name" send-keys h s
until_seen 'Which sensors' "the list of sensors"
tmux -L "$name" send-keys Escape
until_seen 'q quit' "Escape closes the list"
tmux -L "$name" send-keys 'C-\'
until_seen 'ended with 131' "the quit key ends the view"
[[ $(state) == "0 1" ]] || fail "the quit key leaves the terminal as it was"

begin 80 24 C "$live"
until_seen '^Engine RPM +[0-9]+ rpm' "the table without UTF-8"
stays '###' "big digits without UTF-8"
screen | LC_ALL=C grep -qP '[^\x00-\x7F]' && fail "only ASCII is drawn without UTF-8"
tmux -L "$name" send-keys q
until_seen 'ended with 0' "q ends the view"

begin 100 50 C.UTF-8 "$velmora --port 'sim:petrol-can11?instant' --quiet dash --listen 127.0.0.1:0 --allow-clear"
until_seen 'http://127[.]0[.]0[.]1:[0-9]+/#t=' "the link of the page"
until_seen '[▀▄█]{5}' "the QR code"
sleep 0.2
screen >"$folder/screen"
python3 - "$folder" <<'PYTHON'
import sys
folder = sys.argv[1]
lines = [line.rstrip("\n") for line in open(folder + "/screen", encoding="utf-8")]
rows = [line for line in lines if set(line) <= set(" ▀▄█")]
width = max(len(line) for line in rows)
pixels = []
for line in rows:
    line = line.ljust(width)
    for half in ("▀█", "▄█"):
        pixels.append([0 if each in half else 255 for each in line])
scale = 6
edge = [[255] * width] * 4
with open(folder + "/code.pgm", "w") as out:
    picture = edge + pixels + edge
    out.write(f"P2\n{width * scale + 48} {len(picture) * scale}\n255\n")
    for row in picture:
        for _ in range(scale):
            out.write(" ".join(["255"] * 24 + [str(value) for value in row for _ in range(scale)] + ["255"] * 24) + "\n")
PYTHON
link=$(grep -oE 'http://127[^ ]*' "$folder/screen" | head -n 1)
read=$(zbarimg --nodbus -q --raw "$folder/code.pgm") || fail "the QR code can't be read"
[[ $read == "$link" ]] || fail "the QR code says $read, the link is $link"

tmux -L "$name" send-keys C-c
until_seen 'ended with 0' "Ctrl-C ends the page"
echo "all of the screen is as it should be"
