"""Prints one table from two runs of the benchmark program: the peer with and without its SIMD code.

usage: table.py SIMD.json SCALAR.json
Times are the best of the repetitions, in milliseconds of processor time; ratios below 1 are in our favour.
"""
import json
import sys


def best(path):
    """{job: {who: (ms, heap)}}, in the order in which the program lists its jobs."""
    jobs = {}
    with open(path) as file:
        for row in sorted(json.load(file)["benchmarks"], key=lambda row: row["family_index"]):
            if row.get("error_occurred"):
                sys.exit(f"{row['name']}: {row['error_message']}")
            if row["run_type"] != "iteration":
                continue
            job, who = row["run_name"].rsplit("/", 1)
            seen = jobs.setdefault(job, {}).get(who, (float("inf"), 0))
            jobs[job][who] = (min(seen[0], row["cpu_time"]), max(seen[1], row["heap"]))
    return jobs


simd, scalar = map(best, sys.argv[1:3])
# Each ratio stays within one run: the machine may be slower in the other.
print("| job | ours ms | SIMD | SIMD fast | scalar | scalar fast | ours/SIMD | /SIMD fast | /scalar "
      "| /scalar fast | peak heap KiB |")
print("|---|" + "---:|" * 10)
for job in simd:
    times = [runs[job][who][0] for runs in (simd, scalar) for who in ("peer", "peer_fast")]
    ours = [runs[job]["ours"][0] for runs in (simd, scalar)]
    ratios = [ours[i // 2] / time for i, time in enumerate(times)]
    cells = [f"{value:.2f}" for value in (min(ours), *times, *ratios)]
    print(f"| {job} | {' | '.join(cells)} | {simd[job]['ours'][1] / 1024:.0f} |")
