// DroInvoiceLineGroupCol: the line groups of an invoice, keyed by item group full name.
#ifndef DROQBXML_RECORDS_DROINVOICELINEGROUPCOL_HPP_
#define DROQBXML_RECORDS_DROINVOICELINEGROUPCOL_HPP_

#include "droqbxml/records/Transaction.hpp"

namespace droqbxml {

using DroInvoiceLineGroupCol = DroTxnLineGroupCol<TxnKind::Invoice>;

}  // namespace droqbxml

#endif  // DROQBXML_RECORDS_DROINVOICELINEGROUPCOL_HPP_
