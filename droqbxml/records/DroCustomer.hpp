// DroCustomer: one QuickBooks customer or job (a job is a customer whose ParentRef names
// another customer). Filled from a "CustomerRet" of a query or add response (ParseRs) or
// from the host's customer-info text (ParseCustInfo), read by the add builders, printed by
// PrintOut. Four host-side fields ("NonQb...") never go to QuickBooks.
#ifndef DROQBXML_RECORDS_DROCUSTOMER_HPP_
#define DROQBXML_RECORDS_DROCUSTOMER_HPP_

#include <array>
#include <cstdint>

#include "droqbxml/records/DroAddress.hpp"
#include "droqbxml/records/DroTypedRefs.hpp"
#include "droqbxml/records/IndexedResponse.hpp"
#include "droqbxml/records/Record.hpp"

namespace droqbxml {

class DroCustomerCol;

class DroCustomer final : public RecordOf<DroCustomer> {
 public:
  static constexpr std::array<FieldSpec, 43> kFields{{
      {u"NonQbJobName", Trim::None, Check::None, 0, true},
      {u"NonQbCityStateZip", Trim::None, Check::None, 0, true, Rule::Specific},
      {u"NonQbFileName", Trim::None, Check::None, 0, true, Rule::Specific},
      {u"NonQbFileTitle", Trim::None, Check::None, 0, true},
      {u"ListID", Trim::Spaces, Check::Str, 0},
      {u"TimeCreated", Trim::Spaces, Check::DateTime},
      {u"TimeModified", Trim::Spaces, Check::DateTime},
      {u"EditSequence", Trim::Spaces, Check::Int, 0},
      {u"Name", Trim::Spaces, Check::Str, 41, true},
      {u"FullName", Trim::Spaces, Check::Str, 209, true},
      {u"IsActive", Trim::Spaces, Check::Bool},
      {u"Sublevel", Trim::Spaces, Check::Int, 4},
      {u"CompanyName", Trim::Spaces, Check::Str, 41, true},
      {u"Salutation", Trim::Spaces, Check::Str, 15, true},
      {u"FirstName", Trim::Spaces, Check::Str, 25, true},
      {u"MiddleName", Trim::Spaces, Check::Str, 5, true},
      {u"LastName", Trim::Spaces, Check::Str, 25, true},
      {u"Suffix", Trim::Spaces, Check::Str, 0, true},
      {u"PrintAs", Trim::Spaces, Check::Str, 41},
      {u"Phone", Trim::Spaces, Check::Str, 21},
      {u"Mobile", Trim::Spaces, Check::Str, 21},
      {u"Pager", Trim::Spaces, Check::Str, 21},
      {u"AltPhone", Trim::Spaces, Check::Str, 21},
      {u"Fax", Trim::Spaces, Check::Str, 21},
      {u"Email", Trim::Spaces, Check::Str, 99},
      {u"Contact", Trim::Spaces, Check::Str, 41},
      {u"AltContact", Trim::Spaces, Check::Str, 41},
      {u"Balance", Trim::Spaces, Check::Amt},
      {u"OpenBalance", Trim::Spaces, Check::Amt},
      {u"OpenBalanceDate", Trim::Spaces, Check::Date},
      {u"TotalBalance", Trim::Spaces, Check::Amt},
      {u"ResaleNumber", Trim::Spaces, Check::Str, 15},
      {u"AccountNumber", Trim::Spaces, Check::None},
      {u"CreditLimit", Trim::Spaces, Check::Amt},
      {u"JobStatus", Trim::Spaces, Check::JobStatus},
      {u"JobStartDate", Trim::Spaces, Check::Date},
      {u"JobProjectedEndDate", Trim::Spaces, Check::Date},
      {u"JobEndDate", Trim::Spaces, Check::Date},
      {u"JobDesc", Trim::None, Check::Str, 99},
      // The setter discards its argument: Notes stays "" for the life of the record.
      {u"Notes", Trim::None, Check::None, 0, false, Rule::KeepsStoredValue},
      {u"IsStatementWithParent", Trim::Spaces, Check::Bool},
      {u"DeliveryMethod", Trim::Spaces, Check::None},
      {u"RequestID", Trim::None, Check::None},
  }};

  DroCustomer();
  static const ClassInfo& typeInfo();
  const ClassInfo& classInfo() const override { return typeInfo(); }

  // Sub-records, created with the customer and replaceable.
  const ObjectProperty<DroParentRef>& ParentRef() const { return parentRef_.held(); }
  void ParentRef(Ref<DroParentRef> v) { parentRef_ = std::move(v); }
  const ObjectProperty<DroAddress>& BillAddress() const { return billAddress_.held(); }
  void BillAddress(Ref<DroAddress> v) { billAddress_ = std::move(v); }
  const ObjectProperty<DroCustomerTypeRef>& CustomerTypeRef() const {
    return customerTypeRef_.held();
  }
  void CustomerTypeRef(Ref<DroCustomerTypeRef> v) { customerTypeRef_ = std::move(v); }
  const ObjectProperty<DroAddress>& ShipAddress() const { return shipAddress_.held(); }
  void ShipAddress(Ref<DroAddress> v) { shipAddress_ = std::move(v); }
  const ObjectProperty<DroTermsRef>& TermsRef() const { return termsRef_.held(); }
  void TermsRef(Ref<DroTermsRef> v) { termsRef_ = std::move(v); }
  const ObjectProperty<DroSalesRepRef>& SalesRepRef() const { return salesRepRef_.held(); }
  void SalesRepRef(Ref<DroSalesRepRef> v) { salesRepRef_ = std::move(v); }
  const ObjectProperty<DroSalesTaxCodeRef>& SalesTaxCodeRef() const {
    return salesTaxCodeRef_.held();
  }
  void SalesTaxCodeRef(Ref<DroSalesTaxCodeRef> v) { salesTaxCodeRef_ = std::move(v); }
  const ObjectProperty<DroItemSalesTaxRef>& ItemSalesTaxRef() const {
    return itemSalesTaxRef_.held();
  }
  void ItemSalesTaxRef(Ref<DroItemSalesTaxRef> v) { itemSalesTaxRef_ = std::move(v); }
  const ObjectProperty<DroJobTypeRef>& JobTypeRef() const { return jobTypeRef_.held(); }
  void JobTypeRef(Ref<DroJobTypeRef> v) { jobTypeRef_ = std::move(v); }

  // The collection this customer belongs to; a new empty one is created on first read.
  Ref<droqbxml::DroCustomerCol> DroCustomerCol() const;
  void DroCustomerCol(Ref<droqbxml::DroCustomerCol> v) { collection_ = std::move(v); }

  // The text properties (setters trim and check by the table), and the unescaped
  // companions of those the table marks.
  const Text& NonQbJobName() const { return field<u"NonQbJobName">(); }
  void NonQbJobName(const Text& v) { setField<u"NonQbJobName">(v); }
  const Text& NonQbCityStateZip() const { return field<u"NonQbCityStateZip">(); }
  void NonQbCityStateZip(const Text& v) { setField<u"NonQbCityStateZip">(v); }
  const Text& NonQbFileName() const { return field<u"NonQbFileName">(); }
  void NonQbFileName(const Text& v) { setField<u"NonQbFileName">(v); }
  const Text& NonQbFileTitle() const { return field<u"NonQbFileTitle">(); }
  void NonQbFileTitle(const Text& v) { setField<u"NonQbFileTitle">(v); }
  const Text& ListID() const { return field<u"ListID">(); }
  void ListID(const Text& v) { setField<u"ListID">(v); }
  const Text& TimeCreated() const { return field<u"TimeCreated">(); }
  void TimeCreated(const Text& v) { setField<u"TimeCreated">(v); }
  const Text& TimeModified() const { return field<u"TimeModified">(); }
  void TimeModified(const Text& v) { setField<u"TimeModified">(v); }
  const Text& EditSequence() const { return field<u"EditSequence">(); }
  void EditSequence(const Text& v) { setField<u"EditSequence">(v); }
  const Text& Name() const { return field<u"Name">(); }
  void Name(const Text& v) { setField<u"Name">(v); }
  const Text& FullName() const { return field<u"FullName">(); }
  void FullName(const Text& v) { setField<u"FullName">(v); }
  const Text& IsActive() const { return field<u"IsActive">(); }
  void IsActive(const Text& v) { setField<u"IsActive">(v); }
  const Text& Sublevel() const { return field<u"Sublevel">(); }
  void Sublevel(const Text& v) { setField<u"Sublevel">(v); }
  const Text& CompanyName() const { return field<u"CompanyName">(); }
  void CompanyName(const Text& v) { setField<u"CompanyName">(v); }
  const Text& Salutation() const { return field<u"Salutation">(); }
  void Salutation(const Text& v) { setField<u"Salutation">(v); }
  const Text& FirstName() const { return field<u"FirstName">(); }
  void FirstName(const Text& v) { setField<u"FirstName">(v); }
  const Text& MiddleName() const { return field<u"MiddleName">(); }
  void MiddleName(const Text& v) { setField<u"MiddleName">(v); }
  const Text& LastName() const { return field<u"LastName">(); }
  void LastName(const Text& v) { setField<u"LastName">(v); }
  const Text& Suffix() const { return field<u"Suffix">(); }
  void Suffix(const Text& v) { setField<u"Suffix">(v); }
  const Text& PrintAs() const { return field<u"PrintAs">(); }
  void PrintAs(const Text& v) { setField<u"PrintAs">(v); }
  const Text& Phone() const { return field<u"Phone">(); }
  void Phone(const Text& v) { setField<u"Phone">(v); }
  const Text& Mobile() const { return field<u"Mobile">(); }
  void Mobile(const Text& v) { setField<u"Mobile">(v); }
  const Text& Pager() const { return field<u"Pager">(); }
  void Pager(const Text& v) { setField<u"Pager">(v); }
  const Text& AltPhone() const { return field<u"AltPhone">(); }
  void AltPhone(const Text& v) { setField<u"AltPhone">(v); }
  const Text& Fax() const { return field<u"Fax">(); }
  void Fax(const Text& v) { setField<u"Fax">(v); }
  const Text& Email() const { return field<u"Email">(); }
  void Email(const Text& v) { setField<u"Email">(v); }
  const Text& Contact() const { return field<u"Contact">(); }
  void Contact(const Text& v) { setField<u"Contact">(v); }
  const Text& AltContact() const { return field<u"AltContact">(); }
  void AltContact(const Text& v) { setField<u"AltContact">(v); }
  const Text& Balance() const { return field<u"Balance">(); }
  void Balance(const Text& v) { setField<u"Balance">(v); }
  const Text& OpenBalance() const { return field<u"OpenBalance">(); }
  void OpenBalance(const Text& v) { setField<u"OpenBalance">(v); }
  const Text& OpenBalanceDate() const { return field<u"OpenBalanceDate">(); }
  void OpenBalanceDate(const Text& v) { setField<u"OpenBalanceDate">(v); }
  const Text& TotalBalance() const { return field<u"TotalBalance">(); }
  void TotalBalance(const Text& v) { setField<u"TotalBalance">(v); }
  const Text& ResaleNumber() const { return field<u"ResaleNumber">(); }
  void ResaleNumber(const Text& v) { setField<u"ResaleNumber">(v); }
  const Text& AccountNumber() const { return field<u"AccountNumber">(); }
  void AccountNumber(const Text& v) { setField<u"AccountNumber">(v); }
  const Text& CreditLimit() const { return field<u"CreditLimit">(); }
  void CreditLimit(const Text& v) { setField<u"CreditLimit">(v); }
  const Text& JobStatus() const { return field<u"JobStatus">(); }
  void JobStatus(const Text& v) { setField<u"JobStatus">(v); }
  const Text& JobStartDate() const { return field<u"JobStartDate">(); }
  void JobStartDate(const Text& v) { setField<u"JobStartDate">(v); }
  const Text& JobProjectedEndDate() const { return field<u"JobProjectedEndDate">(); }
  void JobProjectedEndDate(const Text& v) { setField<u"JobProjectedEndDate">(v); }
  const Text& JobEndDate() const { return field<u"JobEndDate">(); }
  void JobEndDate(const Text& v) { setField<u"JobEndDate">(v); }
  const Text& JobDesc() const { return field<u"JobDesc">(); }
  void JobDesc(const Text& v) { setField<u"JobDesc">(v); }
  const Text& Notes() const { return field<u"Notes">(); }
  void Notes(const Text& v) { setField<u"Notes">(v); }
  const Text& IsStatementWithParent() const { return field<u"IsStatementWithParent">(); }
  void IsStatementWithParent(const Text& v) { setField<u"IsStatementWithParent">(v); }
  const Text& DeliveryMethod() const { return field<u"DeliveryMethod">(); }
  void DeliveryMethod(const Text& v) { setField<u"DeliveryMethod">(v); }
  const Text& RequestID() const { return field<u"RequestID">(); }
  void RequestID(const Text& v) { setField<u"RequestID">(v); }
  Text NonQbJobName_XmlUnEscaped() const { return fieldUnescaped<u"NonQbJobName">(); }
  Text NonQbCityStateZip_XmlUnEscaped() const { return fieldUnescaped<u"NonQbCityStateZip">(); }
  Text NonQbFileName_XmlUnEscaped() const { return fieldUnescaped<u"NonQbFileName">(); }
  Text NonQbFileTitle_XmlUnEscaped() const { return fieldUnescaped<u"NonQbFileTitle">(); }
  Text Name_XmlUnEscaped() const { return fieldUnescaped<u"Name">(); }
  Text FullName_XmlUnEscaped() const { return fieldUnescaped<u"FullName">(); }
  Text CompanyName_XmlUnEscaped() const { return fieldUnescaped<u"CompanyName">(); }
  Text Salutation_XmlUnEscaped() const { return fieldUnescaped<u"Salutation">(); }
  Text FirstName_XmlUnEscaped() const { return fieldUnescaped<u"FirstName">(); }
  Text MiddleName_XmlUnEscaped() const { return fieldUnescaped<u"MiddleName">(); }
  Text LastName_XmlUnEscaped() const { return fieldUnescaped<u"LastName">(); }
  Text Suffix_XmlUnEscaped() const { return fieldUnescaped<u"Suffix">(); }

  // Reads the customer-info text from lStartPointA: NonQbFileName (required), names,
  // company, bill address, job name; returns the cursor, 0 when no "<CustomerRet>" follows.
  int32_t ParseCustInfo(const Text& sValueA, int32_t lStartPointA = 0);
  // Finds the response carrying this customer's RequestID (any, when it is "") at or after
  // StartPoint and reads its customer; returns the cursor for the next record, or the
  // position the search reached when nothing was read.
  int32_t ParseRs(const Text& Value, int32_t StartPoint = 0);
  // The same read of the response's text, its searches answered from the response's index.
  int32_t ParseRs(const IndexedResponse& Value, int32_t StartPoint = 0) {
    return Value.read([&](const Text& text) { return ParseRs(text, StartPoint); });
  }
  Text PrintOut() const;

 private:
  void applyRule(size_t index, const Text& checked) override;

  mutable ObjectProperty<DroParentRef> parentRef_;
  mutable ObjectProperty<DroAddress> billAddress_;
  mutable ObjectProperty<DroCustomerTypeRef> customerTypeRef_;
  mutable ObjectProperty<DroAddress> shipAddress_;
  mutable ObjectProperty<DroTermsRef> termsRef_;
  mutable ObjectProperty<DroSalesRepRef> salesRepRef_;
  mutable ObjectProperty<DroSalesTaxCodeRef> salesTaxCodeRef_;
  mutable ObjectProperty<DroItemSalesTaxRef> itemSalesTaxRef_;
  mutable ObjectProperty<DroJobTypeRef> jobTypeRef_;
  mutable Ref<droqbxml::DroCustomerCol> collection_;
};

}  // namespace droqbxml

#endif  // DROQBXML_RECORDS_DROCUSTOMER_HPP_
