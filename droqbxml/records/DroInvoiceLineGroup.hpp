// DroInvoiceLineGroup: one line of an invoice that expands an item group into its own lines.
#ifndef DROQBXML_RECORDS_DROINVOICELINEGROUP_HPP_
#define DROQBXML_RECORDS_DROINVOICELINEGROUP_HPP_

#include "droqbxml/records/Transaction.hpp"

namespace droqbxml {

using DroInvoiceLineGroup = DroTxnLineGroup<TxnKind::Invoice>;

}  // namespace droqbxml

#endif  // DROQBXML_RECORDS_DROINVOICELINEGROUP_HPP_
