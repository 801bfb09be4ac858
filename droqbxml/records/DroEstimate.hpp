// DroEstimate: a customer quotation. The host fills it for an "EstimateAddRq"
// (DroXmlBuilder::BuildAddEstimate, which stores the request's identifier in RequestID);
// ParseRs fills it from the matching "EstimateAddRet" with its lines and line groups;
// PrintOut dumps the header and the plain lines.
#ifndef DROQBXML_RECORDS_DROESTIMATE_HPP_
#define DROQBXML_RECORDS_DROESTIMATE_HPP_

#include <array>
#include <cstdint>

#include "droqbxml/records/DroAddress.hpp"
#include "droqbxml/records/DroEstimateLine.hpp"
#include "droqbxml/records/DroEstimateLineCol.hpp"
#include "droqbxml/records/DroEstimateLineGroup.hpp"
#include "droqbxml/records/DroEstimateLineGroupCol.hpp"
#include "droqbxml/records/IndexedResponse.hpp"
#include "droqbxml/records/Transaction.hpp"

namespace droqbxml {

class DroEstimate final : public TxnRecordOf<DroEstimate, TxnKind::Estimate> {
 public:
  static constexpr std::array kFields{
      txnText(u"TxnID"),         txnText(u"TimeCreated"), txnText(u"TimeModified"),
      txnText(u"EditSequence"),  txnText(u"TxnNumber"),   txnText(u"TxnDate"),
      txnText(u"RefNumber"),     txnText(u"PONumber"),    txnText(u"DueDate"),
      txnText(u"FOB"),           txnText(u"Subtotal"),    txnText(u"SalesTaxPercentage"),
      txnText(u"SalesTaxTotal"), txnText(u"TotalAmount"), txnText(u"Memo"),
      txnText(u"IsToBePrinted"), txnText(u"RequestID"),
  };

  static const ClassInfo& typeInfo();
  const ClassInfo& classInfo() const override { return typeInfo(); }

  const ObjectProperty<DroEstimateLineCol>& EstimateLines() const { return lines_.held(); }
  void EstimateLines(Ref<DroEstimateLineCol> v) { lines_ = std::move(v); }
  const ObjectProperty<DroEstimateLineGroupCol>& EstimateLineGroups() const {
    return groups_.held();
  }
  void EstimateLineGroups(Ref<DroEstimateLineGroupCol> v) { groups_ = std::move(v); }

  const Text& TotalAmount() const { return field<u"TotalAmount">(); }
  void TotalAmount(const Text& v) { setField<u"TotalAmount">(v); }

  // Finds the "EstimateAddRet" whose add response carries RequestID (any, when it is "")
  // from StartPoint and reads it: the header in response order ("TxnID" through "TxnNumber"
  // and "TxnDate" required), the lines, the groups. Returns where reading stopped, or the
  // position reached when there is nothing to read.
  int32_t ParseRs(const Text& Value, int32_t StartPoint = 0);
  // The same read of the response's text, its searches answered from the response's index.
  int32_t ParseRs(const IndexedResponse& Value, int32_t StartPoint = 0) {
    return Value.read([&](const Text& text) { return ParseRs(text, StartPoint); });
  }
  // The header and one block per plain line. An estimate holding a line group is the
  // runtime's 13: the dump walks the groups as lines, and hosts have always had it so.
  Text PrintOut() const;
};

}  // namespace droqbxml

#endif  // DROQBXML_RECORDS_DROESTIMATE_HPP_
