#!/usr/bin/env bash
# tui-end-to-end.sh TUI TELEPHONYD DECODE DEMO: drives corvane-tui in a tmux pane
# (send-keys, capture-pane) against corvane-telephonyd and its LTE simulator:
# the root lists the sections, a section shows its rows, back keeps the
# selection, the mouse selects, opens, goes back and scrolls, a saved snapshot reads back, a resize to 60x20 and back keeps
# working, the service going away shows "Connecting..." and its return the
# tree again, and the home screen's numeric signal strength is on while it
# runs; then the same screens on a plain ASCII terminal without colour, and
# corvane-demo --tui.
set -u
tui=$1
service=$2
decode=$3
demo=$4

work=$(mktemp -d /tmp/corvane-tui-e2e.XXXXXX)
runtime="$work/run"
device="$work/device"
sessions=0
socket=""
mkdir -m 700 "$runtime"
export XDG_CONFIG_HOME="$work/config" DBUS_SESSION_BUS_ADDRESS="unix:path=$work/no-bus"
home_screen="$XDG_CONFIG_HOME/corvane/org.corvane.HomeScreen.conf"
mkdir -p "$device/OstrelInternal/Library/PreferenceBundles/Carrier Settings.bundle" "$device/var/log/corvane/snapshots"
service_pid=""

cleanup() {
  local n
  for n in $(seq 1 "$sessions"); do tmux -L "corvane-tui-e2e-$$-$n" kill-server 2>/dev/null; done
  [ -n "$service_pid" ] && kill "$service_pid" 2>/dev/null && wait "$service_pid" 2>/dev/null
  rm -rf "$work"
}
trap cleanup EXIT

fail() {
  echo "FAIL: $*" >&2
  echo "--- the screen:" >&2
  screen >&2
  exit 1
}

start_service() {
  CORVANE_RUNTIME_DIR="$runtime" "$service" --technology Quendra_LTE --seed 3 --rate 10 >>"$work/service.log" 2>&1 &
  service_pid=$!
}

screen() { tmux -L "$socket" capture-pane -p -t e2e; }
line() { screen | sed -n "$(($1 + 1))p"; }
last_lines() { screen | tail -n "$1"; }

# Waits until the screen holds the text (a fixed string), up to $2 seconds (default 10).
wait_for() {
  local text=$1 limit=${2:-10} waited=0
  until screen | grep -qF -- "$text"; do
    sleep 0.2
    waited=$((waited + 1))
    [ "$waited" -ge $((limit * 5)) ] && fail "\"$text\" did not show within ${limit} s"
  done
}

# Waits until line $1 (0 is the top) holds the text.
wait_for_line() {
  local number=$1 text=$2 waited=0
  until line "$number" | grep -qF -- "$text"; do
    sleep 0.2
    waited=$((waited + 1))
    [ "$waited" -ge 50 ] && fail "line $number does not show \"$text\""
  done
}

keys() { tmux -L "$socket" send-keys -t e2e "$@"; }

# With CORVANE_UPDATE_SCREENSHOTS set, the screen is kept as docs/tui/NAME.txt.
captures="$(cd "$(dirname "$0")/../.." && pwd)/docs/tui"
capture() {
  [ -n "${CORVANE_UPDATE_SCREENSHOTS:-}" ] || return 0
  mkdir -p "$captures"
  screen >"$captures/$1.txt"
}

start_tui() {
  # $1: the environment for the program (locale, colour); $2: the program, when not corvane-tui.
  # Each run has a tmux server of its own: one that is still going away cannot be met.
  sessions=$((sessions + 1))
  socket="corvane-tui-e2e-$$-$sessions"
  tmux -L "$socket" -u -f /dev/null new-session -d -s e2e -x 80 -y 24 \
    "env $1 XDG_CONFIG_HOME='$XDG_CONFIG_HOME' DBUS_SESSION_BUS_ADDRESS='$DBUS_SESSION_BUS_ADDRESS' \
       CORVANE_RUNTIME_DIR='$runtime' CORVANE_DEVICE_ROOT='$device' ${2:-'$tui'}; sleep 30"
}

start_service
start_tui "LANG=C.UTF-8 LC_ALL=C.UTF-8 TERM=screen-256color"

# The root screen lists the sections once the first display update has come.
wait_for "Updated " 20
for section in "Serving Cell" "Neighbours" "Reselection" "SIM Info" "PDP Context Info"; do
  screen | grep -q "^ $section  *›\$" || fail "the root does not list \"$section\" as a section"
done
line 0 | grep -q "Corvane" || fail "the title is not Corvane"
last_lines 1 | grep -q "/ filter  s save  ? keys  q quit" || fail "the status line has no key hints"
grep -q "ZLShowGSMRSSI=true" "$home_screen" || fail "the home screen's numeric signal strength is not on"
capture root

# Drilling in: Serving Cell, then its measurements, which show their rows.
keys Enter
wait_for_line 0 "Serving Cell"
line 0 | grep -q "‹ Corvane" || fail "the title line has no way back to Corvane"
keys Down Enter
wait_for_line 0 "Serving Cell Measurements"
wait_for "Measured RSRP"
screen | grep -Eq "^ Measured RSRP  +-?[0-9]+\.[0-9]{2} dBm\$" || fail "the RSRP row has no right-aligned value"
wait_for_line 22 "Version: "
capture serving-cell-measurements

# Back returns to the same selection.
keys Left
wait_for_line 0 "Serving Cell"
wait_for_line 22 "Serving Cell Measurements"
keys BSpace
wait_for_line 22 "Serving Cell"
line 0 | grep -q "‹" && fail "the root shows a way back"

# The mouse, as a terminal reports it in its basic (X10) form: ESC [ M, then
# the button, column and line, each plus 32 (and the column and line from 1).
mouse() {  # $1: button code (0 left, 3 release, 64 wheel up, 65 wheel down); $2 column, $3 line, from 0
  keys -l "$(printf "\\033[M\\$(printf %03o $(($1 + 32)))\\$(printf %03o $(($2 + 33)))\\$(printf %03o $(($3 + 33)))")"
}
click() { mouse 0 "$1" "$2"; mouse 3 "$1" "$2"; }
# A click selects a row, a second click on it opens it, a click on the title line goes back.
click 4 3
wait_for_line 22 "Reselection"
line 0 | grep -q "‹" && fail "the first click opened the row"
click 4 3
wait_for_line 0 "‹ Corvane"
line 0 | grep -q "Reselection" || fail "the second click did not open the row it selected"
click 10 0
wait_for_line 1 "Serving Cell"
line 0 | grep -q "‹" && fail "a click on the title line did not go back"
line 22 | grep -q "^ Reselection\$" || fail "back after a click did not keep the selection"
# The wheel moves the selection.
mouse 65 4 3
wait_for_line 22 "PDP Context Info"
mouse 64 4 3
wait_for_line 22 "Neighbours"
keys Home
wait_for_line 22 "Serving Cell"

# The filter keeps the rows that match.
keys Down Down Down "/" "S" "I" "M"
wait_for_line 22 "Filter: SIM_"
keys Enter
wait_for_line 0 "/SIM"
wait_for_line 22 "SIM Info"
screen | grep -q "^ SIM Info" || fail "the filter hides the matching row"
capture filter
screen | grep -q "^ Neighbours" && fail "the filter shows a row that does not match"
keys Escape
wait_for_line 2 "Neighbours"
line 0 | grep -q "/SIM" && fail "Esc did not drop the filter from the title line"

# A value too long for its row is cut short there and read whole on the
# detail line, which scrolls sideways (at 25 columns the 19-digit ICCID does
# not fit either).
tmux -L "$socket" resize-window -t e2e -x 25 -y 20
keys Home Down Down Down Enter
wait_for_line 0 "SIM Info"
keys "/" "I" "C" "C" "I" "D" Enter
wait_for_line 18 "EF-ICCID: 8900"
line 1 | grep -q "^ EF-ICCID .*…\$" || fail "the ICCID row at 25 columns is not cut short"
line 18 | grep -q "8594606\$" && fail "the detail line shows the end before scrolling"
keys "]"
wait_for_line 18 "8900101233198594606"
line 18 | grep -q "^ EF-ICCID" && fail "] did not scroll the detail line"
keys Escape Left
tmux -L "$socket" resize-window -t e2e -x 80 -y 24
wait_for_line 0 "Corvane"
wait_for_line 22 "SIM Info"

# The keys are shown by ?, and any key closes them.
keys "?"
wait_for "Any key closes this help."
capture keys
keys x
wait_for "Updated "

# A save writes a snapshot that reads back.
keys s
wait_for "Save Snapshot"
wait_for "Contents (every entry is saved):"
keys -l "rig 7 roof"
wait_for "rig 7 roof_"
capture save
keys Enter
wait_for "Saved CorvaneSnapshot-"
snapshot=$(ls "$device"/var/log/corvane/snapshots/CorvaneSnapshot-*.corvane 2>/dev/null | head -n 1)
[ -n "$snapshot" ] || fail "no snapshot file was written"
grep -q "<string>rig 7 roof</string>" "$snapshot" || fail "the snapshot lacks its description"
"$decode" --technology Quendra_LTE --quiet "$snapshot" >"$work/decoded.txt" 2>&1 || fail "the snapshot does not read back: $(cat "$work/decoded.txt")"
grep -q "Measured RSRP" "$work/decoded.txt" || fail "the snapshot read back holds no serving-cell measurement"

# A resize to 60x20 and back keeps working.
keys Home
wait_for_line 22 "Serving Cell"
tmux -L "$socket" resize-window -t e2e -x 60 -y 20
sleep 0.5
[ "$(screen | wc -l)" -eq 20 ] || fail "the pane is not 20 lines high"
wait_for_line 19 "Updated "
# The section's mark follows the right edge: column 58 of 60.
line 1 | grep -Eq "^ Serving Cell {45}›\$" || fail "at 60x20 the first row does not reach the right edge"
capture root-60x20
keys Enter
wait_for_line 0 "Serving Cell"
keys Left
tmux -L "$socket" resize-window -t e2e -x 80 -y 24
sleep 0.5
wait_for_line 23 "Updated "
wait_for_line 22 "Serving Cell"
line 1 | grep -Eq "^ Serving Cell {65}›\$" || fail "after the resize back the first row does not reach the right edge"

# The service killed and restarted: "Connecting..." and then the tree again.
kill "$service_pid"
wait "$service_pid" 2>/dev/null
service_pid=""
wait_for "Connecting..." 15
capture connecting
start_service
wait_for "Updated " 30
screen | grep -q "^ Serving Cell  *›\$" || fail "the tree did not come back"

# q quits, and the preference goes back.
keys q
sleep 1
screen | grep -q "Updated " && fail "q did not quit"
grep -q "ZLShowGSMRSSI=false" "$home_screen" || fail "the home screen's numeric signal strength is still on"
tmux -L "$socket" kill-server 2>/dev/null

# A plain ASCII terminal without colour.
start_tui "LANG=C LC_ALL=C NO_COLOR=1 TERM=screen"
wait_for "Updated " 20
screen | grep -q "^ Serving Cell  *>\$" || fail "on an ASCII terminal the sections are not marked with >"
keys Enter
wait_for_line 0 "< Corvane"
capture serving-cell-ascii
tmux -L "$socket" capture-pane -e -p -t e2e | grep -q $'\e\\[3[0-7]m' && fail "colour although NO_COLOR is set"
# The terminal hung up (as when an SSH connection drops): it ends cleanly, the preference set back.
grep -q "ZLShowGSMRSSI=true" "$home_screen" || fail "the numeric signal strength is not on in the second run"
tmux -L "$socket" kill-server 2>/dev/null
waited=0
until grep -q "ZLShowGSMRSSI=false" "$home_screen"; do
  sleep 0.2
  waited=$((waited + 1))
  [ "$waited" -ge 25 ] && fail "a hang-up left the numeric signal strength on"
done
kill "$service_pid" 2>/dev/null
wait "$service_pid" 2>/dev/null
service_pid=""

# The demo in the terminal: its own service and device root, and the same screens.
start_tui "-u DISPLAY -u WAYLAND_DISPLAY LANG=C.UTF-8 LC_ALL=C.UTF-8 TERM=screen-256color" \
  "'$demo' --tui --technology Quendra_LTE --device-root '$work/demo-device'"
wait_for "Updated " 20
screen | grep -q "^ Serving Cell  *›\$" || fail "the demo in the terminal does not list the sections"
keys q
wait_for "corvane-demo: snapshots are saved in"
[ -d "$work/demo-device/var/log/corvane/snapshots" ] || fail "the demo made no snapshot directory in its device root"
echo "corvane-tui end to end: all passed"
