"""The README's C and C++ examples are the files under samples/, which the package tests compile and run."""
import pathlib
import re
import sys

root = pathlib.Path(sys.argv[1])
readme = (root / "README.md").read_text()
failures = 0
for language, sample in (("c", "samples/thumbnail.c"), ("cpp", "samples/slides.cpp")):
    blocks = re.findall(rf"^```{language}\n(.*?)^```$", readme, flags=re.M | re.S)
    if blocks != [(root / sample).read_text()]:
        print(f"README.md: its ```{language} block is not {sample} ({len(blocks)} blocks)")
        failures += 1
for path in re.findall(r"\]\(([^)#:]+)\)", readme):
    if not (root / path).exists():
        print(f"README.md: links to {path}, which does not exist")
        failures += 1
sys.exit(failures != 0)
