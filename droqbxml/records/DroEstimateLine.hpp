// DroEstimateLine: one line of an estimate: item, class and tax code references and its texts.
#ifndef DROQBXML_RECORDS_DROESTIMATELINE_HPP_
#define DROQBXML_RECORDS_DROESTIMATELINE_HPP_

#include "droqbxml/records/Transaction.hpp"

namespace droqbxml {

using DroEstimateLine = DroTxnLine<TxnKind::Estimate>;

}  // namespace droqbxml

#endif  // DROQBXML_RECORDS_DROESTIMATELINE_HPP_
