// DroInvoiceLine: one line of an invoice: item, class and tax code references and its texts.
#ifndef DROQBXML_RECORDS_DROINVOICELINE_HPP_
#define DROQBXML_RECORDS_DROINVOICELINE_HPP_

#include "droqbxml/records/Transaction.hpp"

namespace droqbxml {

using DroInvoiceLine = DroTxnLine<TxnKind::Invoice>;

}  // namespace droqbxml

#endif  // DROQBXML_RECORDS_DROINVOICELINE_HPP_
