"""Shows kplib's strings, arrays and handles in gdb as what they hold.

In gdb:  source tools/gdb/kplib_printers.py"""
import gdb
import gdb.printing


class StringPrinter:
    def __init__(self, value):
        self.value = value

    def to_string(self):
        length = int(self.value["size_"]) - 1
        return self.value["data_"].string(length=length, errors="replace") if length > 0 else ""

    def display_hint(self):
        return "string"


class ArrayPrinter:
    def __init__(self, value):
        self.value = value

    def to_string(self):
        return f"{self.value.type.unqualified().strip_typedefs()} of {int(self.value['size_'])}, room for {int(self.value['capacity_'])}"

    def children(self):
        for i in range(int(self.value["size_"])):
            yield f"[{i}]", self.value["data_"][i]

    def display_hint(self):
        return "array"


class HandlePrinter:
    def __init__(self, value):
        self.value = value

    def to_string(self):
        pointer = self.value["pointer_"]
        return f"handle of {pointer}" if int(pointer) else "empty handle"


def printers():
    collection = gdb.printing.RegexpCollectionPrettyPrinter("kplib")
    collection.add_printer("KpString", "^KpString$", StringPrinter)
    collection.add_printer("KpDArray", "^KpDArray<.*>$", ArrayPrinter)
    collection.add_printer("KpHandle", "^KpHandle<.*>$", HandlePrinter)
    return collection


gdb.printing.register_pretty_printer(gdb.current_objfile(), printers(), replace=True)
