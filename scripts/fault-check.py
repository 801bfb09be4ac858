#!/usr/bin/env python3
"""Plants deliberate faults, one per area, and checks that the test suite catches each.

Works in a scratch copy of the committed tree (a git worktree), so the checkout stays as it
is: for every fault it changes one place in the source, rebuilds the ordinary test build
and runs the tests; a fault is caught when some test fails. Prints a line per fault and
exits 1 when any fault goes unnoticed. `make fault-check` runs it; it takes some minutes.
An argument names another revision to check instead of HEAD (for a before-and-after).
"""
import os
import subprocess
import sys
import tempfile

# area, file, text as committed, text with the fault
FAULTS = [
    ("escaping", "droqbxml/qbxml/XmlEscaping.cpp",
     'u"&apos;";', 'u"&apo;";'),
    ("builder order", "droqbxml/qbxml/DroXmlBuilder_customers.cpp",
     'writeElementIfSet(builder, u"Salutation", cust.Salutation());\n'
     '  writeElementIfSet(builder, u"FirstName", cust.FirstName());',
     'writeElementIfSet(builder, u"FirstName", cust.FirstName());\n'
     '  writeElementIfSet(builder, u"Salutation", cust.Salutation());'),
    ("value checks", "droqbxml/qbxml/basValidations.cpp",
     "return point <= maxDigits + (startsWithSign(text) ? 1 : 0);", "return point <= maxDigits + (startsWithSign(text) ? 0 : 0);"),
    ("wrapper status", "droqbxml/connection/DroXmlSdkWrapper.cpp",
     "if (containsAnyUpper(upper, kEstimateTaxMessages)) {",
     "if (containsAnyUpper(upper, kInvoiceTaxMessages)) {"),
    ("scanner", "droqbxml/records/basCommonProcs.cpp",
     "StartPoint = start + static_cast<int32_t>(ElementName.size()) + 2;",
     "StartPoint = start + static_cast<int32_t>(ElementName.size()) + 1;"),
    ("customer parse", "droqbxml/records/DroCustomer.cpp",
     'read.optional<u"PrintAs", u"Phone", u"Mobile"', 'read.optional<u"PrintAs", u"Mobile", u"Phone"'),
    ("dumps", "droqbxml/records/DroCustomer.cpp",
     'dump.block(u"BILLADDRESS:", billAddress_->PrintOut(), u"/BILLADDRESS");',
     'dump.block(u"BILLADDRESS:", billAddress_->PrintOut(), u"/BILLADDRES");'),
    ("stand-in status codes", "simulator/handlers/Status.cpp",
     "return error(3100,", "return error(3101,"),
    ("lint", "simulator/schema/SchemaCheck.cpp",
     "leaf.maxLength == 0 || characterCount", "leaf.maxLength != 0 || characterCount"),
    ("CLI exit codes", "cli/ResponseDocument.cpp",
     'if (severity == "Warn") return Severity::Warn;', 'if (severity == "Warn") return Severity::Info;'),
]


def run(command, cwd, quiet=True):
    out = subprocess.DEVNULL if quiet else None
    return subprocess.run(command, cwd=cwd, stdout=out, stderr=out).returncode


def main():
    root = subprocess.check_output(["git", "rev-parse", "--show-toplevel"], text=True).strip()
    scratch = tempfile.mkdtemp(prefix="droqbxml-faults-")
    tree = os.path.join(scratch, "tree")
    revision = sys.argv[1] if len(sys.argv) > 1 else "HEAD"
    subprocess.check_call(["git", "worktree", "add", "--detach", "-q", tree, revision], cwd=root)
    # The faults as listed here, whatever the revision checked.
    # The tests read ../shared beside the tree.
    os.symlink(os.path.join(os.path.dirname(root), "shared"), os.path.join(scratch, "shared"))
    build = os.path.join(tree, "build", "ordinary")
    tests = os.path.join(build, "tests", "droqbxml_tests")
    missed = 0
    try:
        if run(["cmake", "--preset", "ordinary"], tree) or run(["cmake", "--build", build], tree):
            sys.exit("fault-check: the unchanged tree does not build")
        if run([tests, "--gtest_brief=1"], tree):
            sys.exit("fault-check: the unchanged tree fails its tests")
        for area, path, good, bad in FAULTS:
            source = os.path.join(tree, path)
            with open(source, encoding="utf-8") as f:
                text = f.read()
            if text.count(good) != 1:
                print(f"{area:24} NOT PLANTED: the text to change is not once in {path}")
                missed += 1
                continue
            with open(source, "w", encoding="utf-8") as f:
                f.write(text.replace(good, bad))
            try:
                if run(["cmake", "--build", build], tree):
                    # A fault that does not compile tells nothing about the tests.
                    verdict = "NOT PLANTED: the changed source does not build"
                    missed += 1
                elif run([tests, "--gtest_brief=1"], tree):
                    verdict = "caught"
                else:
                    verdict = "MISSED"
                    missed += 1
            finally:
                with open(source, "w", encoding="utf-8") as f:
                    f.write(text)
            print(f"{area:24} {path}: {verdict}", flush=True)
    finally:
        subprocess.call(["git", "worktree", "remove", "--force", tree], cwd=root)
        subprocess.call(["rm", "-rf", scratch])
    print(f"fault-check: {len(FAULTS) - missed} of {len(FAULTS)} faults caught")
    sys.exit(1 if missed else 0)


if __name__ == "__main__":
    main()
