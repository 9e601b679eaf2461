#!/usr/bin/env bash
# run-decode.sh - decode six 12 MP photos (two with EXIF orientation 6) to a
# 720x1280 screen: our decoder threads in one process, side by side in the
# same run with the peers of ../shared/bench/peers.sh section (a): djpeg
# -scale 1/8 and 1/4 (serial and 2 jobs) and Pillow (draft + LANCZOS + EXIF
# transpose, 1 and 2 threads), whose Python is taken from peers.sh itself.
# Then the peak-memory rise of decoding 24 MP baseline, progressive and PNG.
#
# Usage: bench/run-decode.sh BUILD_DIR     (RUNS=7 WARMUP=1 by default)
# Output: "name: min median max (ms)" whole-process wall times, "ratio_*: min
#         median max (A/B)" from A,B,A,B... paired runs, "mem_*" lines.
# Inputs are made by bench_decode gen (libjpeg-turbo, libexif, libpng): about
# 3.9 MB per 12 MP photo at Q92 4:2:0, like the peers' 4.1 MB.
set -euo pipefail
export LC_ALL=C
BUILD=${1:?usage: run-decode.sh BUILD_DIR}
RUNS=${RUNS:-7}
WARMUP=${WARMUP:-1}
BENCH=$BUILD/bench/bench_decode
PEERS=$(dirname "$0")/../../shared/bench/peers.sh
[ -f "$PEERS" ] || PEERS=/work/shared/bench/peers.sh
PY=/usr/bin/python3
export PICTAVO_LOG_LEVEL=F

base=/dev/shm; [ -w "$base" ] || base=${TMPDIR:-/tmp}
W=$(mktemp -d "$base/rundec.XXXXXX")
trap 'rm -rf "$W"' EXIT
IN=$W/in; OUT=$W/out; mkdir -p "$IN" "$OUT"
"$BENCH" gen "$IN"
P12=("$IN"/p12_*.jpg)

us() { local t=$EPOCHREALTIME; echo "${t/./}"; }
# CPU time (user + sys) of all finished children, in microseconds, from a
# file written by `times` (which must run in this shell, not a subshell).
cpu_of() {
  awk 'NR == 2 { t = 0; for (i = 1; i <= 2; i++) { split($i, p, /[ms]/); t += p[1] * 60 + p[2] }
                 printf "%d\n", t * 1e6 }' "$1"
}
stats() {
  sort -g | awk -v n="$1" -v u="${2:-ms}" '{a[NR]=$1/1000} END {
    m = (NR % 2) ? a[(NR+1)/2] : (a[NR/2] + a[NR/2+1]) / 2
    printf "%s: %.1f %.1f %.1f (%s)\n", n, a[1], m, a[NR], u }'
}
# bench NAME CMD...: whole-process wall time, and the CPU time the command's processes used.
bench() {
  local name=$1 i t0 t1 c0 c1; shift; local ts=() cs=()
  for ((i = 0; i < WARMUP; i++)); do "$@" >/dev/null; done
  for ((i = 0; i < RUNS; i++)); do
    times >"$W/t0"; t0=$(us); "$@" >/dev/null; t1=$(us); times >"$W/t1"
    c0=$(cpu_of "$W/t0"); c1=$(cpu_of "$W/t1")
    ts+=($((t1 - t0))); cs+=($((c1 - c0)))
  done
  printf '%s\n' "${ts[@]}" | stats "$name" ms
  printf '%s\n' "${cs[@]}" | stats "$name" "ms cpu"
}
ratio() {
  local name=$1 a=$2 b=$3 i t0 t1 t2; local rs=()
  "$a" >/dev/null; "$b" >/dev/null
  for ((i = 0; i < RUNS; i++)); do
    t0=$(us); "$a" >/dev/null; t1=$(us); "$b" >/dev/null; t2=$(us)
    rs+=("$(awk -v x=$((t1 - t0)) -v y=$((t2 - t1)) 'BEGIN{printf "%.4f", x/y}')")
  done
  printf '%s\n' "${rs[@]}" | sort -g | awk -v n="$name" '{a[NR]=$1} END {
    m = (NR % 2) ? a[(NR+1)/2] : (a[NR/2] + a[NR/2+1]) / 2
    printf "%s: %.2f %.2f %.2f (A/B)\n", n, a[1], m, a[NR] }'
}

# The peers, as in peers.sh: one process per photo for djpeg, Pillow's script verbatim.
cat >"$W/one" <<'EOS'
#!/bin/sh
exec djpeg -scale "$1" -outfile "$OUT/${2##*/}.ppm" "$2"
EOS
chmod +x "$W/one"
export OUT
sed -n "/^cat >\"\$W\/peers_py.py\" <<'EOF_PY'$/,/^EOF_PY$/p" "$PEERS" | sed '1d;$d' >"$W/peers_py.py"
HAVE_PIL=0; "$PY" -c 'import PIL' 2>/dev/null && [ -s "$W/peers_py.py" ] && HAVE_PIL=1

djpeg18_serial() { for f in "${P12[@]}"; do "$W/one" 1/8 "$f"; done; }
djpeg14_serial() { for f in "${P12[@]}"; do "$W/one" 1/4 "$f"; done; }
djpeg14_2jobs() { printf '%s\n' "${P12[@]}" | xargs -d '\n' -P 2 -n 1 "$W/one" 1/4; }
pil_1thr() { "$PY" "$W/peers_py.py" decode 720x1280 1 "$OUT" "${P12[@]}"; }
pil_2thr() { "$PY" "$W/peers_py.py" decode 720x1280 2 "$OUT" "${P12[@]}"; }
ours() { "$BENCH" decode "${P12[@]}"; }
startup_ours() { "$BENCH" decode "$IN/tiny.jpg"; }

echo "# date: $(date -u '+%Y-%m-%d %H:%M UTC')  nproc: $(nproc)  load: $(cut -d' ' -f1-3 /proc/loadavg)"
echo "# $(djpeg -version 2>&1 | head -1); Pillow $([ $HAVE_PIL = 1 ] && "$PY" -c 'import PIL; print(PIL.__version__)' || echo absent)"
echo "# inputs: $(for f in "${P12[@]}"; do printf '%s:%sB ' "${f##*/}" "$(stat -c %s "$f")"; done)"
"$BENCH" decode -r 1 "${P12[@]}" | sed 's/^/# sizes: /'
"$BENCH" decode -r "$RUNS" "${P12[@]}"
bench dec6x12mp_ours_1process ours
bench dec6x12mp_djpeg18_serial djpeg18_serial
bench dec6x12mp_djpeg14_serial djpeg14_serial
bench dec6x12mp_djpeg14_2jobs djpeg14_2jobs
if [ $HAVE_PIL = 1 ]; then
  bench dec6x12mp_pil720_1thr pil_1thr
  bench dec6x12mp_pil720_2thr pil_2thr
fi
ratio ratio_ours_vs_djpeg14_2jobs ours djpeg14_2jobs
[ $HAVE_PIL = 1 ] && ratio ratio_ours_vs_pil720_2thr ours pil_2thr
for f in p24_base.jpg p24_prog.jpg p24.png; do
  echo "mem_${f}: $("$BENCH" mem "$IN/$f")"
done
