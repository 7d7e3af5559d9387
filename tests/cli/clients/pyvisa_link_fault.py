"""Meets one of the served simulator's link faults through Debian's pyvisa-py, as a service
engineer's script would, then checks that a second client is still served. Run with
/usr/bin/python3, the fault's name and the SOCKET resource string. Exits non-zero naming
what went differently."""

import sys
import time

import pyvisa

manager = pyvisa.ResourceManager("@py")


def open_client(resource, timeout_ms=1500):
    return manager.open_resource(
        resource, read_termination="\n", write_termination="\n", timeout=timeout_ms
    )


def fails(what, action, timeout_expected=False):
    """Runs `action`, which the fault must make fail; returns the error's text."""
    try:
        got = action()
    except pyvisa.errors.VisaIOError as error:
        if timeout_expected and error.error_code != pyvisa.constants.StatusCode.error_timeout:
            sys.exit(f"{what}: expected a timeout, got {error}")
        return str(error)
    except (OSError, UnicodeDecodeError, ValueError) as error:
        if timeout_expected:
            sys.exit(f"{what}: expected a timeout, got {error!r}")
        return repr(error)
    sys.exit(f"{what}: expected a failure, got {got!r}")


def main(fault, resource):
    first = open_client(resource)
    if fault == "drop_after_commands":  # after 2
        identity = first.query("*IDN?")
        if first.query("*IDN?") != identity:
            sys.exit("the second command was not answered before the drop")
        fails("a query after the drop", lambda: first.query("*IDN?"))
    elif fault == "drop_mid_response_on":  # CALC:DATA?
        first.write("FORM REAL,64")
        first.query("SENS:SWE:MODE SING;*OPC?")
        fails("a trace cut off halfway",
              lambda: first.query_binary_values("CALC:DATA? FDATA", datatype="d"))
    elif fault == "stall_on":  # *IDN?
        fails("a reply that never comes", lambda: first.query("*IDN?"), timeout_expected=True)
        fails("the stalled connection", lambda: first.query("*OPC?"), timeout_expected=True)
    elif fault == "garbage_on":  # *IDN?
        fails("garbage for a reply", lambda: first.query("*IDN?"))
    elif fault == "split_reply_ms":  # 300
        first.timeout = 5000
        start = time.monotonic()
        identity = first.query("*IDN?")
        elapsed = time.monotonic() - start
        if not identity.startswith("Velquor") or elapsed < 0.28:
            sys.exit(f"split reply: {identity!r} after {elapsed:.3f} s")
    elif fault == "restart_after_commands":  # after 3
        first.write("SENS:SWE:POIN 11")
        if first.query("SENS:SWE:POIN?") != "11":
            sys.exit("points not set")
        first.write("*CLS")
        fails("a query after the restart", lambda: first.query("*IDN?"))
    else:
        sys.exit(f"unknown fault {fault}")
    first.close()

    second = open_client(resource)
    if not second.query("*IDN?").startswith("Velquor"):
        sys.exit("the second client got no identity")
    if fault == "restart_after_commands" and second.query("SENS:SWE:POIN?") == "11":
        sys.exit("the restart kept the volatile sweep points")
    if second.query("SYST:ERR?") != '0,"No error"':
        sys.exit("the second client found an error queued")
    second.close()
    print(f"{fault} seen as expected")


if __name__ == "__main__":
    main(sys.argv[1], sys.argv[2])
