"""Shows the values of kplib in gdb as what they hold.

An installed library brings this file along, and gdb loads it with the library where it trusts the folder:
    add-auto-load-scripts-directory PREFIX/share/gdb/auto-load
    add-auto-load-safe-path PREFIX/share/gdb/auto-load
gdb knows the first for PREFIX /usr. By hand:  source kplib_printers.py
Of classes with virtual functions, such as HxParamBundle, a library without debug information shows nothing, unless the
program is compiled with -femit-class-debug-always (g++) or -fstandalone-debug (clang++)."""
import struct

import gdb
import gdb.printing

longest_hex = 64
prim_types = ["byte", "short", "int", "float", "double", "complex", "string", "ushort", "uint", "sbyte"]
flags = ["NoSave", "NoCopy", "NoDelete", "NoInsertBundle", "NoInsertParam", "NoRename", "NoSetValue", "Hidden"]
scalar_formats = {"byte": "B", "short": "h", "int": "i", "float": "f", "double": "d", "ushort": "H", "uint": "I",
                  "sbyte": "b"}


def memory(address, size):
    return bytes(gdb.selected_inferior().read_memory(int(address), size)) if size > 0 else b""


def text_at(pointer):
    """The text at a `const char*`, in quotes; "null" without one."""
    return '"' + pointer.string(errors="replace") + '"' if int(pointer) else "null"


def atomic(value):
    """The value in a std::atomic, of whatever standard library."""
    while value.type.strip_typedefs().code == gdb.TYPE_CODE_STRUCT:
        value = value[first_field(value.type)]
    return value


def first_field(type_):
    return next(field for field in type_.strip_typedefs().fields() if hasattr(field, "bitpos"))  # static ones have none


def prim_type_name(value):
    number = int(value["type_"])
    return prim_types[number] if 0 <= number < len(prim_types) else f"type {number}"


def numbers(values):
    return "(" + ", ".join(f"{float(v):.6g}" if v.type.strip_typedefs().code == gdb.TYPE_CODE_FLT else str(v)
                           for v in values) + ")"


def elements(array):
    first, last = array.type.strip_typedefs().range()
    return [array[i] for i in range(first, last + 1)]


class Text:
    """A value that is one line of text; a class gives it as text()."""

    def __init__(self, value):
        self.value = value

    def to_string(self):
        return self.text()


class String(Text):
    def text(self):
        length = int(self.value["size_"]) - 1
        return self.value["data_"].string(length=length, errors="replace") if length > 0 else ""

    def display_hint(self):
        return "string"


class Array(Text):
    def text(self):
        return f"{self.value.type.unqualified().strip_typedefs()} of {int(self.value['size_'])}, room for {int(self.value['capacity_'])}"

    def children(self):
        for i in range(int(self.value["size_"])):
            yield f"[{i}]", self.value["data_"][i]

    def display_hint(self):
        return "array"


class Handle(Text):
    def text(self):
        pointer = self.value["pointer_"]
        if not int(pointer):
            return "empty handle"
        try:
            count = f", {int(atomic(pointer.dereference()['refCount_']))} references"
        except gdb.error:
            count = ""
        return f"handle of {pointer.dynamic_type.target()} at {int(pointer):#x}{count}"

    def children(self):
        pointer = self.value["pointer_"]
        if int(pointer):
            yield "object", pointer.cast(pointer.dynamic_type).dereference()


class PrimType(Text):
    def text(self):
        return prim_type_name(self.value)


class TypedPointer(Text):
    def text(self):
        name = prim_type_name(self.value["type"])
        address = int(self.value["data"])
        return f"{name} data at {address:#x}" if address else f"null, {name}"


class Parameter(Text):
    def text(self):
        return parameter_text(self.value)


def parameter_text(parameter):
    """The name of a parameter and its value."""
    type_name = prim_type_name(parameter["primType_"])
    storage = parameter["value_"]
    dimension = int(parameter["dimension_"])
    if not int(storage):
        shown = "null"
    elif type_name == "string":
        shown = text_at(storage.cast(gdb.lookup_type("char").pointer()))
    elif type_name in scalar_formats:
        form = f"<{dimension}{scalar_formats[type_name]}"
        values = struct.unpack(form, memory(storage, struct.calcsize(form)))
        shown = " ".join(f"{v:.6g}" if isinstance(v, float) else str(v) for v in values) + f" ({type_name})"
    else:
        shown = f"{dimension} of {type_name} at {int(storage):#x}"
    return f"{parameter['name_'].string(errors='replace')} = {shown}{flags_text(parameter)}"


def flags_text(node):
    names = [name for i, name in enumerate(flags) if int(node["flags_"]) >> i & 1]
    return f" [{' '.join(names)}]" if names else ""


def tree_lines(bundle, indent):
    """A bundle and all that is below it, one line a node."""
    yield f"{indent}{bundle['name_'].string(errors='replace')} {{{flags_text(bundle)}"
    children = bundle["children_"]
    for i in range(int(children["size_"])):
        node = children["data_"][i].dereference()
        if int(node["type_"]) == 1:
            yield from tree_lines(node.cast(gdb.lookup_type("HxParamBundle")), indent + "    ")
        else:
            yield f"{indent}    {parameter_text(node.cast(gdb.lookup_type('HxParameter')))}"
    yield indent + "}"


class Bundle(Text):
    def text(self):
        return "\n".join(tree_lines(self.value, ""))


class Bitfield(Text):
    def text(self):
        bits, words = int(self.value["nBits_"]), int(self.value["nWords_"])
        data = memory(self.value["bits_"], (bits + 31) // 32 * 4) if words else b""
        field = int.from_bytes(data, "little") & ((1 << bits) - 1)
        first = "".join(str(field >> i & 1) for i in range(min(bits, longest_hex)))
        return f"{bits} bits, {bin(field).count('1')} set: {first}{'...' if bits > longest_hex else ''}"


class Vector(Text):
    def text(self):
        return numbers(elements(self.value["v_"]))


class SquareMatrix(Text):
    def text(self):
        return "[" + ", ".join(numbers(elements(row)) for row in elements(self.value["m_"])) + "]"


class Rotation(Text):
    def text(self):
        return "quaternion " + numbers(elements(self.value["q_"]))


class Matrix(Text):
    def text(self):
        return f"{int(self.value['rows_'])} x {int(self.value['cols_'])}"

    def children(self):
        columns = int(self.value["cols_"])
        for row in range(int(self.value["rows_"])):
            yield f"[{row}]", numbers([self.value["data_"][row * columns + i] for i in range(columns)])


class Message(Text):
    def text(self):
        size, offset = int(self.value["buffer_"]["size_"]), int(self.value["readOffset_"])
        begin = memory(self.value["buffer_"]["data_"], min(size, longest_hex)).hex(" ")
        return f"{size} bytes, read up to {offset}: {begin}{' ...' if size > longest_hex else ''}"


class Result(Text):
    def text(self):
        error = self.value["error_"]["pointer_"]
        if not int(error):
            return "Ok"
        record = error.dereference()
        if not record.type.strip_typedefs().fields():  # no debug information of it
            return f"failure at {int(error):#x}"
        texts = [String(record[name]).text() for name in ("text_", "data_", "file_")]
        place = f" at {texts[2]}:{int(record['line_'])}" if texts[2] else ""
        return f'failure {int(record["code_"])} "{texts[0]}", data "{texts[1]}"{place}'


class Identifier(Text):
    def text(self):
        value, empty = self.value["value_"], self.base_of(self.value.type).template_argument(1)
        return f"{value} (empty)" if int(value) == int(empty) else str(value)

    def base_of(self, type_):
        while not type_.strip_typedefs().name.startswith("KpID<"):
            type_ = first_field(type_).type
        return type_.strip_typedefs()


class Kp128(Text):
    def text(self):
        return f"{int(self.value['first']):016x}{int(self.value['second']):016x}"


class Digest(Text):
    def text(self):
        words = self.value["bytes_"]
        return bytes(int(v) for v in elements(words[first_field(words.type)])).hex()


printers = {
    "^(KpString|KpFilename)$": String,
    "^KpDArray<.*>$": Array,
    "^KpHandle<.*>$": Handle,
    "^KpPrimType$": PrimType,
    "^KpTypedPointer$": TypedPointer,
    "^HxParameter$": Parameter,
    "^HxParamBundle$": Bundle,
    "^KpBitfield$": Bitfield,
    "^KpVec[234][dfil]$": Vector,
    "^KpMat[34]f$": SquareMatrix,
    "^KpRotation$": Rotation,
    "^KpDMatrix<.*>$": Matrix,
    "^TmMsg$": Message,
    "^KpResult$": Result,
    "^(KpUniqueID|KpTransferID|KpFrameID|KpRemotificationID|TmSessionContextID)$": Identifier,
    "^Kp128$": Kp128,
    "^(KpLib::MD5|KpUUID)$": Digest,
}


def collection():
    result = gdb.printing.RegexpCollectionPrettyPrinter("kplib")
    for pattern, printer in printers.items():
        result.add_printer(printer.__name__, pattern, printer)
    return result


gdb.printing.register_pretty_printer(gdb.current_objfile(), collection(), replace=True)
