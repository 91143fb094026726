"""Checks what the shared library shows: its soname, and no symbol that is not
the library's public face.

Usage: check_symbols.py LIBRARY SONAME
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
    # Stream operators, and what the inline formulas report through.
    r"|^operator(<<|>>)\(std::[io]stream&, Kvo"
    r"|^zt_geometry::(illegal_|division_by_)")
# Templates of the standard library that the compiler put in here.
STANDARD = re.compile(r"^((\w+ )*for )?[\w:<>*&, ]*(std::|__gnu_cxx::)")


def output_of(*command):
    return subprocess.run(command, check=True, capture_output=True,
                          text=True).stdout


def main():
    library, soname = sys.argv[1:]
    faults = []
    if f"Library soname: [{soname}]" not in output_of("readelf", "-dW", library):
        faults.append(f"the soname is not {soname}")
    names = []
    for line in output_of("nm", "-D", "--defined-only", "--demangle",
                          library).splitlines():
        address, kind, name = line.split(" ", 2)
        names.append(name)
        if not (PUBLIC.match(name) or STANDARD.match(name)):
            faults.append(f"shows {name}")
    for wanted in ("ZtErrHandler::handlerStack", "KvoObject::classInfo"):
        if wanted not in names:
            faults.append(f"does not show {wanted}")
    print("\n".join(faults) or f"symbols: {len(names)}, all public")
    return 1 if faults else 0


if __name__ == "__main__":
    sys.exit(main())
