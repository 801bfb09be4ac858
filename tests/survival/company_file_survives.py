#!/usr/bin/env python3
"""The company file survives what happens to the processes that write it.

- Killed: an adder (company_adder.cpp) adding customers, items and invoices with lines is
  killed with SIGKILL at random points until all adds are done. After each kill the file
  opens in the stand-in (droqbxml company show), passes SQLite's integrity check, and holds
  exactly the adds that were answered, plus at most the one in flight, and never part of
  one (an invoice has all its lines or is not there).
- Together: two, then four adders on one file at once lose nothing.
- Kept waiting: an adder whose file another process holds locked gets QuickBooks' "could
  not open the company data file" (0x80040403) once its wait runs out, and what was added
  before stays.

usage: company_file_survives.py ADDER DROQBXML
DROQBXML_FULL_SURVIVAL=1: a thousand adds killed, 250 per adder together (else 120 and 25).
DROQBXML_SURVIVAL_SEED=N repeats a run's kill points (the seed is printed).
"""
import os
import random
import signal
import sqlite3
import subprocess
import sys
import tempfile
import threading
import time

FULL = os.environ.get("DROQBXML_FULL_SURVIVAL") == "1"
ADDS = 1000 if FULL else 120
EACH = 250 if FULL else 25
KINDS = ("customers", "items", "invoices")


def fail(message):
    print("FAILED: " + message, flush=True)
    sys.exit(1)


def lines_of(n):
    return n // 3 % 4 + 1


class Adder:
    """One adder process; `answered` fills from its reports as they arrive."""

    def __init__(self, adder, company, prefix, first, count):
        self.first = first
        self.answered = []
        self.other = []
        self.ended = False  # its output
        self.process = subprocess.Popen([adder, company, prefix, str(first), str(count)],
                                        stdout=subprocess.PIPE, text=True)
        self.reports = threading.Condition()
        self.reader = threading.Thread(target=self._read)
        self.reader.start()

    def _read(self):
        for line in self.process.stdout:
            with self.reports:
                if line.startswith("answered "):
                    self.answered.append(int(line.split()[1]))
                else:
                    self.other.append(line.strip())
                self.reports.notify_all()
        with self.reports:
            self.ended = True
            self.reports.notify_all()

    def wait_for(self, answered):
        with self.reports:
            self.reports.wait_for(lambda: len(self.answered) >= answered or self.ended)

    def finish(self):
        status = self.process.wait()
        self.reader.join()
        return status

    def in_flight(self):
        return self.answered[-1] + 1 if self.answered else self.first


def contents(company, prefix):
    """Add number -> what the file holds of it; fails on a damaged file or a partial add."""
    db = sqlite3.connect(company)
    try:
        check = db.execute("PRAGMA integrity_check").fetchall()
        if check != [("ok",)]:
            fail(f"{company}: integrity check: {check}")
        present = {}
        for kind in ("customers", "items"):
            for (name,) in db.execute(f"SELECT full_name FROM {kind} WHERE full_name LIKE ?",
                                      (prefix + "-%",)):
                present[int(name.split("-")[-1])] = (kind, None)
        orphans = db.execute("SELECT count(*) FROM invoice_lines WHERE txn NOT IN "
                             "(SELECT id FROM invoices)").fetchone()[0]
        if orphans:
            fail(f"{company}: {orphans} invoice lines without their invoice")
        for ref, lines in db.execute(
                "SELECT ref_number, (SELECT count(*) FROM invoice_lines WHERE txn = i.id) "
                "FROM invoices i WHERE ref_number LIKE ?", (prefix + "-%",)):
            present[int(ref.split("-")[-1])] = ("invoices", lines)
    finally:
        db.close()
    for n, (kind, lines) in present.items():
        if kind != KINDS[n % 3] or (lines is not None and lines != lines_of(n)):
            fail(f"add {n} of {prefix} is held as {kind} with {lines} lines: part of an add")
    return present


def create(droqbxml, folder, name):
    company = os.path.join(folder, name)
    subprocess.run([droqbxml, "company", "create", company], check=True, capture_output=True)
    return company


def killed(adder, droqbxml, folder, rng):
    company = create(droqbxml, folder, "killed.qbw")
    done, kills = 0, 0
    per_add = 0.01  # seconds, then as measured: kills land anywhere in an add
    while done < ADDS:
        started = time.monotonic()
        run = Adder(adder, company, "K", done, ADDS - done)
        run.wait_for(rng.randint(1, 8))
        if run.answered:
            per_add = (time.monotonic() - started) / len(run.answered)
        time.sleep(rng.uniform(0, per_add))
        run.process.send_signal(signal.SIGKILL)
        status = run.finish()
        if run.other or status not in (0, -signal.SIGKILL):
            fail(f"adder from {done}: exit {status}, {run.other}")
        kills += status != 0
        shown = subprocess.run([droqbxml, "company", "show", company], capture_output=True,
                               text=True)
        if shown.returncode != 0:
            fail(f"after a kill the stand-in cannot open the file: {shown.stderr}")
        present = set(contents(company, "K"))
        answered = set(range(done)) | set(run.answered)
        if not answered <= present or not present - answered <= {run.in_flight()}:
            fail(f"after a kill at {run.in_flight()}: answered but missing "
                 f"{sorted(answered - present)}, held but not answered "
                 f"{sorted(present - answered)}")
        done = max(present) + 1 if present else 0
    print(f"killed: {ADDS} adds, {kills} kills, the file whole after each", flush=True)


def together(adder, droqbxml, folder, count):
    company = create(droqbxml, folder, f"together{count}.qbw")
    runs = [Adder(adder, company, f"T{k}", 0, EACH) for k in range(count)]
    for k, run in enumerate(runs):
        status = run.finish()
        if status != 0 or run.answered != list(range(EACH)):
            fail(f"adder T{k} of {count}: exit {status}, {len(run.answered)} answered, "
                 f"{run.other}")
        held = contents(company, f"T{k}")
        if set(held) != set(range(EACH)):
            fail(f"adder T{k} of {count}: the file holds {sorted(held)}")
    print(f"together: {count} adders, {count * EACH} adds, none lost", flush=True)


def kept_waiting(adder, droqbxml, folder):
    company = create(droqbxml, folder, "locked.qbw")
    before = Adder(adder, company, "W", 0, 3)
    if before.finish() != 0:
        fail(f"adds before the lock: {before.other}")
    holder = sqlite3.connect(company, timeout=60, isolation_level=None)
    holder.execute("BEGIN EXCLUSIVE")
    run = Adder(adder, company, "W", 3, 3)
    status = run.finish()
    holder.execute("ROLLBACK")
    holder.close()
    expected = "error 0x80040403 Could not open the specified QuickBooks company data file."
    if status != 3 or run.answered or run.other != [expected]:
        fail(f"an adder kept waiting: exit {status}, {run.answered}, {run.other}")
    held = set(contents(company, "W"))
    if held != {0, 1, 2}:
        fail(f"after an adder was kept waiting the file holds {sorted(held)}")
    print("kept waiting: 0x80040403, and the adds made before stay", flush=True)


def main():
    if len(sys.argv) != 3:
        fail(__doc__)
    adder, droqbxml = sys.argv[1], sys.argv[2]
    seed = int(os.environ.get("DROQBXML_SURVIVAL_SEED", random.randrange(1 << 32)))
    print(f"seed {seed}", flush=True)
    with tempfile.TemporaryDirectory(prefix="droqbxml-survival-") as folder:
        killed(adder, droqbxml, folder, random.Random(seed))
        together(adder, droqbxml, folder, 2)
        together(adder, droqbxml, folder, 4)
        kept_waiting(adder, droqbxml, folder)


if __name__ == "__main__":
    main()
