"""The shared library exports exactly what the headers declare with TAVIRPELO_API, and runs no initialiser
when it is loaded.

The headers go through the preprocessor first, since some declare a family through a macro.
"""
import argparse
import pathlib
import re
import subprocess
import sys

parser = argparse.ArgumentParser()
for option in ("compiler", "nm", "source", "library"):
    parser.add_argument("--" + option, required=True)
arguments = parser.parse_args()
root = pathlib.Path(arguments.source)

MARK = r'extern "C" __attribute__\(\(visibility\("default"\)\)\)'
# The declared name: before the parameter list, or last in front of ';', '=' or an array's '['.
NAME = re.compile(MARK + r"[^;{}()=\[]*?([A-Za-z_]\w*)\s*(?:\(|;|=|\[)")


def declared(headers):
    """Names that the headers declare; every declaration must yield one."""
    includes = "".join(f'#include "{header}"\n' for header in headers)
    command = [arguments.compiler, "-std=c++20", "-E", "-P", "-x", "c++",
               f"-I{root}", f"-I{root / 'include'}", "-"]
    text = subprocess.run(command, input=includes, capture_output=True, check=True, text=True).stdout
    names = NAME.findall(text)
    assert len(names) == len(re.findall(MARK, text)), "a declaration was not understood"
    return set(names)


def headers_under(*folders):
    return sorted(h.relative_to(root) for folder in folders for h in (root / folder).rglob("*.h"))


public = declared(headers_under("include"))
interface = declared(headers_under("include", "platform", "codec", "slideshow"))


def symbols(*options):
    return subprocess.run([arguments.nm, *options, "--defined-only", arguments.library],
                          capture_output=True, check=True, text=True).stdout


table = symbols("-D")
exported = {line.split()[-1].split("@")[0] for line in table.splitlines() if line.strip()}

assert len(public) > 50, "the public headers were not read"
for title, names in (("exported, but declared in no header", exported - interface - {"JNI_OnLoad"}),
                     ("declared in a public header, but not exported", public - exported),
                     ("declared in an internal header, but not exported", interface - public - exported)):
    for name in sorted(names):
        print(f"{title}: {name}")
print(f"{len(exported)} names exported, {len(public)} of them public")
initialisers = re.findall(r"_GLOBAL__sub_I_\S*", symbols())
print("initialisers at load:", initialisers)
sys.exit(exported - {"JNI_OnLoad"} != interface or bool(initialisers))
