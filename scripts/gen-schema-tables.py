#!/usr/bin/env python3
"""Writes simulator/schema/SchemaTables.inc, the stand-in's compiled-in qbXML 13.0 tables.

Reads Intuit's qbXML 13.0 validator schemas (qbxmlops130.xsd and the three files it
includes) and turns the request side of a document into constexpr rows: every aggregate
reachable from QBXML through SignonMsgsRq, QBXMLMsgsRq and QBXMLSubscriptionMsgsRq as a
tree of particles (elements, sequences, choices with min/max, groups spliced in), leaf value
types with their maximum lengths, enum values, bounds and defaults, and attributes. The
Ret and Rs aggregates the stand-in writes are added so that responses follow schema order.
The qbXML version that introduced a child comes from the version-tagged element order
(qbxml130_children_with_version_tags.txt). Run by hand when the schemas change:

    scripts/gen-schema-tables.py [path/to/qbxml/folder]

Standard library only. The output is committed; the build never needs the input.
"""

import os
import re
import sys
import textwrap
import xml.etree.ElementTree as ET

REPO = os.path.dirname(os.path.dirname(os.path.abspath(__file__)))
DEFAULT_INPUT = os.path.join(REPO, "..", "shared", "qbxml")
OUTPUT = os.path.join(REPO, "simulator", "schema", "SchemaTables.inc")
UNBOUNDED = 0xFFFF
XSD = "{http://www.w3.org/2001/XMLSchema}"

# Aggregates the stand-in writes in its responses, looked up by name for their child order.
ITEM_KINDS = ["NonInventory", "Service", "OtherCharge", "Inventory", "Discount", "Subtotal",
              "Group", "Payment", "SalesTax", "SalesTaxGroup"]
RESPONSE_ELEMENTS = (["CustomerRet", "AccountRet", "EstimateRet", "InvoiceRet",
                      "PayrollItemWageRet"] + [f"Item{kind}Ret" for kind in ITEM_KINDS])
RESPONSE_TYPES = ["CustomerAddRs", "CustomerQueryRs", "EstimateAddRs", "InvoiceAddRs",
                  "ItemQueryRs"]

VALUE_TYPES = {
    "STRTYPE": "kStr", "IDTYPE": "kId", "BOOLTYPE": "kBool", "DATETYPE": "kDate",
    "DATETIMETYPE": "kDateTime", "INTTYPE": "kInt", "AMTTYPE": "kAmt", "PRICETYPE": "kPrice",
    "QUANTYPE": "kQuan", "PERCENTTYPE": "kPercent", "FLOATTYPE": "kFloat",
    "GUIDTYPE": "kGuid", "ENUMTYPE": "kEnum", "TIMEINTERVALTYPE": "kTimeInterval",
    "UUIDTYPE": "kStr", "MACROTYPE": "kStr",
}


class SchemaError(Exception):
    pass


def occurs(node):
    low = int(node.get("minOccurs", "1"))
    high = node.get("maxOccurs", "1")
    return low, UNBOUNDED if high == "unbounded" else int(high)


def read_version_tags(path):
    """aggregate -> {child: version times ten} from 'Agg: A, B(v2.1)[not QBD], ...' lines."""
    tags = {}
    with open(path, encoding="utf-8") as handle:
        for line in handle:
            if ":" not in line:
                continue
            aggregate, children = line.split(":", 1)
            for child in children.split(","):
                match = re.match(r"\s*(\w+)\(v(\d+)\.(\d+)\)", child)
                if match:
                    tags.setdefault(aggregate.strip(), {})[match.group(1)] = (
                        int(match.group(2)) * 10 + int(match.group(3)))
    return tags


class Schema:
    """The global declarations of the four schema files."""

    def __init__(self, folder):
        self.elements, self.complex_types, self.simple_types, self.groups = {}, {}, {}, {}
        for name in ("qbxmltypes130.xsd", "qbxml130.xsd", "qbxmlso130.xsd", "qbxmlops130.xsd"):
            root = ET.parse(os.path.join(folder, "xsd", name)).getroot()
            for node in root:
                kind = {XSD + "element": self.elements, XSD + "complexType": self.complex_types,
                        XSD + "simpleType": self.simple_types,
                        XSD + "group": self.groups}.get(node.tag)
                if kind is not None:
                    kind[node.get("name")] = node


class Builder:
    """Turns declarations into aggregates (name, content key, attributes) and contents
    (particle trees), sharing identical contents."""

    def __init__(self, schema, tags):
        self.schema = schema
        self.tags = tags
        self.aggregates = {}   # aggregate key -> (name, attributes)
        self.contents = {}     # content key -> particle tree
        self.order = []        # aggregate keys in first-seen order
        self.memo = {}         # (declaring node, name) -> aggregate key
        self.resolving = set()

    # ---- simple types -----------------------------------------------------------------

    def simple_value(self, node, default):
        """A leaf's value description from a simpleType or a type name."""
        base, length, enums, low, high = None, 0, [], None, None
        if isinstance(node, str):
            base = node
        else:
            restriction = node.find(XSD + "restriction")
            if restriction is None:
                raise SchemaError("a simple type that is not a restriction")
            base = restriction.get("base")
            for facet in restriction:
                value = facet.get("value")
                if facet.tag == XSD + "maxLength":
                    length = int(value)
                elif facet.tag == XSD + "enumeration":
                    enums.append(value)
                elif facet.tag == XSD + "minInclusive":
                    low = int(value)
                elif facet.tag == XSD + "maxInclusive":
                    high = int(value)
        if base not in VALUE_TYPES:
            raise SchemaError(f"unknown value type {base}")
        type_name = "ENUMTYPE" if enums else base
        if type_name == "IDTYPE":
            length = 0  # the type itself holds 36
        return ("value", type_name, length, tuple(enums), low, high, default, False)

    # ---- complex content --------------------------------------------------------------

    def attributes_of(self, complex_type):
        result = []
        holder = complex_type
        extension = complex_type.find(f"{XSD}simpleContent/{XSD}extension")
        if extension is not None:
            holder = extension
        for attribute in holder.findall(XSD + "attribute"):
            enums = [e.get("value") for e in attribute.iter(XSD + "enumeration")]
            result.append((attribute.get("name"), attribute.get("use") == "required",
                           tuple(enums)))
        return tuple(result)

    def model(self, node, low=1, high=1):
        """A particle tree for a sequence, choice, group reference or element."""
        if node.tag == XSD + "element":
            return self.element(node)
        if node.tag == XSD + "group":
            group = self.schema.groups[node.get("ref")]
            inner = next(child for child in group if child.tag in (XSD + "sequence",
                                                                   XSD + "choice"))
            return self.model(inner, *occurs(node))
        if node.tag not in (XSD + "sequence", XSD + "choice"):
            raise SchemaError(f"unexpected {node.tag}")
        if low == 1 and high == 1:
            low, high = occurs(node)
        children = []
        for child in node:
            if child.tag not in (XSD + "element", XSD + "group", XSD + "sequence",
                                 XSD + "choice"):
                continue
            particle = self.model(child)
            if node.tag == XSD + "sequence" and particle[0] == "seq" and particle[1:3] == (1, 1):
                children.extend(particle[3])  # a plain sequence within a sequence
            elif (node.tag == XSD + "choice" and particle[0] == "seq" and len(particle[3]) == 1
                  and particle[1:3] == (1, 1) and particle[3][0][0] == "elem"):
                children.append(particle[3][0])
            else:
                children.append(particle)
        return ("seq" if node.tag == XSD + "sequence" else "choice", low, high, children)

    def element(self, node):
        low, high = occurs(node)
        if node.get("ref"):
            name = node.get("ref")
            declaration = self.schema.elements[name]
        else:
            name = node.get("name")
            declaration = node
        return ("elem", name, low, high, self.content_of(name, declaration))

    def content_of(self, name, declaration):
        default = declaration.get("default")
        type_name = declaration.get("type")
        if type_name in self.schema.complex_types:
            return ("aggregate", self.aggregate(name, self.schema.complex_types[type_name]))
        if type_name in self.schema.simple_types or type_name in VALUE_TYPES:
            return self.simple_value(type_name, default)
        simple = declaration.find(XSD + "simpleType")
        if simple is not None:
            return self.simple_value(simple, default)
        complex_type = declaration.find(XSD + "complexType")
        if complex_type is None:
            raise SchemaError(f"{name} has no type")
        extension = complex_type.find(f"{XSD}simpleContent/{XSD}extension")
        if extension is not None:
            value = self.simple_value(extension.get("base"), default)
            return value[:-1] + (len(self.attributes_of(complex_type)) > 0,)
        return ("aggregate", self.aggregate(name, complex_type))

    def aggregate(self, name, complex_type, content=None):
        memo_key = (id(complex_type), name)
        if memo_key in self.memo:
            return self.memo[memo_key]
        if memo_key in self.resolving:
            raise SchemaError(f"{name} contains itself")
        self.resolving.add(memo_key)
        if content is None:
            content = next((child for child in complex_type
                            if child.tag in (XSD + "sequence", XSD + "choice", XSD + "group")),
                           None)
        tree = ("seq", 1, 1, []) if content is None else self.model(content)
        if tree[0] != "seq" or tree[1:3] != (1, 1):
            tree = ("seq", 1, 1, [tree])
        tree = self.tagged(name, tree)
        self.resolving.discard(memo_key)
        key = repr(tree)
        self.contents.setdefault(key, tree)
        attributes = self.attributes_of(complex_type)
        aggregate_key = (name, key, repr(attributes))
        if aggregate_key not in self.aggregates:
            self.aggregates[aggregate_key] = (name, attributes)
            self.order.append(aggregate_key)
        self.memo[memo_key] = aggregate_key
        return aggregate_key

    def tagged(self, aggregate, tree):
        """The tree with the version that introduced each child of `aggregate` on it."""
        versions = self.tags.get(aggregate)
        if not versions:
            return tree

        def tag(particle):
            if particle[0] == "elem":
                return particle + (versions.get(particle[1], 0),)
            return particle[:3] + ([tag(child) for child in particle[3]],)
        return tag(tree)


# ---- writing C++ ----------------------------------------------------------------------


def cxx_string(text):
    return '"' + text.replace("\\", "\\\\").replace('"', '\\"') + '"'


def write(builder):
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

    rows = []
    content_first = {}

    def emit(tree):
        at = len(rows)
        rows.append(None)
        kind = tree[0]
        if kind == "elem":
            name, low, high, content = tree[1:5]
            since = tree[5] if len(tree) > 5 else 0
            head = f"{{P::kElement, {low}, {high}, {at + 1}, {cxx_string(name)}, "
            if content[0] == "value":
                _, type_name, length, values, minimum, maximum, default, macro = content
                first, count = enums(values)
                rows[at] = (head + f"C::kValue, -1, V::{VALUE_TYPES[type_name]}, {length}, "
                            f"{first}, {count}, {minimum if minimum is not None else 0}, "
                            f"{maximum if maximum is not None else 0}, "
                            f"{int(minimum is not None) | int(maximum is not None) << 1 | int(macro) << 2}, "
                            f"{since}, {cxx_string(default) if default is not None else '{}'}}},")
            else:
                rows[at] = (head + f"C::kAggregate, {index_of[content[1]]}, V::kStr, 0, 0, 0, "
                            f"0, 0, 0, {since}, {{}}}},")
            return
        low, high, children = tree[1:4]
        for child in children:
            emit(child)
        label = "P::kSequence" if kind == "seq" else "P::kChoice"
        rows[at] = (f"{{{label}, {low}, {high}, {len(rows)}, {{}}, C::kUnchecked, -1, V::kStr, "
                    f"0, 0, 0, 0, 0, 0, 0, {{}}}},")

    for key in names:
        content_key = key[1]
        if content_key not in content_first:
            content_first[content_key] = len(rows)
            emit(builder.contents[content_key])
    if len(rows) >= 0xFFFF:
        raise SchemaError(f"{len(rows)} particles do not fit 16-bit indexes")

    attribute_rows = []
    aggregate_rows = []
    for key in names:
        name, attributes = builder.aggregates[key]
        first_attribute = len(attribute_rows)
        for attribute, required, values in attributes:
            first, count = enums(values)
            attribute_rows.append(f"{{{cxx_string(attribute)}, {'true' if required else 'false'}, "
                                  f"{first}, {count}}},")
        aggregate_rows.append(f"{{{cxx_string(name)}, {content_first[key[1]]}, "
                              f"{first_attribute}, {len(attributes)}}},")

    out = []
    out.append("// qbXML 13.0 aggregates for the stand-in's request checks and Ret order.")
    out.append("// Written by scripts/gen-schema-tables.py from the qbXML 13.0 validator schemas;")
    out.append("// do not edit by hand.")
    out.append(f"// {len(aggregate_rows)} aggregates, {len(rows)} particles, "
               f"{len(enum_pool)} enum values.")
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
    out.append("// type, maximum length, first enum value, enum value count, minimum, maximum,")
    out.append("// flags (1 minimum, 2 maximum, 4 useMacro), version introduced, default")
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
    return "\n".join(out) + "\n", len(aggregate_rows), len(rows)


def main(argv):
    folder = argv[1] if len(argv) > 1 else DEFAULT_INPUT
    schema = Schema(folder)
    tags = read_version_tags(os.path.join(folder, "element-order",
                                          "qbxml130_children_with_version_tags.txt"))
    builder = Builder(schema, tags)
    # The request side of QBXML: its first sequence (the second is the response's).
    qbxml = schema.elements["QBXML"].find(XSD + "complexType")
    builder.aggregate("QBXML", qbxml, qbxml.find(f"{XSD}choice/{XSD}sequence"))
    for name in RESPONSE_ELEMENTS:
        builder.element(ET.Element(XSD + "element", ref=name))
    for name in RESPONSE_TYPES:
        builder.aggregate(name, schema.complex_types[name + "Type"])
    output, aggregates, particles = write(builder)
    os.makedirs(os.path.dirname(OUTPUT), exist_ok=True)
    with open(OUTPUT, "w", encoding="utf-8", newline="\n") as handle:
        handle.write(output)
    print(f"wrote {os.path.relpath(OUTPUT, REPO)}: {aggregates} aggregates, {particles} particles")
    return 0


if __name__ == "__main__":
    try:
        sys.exit(main(sys.argv))
    except (SchemaError, OSError, ET.ParseError, KeyError) as error:
        print(f"gen-schema-tables: {error!r}", file=sys.stderr)
        sys.exit(1)
