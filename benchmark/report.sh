# The table, build/bench.json and build/bench.png from the lines in $raw; sourced by ./bench.
report() {
  jq -s --argjson scale "$scale" -f benchmark/rows.jq "$raw" >"$work/rows.json"
  jq -n --arg machine "$(nproc) processors, $(/usr/lib/wine/wine64 --version)" --argjson scale "$scale" \
    --slurpfile rows "$work/rows.json" --slurpfile runs "$raw" \
    '{machine: $machine, sizes_divided_by: $scale,
      counted: "remote_ms: all calls of RAPI.DLL; pc_file_ms: CreateFileW, ReadFile, WriteFile, FlushFileBuffers, CloseHandle, GetFileAttributesW, GetFileSizeEx, GetFileTime, SetFileTime, FindFirstFileW, FindNextFileW, FindClose, MoveFileExW, DeleteFileW, CreateDirectoryW; wait_ms: WaitForSingleObject and MsgWaitForMultipleObjects on the threads that work (cancel polls and session starts)",
      rows: $rows[0], runs: $runs}' >build/bench.json
  jq -r '
    def short: if . == null then "" elif . >= 100 then (. + 0.5 | floor) else (. * 100 + 0.5 | floor / 100) end | tostring;
    (["", "", "median", "min", "max", "", "wanted"]),
    (.[] | [.row, .name, (.median | short), (.min | short), (.max | short), .unit,
            (if .wanted == null then "" elif .at_least
             then ">= " + (.wanted | short) + (if .median < .wanted then "  *" else "" end)
             else "<= " + (.wanted | short) + (if .median > .wanted then "  *" else "" end) end)])
    | @tsv' "$work/rows.json" |
    awk -F'\t' '{ printf "%-2s %-62s %9s %9s %9s %-6s %s\n", $1, $2, $3, $4, $5, $6, $7 }' | tee "$work/table.txt"
  echo "* not what is wanted"

  # A row that is indented goes on with what the last one began. Where at least so much is wanted, twice as much
  # is drawn as half of it is elsewhere: left is good in all rows.
  jq -r 'reduce .[] as $r ({head: "", rows: []};
      (if $r.name | startswith("  ") then (.head | split(":")[0]) + ":" + ($r.name | ltrimstr(" ")) else $r.name end) as $name
      | (if $r.name | startswith("  ") then . else .head = $r.name end)
      | if $r.wanted == null then . else .rows += [$r + {name: $name}] end)
    | .rows | to_entries[]
    | [.key, "\(.value.row). \(.value.name)",
       (.value | if .at_least then [.wanted / ([.median, .max, .min][] | [., 0.001] | max)]
                 else [[.median, .min, .max][] as $v | [$v / .wanted, 0.001] | max] end | .[])]
    | @tsv' "$work/rows.json" >"$work/chart.tsv"
  gnuplot -e "data='$work/chart.tsv'; picture='build/bench.png'; count=$(wc -l <"$work/chart.tsv")" benchmark/chart.gp
}
