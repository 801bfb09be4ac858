// DroInvoiceLineCol: the plain lines of an invoice (or of one of its line groups), keyed by item
// full name or description.
#ifndef DROQBXML_RECORDS_DROINVOICELINECOL_HPP_
#define DROQBXML_RECORDS_DROINVOICELINECOL_HPP_

#include "droqbxml/records/Transaction.hpp"

namespace droqbxml {

using DroInvoiceLineCol = DroTxnLineCol<TxnKind::Invoice>;

}  // namespace droqbxml

#endif  // DROQBXML_RECORDS_DROINVOICELINECOL_HPP_
