// Errors as JScript sees them: the component's numbers as HRESULTs, the runtime's as the
// platform's control-facility codes, sources and descriptions exactly.
var failures = 0;
function check(label, actual, expected) {
  if (actual !== expected) {
    WScript.Echo("FAIL " + label + ": got [" + actual + "], expected [" + expected + "]");
    failures++;
  }
}
function hex(n) { return (n < 0 ? n + 0x100000000 : n).toString(16).toUpperCase(); }
function caught(body) {
  try { body(); } catch (e) { return e; }
  return null;
}

var builder = new ActiveXObject("DroQbXml.DroXmlBuilder");
var err = new ActiveXObject("DroQbXml.clsMyErr");
var e = caught(function () { err.Raise(undefined, 0x80044E22 | 0, "DroXmlProcessor.AddHeaders", "Headers"); });
check("component number", e && hex(e.number), "80044E22");
check("component text", e && e.description, "Headers");
e = caught(function () { new ActiveXObject("DroQbXml.DroEstimate").EstimateLines.Item(7); });
check("runtime 5", e && hex(e.number), "800A0005");
e = caught(function () { builder.NoSuchMember(); });
check("unknown member", e && hex(e.number), "800A01B6");
var line = new ActiveXObject("DroQbXml.DroInvoiceLine");
line.ServiceDate = "2026-11-25";
check("text property", line.ServiceDate, "2026-11-25");
line.Class_Treminate();
e = caught(function () { return line.PrintOut; });
check("nothing set", e && hex(e.number), "800A005B");

if (failures === 0) WScript.Echo("ALL PASS");
WScript.Echo("SCRIPT DONE");
WScript.Quit(failures);
