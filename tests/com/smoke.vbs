' A first look at the component from VBScript.
Dim failures : failures = 0
Sub Check(label, actual, expected)
  If actual <> expected Then
    WScript.Echo "FAIL " & label & ": got [" & actual & "], expected [" & expected & "]"
    failures = failures + 1
  End If
End Sub

Dim qb : Set qb = CreateObject("DroQbXml.DroXmlProcessor")
Dim builder : Set builder = qb.XML
builder.BuildQueryByAll 0
Check "query", InStr(builder.XML, "<CustomerQueryRq requestID=""2"" />") > 0, True

Dim est : Set est = CreateObject("DroQbXml.DroEstimate")
est.CustomerRef.FullName = "Kim Lee"
Dim line : Set line = est.EstimateLines.Add("Tile")
line.ItemRef.FullName = "Tile"
line.Quantity = "3"
builder.BuildAddEstimate est
Check "estimate id", est.RequestID, "2"
Check "estimate request", InStr(builder.XML, "<Quantity>3</Quantity>") > 0, True
Dim n : n = 0
Dim member
For Each member In est.EstimateLines
  n = n + 1
Next
Check "for each", n, 1
Check "default member", est.EstimateLines(1).Quantity, "3"

On Error Resume Next
est.PrintOut
Check "no error yet", Err.Number, 0
est.EstimateLineGroups.Add
Dim dump : dump = est.PrintOut
Check "type mismatch", Err.Number, 13
Err.Clear
builder.NoSuchMember
Check "unknown member", Err.Number, 438
Err.Clear
Dim e : Set e = CreateObject("DroQbXml.clsMyErr")
e.Raise , &H80044E22, "Host.Script", "bad thing"
Check "component error number", Hex(Err.Number), "80044E22"
Check "component error source", Err.Source, "Host.Script"
Check "component error text", Err.Description, "bad thing"
On Error GoTo 0

Dim cust : Set cust = CreateObject("DroQbXml.DroCustomer")
Check "nothing to read", cust.ParseRs("<QBXML/>"), 1

If failures = 0 Then WScript.Echo "ALL PASS"
WScript.Echo "SCRIPT DONE"
