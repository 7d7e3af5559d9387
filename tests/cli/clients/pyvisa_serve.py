"""Drives `rcvrchar serve` through Debian's pyvisa with its pure-Python back end, as a
service engineer's script would. Run with /usr/bin/python3 and a VISA resource string.
Exits non-zero on the first wrong answer, naming it."""

import math
import sys

import pyvisa


def expect(what, got, wanted):
    if got != wanted:
        sys.exit(f"{what}: got {got!r}, expected {wanted!r}")


def close(what, got, wanted, tolerance):
    expect(f"{what} count", len(got), len(wanted))
    for i, (g, w) in enumerate(zip(got, wanted)):
        if not math.isclose(g, w, rel_tol=tolerance, abs_tol=1e-12):
            sys.exit(f"{what}[{i}]: got {g!r}, expected {w!r}")


def main(resource):
    manager = pyvisa.ResourceManager("@py")
    analyzer = manager.open_resource(
        resource, read_termination="\n", write_termination="\n", timeout=10000
    )
    if not analyzer.query("*IDN?").strip():
        sys.exit("*IDN?: empty")
    analyzer.write("NO:SUCH:COMMAND")
    if not analyzer.query("SYST:ERR?").startswith("-113,"):
        sys.exit("a bad command left no -113 in the error queue")
    analyzer.write("FORM ASC;:FORM:BORD NORM")
    expect("compound query", analyzer.query("FORM?;FORM:BORD?"), "ASC,0;NORM")

    analyzer.write("CALC:PAR:DEL:ALL")
    analyzer.write('CALC:PAR:DEF:EXT "ratio","A/R1,1"')
    analyzer.write("SENS:SWE:TYPE SEGM")
    segments = "SSTOP,2, 1,3,1e9,2e9,1000,0,-10, 1,2,5e9,6e9,1000,0,0"
    analyzer.write("SENS:SEGM:LIST " + segments)
    listed = analyzer.query_ascii_values("SENS:SEGM:LIST? SSTOP")
    close("segment list", listed, [2, 1, 3, 1e9, 2e9, 1000, 0, -10, 1, 2, 5e9, 6e9, 1000, 0, 0], 0)
    analyzer.write("SENS:SEGM:POW:CONT ON")
    analyzer.write("SENS:SWE:MODE SING")
    expect("*OPC?", analyzer.query("*OPC?"), "1")
    expect("sweep mode after a single sweep", analyzer.query("SENS:SWE:MODE?"), "HOLD")
    analyzer.write('CALC:PAR:SEL "ratio"')
    ascii = analyzer.query_ascii_values("CALC:DATA? FDATA")
    expect("trace points", len(ascii), 5)
    for bits, datatype, tolerance in ((32, "f", 1e-6), (64, "d", 1e-10)):
        for order, big in (("NORM", True), ("SWAP", False)):
            analyzer.write(f"FORM:BORD {order};:FORM REAL,{bits}")
            values = analyzer.query_binary_values(
                "CALC:DATA? FDATA", datatype=datatype, is_big_endian=big
            )
            close(f"REAL,{bits} {order}", values, ascii, tolerance)
    analyzer.write("FORM ASC")

    payload = bytes(range(256)) * 40 + b"\n\r;\"#"
    analyzer.write_binary_values('MMEM:TRAN "C:\\pyvisa.bin",', payload, datatype="B")
    back = analyzer.query_binary_values(
        'MMEM:TRAN? "C:\\pyvisa.bin"', datatype="B", container=bytes
    )
    expect("file read back", back, payload)
    expect("errors at the end", analyzer.query("SYST:ERR?"), '0,"No error"')

    if resource.endswith("INSTR"):
        analyzer.write("*IDN?")
        analyzer.clear()  # device clear drops the unread response
        if analyzer.read_stb() & 0x10:
            sys.exit("message available after a device clear")
        analyzer.lock_excl()
        if not analyzer.query("*IDN?").strip():
            sys.exit("*IDN? while locked: empty")
        analyzer.unlock()
    analyzer.close()
    print("pyvisa serve client passed")


if __name__ == "__main__":
    main(sys.argv[1])
