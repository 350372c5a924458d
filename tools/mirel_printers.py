"""Shows mirel's vectors and strings as text in GDB and in LLDB.

GDB runs this file when it starts, if the file lies in its data directory; `source FILE` runs it from elsewhere, in GDB's
own namespace, so every name has a prefix. LLDB runs it with `command script import FILE`.
"""

import codecs

MIREL_TYPES = r"^mirel::(VectorOfByte|(xvector|basic_xstring|MovableString)<(char|unsigned short|short unsigned int)>)$"

# The most elements that are shown, whatever limit is set: a corrupt size must not keep the debugger busy.
MIREL_MAX_ELEMENTS = 1 << 20

MIREL_ESCAPES = {'"': '\\"', "\\": "\\\\", "\n": "\\n", "\r": "\\r", "\t": "\\t"}


def mirel_escaped(character, width, charset):
    """A character as it is shown; malformed text has been decoded to surrogates."""
    code = ord(character)
    if character in MIREL_ESCAPES:
        return MIREL_ESCAPES[character]
    if width == 1 and 0xDC80 <= code <= 0xDCFF:
        return f"\\{code - 0xDC00:03o}"
    if character.isprintable() and character.encode(charset, "ignore"):
        return character
    if code < 0x80:
        return f"\\{code:03o}"
    return f"\\u{code:04x}" if code < 0x10000 else f"\\U{code:08x}"


def mirel_literal(units, width, order, charset, is_cut):
    """Code units as a literal. Octal escapes are control characters or bytes of malformed UTF-8; hexadecimal ones are
    code points or unpaired surrogates."""
    encoding, errors = ("utf-8", "surrogateescape") if width == 1 else (f"utf-16-{order}", "surrogatepass")
    text = codecs.getincrementaldecoder(encoding)(errors).decode(units, final=not is_cut)
    escaped = "".join(mirel_escaped(character, width, charset) for character in text)
    return ("" if width == 1 else "u") + f'"{escaped}"' + ("..." if is_cut else "")


class MirelFault(Exception):
    """The reason why an object can't be shown."""

    kind = "corrupt or uninitialised"


class MirelUnavailable(MirelFault):
    """The debugger doesn't know the object's fields."""

    kind = "unavailable"


class MirelObject:
    """A vector or string of the program, whatever the debugger.

    A subclass for a debugger has the `width` of an element in bytes, the byte `order`, "le" or "be", the `charset` of the
    terminal, and these two methods, which raise MirelFault:
      fields()              the address of the storage, and the size and the capacity in bytes
      read(address, count)  count bytes of the program's memory
    """

    def check(self):
        """The three fields; raises MirelFault if they contradict each other."""
        address, size, capacity = self.fields()
        if size < 0:
            raise MirelFault(f"its size is negative, {size} bytes")
        if capacity < 0:
            raise MirelFault(f"its capacity is negative, {capacity} bytes")
        if size > capacity:
            raise MirelFault(f"its size, {size} bytes, is above its capacity, {capacity} bytes")
        if size % self.width:
            raise MirelFault(f"its size, {size} bytes, isn't a whole number of elements")
        if capacity and not address:
            raise MirelFault(f"it has no storage, but a capacity of {capacity} bytes")
        if capacity:
            self.read(address, 1)
            self.read(address + capacity - 1, 1)
        return address, size, capacity

    def summary(self, limit):
        """The text, up to limit elements unless that is None or 0; or what is wrong with the object."""
        try:
            address, size, capacity = self.check()
            shown = min(size // self.width, limit or MIREL_MAX_ELEMENTS, MIREL_MAX_ELEMENTS) * self.width
            units = self.read(address, shown) if shown else b""
        except MirelFault as fault:
            return f"<{fault.kind}: {fault}>"
        literal = mirel_literal(units, self.width, self.order, self.charset, shown < size)
        return f"{literal} (size {size // self.width}, capacity {capacity // self.width})"


class MirelInGdb(MirelObject):
    """A pretty-printer of GDB. Each call reads everything anew, since a front end may keep a printer while it steps."""

    def __init__(self, value):
        self.value = value

    def fields(self):
        try:
            value = self.value
            if value.type.strip_typedefs().code in (gdb.TYPE_CODE_REF, gdb.TYPE_CODE_RVALUE_REF):
                value = value.referenced_value()
            buffer = value
            unit = value["m_buffer"].type.strip_typedefs()
            if unit.code != gdb.TYPE_CODE_PTR:
                buffer = value["m_buffer"]
                unit = value.type.strip_typedefs().template_argument(0).pointer()
            self.elements = buffer["m_buffer"].cast(unit)
            self.width = unit.target().sizeof
            self.order = "le" if self.width == 1 or int(gdb.Value(b"\1\0", unit.target())) == 1 else "be"
            return int(self.elements), int(buffer["size_"]), int(buffer["m_capacity"])
        except (RuntimeError, OverflowError) as error:
            raise MirelUnavailable(str(error)) from error

    def read(self, address, count):
        try:
            return bytes(gdb.selected_inferior().read_memory(address, count))
        except (RuntimeError, OverflowError) as error:
            raise MirelFault(f"its storage can't be read at {address:#x}") from error

    @property
    def charset(self):
        """The character set, if the program's and the terminal's are the same: GDB writes the text unchanged."""
        try:
            charsets = {codecs.lookup(name).name for name in (gdb.target_charset(), gdb.host_charset())}
        except (LookupError, AttributeError):
            charsets = set()
        return charsets.pop() if len(charsets) == 1 else "ascii"

    def to_string(self):
        if hasattr(gdb, "print_options"):
            return self.summary(gdb.print_options()["max_elements"])
        return self.summary(gdb.parameter("print elements"))


class MirelWithElements(MirelInGdb):
    """Adds the elements, which front ends show instead of the text."""

    def children(self):
        try:
            _, size, _ = self.check()
        except MirelFault:
            return
        for i in range(min(size // self.width, MIREL_MAX_ELEMENTS)):
            yield f"[{i}]", (self.elements + i).dereference()

    def display_hint(self):
        return "array"


class MirelInLldb(MirelObject):
    """Makes LLDB's summary; LLDB's strings are UTF-8, whatever the terminal."""

    charset = "utf-8"

    def __init__(self, value):
        self.value = value.GetNonSyntheticValue()
        self.width = 2 if "short" in value.GetType().GetCanonicalType().GetName() else 1
        self.order = "le" if value.GetTarget().GetByteOrder() == lldb.eByteOrderLittle else "be"

    def fields(self):
        buffer = self.value
        if not buffer.GetChildMemberWithName("size_").IsValid():
            buffer = buffer.GetChildMemberWithName("m_buffer")
        error = lldb.SBError()
        fields = []
        for name in ("m_buffer", "size_", "m_capacity"):
            field = buffer.GetChildMemberWithName(name)
            fields.append(field.GetValueAsSigned(error))
            if not field.IsValid() or error.Fail():
                raise MirelUnavailable(f"{name} can't be read")
        return fields[0] & 0xFFFFFFFFFFFFFFFF, *fields[1:]

    def read(self, address, count):
        error = lldb.SBError()
        units = self.value.GetProcess().ReadMemory(address & 0xFFFFFFFFFFFFFFFF, count, error)
        if error.Fail() or units is None or len(units) != count:
            raise MirelFault(f"its storage can't be read at {address:#x}")
        return units


class MirelElementsInLldb:
    """Shows the elements below LLDB's summary, once their category is enabled."""

    def __init__(self, value, _):
        self.object = MirelInLldb(value)
        self.update()

    def update(self):
        try:
            self.address, size, _ = self.object.check()
        except MirelFault:
            size = 0
        self.count = min(size // self.object.width, MIREL_MAX_ELEMENTS)

    def num_children(self):
        return self.count

    def get_child_index(self, name):
        return int(name.strip("[]"))

    def get_child_at_index(self, i):
        value, width = self.object.value, self.object.width
        unit = value.GetTarget().GetBasicType(lldb.eBasicTypeChar if width == 1 else lldb.eBasicTypeUnsignedShort)
        return value.CreateValueFromAddress(f"[{i}]", self.address + i * width, unit)


def mirel_lldb_summary(value, _):
    debugger = value.GetTarget().GetDebugger()
    limit = debugger.GetInternalVariableValue("target.max-string-summary-length", debugger.GetInstanceName())
    return MirelInLldb(value).summary(int(limit.GetStringAtIndex(0)))


def __lldb_init_module(debugger, _):
    summary = f'-F {__name__}.mirel_lldb_summary -x "{MIREL_TYPES}"'
    debugger.HandleCommand(f"type summary add -w mirel {summary}")
    debugger.HandleCommand("type category enable mirel")
    debugger.HandleCommand(f"type summary add -w mirel-elements --expand {summary}")
    debugger.HandleCommand(f'type synthetic add -w mirel-elements -l {__name__}.MirelElementsInLldb -x "{MIREL_TYPES}"')
    debugger.HandleCommand("type category disable mirel-elements")


try:
    import gdb.printing
except ImportError:
    import lldb
else:
    try:
        gdb.parameter("print mirel-elements")
    except RuntimeError:  # this is the first run
        class MirelElements(gdb.Parameter):
            """Whether the elements of mirel's vectors and strings are shown beside their text."""

            set_doc = show_doc = __doc__

            def get_set_string(self):
                return ""

            def get_show_string(self, value):
                return f"Elements of mirel's vectors and strings: {value}."

        MirelElements("print mirel-elements", gdb.COMMAND_DATA, gdb.PARAM_BOOLEAN)

    def mirel_printer(value):
        return (MirelWithElements if gdb.parameter("print mirel-elements") else MirelInGdb)(value)

    mirel_printers = gdb.printing.RegexpCollectionPrettyPrinter("mirel")
    mirel_printers.add_printer("text", MIREL_TYPES, mirel_printer)
    gdb.printing.register_pretty_printer(gdb.current_objfile(), mirel_printers, replace=True)
