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
builder.BuildQueryByAll(0);  // a finished document: headers cannot be added now
var e = caught(function () { builder.AddHeaders(); });
check("component number", e && hex(e.number), "80044E22");
check("component text", e && e.description,
      "Could not assign XML header information because the DroXmlProcessor object has not " +
      "been initialized properly prior to attempted use.");
var err = new ActiveXObject("DroQbXml.clsMyErr");
e = caught(function () { err.Raise(undefined, 0x80044E34 | 0, "Host.Script", "parse"); });
check("raised through the error object", e && hex(e.number) + " " + e.description,
      "80044E34 parse");
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

// The request processor's own failure crosses the wrapper with its HRESULT and message.
var qb = new ActiveXObject("DroQbXml.DroXmlProcessor");
qb.API.CompanyFilePath = "Z:\\tmp\\droqbxml-com\\no-such-file.qbw";
qb.API.ConnectionOpen();
e = caught(function () { qb.API.SessionBegin(); });
check("processor error", e && hex(e.number) + " " + e.description,
      "80040403 Could not open the specified QuickBooks company data file.");

if (failures === 0) WScript.Echo("ALL PASS");
WScript.Echo("SCRIPT DONE");
