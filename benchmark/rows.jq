# From the lines that the cases gave to the rows of the table: an array of
# {row, name, unit, median, min, max, wanted}. `wanted` is the most that is wanted, with `at_least` the least,
# null where nothing is.
# In: all lines as one array. $scale: the divisor of all sizes.

def values($case; $metric): [.[] | select(.case == $case) | .[$metric] | select(. != null)];
def spread:
  sort | if length == 0 then null
         else {median: ((.[((length - 1) / 2 | floor)] + .[(length / 2 | floor)]) / 2), min: .[0], max: .[-1]} end;
# A row of the values; the row is left out when its case gave none.
def row($number; $name; $unit; $wanted; $values):
  ($values | spread) as $spread
  | if $spread == null then empty else {row: $number, name: $name, unit: $unit, wanted: $wanted} + $spread end;
def at_least: . + {at_least: true};
# Each value of one case by each of the other.
def by_each($a; $b): [$a[] as $x | $b[] as $y | select($y != 0) | $x / $y];
# One metric as a percentage of another, run by run.
def percent($case; f): [.[] | select(.case == $case) | 100 * f / .ms];
# What the program itself takes of a synchronization.
def own($case): [.[] | select(.case == $case) | .ms - .remote_ms - .pc_file_ms - .wait_ms];
def calls($name): .["ms_" + $name] // 0;

def size($n): $n / $scale | floor | tostring;
def thousands: if . >= 1000 then "\(. / 1000 | floor),\(. % 1000 + 1000 | tostring | .[1:])" else tostring end;
def shown($n): $n / $scale | floor | thousands;

def decision($kind; $what):
  . as $all
  | (10000, 40000, 160000) as $n
  | "decision \($kind) \(size($n))" as $case
  | ($all | row("1"; "decide \(shown($n)) rows a side, \($what)"; "ms"; null; values($case; "ms"))),
    ($all | row("1"; "  per row"; "us"; 2; values($case; "us_per_row"))),
    ($all | row("1"; "  growth, linear is 4"; "x"; 4.5;
        by_each(values($case; "ms"); values("decision \($kind) \(size($n / 4))"; "ms"))));

def nothing:
  . as $all
  | (10000, 40000) as $n
  | "nothing \(size($n))" as $case
  | ($all | row("2"; "synchronize, nothing to do, \(shown($n)) files a side"; "ms"; null; values($case; "ms"))),
    ($all | row("2"; "  of that, both listings"; "ms"; null; values($case; "listing_ms"))),
    ($all | row("2"; "  of that, both passes"; "ms"; null; values($case; "passes_ms"))),
    ($all | row("2"; "  of that, outside of calls and waits"; "ms"; null; own($case))),
    ($all | row("2"; "  longest time without an answer"; "ms"; 100; values($case; "no_answer_ms"))),
    ($all | row("2"; "  bar's last look (100 ms sleep), not in the above"; "ms"; null; values($case; "end_sleep_ms"))),
    ($all | row("2"; "  growth, linear is 4"; "x"; 4.5;
        by_each(values($case; "ms"); values("nothing \(size($n / 4))"; "ms")))),
    ($all | row("2"; "  on one processor"; "ms"; null; values("\($case) one"; "ms"))),
    ($all | row("2"; "  growth on one processor"; "x"; 4.5;
        by_each(values("\($case) one"; "ms"); values("nothing \(size($n / 4)) one"; "ms")))),
    ($all | row("2"; "  growth outside of calls and waits"; "x"; 4.5; by_each(own($case); own("nothing \(size($n / 4))")))),
    ($all | row("2"; "  growth of rsync on the same folders"; "x"; null;
        by_each(values("\($case) rsync"; "ms"); values("nothing \(size($n / 4)) rsync"; "ms"))));
# What more rows cost beyond the dialog itself; a side has a row for each file and each folder of 100.
def memory:
  (30000 * 2.02 / $scale) as $more
  | row("2"; "  peak memory per row"; "bytes"; 1024;
      [values("nothing \(size(40000))"; "peak_bytes")[] as $big
       | values("nothing \(size(10000))"; "peak_bytes")[] as $small | ($big - $small) / $more]);

# The calls that the steps of a copy need. To the device: a session with its two folders to create; a session
# with create, the chunks, two time calls, close and the move to its name. What is replaced is found and deleted
# before that; what is kept is found, its backup's name looked up and taken. From the device: a session with open,
# the chunks and close; what becomes of the PC's old file takes no call.
def calls_needed($to; $bytes; $old):
  ($bytes / 8192 | floor + 1) as $chunks
  | if $to == "device" then (2 + 2) + (2 + 1 + $chunks + 2 + 1 + 1) + {new: 0, replaced: 2, kept: 3}[$old]
    else 2 + 1 + $chunks + 1 end;
# The calls of the listing that comes first are left out.
def calls_per_file($case; $files):
  [.[] | select(.case == $case)
   | (.remote_calls - .calls_CeFindAllFiles - (.calls_CeRapiFreeBuffer // 0) - 2
      - (.calls_CeRegOpenKeyEx // 0) - (.calls_CeRegQueryValueEx // 0) - (.calls_CeRegCloseKey // 0)) / $files];
def copy_calls:
  . as $all
  | (["device", "the device"], ["pc", "the PC"]) as [$to, $place]
  | (["new", "Remote API calls of a copy to \($place): new file"], ["replaced", "  file replaced"],
     ["kept", "  file replaced, with a backup"]) as [$old, $name]
  | $all | row("3"; $name; "calls"; calls_needed($to; 1024; $old);
      calls_per_file("calls \($to) \($old)"; 100 / $scale));

# $looks: the share of looking whether cancelled that is wanted.
def first($case; $files; $bytes; $what; $looks):
  ([calls_needed("device", "pc"; $bytes; "new")] | add / 2) as $needed
  | row("3"; "first synchronization, \($what) a side"; "ms"; null; values($case; "ms")),
  row("3"; "  Remote API calls per file, \($needed) needed"; "calls"; $needed;
      calls_per_file($case; 2 * $files)),
  row("3"; "  in Remote API calls"; "%"; null; percent($case; .remote_ms)),
  row("3"; "  in PC file calls"; "%"; null; percent($case; .pc_file_ms)),
  row("3"; "  in waits of the copy's steps"; "%"; null; percent($case; .wait_ms)),
  row("3"; "  outside of all these"; "%"; 10; percent($case; .ms - .remote_ms - .pc_file_ms - .wait_ms)),
  row("3"; "  fixed: sessions"; "%"; null;
      percent($case; calls("CeRapiInitEx") + calls("CeRapiUninit") + calls("MsgWaitForMultipleObjects"))),
  row("3"; "  fixed: folder creation before each copy"; "%"; null;
      percent($case; calls("CeCreateDirectory") + calls("CreateDirectoryW"))),
  row("3"; "  fixed: looking whether cancelled"; "%"; $looks; percent($case; calls("WaitForSingleObject"))),
  row("3"; "  fixed: chunks of 8192 bytes"; "%"; null;
      percent($case; calls("CeReadFile") + calls("CeWriteFile") + calls("ReadFile") + calls("WriteFile"))),
  row("3"; "  longest time without an answer"; "ms"; 100; values($case; "no_answer_ms"));

def latency:
  . as $all
  | ("1", "5") as $ms
  | "latency \($ms)" as $case
  | ($all | row("4"; "100 files a side, each call \($ms) ms longer"; "ms"; null; values($case; "ms"))),
    ($all | row("4"; "  by the time of the calls and waits"; "x"; 1.05;
        [.[] | select(.case == $case) | .ms / (.remote_ms + .pc_file_ms + .wait_ms)]));

# A device whose listing alone takes seconds.
def slow:
  row("4"; "\(shown(50)) folders, each call 20 ms longer"; "ms"; null; values("slow calls"; "ms")),
  row("4"; "  of that, both listings"; "ms"; null; values("slow calls"; "listing_ms")),
  row("4"; "  longest time without an answer"; "ms"; 100; values("slow calls"; "no_answer_ms"));

# The start of two Windows programs is taken out of xcopy's time, as ours does not begin with its start.
def start: row("5"; "start of two Windows programs, taken out of xcopy's times"; "ms"; null; values("start xcopy"; "ms"));
# $wanted: {xcopy, rsync}, the least that is wanted; null where nothing is.
def instead($case; $what; $wanted):
  . as $all
  | ("xcopy", "rsync") as $tool
  | (if $tool == "xcopy" then $all | values("start xcopy"; "ms") | spread.median // 0 else 0 end) as $start
  | $all | row("5"; "\($tool), \($what), by ours"; "x"; $wanted[$tool];
      by_each([values("\($case) \($tool)"; "ms")[] | [. - $start, 0] | max]; values($case; "ms")))
  | at_least;

def lists:
  . as $all
  | (10000, 100000) as $n
  | "lists \(size($n))" as $case
  | ($all | row("6"; "manual view, \(shown($n)) entries a list: refresh, with both listings"; "ms"; null; values($case; "refresh_ms"))),
    ( ["fill a list", "first_fill_ms", 500], ["refill it", "refill_ms", 500],
      ["tick all", "select_all_ms", 300], ["untick all", "select_none_ms", 300],
      ["one tick", "tick_ms", 100], ["double click", "double_click_ms", 100],
      ["sort by date", "sort_by_date_ms", 500], ["sort by name", "sort_by_name_ms", 500],
      ["sort backwards", "sort_reverse_ms", 500], ["sort by tick", "sort_by_tick_ms", 500],
      ["to the device's page", "to_device_page_ms", 100], ["to the PC's page", "to_pc_page_ms", 100],
      ["repaint all", "repaint_ms", 100] ) as [$what, $metric, $wanted]
    | $all | row("6"; "  \($what)"; "ms"; $wanted; values($case; $metric));

def listing:
  row("7"; "device listing of \(shown(2000)) folders, per folder"; "us"; null; values("listing"; "us_per_folder")),
  row("7"; "  calls per folder"; "calls"; 2; values("listing"; "calls_per_folder")),
  row("7"; "  outside of the calls"; "%"; null; values("listing"; "outside_percent"));

def program_start: row("8"; "program's start to its painted window"; "ms"; 1000; values("start"; "painted_ms"));

[
  decision("folders"; "folders of 100"),
  decision("one"; "one folder"),
  row("1"; "decide \(shown(40000)) rows a side 2 s apart, per row"; "us"; 2; values("decision close"; "us_per_row")),
  row("1"; "decide \(shown(40000)) rows a side in another order, per row"; "us"; 2; values("decision strewn"; "us_per_row")),
  nothing,
  memory,
  first("first small"; 1000 / $scale; 20480; "\(shown(1000)) files of 20 KB"; null),
  first("first big"; 20 / $scale; 8388608; "\(shown(20)) files of 8 MB"; 1),
  copy_calls,
  latency,
  slow,
  start,
  instead("first small"; "first copy of 20 KB files"; null),
  instead("first big"; "first copy of 8 MB files"; {xcopy: 0.8, rsync: 1}),
  instead("nothing \(size(10000))"; "nothing to do"; null),
  lists,
  listing,
  program_start
]
