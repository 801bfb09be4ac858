// DroXmlBuilder: writes one qbXML request document at a time as one growing text: the
// frame (declaration, DOCTYPE, QBXML and QBXMLMsgsRq wrappers), elements and aggregates
// indented one TAB per level, and the request counter behind each "requestID". The request
// builders (queries here, adds in later groups) are written on top of these operations.
#ifndef DROQBXML_QBXML_DROXMLBUILDER_HPP_
#define DROQBXML_QBXML_DROXMLBUILDER_HPP_

#include <cstdint>
#include <vector>

#include "droqbxml/qbxml/DroXmlElement.hpp"
#include "droqbxml/qbxml/Enumerations.hpp"
#include "droqbxml/runtime/Object.hpp"
#include "droqbxml/runtime/Ref.hpp"
#include "droqbxml/runtime/Text.hpp"
#include "droqbxml/runtime/Variant.hpp"

namespace droqbxml {

class DroAccount;
class DroCustomer;
class DroCustomerCol;
class DroEstimate;
class DroInvoice;

class DroXmlBuilder final : public Object {
 public:
  static const ClassInfo& typeInfo();
  const ClassInfo& classInfo() const override { return typeInfo(); }

  // A builder ready for a new document (runs Class_Initialize).
  DroXmlBuilder();

  // Runs Initialize; also runs at creation.
  void Class_Initialize();
  // Starts a new document: empty text, indentation level 1, OnError "stopOnError",
  // request counter 1, no open aggregate.
  void Initialize();

  // The onError attribute of the next header: "continueOnError" or "rollbackOnError"
  // when the trimmed argument is exactly one of them (case-sensitive), otherwise
  // "stopOnError". Never raises.
  const Text& OnError() const { return onError_; }
  void OnError(const Text& value);

  // The whole document text so far.
  const Text& XML() const { return document_; }

  // Replaces the document with the four header lines and opens the messages level.
  // Only valid at indentation level 1 (after Initialize): otherwise raises
  // DRO_XML_PROCESSOR_IMPROPERLY_INITIONALIZED under the facade's source
  // "DroXmlProcessor.AddHeaders", leaving text and level unchanged.
  void AddHeaders();
  // Appends the two closing lines (no line end after "</QBXML>") and leaves the level at
  // 0. Aggregates still open are not closed; anything written later follows "</QBXML>".
  void AddFooters();

  // Opens an aggregate of that name (trimmed) without attributes.
  void AddElementAggregateSimple(const Text& sNameA);
  // Writes a leaf element whose value is escaped first; an empty value gives the
  // self-closing form.
  void AddElementSimple(const Text& sNameA, const Text& sValueA);
  // Writes a leaf element with its attributes, exactly as the element holds them
  // (nothing is escaped): "<Name a="v" />" without a value, "<Name>value</Name>" with one.
  // An empty reference is the runtime's 91.
  void AddElement(const Ref<DroXmlElement>& Elem);
  // Writes the opening tag with attributes (the value is ignored), then opens a level and
  // remembers the name for AddAggregateEnd. An empty reference is the runtime's 91.
  void AddAggregateBegin(const Ref<DroXmlElement>& Elem);
  // Closes the most recently opened aggregate one level lower. With none open it writes
  // "</>" and never goes below level 0: deliberate, hosts rely on it not failing.
  void AddAggregateEnd();

  // The request counter: 1 after Initialize, so the first request of a document, which
  // calls RequestIDUp first, is numbered 2.
  int16_t RequestID() const { return requestId_; }
  // Counter + 1; past 32767 the runtime's 6, counter unchanged.
  void RequestIDUp();

  // A new element with the name (trimmed) and value (as given); the builder keeps no
  // reference to it.
  Ref<DroXmlElement> CreateElement(const Text& Name = {}, const Text& Value = {}) const;

  // A whole query document for every record of a kind: "<...QueryRq requestID="2" />".
  void BuildQueryByAll(udEntityType entity);
  // A whole query document for one record by full name (written escaped, not trimmed).
  // For udEtItem the request is chosen by OtherParameter, an item kind compared by numeric
  // value (numbers or numeric text); anything else, a missing value included, gives the
  // request "UnknownItemSentByDRO". An empty FullName does nothing: XML keeps the previous
  // document.
  void BuildQueryByFullName(udEntityType entity, const Text& FullName,
                            const Variant& OtherParameter = Variant::missing());
  // A whole customer query for one list id (trimmed, escaped), whatever the entity. An
  // empty ListID does nothing.
  void BuildQueryByListID(udEntityType entity, const Text& ListID);
  // A whole query document filtered by active status and, when given (not empty), the
  // modification dates, trimmed and escaped but not checked.
  void BuildQueryByActiveOrDate(udEntityType entity, udActiveStatus active,
                                const Text& fromDate = {}, const Text& toDate = {});

  // The customer-info text of a collection: a customer query response holding, for each
  // customer, its file name, names, company, bill address and job name. The message-set
  // end tag comes out as "<QBXMLMsgsRs>" (its slash is dropped): hosts read it back only
  // through ParseCustInfo, and the text is kept exactly so.
  void BuildRetCustomerInfo(const Ref<DroCustomerCol>& oCustColA);
  void BuildRetCustomerInfo(const DroCustomerCol& oCustColA);
  // The request adding one customer, or one job (a customer with a ParentRef); the record's
  // RequestID becomes the request's identifier.
  void BuildAddCustomer(const Ref<DroCustomer>& cust);
  void BuildAddJob(const Ref<DroCustomer>& Job);
  // The request adding one account: "Name" and "AccountType" always (empty ones too), the
  // parent reference ("ListID" preferred) and the other texts the host set. Nothing else
  // the account holds is sent. The account's RequestID becomes the request's identifier.
  void BuildAddAccount(const Ref<DroAccount>& Account);
  // The request adding one item of the kind ItemType. The non-inventory builder takes a
  // DroItemNonInventory (any other object is the runtime's 13 before anything is written);
  // every other kind reaches the item's members by name, so any object with members of
  // those names will do, and a member it lacks is the runtime's 438 where it is used,
  // leaving the document incomplete. Payroll wage, udUnknown and any other value build
  // nothing and leave XML as it was.
  void BuildAddItem(udItemType ItemType, const Variant& Item);
  // The request adding one estimate, or one invoice: the header elements the host set (the
  // customer reference always), then every plain line, then every line group; the
  // record's RequestID becomes the request's identifier. Values are escaped, not checked.
  // bTaxable true keeps every line's tax code reference out of the request.
  void BuildAddEstimate(const Ref<DroEstimate>& Estimate, bool bTaxable = false);
  void BuildAddInvoice(const Ref<DroInvoice>& Invoice, bool bTaxable = false);

  // True when the first "requestID=" of the response carries ReqID (any id when ReqID is
  // empty) and the first "statusCode=" after it is "0". A status code without a closing
  // quote is the runtime's 5.
  bool IsSuccessRs(const Text& SearchIn, const Text& ReqID) const;

  // The component's escaping of a value for a request, without a length limit.
  Text XmlEscapeX(const Text& Value) const;

 private:
  void appendIndent();
  void indentUp();
  void indentDown();
  void aggregateStackReset();
  void aggregateStackPush(const Text& name);
  Text aggregateStackPop();
  // Initialize, AddHeaders and the request element with its "requestID" attribute.
  Ref<DroXmlElement> openRequest(TextView requestName);

  Text document_;
  int16_t indentLevel_ = 1;
  Text onError_;
  int16_t requestId_ = 1;
  std::vector<Text> aggregateStack_;  // capacity 1, 11, 21, ...; never empty
  int16_t aggregateCount_ = 0;
};

}  // namespace droqbxml

#endif  // DROQBXML_QBXML_DROXMLBUILDER_HPP_
