// DroEstimateLineGroup: one line of an estimate that expands an item group into its own lines.
#ifndef DROQBXML_RECORDS_DROESTIMATELINEGROUP_HPP_
#define DROQBXML_RECORDS_DROESTIMATELINEGROUP_HPP_

#include "droqbxml/records/Transaction.hpp"

namespace droqbxml {

using DroEstimateLineGroup = DroTxnLineGroup<TxnKind::Estimate>;

}  // namespace droqbxml

#endif  // DROQBXML_RECORDS_DROESTIMATELINEGROUP_HPP_
