' The job-costing host's round: the facade, a connection and a session on a company file
' of the stand-in (reached as QuickBooks' request processor), queries, a customer, a job,
' an account, an item, an estimate and an invoice sent and read back, collections walked, errors caught.
' The company file is Z:\tmp\droqbxml-com\books.qbw (made by scripts/com-tests.sh).
Dim failures : failures = 0
Sub Check(label, actual, expected)
  If actual <> expected Then
    WScript.Echo "FAIL " & label & ": got [" & actual & "], expected [" & expected & "]"
    failures = failures + 1
  End If
End Sub

Dim qb : Set qb = CreateObject("DroQbXml.DroXmlProcessor")
Dim api : Set api = qb.API
Dim builder : Set builder = qb.XML
Check "application", api.appName, "Tessaly"
api.CompanyFilePath = "Z:\tmp\droqbxml-com\books.qbw"
api.ConnectionOpen
api.SessionBegin
Check "session", Len(api.SessionTicket) > 0, True
Check "company", api.GetCurrentCompanyFileName, "Z:\tmp\droqbxml-com\books.qbw"

builder.BuildQueryByAll 8   ' accounts
Dim response : response = api.ProcessRequest(builder.XML)
Check "accounts", builder.IsSuccessRs(response, "2"), True

Dim cust : Set cust = CreateObject("DroQbXml.DroCustomer")
cust.Name = "Script Builders"
cust.CompanyName = "Script & Sons"
builder.BuildAddCustomer cust
response = api.ProcessRequest(builder.XML)
Check "customer added", builder.IsSuccessRs(response, cust.RequestID), True
cust.ParseRs response
Check "customer read back", Len(cust.ListID) > 0, True
Check "customer dump", InStr(cust.PrintOut, "Script Builders") > 0, True

Dim job : Set job = CreateObject("DroQbXml.DroCustomer")
job.Name = "Porch"
job.ParentRef.FullName = "Script Builders"
builder.BuildAddJob job
response = api.ProcessRequest(builder.XML)
Check "job added", builder.IsSuccessRs(response, job.RequestID), True

Dim acct : Set acct = CreateObject("DroQbXml.DroAccount")
acct.Name = "Scripted Sales"
acct.AccountType = "Income"
builder.BuildAddAccount acct
response = api.ProcessRequest(builder.XML)
Check "account added", builder.IsSuccessRs(response, acct.RequestID), True
acct.ParseRs response
Check "account read back", acct.AccountType, "Income"

Dim labour : Set labour = CreateObject("DroQbXml.DroItemNonInventory")
labour.Name = "Decking"
labour.SalesOrPurchase.Price = "12.5"
labour.SalesOrPurchase.AccountRef.FullName = "Sales"
builder.BuildAddItem 0, labour
response = api.ProcessRequest(builder.XML)
Check "item added", builder.IsSuccessRs(response, labour.RequestID), True
labour.ParseRs response
Check "item read back", labour.FullName, "Decking"

Dim est : Set est = CreateObject("DroQbXml.DroEstimate")
est.CustomerRef.FullName = "Script Builders:Porch"
Dim line : Set line = est.EstimateLines.Add("Decking")
line.ItemRef.FullName = "Decking"
line.Quantity = "8"
builder.BuildAddEstimate est
response = api.ProcessRequest(builder.XML)
Check "estimate added", builder.IsSuccessRs(response, est.RequestID), True
Check "estimate subtotal", InStr(response, "<Subtotal>100.00</Subtotal>") > 0, True

Dim inv : Set inv = CreateObject("DroQbXml.DroInvoice")
inv.CustomerRef.FullName = "Script Builders:Porch"
Set line = inv.InvoiceLines.Add("Decking")
line.ItemRef.FullName = "Decking"
line.Quantity = "4"
line.Rate = "15"
builder.BuildAddInvoice inv
response = api.ProcessRequest(builder.XML)
Check "invoice added", builder.IsSuccessRs(response, inv.RequestID), True
Check "invoice balance", InStr(response, "<BalanceRemaining>") > 0, True
Dim n : n = 0
Dim member
For Each member In inv.InvoiceLines
  n = n + 1
  Check "line", member.Quantity, "4"
Next
Check "lines walked", n, 1

' A refused request: QuickBooks' answer, and the wrapper's status.
builder.BuildAddCustomer cust
response = api.ProcessRequest(builder.XML)
Check "duplicate refused", builder.IsSuccessRs(response, cust.RequestID), False
Check "status", api.ResponseStatus <> 0, True

' The component's own error, raised by the builder after a finished document.
On Error Resume Next
qb.XML.AddHeaders
Check "component error", Hex(Err.Number), "80044E22"
Check "component error source", Err.Source, "DroXmlProcessor.AddHeaders"
Check "component error text", Left(Err.Description, 41), "Could not assign XML header information b"
On Error GoTo 0

api.SessionEnd
api.ConnectionClose
If failures = 0 Then WScript.Echo "ALL PASS"
WScript.Echo "SCRIPT DONE"
