"""python -m pxfx batch OP INPUTS... -o DIR [--PARAM VALUE]... [--scheduler ADDRESS]
[--workers N] [--ext png|jpg|bmp]: one operation over many pictures on Dask
(see pxfx.batch). Exit status 0 when every picture was written, 1 when some
failed, 2 on a usage error."""

import argparse
import sys

from . import _BY_NAME
from .batch import EXTENSIONS, run


def _parser():
    p = argparse.ArgumentParser(prog="python -m pxfx", description="pxfx operations over picture files")
    sub = p.add_subparsers(dest="command", required=True)
    b = sub.add_parser(
        "batch",
        help="one operation over many pictures, as Dask tasks",
        description="Runs OP over INPUTS, writing DIR/STEM-OP.EXT; operation parameters as --NAME VALUE.",
    )
    b.add_argument("op")
    b.add_argument("inputs", nargs="+")
    b.add_argument("-o", dest="out_dir", required=True)
    b.add_argument("--scheduler", help="address of a running Dask scheduler (default: a local cluster)")
    b.add_argument("--workers", type=int, default=2, help="worker processes of the local cluster (default 2)")
    b.add_argument("--ext", choices=EXTENSIONS, default="png")
    return p


def _params(op, words):
    """The operation's parameters from --NAME VALUE pairs."""
    names = {p.name: p for p in op.params}
    params = {}
    if len(words) % 2:
        raise ValueError(f"{words[-1]} needs a value")
    for flag, text in zip(words[::2], words[1::2]):
        p = names.get(flag[2:]) if flag.startswith("--") else None
        if p is None:
            raise ValueError(f"{op.name} has no parameter {flag} (it takes: {', '.join(names) or 'none'})")
        try:
            params[p.keyword] = float(text)
        except ValueError:
            raise ValueError(f"{flag} takes a number, not {text!r}") from None
    return params


_OPTIONS = ("-o", "--scheduler", "--workers", "--ext", "-h", "--help")


def _split(argv):
    """The command line without the operation's --NAME VALUE pairs, and those pairs."""
    own, words = [], []
    i = 0
    while i < len(argv):
        a = argv[i]
        if a.startswith("--") and a.split("=")[0] not in _OPTIONS:
            taken = a.split("=", 1) if "=" in a else argv[i : i + 2]
            words += taken
            i += 1 if "=" in a else 2
        else:
            own.append(a)
            i += 1
    return own, words


def main(argv=None):
    parser = _parser()
    own, rest = _split(sys.argv[1:] if argv is None else argv)
    args = parser.parse_args(own)
    op = _BY_NAME.get(args.op)
    if op is None:
        parser.error(f"unknown operation {args.op!r} (see pxfx.operations())")
    if args.workers < 1:
        parser.error("--workers takes 1 or more")
    try:
        params = _params(op, rest)
    except ValueError as e:
        parser.error(str(e))
    try:
        failures = run(op.name, args.inputs, args.out_dir, params, ext=args.ext, scheduler=args.scheduler,
                       workers=args.workers)
    except ValueError as e:
        parser.error(str(e))
    except OSError as e:
        print(f"python -m pxfx: {e}", file=sys.stderr)
        return 1
    return 1 if failures else 0


if __name__ == "__main__":
    sys.exit(main())
