"""The rules of `cdef diff --compat` and `cdef gate`: for each, a change of tests/cdef/diff/base.cdefsrc that breaks it,
and a similar one that does not."""

LEVELS = ("readers", "clients", "stored")
SERIAL = "PersistentResourceAttribute 'Serial'"

NEW = "PersistentResourceAttribute\n\tName=New\n\tDescription=3\n\tDisplayName=4\n\tId={}\n\tDataType={}\n\tVarietyRange=1,2\n"
OPTIONAL = "\tProperties=OptForDefine\n"
BEFORE_ACTION = "ResourceAction\n"
DYNAMIC = NEW.replace("PersistentResource", "DynamicResource") + "\tVariableType=State\n"


def added(stanza, lines=""):
    """A new stanza in front of the action."""
    return [(BEFORE_ACTION, stanza + lines + BEFORE_ACTION)]


# A rule's code; what changes in the source; the line that --compat shows of it without its sign; and the similar change
# that does not break the rule.
RULES = [
    ("CMP101", [("\tName=List\n", "\tName=Lister\n")], "ClassAction 'List': renamed to 'Lister' (readers miss it)",
     added(NEW.format(60, "Int32"))),
    ("CMP102", [("\tId=10\n", "\tId=61\n")], f"{SERIAL}: Id 10 -> 61 (readers know it by its number)",
     [("\tDescription=8\n", "\tDescription=61\n")]),
    ("CMP103", added(NEW.format(10, "Int32")),
     "PersistentResourceAttribute 'New' (readers know another one by its number)", added(NEW.format(27, "Int32"))),
    ("CMP104", [("\tDataType=UInt32\n\tValidValue=19\n", "\tDataType=UInt64\n\tValidValue=19\n")],
     "PersistentResourceAttribute 'Times', element 'Mount': type UInt32 -> UInt64 (values of another type)",
     [("\tValidValue=19\n", "\tValidValue=19\n\tValidValue=20\n")]),
    ("CMP105", [("\tElementName=Repair\n", "\tElementName=Mend\n")],
     "ResourceAction 'Check', input element 'Repair' (another layout of the structure)",
     [("\tDescription=41\n", "\tDescription=64\n")]),
    ("CMP201", added(NEW.format(60, "Int32"), "\tProperties=ReqdForDefine\n"),
     "PersistentResourceAttribute 'New' (clients do not give it)", added(NEW.format(60, "Int32"), OPTIONAL)),
    ("CMP202", [("\tVarietyRange=1,2\nDynamicClassAttribute\n",
                 "\tVarietyRange=1,2\n\tProperties=ReqdForDefine\nDynamicClassAttribute\n")],
     "PersistentClassAttribute 'Limit': properties InvalForDefine -> ReqdForDefine (clients may leave it out)",
     [("\tProperties=Public,ReqdForDefine\n", "\tProperties=Public,OptForDefine\n")]),
    ("CMP203", [("\tValidValue=0,1\n", "\tValidValue=0\n")],
     "define input element 'Force', valid value 0 to 1 (clients may use the value)",
     [("\tValidValue=0,1\n", "\tValidValue=-5,0\n\tValidValue=1,9\n")]),
    ("CMP204", [("\tId=24\n\tDataType=UInt32\n\tVarietyRange=1,2\n",
                 "\tId=24\n\tDataType=UInt32\n\tVarietyRange=1,2\n\tValidValue=7\n")],
     "PersistentClassAttribute 'Limit', valid value 7 (clients may use other values)",
     [("\tValidValue=19\n", "")]),
    ("CMP205", [("\tId=38\n\tVarietyRange=1,2\n", "\tId=38\n\tVarietyRange=1,1\n")],
     "ResourceAction 'Check', variety 1 to 2 (clients may use the variety)",
     [("\tId=38\n\tVarietyRange=1,2\n", "\tId=38\n\tVarietyRange=2,3\n\tVarietyRange=0,1\n")]),
    ("CMP206", [("\tProperties=Public,ReqdForDefine\n", "\tProperties=ReqdForDefine\n")],
     f"{SERIAL}: properties Public+ReqdForDefine -> ReqdForDefine (clients may rely on the property)",
     [("\tProperties=Public,ReqdForDefine\n", "\tProperties=Public,Select,OptForDefine\n")]),
    ("CMP207", [("\tProperties=Public,ReqdForDefine\n", "\tProperties=Public,ReqdForDefine,ReadOnly\n")],
     f"{SERIAL}: properties Public+ReqdForDefine -> Public+ReqdForDefine+ReadOnly (clients may set it)",
     [("\tProperties=Public,ReqdForDefine\n", "\tProperties=Public,Select,ReqdForDefine\n")]),
    ("CMP208", [("\tRange=1,31\n", "\tRange=1,30\n")],
     "DynamicResourceAttribute 'Load': upper bound 31 -> 30 (clients may use values outside)",
     [("\tRange=1,31\n", "\tRange=-1,32\n")]),
    ("CMP209", [("\tPermission=x\n", "\tPermission=a\n")],
     "ResourceAction 'Check': permission x -> a (clients may lack the permission)",
     [("\tTimeOut=40\n", "\tTimeOut=41\n")]),
    ("CMP301", [("\tName=Limit\n", "\tName=Border\n")],
     "PersistentClassAttribute 'Limit': renamed to 'Border' (readers miss it; stored values are those of another name)",
     [("\tName=Limit\n", "\tName=Border\n"), ("\tId=24\n", "\tId=62\n")]),
    ("CMP302", added(DYNAMIC.format(16, "SD")),
     "DynamicResourceAttribute 'New' (stored values are those of another kind; stored values are those of another name)",
     added(DYNAMIC.format(24, "UInt32"))),
    ("CMP303", [("\tDataType=Float32\n", "\tDataType=Float64\n")],
     "DynamicResourceAttribute 'Load': type Float32 -> Float64 "
     "(values of another type; stored values are those of another type)",
     [("\tDataType=Float32\n", "\tDataType=Float64\n"), ("\tId=30\n", "\tId=63\n")]),
]
