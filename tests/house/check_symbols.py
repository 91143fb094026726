"""Checks what the shared library shows: its soname, no symbol that is not the
library's public face, each under the version of the soname, and every one that
the sources mark as public (so a line is missing in cmake/zt_util2.map).

Usage: check_symbols.py LIBRARY SONAME STATIC_LIBRARY
"""

import re
import subprocess
import sys

# Functions that go by plain names.
CODEC = ("sizeofimage", "longimagedata", "longstoimage", "fastzoom",
         "longimageyuvdata", "decode_yuv", "ReadQuarnPix")
FREE = ("OnSignal", "BSDsignal", "checktimer")
PUBLIC = re.compile(
    r"^((non-)?virtual thunk to |vtable for |typeinfo (name )?for |"
    r"guard variable for |VTT for |construction vtable for )?"
    r"(void |operator|bool |[\w:<>*& ]+ )?((Kvo|Zt)\w*|"
    + "|".join(CODEC + FREE) + r")\b"
    # Operators, and what the inline formulas report through.
    r"|^operator[^\w(]+\((std::[io]stream&, )?Kvo"
    r"|^zt_geometry::(illegal_|division_by_)")
# Templates of the standard library that the compiler puts into objects.
STANDARD = re.compile(r"^((\w+ )*for )?([\w:<>*&, ]|decltype\(nullptr\))*"
                      r"(std::|__gnu_cxx::)")


def output_of(*command):
    return subprocess.run(command, check=True, capture_output=True,
                          text=True).stdout


def marked_as_public(archive):
    """Gives the names that the objects of a static library do not hide."""
    names = set()
    for line in output_of("readelf", "-sW", archive).splitlines():
        words = line.split()
        if (len(words) == 8 and words[4] in ("GLOBAL", "WEAK", "UNIQUE")
                and words[5] == "DEFAULT" and words[6] != "UND"):
            names.add(words[7])
    return names


def demangled(names):
    text = "\n".join(names) + "\n"
    return subprocess.run(["c++filt"], input=text, check=True,
                          capture_output=True, text=True).stdout.splitlines()


def main():
    library, soname, archive = sys.argv[1:]
    version = "@@ZT_UTIL2_" + soname.rpartition(".")[2]
    faults = []
    if f"Library soname: [{soname}]" not in output_of("readelf", "-dW", library):
        faults.append(f"the soname is not {soname}")
    names = []
    for line in output_of("nm", "-D", "--defined-only", "--demangle",
                          library).splitlines():
        address, kind, name = line.split(" ", 2)
        if kind == "A":
            continue  # the version itself
        if not name.endswith(version):
            faults.append(f"shows {name} without {version}")
        name = name.removesuffix(version)
        names.append(name)
        if not PUBLIC.match(name):
            faults.append(f"shows {name}")
    shown = {line.split()[2].partition("@")[0] for line in
             output_of("nm", "-D", "--defined-only", library).splitlines()}
    for name in demangled(sorted(marked_as_public(archive) - shown)):
        if not STANDARD.match(name):
            faults.append(f"does not show {name}: cmake/zt_util2.map")
    for wanted in ("ZtErrHandler::handlerStack", "KvoObject::classInfo"):
        if wanted not in names:
            faults.append(f"does not show {wanted}")
    print("\n".join(faults) or f"symbols: {len(names)}, all public")
    return 1 if faults else 0


if __name__ == "__main__":
    sys.exit(main())
