"""Drives the transport test instrument through Debian's pyvisa with its pure-Python back
end: run with /usr/bin/python3 and a VISA resource string. Exits non-zero on the first
wrong answer, naming it."""

import sys

import pyvisa


def expect(what, got, wanted):
    if got != wanted:
        sys.exit(f"{what}: got {got!r}, expected {wanted!r}")


def main(resource):
    manager = pyvisa.ResourceManager("@py")
    instrument = manager.open_resource(
        resource, read_termination="\n", write_termination="\n", timeout=5000
    )
    expect("*IDN?", instrument.query("*IDN?"), "FAKE,LAN-TEST,0,1.0")

    instrument.write("BOGUS:COMMAND")
    expect("error after a bad command", instrument.query("SYST:ERR?"), '-113,"Undefined header"')
    expect("error queue emptied", instrument.query("SYST:ERR?"), '0,"No error"')

    block = instrument.query_binary_values("BLOCK? 100000", datatype="B", container=bytes)
    expect("block length", len(block), 100000)
    expect("block bytes", block, bytes(i * 7 % 256 for i in range(100000)))

    # A write larger than pyvisa's chunk, carrying a block full of NL bytes.
    values = [float(i) for i in range(3000)]
    instrument.write_binary_values("DATA ", values, datatype="d")
    expect("query after a block write", instrument.query("ECHO? after"), "after")

    for i in range(50):
        expect("query in a row", instrument.query(f"ECHO? {i}"), str(i))

    if resource.endswith("INSTR"):
        instrument.clear()
        expect("status byte", instrument.read_stb(), 0)
        instrument.lock_excl()
        expect("query while locked", instrument.query("ECHO? locked"), "locked")
        instrument.unlock()
    instrument.close()
    print("pyvisa client passed")


if __name__ == "__main__":
    main(sys.argv[1])
