#!/usr/bin/env python3
"""Writes simulator/schema/SchemaTables.inc, the stand-in's compiled-in qbXML 13.0 tables.

Reads the detailed element order (children in order with cardinality, choices, flattened
groups and leaf types) and turns every aggregate the stand-in reads or writes into
constexpr rows: particles (elements, sequences, choices with min/max), leaf value types,
enum values and attributes. A reference written {...} takes, in this order: the file's
own top-level definition of that name, a definition written below from the validator
schema, an inline definition of the same name elsewhere in the file, GenericListRef
content (ListID?, FullName?) for names ending in "Ref", AddressData for ShipAddress and
BillAddress; anything else is marked "content not checked". Run by hand when the element
order changes:

    scripts/gen-schema-tables.py [path/to/qbxml130_detailed.txt]

Standard library only. The output is committed; the build never needs the input.
"""

import ast
import os
import re
import sys
import textwrap

REPO = os.path.dirname(os.path.dirname(os.path.abspath(__file__)))
DEFAULT_INPUT = os.path.join(REPO, "..", "shared", "qbxml", "element-order",
                             "qbxml130_detailed.txt")
OUTPUT = os.path.join(REPO, "simulator", "schema", "SchemaTables.inc")
UNBOUNDED = 0xFFFF

# The requests the stand-in answers, in the order the envelope lists them.
ITEM_KINDS = ["NonInventory", "Service", "OtherCharge", "Inventory", "Discount", "Subtotal",
              "Group", "Payment", "SalesTax", "SalesTaxGroup"]
SUPPORTED_REQUESTS = (
    ["CustomerAddRq", "CustomerQueryRq", "AccountAddRq", "AccountQueryRq"]
    + [f"Item{kind}AddRq" for kind in ITEM_KINDS]
    + [f"Item{kind}QueryRq" for kind in ITEM_KINDS]
    + ["ItemQueryRq", "PayrollItemWageQueryRq", "EstimateAddRq", "EstimateQueryRq",
       "InvoiceAddRq", "InvoiceQueryRq"])

# Aggregates the detailed order leaves out, written in its own notation from the qbXML 13.0
# validator schema: the envelope, the add wrappers (the add aggregate, then any number of
# IncludeRetElement), PayrollItemWageQueryRq (the plain ListQuery group), and the contents
# of a few small aggregates that requests carry and the detailed order only names.
ADD_WRAPPER = """{name}Rq attrs=[('requestID', 'optional')]
  {name} {{...}}
  IncludeRetElement* : STRTYPE(50)
"""

EXPLICIT = """
QBXML
  QBXMLMsgsRq {...}

QBXMLMsgsRq attrs=[('oldMessageSetID', 'optional'), ('newMessageSetID', 'optional'), \
('responseData', 'optional'), ('onError', 'required')]
  CHOICE* {
""" + "    | or\n".join(f"    {request} {{...}}\n" for request in SUPPORTED_REQUESTS) + """\
  }

PayrollItemWageQueryRq attrs=[('requestID', 'optional'), ('metaData', 'optional')]
  CHOICE? {
    ListID+ : IDTYPE
    | or
    FullName+ : STRTYPE
    | or
    <group ListFilter>
      MaxReturned? : INTTYPE
      ActiveStatus? : ENUMTYPE[ActiveOnly|InactiveOnly|All]
      FromModifiedDate? : DATETIMETYPE
      ToModifiedDate? : DATETIMETYPE
      CHOICE? {
        NameFilter {
          MatchCriterion : ENUMTYPE[StartsWith|Contains|EndsWith]
          Name : STRTYPE
        }
        | or
        NameRangeFilter {
          FromName? : STRTYPE
          ToName? : STRTYPE
        }
      }
  }
  IncludeRetElement* : STRTYPE(50)

AdditionalContactRef
  ContactName : STRTYPE(40)
  ContactValue : STRTYPE(255)

BarCode
  BarCodeValue? : STRTYPE(50)
  AssignEvenIfUsed? : BOOLTYPE
  AllowOverride? : BOOLTYPE

DataExt
  OwnerID : GUIDTYPE
  DataExtName : STRTYPE(31)
  DataExtValue : STRTYPE

ShipToAddress
  Name : STRTYPE(41)
  Addr1? : STRTYPE(41)
  Addr2? : STRTYPE(41)
  Addr3? : STRTYPE(41)
  Addr4? : STRTYPE(41)
  Addr5? : STRTYPE(41)
  City? : STRTYPE(31)
  State? : STRTYPE(21)
  PostalCode? : STRTYPE(13)
  Country? : STRTYPE(31)
  Note? : STRTYPE(41)
  DefaultShipTo? : BOOLTYPE

TotalBalanceFilter
  Operator : ENUMTYPE[LessThan|LessThanEqual|Equal|GreaterThan|GreaterThanEqual]
  Amount : AMTTYPE

CurrencyFilter
  CHOICE {
    ListID+ : IDTYPE
    | or
    FullName+ : STRTYPE(64)
  }

ClassFilter
  CHOICE {
    ListID+ : IDTYPE
    | or
    FullName+ : STRTYPE
    | or
    ListIDWithChildren : IDTYPE
    | or
    FullNameWithChildren : STRTYPE
  }

AccountFilter
  CHOICE {
    ListID+ : IDTYPE
    | or
    FullName+ : STRTYPE
    | or
    ListIDWithChildren : IDTYPE
    | or
    FullNameWithChildren : STRTYPE
  }

RefNumberFilter
  MatchCriterion : ENUMTYPE[StartsWith|Contains|EndsWith]
  RefNumber : STRTYPE

RefNumberRangeFilter
  FromRefNumber? : STRTYPE
  ToRefNumber? : STRTYPE
"""

# Query wrappers with the same content and attributes as one the detailed order spells
# out: the item queries use the ListQueryWithOwnerIDAndClass group (as ItemServiceQueryRq)
# or the ListQueryWithOwnerID group (as ItemQueryRq).
SAME_AS = {
    "ItemNonInventoryQueryRq": "ItemServiceQueryRq",
    "ItemOtherChargeQueryRq": "ItemServiceQueryRq",
    "ItemInventoryQueryRq": "ItemServiceQueryRq",
    "ItemDiscountQueryRq": "ItemServiceQueryRq",
    "ItemPaymentQueryRq": "ItemServiceQueryRq",
    "ItemSalesTaxQueryRq": "ItemServiceQueryRq",
    "ItemSubtotalQueryRq": "ItemQueryRq",
    "ItemGroupQueryRq": "ItemQueryRq",
    "ItemSalesTaxGroupQueryRq": "ItemQueryRq",
}

# Values an attribute may take where the schema restricts it.
ATTRIBUTE_VALUES = {
    "onError": ["stopOnError", "continueOnError", "rollbackOnError"],
    "responseData": ["includeAll", "includeNone"],
    "metaData": ["NoMetaData", "MetaDataOnly", "MetaDataAndResponseData"],
    "iterator": ["Start", "Continue", "Stop"],
}

# Integer leaves with a lower bound (minInclusive) that the detailed order does not show.
INT_MINIMUM = {"MaxReturned": 1}

# Leaves with a default value, which an empty element takes.
DEFAULTS = {
    "ActiveStatus": "ActiveOnly",
    "DeliveryMethod": "Print",
    "JobStatus": "None",
    "PaidStatus": "All",
    "SalesTaxCountry": "Canada",
}

GENERIC_LIST_REF = """  ListID? : IDTYPE
  FullName? : STRTYPE
"""
ADDRESS_DATA = """  Addr1? : STRTYPE(41)
  Addr2? : STRTYPE(41)
  Addr3? : STRTYPE(41)
  Addr4? : STRTYPE(41)
  Addr5? : STRTYPE(41)
  City? : STRTYPE(31)
  State? : STRTYPE(21)
  PostalCode? : STRTYPE(13)
  Country? : STRTYPE(31)
  Note? : STRTYPE(41)
"""

VALUE_TYPES = {
    "STRTYPE": "kStr", "IDTYPE": "kId", "BOOLTYPE": "kBool", "DATETYPE": "kDate",
    "DATETIMETYPE": "kDateTime", "INTTYPE": "kInt", "AMTTYPE": "kAmt", "PRICETYPE": "kPrice",
    "QUANTYPE": "kQuan", "PERCENTTYPE": "kPercent", "FLOATTYPE": "kFloat",
    "GUIDTYPE": "kGuid", "ENUMTYPE": "kEnum",
}


class ParseError(Exception):
    pass


# ---- reading the notation -------------------------------------------------------------

CARD = r"(\?|\*|\+|\{\d+\.\.\d+\})?"
RE_HEADER = re.compile(r"^(\w+)(?: attrs=(\[.*\]))?$")
RE_GROUP = re.compile(r"^<group (\w+)>$")
RE_CHOICE = re.compile(r"^CHOICE" + CARD + r" \{$")
RE_INLINE = re.compile(r"^(\w+)" + CARD + r"(?: @(\[.*?\]))? \{$")
RE_REF = re.compile(r"^(\w+)" + CARD + r" \{\.\.\.\}$")
RE_LEAF = re.compile(r"^(\w+)" + CARD + r" : (\w+)(?:\((\d+)\)|\[([^\]]*)\])?$")


def cardinality(text):
    if not text:
        return 1, 1
    if text == "?":
        return 0, 1
    if text == "*":
        return 0, UNBOUNDED
    if text == "+":
        return 1, UNBOUNDED
    low, high = re.match(r"\{(\d+)\.\.(\d+)\}", text).groups()
    return int(low), int(high)


def indent_of(line):
    return len(line) - len(line.lstrip(" "))


class Reader:
    """Reads definitions: name -> (attributes, items). Items are tuples:
    ("leaf", name, min, max, type, length, enums), ("ref", name, min, max),
    ("inline", name, min, max, attributes, items), ("choice", min, max, [branch items]),
    ("group", name, items)."""

    def __init__(self, text, source):
        self.lines = [line.rstrip() for line in text.split("\n")]
        self.source = source
        self.pos = 0

    def fail(self, message):
        raise ParseError(f"{self.source}:{self.pos + 1}: {message}: {self.lines[self.pos]!r}")

    def definitions(self):
        result = []
        while self.pos < len(self.lines):
            line = self.lines[self.pos]
            if not line.strip():
                self.pos += 1
                continue
            if indent_of(line):
                self.fail("indented line outside a definition")
            match = RE_HEADER.match(line)
            if not match:
                self.fail("not a definition header")
            name, attrs = match.groups()
            attributes = []
            for attribute, use in (ast.literal_eval(attrs) if attrs else []):
                attributes.append((attribute, use == "required"))
            self.pos += 1
            result.append((name, attributes, self.items(2)))
        return result

    def items(self, indent):
        """Items at exactly `indent` until a line with a smaller indent or a separator."""
        items = []
        while self.pos < len(self.lines):
            line = self.lines[self.pos]
            if not line.strip():
                break
            here = indent_of(line)
            if here < indent:
                break
            if here > indent:
                self.fail("unexpected indent")
            body = line.strip()
            if body in ("}", "| or"):
                break
            items.append(self.item(body, indent))
        return items

    def closing(self, indent):
        if self.pos >= len(self.lines) or self.lines[self.pos] != " " * indent + "}":
            self.fail("expected a closing brace")
        self.pos += 1

    def item(self, body, indent):
        match = RE_GROUP.match(body)
        if match:
            self.pos += 1
            return ("group", match.group(1), self.items(indent + 2))
        match = RE_CHOICE.match(body)
        if match:
            low, high = cardinality(match.group(1))
            self.pos += 1
            branches = [self.items(indent + 2)]
            while self.lines[self.pos] == " " * (indent + 2) + "| or":
                self.pos += 1
                branches.append(self.items(indent + 2))
            self.closing(indent)
            return ("choice", low, high, branches)
        match = RE_INLINE.match(body)
        if match:
            name, card, attrs = match.groups()
            low, high = cardinality(card)
            attributes = [(a, False) for a in ast.literal_eval(attrs)] if attrs else []
            self.pos += 1
            items = self.items(indent + 2)
            self.closing(indent)
            return ("inline", name, low, high, attributes, items)
        match = RE_REF.match(body)
        if match:
            low, high = cardinality(match.group(2))
            self.pos += 1
            return ("ref", match.group(1), low, high)
        match = RE_LEAF.match(body)
        if match:
            name, card, type_name, length, enums = match.groups()
            if type_name not in VALUE_TYPES:
                self.fail(f"unknown value type {type_name}")
            low, high = cardinality(card)
            self.pos += 1
            return ("leaf", name, low, high, type_name, int(length or 0),
                    enums.split("|") if enums is not None else [])
        self.fail("unrecognised line")
        return None


# ---- resolving names ------------------------------------------------------------------


class Schema:
    def __init__(self, detailed_text, source):
        detailed = Reader(detailed_text, source).definitions()
        wrappers = "\n".join(ADD_WRAPPER.format(name=request[:-2])
                              for request in SUPPORTED_REQUESTS if request.endswith("AddRq"))
        explicit = Reader(EXPLICIT + "\n" + wrappers, "explicit").definitions()
        self.top = {}          # name -> (attributes, items): definitions in the file
        self.inline = {}       # name -> items: first inline definition in the file
        self.explicit = {}     # name -> (attributes, items): written from the schema above
        for name, attributes, items in detailed:
            self.top.setdefault(name, (attributes, items))
            self.collect_inline(items)
        for name, attributes, items in explicit:
            if name in self.top:
                continue  # the file's own definition wins
            self.explicit[name] = (attributes, items)
        for name, model in SAME_AS.items():
            if name not in self.top:
                self.explicit[name] = self.top[model]
        self.unchecked = set()

    def collect_inline(self, items):
        for item in items:
            if item[0] == "inline":
                self.inline.setdefault(item[1], item[5])
                self.collect_inline(item[5])
            elif item[0] == "group":
                self.collect_inline(item[2])
            elif item[0] == "choice":
                for branch in item[3]:
                    self.collect_inline(branch)

    def content_of(self, name):
        """(attributes, items) for a {...} reference, or None when unknown."""
        if name in self.top:
            return self.top[name]
        if name in self.explicit:
            return self.explicit[name]
        if name in self.inline:
            return [], self.inline[name]
        if name.endswith("Ref"):
            return [], Reader(GENERIC_LIST_REF, "GenericListRef").items(2)
        if name in ("ShipAddress", "BillAddress"):
            return [], Reader(ADDRESS_DATA, "AddressData").items(2)
        return None


# ---- flattening into particles --------------------------------------------------------


class Builder:
    """Turns definitions into aggregates (name, content key, attributes) and contents
    (lists of particle rows), sharing identical contents."""

    def __init__(self, schema):
        self.schema = schema
        self.aggregates = {}   # (name, content key) -> attributes
        self.contents = {}     # content key -> particle tree
        self.order = []        # aggregate keys in first-seen order
        self.resolving = set()

    def aggregate(self, name, attributes, items):
        if name in self.resolving:
            raise ParseError(f"{name} contains itself")
        self.resolving.add(name)
        tree = ("seq", 1, 1, self.sequence(items))
        self.resolving.discard(name)
        key = repr(tree)
        self.contents.setdefault(key, tree)
        aggregate_key = (name, key)
        if aggregate_key not in self.aggregates:
            self.aggregates[aggregate_key] = attributes
            self.order.append(aggregate_key)
        return aggregate_key

    def sequence(self, items):
        particles = []
        for item in items:
            if item[0] == "group":
                particles.extend(self.sequence(item[2]))
            else:
                particles.append(self.particle(item))
        return particles

    def particle(self, item):
        kind = item[0]
        if kind == "leaf":
            _, name, low, high, type_name, length, enums = item
            return ("elem", name, low, high, ("value", type_name, length, tuple(enums),
                                              INT_MINIMUM.get(name), DEFAULTS.get(name)))
        if kind == "choice":
            _, low, high, branches = item
            rows = []
            for branch in branches:
                flat = self.sequence(branch)
                rows.append(flat[0] if len(flat) == 1 and flat[0][0] == "elem"
                            else ("seq", 1, 1, flat))
            return ("choice", low, high, rows)
        if kind == "inline":
            _, name, low, high, attributes, items = item
            return ("elem", name, low, high, ("aggregate", self.aggregate(name, attributes,
                                                                          items)))
        if kind == "ref":
            _, name, low, high = item
            content = self.schema.content_of(name)
            if content is None:
                self.schema.unchecked.add(name)
                return ("elem", name, low, high, ("unchecked",))
            return ("elem", name, low, high, ("aggregate", self.aggregate(name, *content)))
        raise ParseError(f"unexpected item {item!r}")


# ---- writing C++ ----------------------------------------------------------------------


def cxx_string(text):
    return '"' + text.replace("\\", "\\\\").replace('"', '\\"') + '"'


def write(builder, schema, source_name):
    names = sorted(builder.order, key=lambda key: (key[0], builder.order.index(key)))
    index_of = {key: i for i, key in enumerate(names)}
    enum_pool = []
    enum_index = {}

    def enums(values):
        values = tuple(values)
        if not values:
            return 0, 0
        if values not in enum_index:
            enum_index[values] = len(enum_pool)
            enum_pool.extend(values)
        return enum_index[values], len(values)

    rows = []          # C++ particle rows
    content_first = {}

    def emit(tree):
        at = len(rows)
        rows.append(None)
        kind = tree[0]
        if kind == "elem":
            _, name, low, high, content = tree
            if content[0] == "value":
                _, type_name, length, values, minimum, default = content
                first, count = enums(values)
                rows[at] = (f"{{P::kElement, {low}, {high}, {at + 1}, {cxx_string(name)}, "
                            f"C::kValue, -1, V::{VALUE_TYPES[type_name]}, {length}, {first}, "
                            f"{count}, {minimum if minimum is not None else 0}, "
                            f"{'true' if minimum is not None else 'false'}, "
                            f"{cxx_string(default) if default is not None else '{}'}}},")
            elif content[0] == "aggregate":
                rows[at] = (f"{{P::kElement, {low}, {high}, {at + 1}, {cxx_string(name)}, "
                            f"C::kAggregate, {index_of[content[1]]}, V::kStr, 0, 0, 0, 0, "
                            f"false, {{}}}},")
            else:
                rows[at] = (f"{{P::kElement, {low}, {high}, {at + 1}, {cxx_string(name)}, "
                            f"C::kUnchecked, -1, V::kStr, 0, 0, 0, 0, false, {{}}}},")
            return
        _, low, high, children = tree
        for child in children:
            emit(child)
        label = "P::kSequence" if kind == "seq" else "P::kChoice"
        rows[at] = (f"{{{label}, {low}, {high}, {len(rows)}, {{}}, C::kUnchecked, -1, "
                    f"V::kStr, 0, 0, 0, 0, false, {{}}}},")

    for key in names:
        content_key = key[1]
        if content_key not in content_first:
            content_first[content_key] = len(rows)
            emit(builder.contents[content_key])

    attribute_rows = []
    aggregate_rows = []
    for key in names:
        attributes = builder.aggregates[key]
        first_attribute = len(attribute_rows)
        for attribute, required in attributes:
            first, count = enums(ATTRIBUTE_VALUES.get(attribute, []))
            attribute_rows.append(f"{{{cxx_string(attribute)}, {'true' if required else 'false'}, "
                                  f"{first}, {count}}},")
        aggregate_rows.append(f"{{{cxx_string(key[0])}, {content_first[key[1]]}, "
                              f"{first_attribute}, {len(attributes)}}},")

    unchecked = sorted(schema.unchecked)
    out = []
    out.append("// qbXML 13.0 aggregates for the stand-in's request checks and Ret order.")
    out.append(f"// Written by scripts/gen-schema-tables.py from {source_name}; do not edit by")
    out.append("// hand.")
    out.append(f"// {len(aggregate_rows)} aggregates, {len(rows)} particles, "
               f"{len(enum_pool)} enum values.")
    out.extend(textwrap.wrap("Content not checked (no definition known): " +
                             (", ".join(unchecked) if unchecked else "none") + ".",
                             width=97, initial_indent="// ", subsequent_indent="// "))
    out.append("// Included once, by simulator/schema/SchemaModel.cpp, inside")
    out.append("// namespace droqbxml::simulator::internal.")
    out.append("// clang-format off")
    out.append("")
    out.append(f"inline constexpr std::array<std::string_view, {max(len(enum_pool), 1)}> "
               "kEnumValues{{")
    out.extend(f"    {cxx_string(value)}," for value in (enum_pool or [""]))
    out.append("}};")
    out.append("")
    out.append("// kind, min, max, end (one past its subtree), name, content, aggregate, value")
    out.append("// type, maximum length, first enum value, enum value count, minimum, has minimum,")
    out.append("// default")
    out.append(f"inline constexpr std::array<Particle, {len(rows)}> kParticles{{{{")
    out.extend(f"    {row}" for row in rows)
    out.append("}};")
    out.append("")
    out.append("// name, required, first enum value, enum value count")
    out.append(f"inline constexpr std::array<AttributeRule, {max(len(attribute_rows), 1)}> "
               "kAttributes{{")
    out.extend(f"    {row}" for row in (attribute_rows or ['{"", false, 0, 0},']))
    out.append("}};")
    out.append("")
    out.append("// Sorted by name; where two definitions share a name, the first is the one a")
    out.append("// lookup by name finds. name, root sequence particle, first attribute, count")
    out.append(f"inline constexpr std::array<AggregateRule, {len(aggregate_rows)}> kAggregates{{{{")
    out.extend(f"    {row}" for row in aggregate_rows)
    out.append("}};")
    out.append("")
    out.append("// clang-format on")
    return "\n".join(out) + "\n", unchecked


def main(argv):
    source = argv[1] if len(argv) > 1 else DEFAULT_INPUT
    with open(source, encoding="utf-8") as handle:
        text = handle.read()
    schema = Schema(text, os.path.basename(source))
    builder = Builder(schema)
    for name in ["QBXML", "QBXMLMsgsRq"] + SUPPORTED_REQUESTS:
        content = schema.content_of(name)
        if content is None:
            raise ParseError(f"no definition for {name}")
        builder.aggregate(name, *content)
    # Every other aggregate the file defines, so that Ret aggregates have an order.
    for name, (attributes, items) in schema.top.items():
        builder.aggregate(name, attributes, items)
    names = [key[0] for key in builder.order]
    for name in sorted({name for name in names if names.count(name) > 1}):
        print(f"note: {name} has more than one definition; lookups by name find the first",
              file=sys.stderr)
    output, unchecked = write(builder, schema, os.path.basename(source))
    os.makedirs(os.path.dirname(OUTPUT), exist_ok=True)
    with open(OUTPUT, "w", encoding="utf-8", newline="\n") as handle:
        handle.write(output)
    print(f"wrote {os.path.relpath(OUTPUT, REPO)}; content not checked: "
          f"{', '.join(unchecked) or 'none'}")
    return 0


if __name__ == "__main__":
    try:
        sys.exit(main(sys.argv))
    except (ParseError, OSError) as error:
        print(f"gen-schema-tables: {error}", file=sys.stderr)
        sys.exit(1)
