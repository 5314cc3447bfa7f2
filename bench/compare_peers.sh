#!/usr/bin/env bash
# Text <-> rbx0 conversion speed beside its peers, in one run on one core: cat (the limit), pandas
# (read_csv, to_datetime with the explicit format, written to a binary file) and DuckDB (its npm
# package, one thread, written to Parquet). Installs python3-pandas (apt) and DuckDB (npm, into a
# temporary folder) when they are missing.
#   bench/compare_peers.sh [BUILD_DIR] [ROWS]     (defaults: build, 1000000)
# BASELINE_ENGINE=path/to/an/older/Velmora adds its text <-> rbx0 and .xlsx rows, for before/after in one
# run; ENGINES_ONLY=1 leaves out the peers.
set -euo pipefail
cd "$(dirname "$0")/.."
build="${1:-build}"
rows="${2:-1000000}"
engine="$build/bin/Velmora"
[ -x "$engine" ] || { echo "no engine program at $engine; build first" >&2; exit 2; }
work="$(mktemp -d)"
trap 'rm -rf "$work"' EXIT
# Each engine runs from a copy, as an installed program would. The linker's own output file ran
# 8-12% slower here than a byte-identical copy of it (same system calls, same page faults), which
# would favour whichever build happened to be copied.
mkdir -p "$work/engines/new" "$work/engines/baseline"
cp "$engine" "$work/engines/new/Velmora"
engine="$work/engines/new/Velmora"
if [ -n "${BASELINE_ENGINE:-}" ]; then
  cp "$BASELINE_ENGINE" "$work/engines/baseline/Velmora"
  BASELINE_ENGINE="$work/engines/baseline/Velmora"
fi

if [ -z "${ENGINES_ONLY:-}" ]; then
  if ! /usr/bin/python3 -c 'import pandas' 2>/dev/null; then
    echo "installing python3-pandas ..." >&2
    (apt-get update -qq && apt-get install -y -qq python3-pandas) >/dev/null
  fi
  if [ ! -d "$work/duckdb/node_modules/@duckdb/node-api" ]; then
    echo "installing DuckDB for node into $work/duckdb ..." >&2
    mkdir -p "$work/duckdb"
    (cd "$work/duckdb" && npm init -y >/dev/null && npm install --silent @duckdb/node-api >/dev/null)
  fi
fi

echo "generating $rows rows ..." >&2
/usr/bin/python3 - "$work/series.txt" "$rows" <<'PY'
import random, sys, datetime
path, rows = sys.argv[1], int(sys.argv[2])
random.seed(1)
t, step = datetime.datetime(2000, 1, 1), datetime.timedelta(minutes=1)
with open(path, "w") as f:
    f.write("\t".join(["Undefined[Undefined]:Instantaneous"] * 10) + "\n")
    f.write("Date/time\t" + "\t".join("V%d" % i for i in range(10)) + "\n")
    for _ in range(rows):
        f.write(t.strftime("%Y/%m/%d %H:%M:%S") + "\t" + "\t".join("%.4f" % (random.random() * 1000) for _ in range(10)) + "\n")
        t += step
PY
bytes=$(stat -c %s "$work/series.txt")

setup() { # input-format input output-format output
  printf 'wpx 1\ntarget "VELMORA"\n section "INPUT"\n  Type = 1\n  File_format = %s\n  File_name = file "%s"\n end\n section "OUTPUT"\n  File_format = %s\n  File_name = file "%s"\n  Log_file = file "%s"\n end\nend\nwpx end\n' \
    "$1" "$2" "$3" "$4" "$work/log.txt" > "$work/setup.wpx"
}
# Rates are per CPU second (user + system): the machine is shared, so wall time says more about
# the neighbours than about the program. Wall seconds are shown beside them.
# Each command runs RUNS times (default 3); the run with the least CPU time is shown, since the
# neighbours only ever add to it.
measure() { # name command...
  local name="$1"; shift
  local best="" wall user sys kb
  for ((run = 0; run < ${RUNS:-3}; run++)); do
    "$work/rusage.py" "$work/time" "$@" >/dev/null
    read -r w u s k < "$work/time"
    if [ -z "$best" ] || awk -v a="$u" -v b="$s" -v c="$best" 'BEGIN { exit !(a + b < c) }'; then
      best=$(awk -v a="$u" -v b="$s" 'BEGIN { print a + b }'); wall=$w; user=$u; sys=$s; kb=$k
    fi
  done
  awk -v n="$name" -v w="$wall" -v u="$user" -v s="$sys" -v kb="$kb" -v b="$bytes" -v r="$rows" \
    'BEGIN { c = u + s; if (c < 0.005) c = 0.005;
             printf "| %-28s | %6.2f | %6.3f | %8.1f | %10.0f | %7.1f |\n", n, w, c, b / c / 1e6, r / c, kb / 1024 }'
}

# /usr/bin/time rounds CPU seconds to hundredths, a tenth of the engine's time: the CPU time comes
# from the kernel's resource usage of the child tree (microseconds), the peak from /usr/bin/time,
# whose own start-up is a fraction of a millisecond. (The wrapper's own peak would hide the child's:
# a fork starts with the parent's resident size.)
cat > "$work/rusage.py" <<'PY'
#!/usr/bin/python3
import resource, subprocess, sys, time
peak_file = sys.argv[1] + ".peak"
start = time.monotonic()
subprocess.run(["/usr/bin/time", "-f", "%M", "-o", peak_file] + sys.argv[2:], check=True)
wall = time.monotonic() - start
usage = resource.getrusage(resource.RUSAGE_CHILDREN)
with open(peak_file) as f:
    peak_kb = int(f.read().split()[-1])
with open(sys.argv[1], "w") as out:
    out.write("%.3f %.4f %.4f %d\n" % (wall, usage.ru_utime, usage.ru_stime, peak_kb))
PY
chmod +x "$work/rusage.py"
cat > "$work/pandas_read.py" <<'PY'
import sys, numpy, pandas
frame = pandas.read_csv(sys.argv[1], sep="\t", skiprows=[0])
stamps = pandas.to_datetime(frame.iloc[:, 0], format="%Y/%m/%d %H:%M:%S")
with open(sys.argv[2], "wb") as out:
    stamps.to_numpy().astype("int64").tofile(out)
    frame.iloc[:, 1:].to_numpy(dtype=numpy.float64).tofile(out)
PY
mkdir -p "$work/duckdb"
cat > "$work/duckdb/convert.mjs" <<'JS'
import { DuckDBInstance } from "@duckdb/node-api";
const instance = await DuckDBInstance.create(":memory:", { threads: "1" });
const connection = await instance.connect();
await connection.run(`COPY (SELECT strptime("Date/time", '%Y/%m/%d %H:%M:%S') AS stamp, * EXCLUDE ("Date/time")
  FROM read_csv('${process.argv[2]}', delim='\t', skip=1, header=true, types={'Date/time': 'VARCHAR'})) TO '${process.argv[3]}' (FORMAT parquet)`);
JS

echo "| What (one core)              | wall s |  CPU s | MB/CPU s | rows/CPU s | peak MB |"
echo "|------------------------------|--------|--------|----------|------------|---------|"
measure "cat" cat "$work/series.txt"
# One engine's round trips: the whole text to rbx0 and back, then a tenth of it to .xlsx and back.
measure_engine() { # label engine
  local label="$1" program="$2"
  setup 2 "$work/series.txt" 1 "$work/$label.rbx0"
  measure "$label text -> rbx0" "$program" "$work/setup.wpx" 1 --threads 1 --quiet
  setup 1 "$work/$label.rbx0" 2 "$work/$label.txt"
  measure "$label rbx0 -> text" "$program" "$work/setup.wpx" 1 --threads 1 --quiet
  bytes=$(stat -c %s "$work/tenth.txt"); rows=$((rows_all / 10))
  setup 2 "$work/tenth.txt" 3 "$work/$label.xlsx"
  measure "$label text -> xlsx (1/10)" "$program" "$work/setup.wpx" 1 --threads 1 --quiet
  setup 3 "$work/$label.xlsx" 1 "$work/$label-tenth.rbx0"
  measure "$label xlsx -> rbx0 (1/10)" "$program" "$work/setup.wpx" 1 --threads 1 --quiet
  bytes=$bytes_all; rows=$rows_all
}
head -n $((rows / 10 + 2)) "$work/series.txt" > "$work/tenth.txt"
bytes_all=$bytes; rows_all=$rows
measure_engine Velmora "$engine"
[ -z "${BASELINE_ENGINE:-}" ] || measure_engine baseline "$BASELINE_ENGINE"
[ -n "${ENGINES_ONLY:-}" ] && exit 0
measure "pandas read_csv + binary" /usr/bin/python3 "$work/pandas_read.py" "$work/series.txt" "$work/pandas.bin"
measure "DuckDB 1 thread + Parquet" node "$work/duckdb/convert.mjs" "$work/series.txt" "$work/duck.parquet"
