#!/usr/bin/env bash
# What a person sees on a real terminal: the live view and the QR code of the page, in tmux.
#   screen.sh VELMORA
set -euo pipefail
velmora=$(realpath "$1")
name=velmora-screen-$$-0
views=0
folder=$(mktemp -d)
trap 'tmux -L "$name" kill-server 2>/dev/null || true; rm -rf "$folder"' EXIT
export STATE_DIRECTORY=$folder VELMORA_SETTINGS=$folder/settings.toml XDG_DATA_HOME=$folder/data
kind=screen-256color

fail() {
    echo "FAILED: $1"
    screen
    exit 1
}
begin() { # begin COLUMNS ROWS LOCALE COMMAND
    tmux -L "$name" kill-server 2>/dev/null || true
    name=velmora-screen-$$-$((++views))
    tmux -L "$name" -f /dev/null -u new-session -d -x "$1" -y "$2" \
        "env -u NO_COLOR TERM=$kind LC_ALL=$3 $4; echo ended with \$?; exec cat"
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

sqlite_count() { python3 -c 'import sqlite3, sys; print(sqlite3.connect(sys.argv[1]).execute("SELECT count(*) FROM reading").fetchone()[0])' "$1"; }
signal_child() { # the program in the pane, by a signal's name
    local shell
    shell=$(tmux -L "$name" display-message -p '#{pane_pid}')
    # shellcheck disable=SC2046
    kill -"$1" $(cat "/proc/$shell/task/$shell/children")
}

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
tmux -L "$name" send-keys Down + Enter # the second sensor becomes the first
until_seen 'q quit' "the list closes"
until_seen '^Engine RPM +[0-9]+ rpm' "the table in another order"
[[ $(screen | grep -nE '^Engine RPM +[0-9]' | cut -d: -f1) -lt $(screen | grep -nE '^Vehicle Speed.* km/h' | cut -d: -f1) ]] ||
    fail "the order that was chosen"
tmux -L "$name" send-keys '?'
until_seen 'reset minimum' "help"
tmux -L "$name" send-keys x w
until_seen '^Recording to ' "a recording begins"
tmux -L "$name" send-keys n
until_seen '^Noted in ' "a note of all values"
tmux -L "$name" send-keys w
until_seen 'Recorded to' "the recording ends"
grep -q '^Engine RPM' "$folder"/data/velmora/live/snapshot-*.txt || fail "the note holds the table"
tmux -L "$name" send-keys p
until_seen 'Performance: ' "the page of performance"
stays '0 to 100 km/h' "the goals of a run"
tmux -L "$name" send-keys p
until_seen '^Engine RPM +[0-9]+ rpm' "the values are back"
tmux -L "$name" send-keys 'C-\'
until_seen 'ended with 131' "the quit key ends the view"
[[ $(state) == "0 1" ]] || fail "the quit key leaves the terminal as it was"
[[ $(sqlite_count "$folder"/data/velmora/live/live-*.db) -gt 0 ]] || fail "readings in the recording"

# A limit that every value is beyond, the order from before, and an end by a fault.
"$velmora" settings limit.RPM 1 >/dev/null
begin 80 24 C.UTF-8 "$live"
until_seen '^Engine RPM +![0-9]+ rpm' "a value beyond its limit has a mark"
tmux -L "$name" capture-pane -pe | grep -q '31m.*Engine RPM' || fail "a value beyond its limit has a colour"
[[ $(screen | grep -nE '^Engine RPM' | cut -d: -f1) -lt $(screen | grep -nE '^Vehicle Speed' | tail -1 | cut -d: -f1) ]] ||
    fail "the order is kept"
signal_child SEGV
until_seen 'ended with 139' "a fault ends the view"
[[ $(state) == "0 1" ]] || fail "a fault leaves the terminal as it was"

begin 80 24 C.UTF-8 "NO_COLOR=1 $live"
until_seen '^Engine RPM +![0-9]+ rpm' "the view without colours"
tmux -L "$name" capture-pane -pe | grep -qP '\x1b\[[0-9;]*3[0-7]m' && fail "NO_COLOR means no colours"
signal_child ABRT
until_seen 'ended with 134' "an abort ends the view"
[[ $(state) == "0 1" ]] || fail "an abort leaves the terminal as it was"

kind=xterm-kitty
begin 80 24 C.UTF-8 "$live"
until_seen '^Engine RPM +![0-9]+ rpm' "a newer terminal is drawn to"
"$velmora" settings limit.RPM none >/dev/null
kind=nobody-knows
begin 80 24 C.UTF-8 "$live --duration 1"
until_seen 'ended with 0' "an unknown terminal gets lines"
stays '^Engine RPM: [0-9]+ rpm' "lines"
tmux -L "$name" capture-pane -pS - | grep -q '^Nothing is known of this kind of terminal, so values come in lines' ||
    fail "why there are lines"
kind=screen-256color

begin 80 24 C "$live"
until_seen '^Engine RPM +[0-9]+ rpm' "the table without UTF-8"
stays '###' "big digits without UTF-8"
screen | LC_ALL=C grep -qP '[^\x00-\x7F]' && fail "only ASCII is drawn without UTF-8"
tmux -L "$name" send-keys q
until_seen 'ended with 0' "q ends the view"

# A recording stands still where it is paused, so that its frame is exact.
{
    echo "time,Engine RPM (rpm),Coolant (°C)"
    for i in $(seq 0 59); do
        printf '2024-03-07T09:05:%02d.000Z,%d,%d\n' "$i" $((800 + i * 10)) $((20 + i))
    done
} >"$folder/drive.csv"
begin 80 24 C.UTF-8 "$velmora live --play $folder/drive.csv --speed 0.125"
until_seen '0:0[0-9] \[.*\] 0:59 0[.]125x' "the bar of time"
tmux -L "$name" send-keys Space End
until_seen 'Paused 0:59 \[={20}\] 0:59' "the end of the recording"
stays '^Engine RPM +1390 rpm +800 +1095 +1390' "values and statistics of all of it"
tmux -L "$name" send-keys Left
until_seen 'Paused 0:49' "ten seconds back"
stays '^Coolant +69 °C +20 ' "the values of then"
tmux -L "$name" send-keys q
until_seen 'ended with 0' "q ends a recording"

# A dialogue has the times of its replies, and no date.
{
    printf 'vehicle: made up\nadapter: ELM327 v1.5\nprotocol: 6\nheaders: on\n\n'
    printf -- '-> 0100\n<- 7E8 06 41 00 BE 1F A8 12\\r\\r>\n'
    for speed in 10 20 30; do
        printf -- '-> 010D\n.. 30000\n<- 7E8 03 41 0D %s\\r\\r>\n' "$speed"
    done
} >"$folder/drive.dialogue"
begin 80 24 C.UTF-8 "$velmora live --play $folder/drive.dialogue"
until_seen '0:0[0-9] \[.*\] 1:00 1x' "the bar of a dialogue"
tmux -L "$name" send-keys Space End
until_seen 'Paused 1:00' "the end of the dialogue"
stays '^Vehicle Speed Sensor +48 km/h +16 +32 +48' "values and statistics of a dialogue"
stays 'drive.dialogue, 1 sensors *$' "a dialogue has no date"
tmux -L "$name" send-keys q
until_seen 'ended with 0' "q ends a dialogue"

begin 80 24 C.UTF-8 "$live --fast"
until_seen 'Asking without the pause that spares the vehicle' "the warning of --fast"
stays 'q quit|RPM' "the table beside the warning"
tmux -L "$name" send-keys q
until_seen 'ended with 0' "q ends the fast view"

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
