// DroEstimateLineGroupCol: the line groups of an estimate, keyed by item group full name.
#ifndef DROQBXML_RECORDS_DROESTIMATELINEGROUPCOL_HPP_
#define DROQBXML_RECORDS_DROESTIMATELINEGROUPCOL_HPP_

#include "droqbxml/records/Transaction.hpp"

namespace droqbxml {

using DroEstimateLineGroupCol = DroTxnLineGroupCol<TxnKind::Estimate>;

}  // namespace droqbxml

#endif  // DROQBXML_RECORDS_DROESTIMATELINEGROUPCOL_HPP_
