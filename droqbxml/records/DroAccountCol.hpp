// DroAccountCol: the ordered keyed collection of accounts a host keeps several in.
#ifndef DROQBXML_RECORDS_DROACCOUNTCOL_HPP_
#define DROQBXML_RECORDS_DROACCOUNTCOL_HPP_

#include "droqbxml/records/DroAccount.hpp"
#include "droqbxml/records/RecordCol.hpp"

namespace droqbxml {

class DroAccountCol final : public RecordCol<DroAccount> {
 public:
  static const ClassInfo& typeInfo() {
    static const ClassInfo info(u"DroAccountCol", collectionMembers().take());
    return info;
  }
  const ClassInfo& classInfo() const override { return typeInfo(); }
};

}  // namespace droqbxml

#endif  // DROQBXML_RECORDS_DROACCOUNTCOL_HPP_
