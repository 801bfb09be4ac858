// DroEstimateLineCol: the plain lines of an estimate (or of one of its line groups), keyed by item
// full name or description.
#ifndef DROQBXML_RECORDS_DROESTIMATELINECOL_HPP_
#define DROQBXML_RECORDS_DROESTIMATELINECOL_HPP_

#include "droqbxml/records/Transaction.hpp"

namespace droqbxml {

using DroEstimateLineCol = DroTxnLineCol<TxnKind::Estimate>;

}  // namespace droqbxml

#endif  // DROQBXML_RECORDS_DROESTIMATELINECOL_HPP_
