"""Printers of gdb for qltypes: records, tables, elements, number records and symbolic dimensions.

gdb loads them by itself with a libqltypes.so that is installed; elsewhere `source qltypes_gdb.py` does. Fields and the names
of enumerators are read from the debug information, so a program must be built with -g. Nothing is called in the program
that is looked at.
"""

import re
import struct

import gdb
import gdb.printing


def enumerator(value):
    """The name of an enumeration's value without its scope, or the number where none has it."""
    number = int(value)
    for field in value.type.strip_typedefs().fields():
        if field.enumval == number:
            return field.name.rsplit("::", 1)[-1]
    return str(number)


def text(string):
    """A std::string, as gdb has printed it since the new strings of libstdc++."""
    return string["_M_dataplus"]["_M_p"].string("utf-8", "replace", int(string["_M_string_length"]))


def items(vector):
    """The items of a std::vector."""
    start, finish = vector["_M_impl"]["_M_start"], vector["_M_impl"]["_M_finish"]
    return [start[i] for i in range(int(finish - start))]


def deque_item(deque, index):
    """An item of a std::deque: blocks of 512 bytes."""
    start = deque["_M_impl"]["_M_start"]
    first = start["_M_first"]
    per_block = max(1, 512 // first.dereference().type.sizeof)
    at = index + int(start["_M_cur"] - first)
    return start["_M_node"][at // per_block][at % per_block]


def pointee(pointer):
    """What a pointer points to, as of the class that the pointer names: gdb would look for another one, and complain."""
    return pointer.cast(pointer.type.target().array(0).pointer()).dereference()[0]


def owned(unique):
    """What a std::unique_ptr points to; with the usual deleter it is one pointer."""
    return pointee(unique.address.cast(unique.type.template_argument(0).pointer().pointer()).dereference())


def class_name(record):
    """The class that a record really is of, by its table of virtual operations; empty where that has no symbol."""
    pointer = gdb.lookup_type("void").pointer().pointer()
    symbol = gdb.execute(f"info symbol {int(record.address.cast(pointer.pointer()).dereference())}", to_string=True)
    found = re.match(r"vtable for (.+?) \+ \d+", symbol)
    return found[1] if found else ""


def most_derived(record):
    """A record as what it is, where the debug information tells of that class."""
    if record.address is None:
        return record
    try:
        return record.address.cast(gdb.lookup_type(class_name(record)).pointer()).dereference()
    except gdb.error:
        return record


def derives_from(type, name):
    type = type.strip_typedefs().unqualified()
    if type.name == name:
        return True
    if type.code != gdb.TYPE_CODE_STRUCT:
        return False
    return any(field.is_base_class and derives_from(field.type, name) for field in type.fields())


def has_field(value, name):
    try:
        value[name]
    except gdb.error:
        return False
    return True


def plural(count, what):
    return f"{count} {what}" if count == 1 else f"{count} {what}s"


def record_summary(record):
    """One line: id, name, kind, size; what an alias stands for."""
    record = most_derived(record)
    summary = f'{int(record["id_"])} "{text(record["name_"])}"'
    if has_field(record, "aliasedTo_"):
        return f'{summary}, alias of {int(record["aliasedTo_"]["id_"])} "{text(record["aliasedTo_"]["name_"])}"'
    if class_name(record).endswith("::AliasDataType"):
        return f"{summary}, an alias"
    summary += f', {enumerator(record["qualifier_"])}'
    size = int(record["size_"])
    return summary + (f', {plural(size, "byte")}' if size >= 0 else ", no size yet")


class Record:
    """QLTypeSys::DataType and what derives from it; a structure with its elements."""

    def __init__(self, value):
        self.value = most_derived(value)

    def to_string(self):
        return record_summary(self.value)

    def children(self):
        if has_field(self.value, "elements_"):
            for index, element in enumerate(items(self.value["elements_"])):
                yield f"[{index}]", element.dereference()

    def display_hint(self):
        return None


class Table:
    """QLTypeSys::DataTypeTable and what derives from it: a line for each record."""

    def __init__(self, value):
        self.records = items(value["dataTypes_"])

    def to_string(self):
        return plural(len(self.records), "type")

    def children(self):
        for position, record in enumerate(self.records):
            yield f"[{position - 1}]", LineOf(record)


class LineOf(str):
    """A record's line, which gdb prints as it is."""

    def __new__(cls, record):
        return super().__new__(cls, record_summary(pointee(record)) if record else "none")


class Element:
    """StructElement."""

    def __init__(self, value):
        self.value = value

    def to_string(self):
        value = self.value
        dimensions = [int(value["dims"][i]) for i in range(int(value["numDims"]))]
        parts = [f'type {int(value["dataTypeId"])}']
        if dimensions:
            parts.append("".join(f"[{dimension}]" for dimension in dimensions))
        if int(value["signalType"]) == 1:
            parts.append("complex")
        if int(value["samplingMode"]) == 1:
            parts.append("frame based")
        if int(value["dimensionsMode"]) == 1:
            parts.append("variable dimensions")
        offset = int(value["offset"])
        parts.append(f"offset {offset}" if offset >= 0 else "not laid out")
        return f'"{text(value["name"])}": {", ".join(parts)}'


class NumberRecord:
    """fxpDataTypeProp."""

    def __init__(self, value):
        self.value = value

    def to_string(self):
        value = self.value
        sign = {0: "unsigned", 1: "signed"}.get(int(value["Signedness"]), "sign left open")
        parts = [enumerator(value["DataTypeMode"]), sign, plural(int(value["WordLength"]), "bit")]
        exponent_bits = int(value["ExponentLength"])
        if exponent_bits:
            parts.append(f"{exponent_bits} of them exponent")
        factor, exponent, bias = float(value["SlopeAdjustmentFactor"]), int(value["FixedExponent"]), float(value["Bias"])
        if (factor, exponent, bias) != (1.0, 0, 0.0):
            scaling = f"{factor:g}*2^{exponent}*Q" if factor != 1.0 else f"2^{exponent}*Q"
            parts.append(scaling + (f" + {bias:g}" if bias else ""))
        return ", ".join(parts)


class Expressions:
    """The nodes of an expression table, read from its memory."""

    def __init__(self, table):
        self.store = owned(table["nodes_"])
        self.records = self.store["records_"]["_M_impl"]["_M_start"]
        self.op_type = gdb.lookup_type("QL::SymbolicOp")

    @staticmethod
    def constant(name):
        return int(gdb.parse_and_eval(f"QL::NodeStore::{name}"))

    def text(self, node, depth=0):
        record = self.records[node]
        head, first, second = int(record["head"]), int(record["first"]), int(record["second"])
        op = enumerator(gdb.Value(head & self.constant("opMask")).cast(self.op_type))
        if op == "StringSymbol":
            return text(deque_item(self.store["names_"], first))
        if op == "IntValue":
            return str(struct.unpack("<i", struct.pack("<I", first))[0])
        if op == "DoubleValue":
            return repr(struct.unpack("<d", struct.pack("<II", first, second))[0])
        if op == "BoolSymbol":
            return "true" if first else "false"
        if depth == 20:
            return "..."
        count = (head & self.constant("countMask")) >> self.constant("countShift")
        operands = [first, second][:count]
        if count > 2:
            pool = self.store["pool_"]["_M_impl"]["_M_start"]
            operands = [int(pool[first + i]) for i in range(min(count, 50))]
        texts = [self.text(operand, depth + 1) for operand in operands]
        return f'{op}({", ".join(texts + ["..."] * (count > len(operands)))})'


def expression_text(table, node):
    """An expression with its operators by name, or nothing where the debug information does not tell."""
    try:
        return ": " + Expressions(table).text(node)
    except (gdb.error, gdb.MemoryError):
        return ""


class Dimension:
    """QLTypeSys::SymbolicDims and what derives from it. The expression is that of the id plus one."""

    def __init__(self, value):
        self.value = value

    def to_string(self):
        number = int(self.value["id_"])
        try:
            table = owned(self.value["table_"]["exprTable_"])
        except gdb.error:
            return f"id {number}"
        return f"id {number}" + expression_text(table, number + 1)


class Expression:
    """QL::SymbolicExpr and what derives from it."""

    def __init__(self, value):
        self.value = value

    def to_string(self):
        number = int(self.value["id_"])
        return f"expression {number}" + expression_text(self.value["table_"].dereference(), number)


PRINTERS = [
    ("QLTypeSys::DataType", Record),
    ("QLTypeSys::DataTypeTable", Table),
    ("StructElement", Element),
    ("fxpDataTypeProp", NumberRecord),
    ("QLTypeSys::SymbolicDims", Dimension),
    ("QL::SymbolicExpr", Expression),
]


class Printers(gdb.printing.PrettyPrinter):
    """Finds the printer of a class by what it derives from, so that classes of clients have it too."""

    def __init__(self):
        subprinters = []
        for name, _ in PRINTERS:
            subprinters.append(gdb.printing.SubPrettyPrinter(name))
        super().__init__("qltypes", subprinters)

    def __call__(self, value):
        type = value.type.strip_typedefs()
        if type.code != gdb.TYPE_CODE_STRUCT:
            return None
        for subprinter, (name, printer) in zip(self.subprinters, PRINTERS):
            if subprinter.enabled and derives_from(type, name):
                return printer(value)
        return None


def register(objfile):
    """Makes the printers known for what an object file brings, or for everything."""
    gdb.printing.register_pretty_printer(objfile, Printers(), replace=True)


if __name__ == "__main__":
    register(None)
