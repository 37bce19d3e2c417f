"""Compares the names in the documents and manual pages with those that the compiler and the format have, as the program
tests/support/list_names.cpp lists them.

They come from the program tests/support/list_names.cpp.
"""

import collections
import re
import subprocess
import unittest

from documents import DOCUMENTS, PAGES, PROJECT, chapters, sources, spans, tables, text_of
from lsp_client import Client
from programs import PROGRAMS

LANGUAGE, FORMAT = PROJECT / "docs/language.md", PROJECT / "docs/format.md"
# Records that have no chapter of their own: entries of lists, and records in tables of other chapters.
ENTRIES = {"vl_entry_t": "variety_list_t", "vv_entry_t": "valid_values_t", "sd_field_t": "sd_def_t",
           "sbs_field_t": "sbs_def_t", "rc_hash_block_t": "rsrc_class_hash_t"}
# The members that hold the entries: the document has the entries themselves in their place.
ARRAYS = {"vl_values", "vv_values", "sd_fields", "sbs_fields", "rc_hash_blocks"}
UNION = {"u_ctxt": ["u_offset", "u_ctxt_name", "u_ctxt_pattr_id"]}  # likewise, of its members
# What the names of fields begin with; what is called is a function.
FIELD = r"\b(?:u_)?(?:rc|ra|ac|re|rd|rch|rcm|rm|rvc|vl|vv|sd|sbs|cda|cdb_hdr)_\w+(?!\w*\()"
SUPPOSED = {"CONTRIBUTING.md": {"rc_owner_msgid", "RangeMessage"}}  # by examples of what is new
SD_KINDS = "The nine SD definitions"


def read_names(program):
    names = collections.defaultdict(list)
    for line in subprocess.run([program], check=True, capture_output=True, text=True).stdout.splitlines():
        kind, *rest = line.split()
        names[kind].append(tuple(rest))
    return names


def known_fields(names):
    """record -> fields; those of entries are listed with the record before them."""
    found = collections.defaultdict(list)
    for record, field in names["field"]:
        if field not in ARRAYS:
            found[ENTRIES.get(record, record)] += UNION.get(field, field.split("."))
    return found


class Names(unittest.TestCase):
    maxDiff = None

    @classmethod
    def setUpClass(cls):
        cls.names = read_names(PROGRAMS.list_names)


class Language(Names):
    """docs/language.md"""

    def stanza_chapters(self):
        """The chapters about stanzas: the names of their stanzas, and the rows about attributes."""
        found = {}
        for title, text in chapters(LANGUAGE, 3):
            rows = [row for table in tables(text) if table[0][0] == "attribute" for row in table]
            if rows:
                kinds = spans(text.split("| attribute")[0]) if title == SD_KINDS else title.split(", ")
                for kind in kinds:
                    found[kind] = rows
        return found

    def said_of(self, rows, earlier):
        """attribute -> (required, repeats, form), from the rows; 'as above' means the row of another stanza."""
        head, said = rows[0], {}
        for row in rows[1:]:
            cell = dict(zip(head, row))
            for name in spans(cell["attribute"]):
                words = [cell["required"], cell.get("repeats", "no"), cell["form"].replace("`", "")]
                if "as above" in words:
                    words = [above if word == "as above" else word for word, above in zip(words, earlier[name])]
                said[name] = tuple(words)
        return said

    def test_each_stanza_has_its_attributes(self):
        said, earlier = {}, {}
        for kind, rows in self.stanza_chapters().items():
            earlier = said[kind] = self.said_of(rows, earlier)
        known = {stanza: {} for (stanza,) in self.names["stanza"]}
        for stanza, name, needed, often, *form in self.names["attribute"]:
            known[stanza][name] = ("yes" if needed == "required" else "no", "yes" if often == "repeats" else "no",
                                   " ".join(form))
        self.assertEqual(said, known)

    def test_each_attribute_has_a_row_about_its_checks(self):
        """Who checks its values: the compiler, `cdef check`, or somebody else."""
        rows = tables(dict(chapters(LANGUAGE, 2))["Numbers and who checks them"])[0][1:]
        listed = {name for row in rows for name in spans(row[0])}
        self.assertEqual(listed, {name for stanza, name, *_ in self.names["attribute"]})

    def test_attributes_are_in_their_usual_order(self):
        """That of `cdef format --reorder`, which the language server shows."""
        with Client() as client:
            for number, (kind, rows) in enumerate(self.stanza_chapters().items()):
                uri = f"file:///{number}.cdefsrc"
                client.open(uri, kind + "\n")
                shown = client.at("textDocument/hover", uri, 0, 0)["contents"]["value"].splitlines()
                usual = [line for line in shown if line.startswith(("- required: ", "- optional: "))]
                self.assertEqual([name for row in rows[1:] for name in spans(row[0])], spans("".join(usual)), kind)

    def test_whole_class_is_in_the_usual_order(self):
        (source,) = re.findall(r"```\n(.*?)```", dict(chapters(LANGUAGE, 2))["A whole class"], re.S)
        formatted = [subprocess.run([PROGRAMS.cdef, "format", *options, "-"], input=source, capture_output=True, text=True,
                                    check=True).stdout for options in ((), ("--reorder",))]
        self.assertEqual(formatted[0], formatted[1])

    def test_list_of_stanzas_is_complete(self):
        listed = [name for row in tables(dict(chapters(LANGUAGE, 2))["Stanzas"].split("###")[0])[0][1:]
                  for name in spans(row[0])]
        self.assertEqual(sorted(listed), sorted(stanza for (stanza,) in self.names["stanza"]))

    def words(self, first):
        """The rows of the table in the chapter "Names" that has this first heading."""
        (found,) = [rows for head, *rows in tables(dict(chapters(LANGUAGE, 2))["Names"]) if head[0] == first]
        return found

    def meanings(self, of):
        """name -> meaning, for the names that the program lists under a word."""
        return {name: " ".join(text) for kind, name, *text in self.names["meaning"] if kind == of and text}

    def test_each_attribute_has_its_meaning(self):
        """The documents and the texts that editors show use the same words."""
        earlier = {}
        for stanza, rows in self.stanza_chapters().items():
            said = {}
            for row in rows[1:]:
                text = re.sub(r"\[([^]]*)\]\([^)]*\)", r"\1", row[-1])
                said.update((name, earlier[name] if text == "as above" else text) for name in spans(row[0]))
            self.assertEqual(said, self.meanings(stanza), stanza)
            earlier = said

    def test_each_stanza_has_its_meaning(self):
        said = {}
        for table in tables(dict(chapters(LANGUAGE, 2))["Stanzas"]):
            if table[0][-1] in ("what it is", "structure that it describes"):
                said.update((name, text) for kind, text in table[1:] for name in spans(kind))
        self.assertEqual(said, self.meanings("stanza"))

    def test_types_and_words_have_their_meanings(self):
        value, default = {}, {}
        for names, text, without, *_ in tables(dict(chapters(LANGUAGE, 2))["Data types"])[0][1:]:
            for name in spans(names):
                value[name], default[name] = text, without
        del value["SBS"], default["SBS"]  # which is refused
        self.assertEqual((value, default), (self.meanings("value"), self.meanings("default")))
        said = {name: text for names, text in self.words("word") for name in spans(names)}
        self.assertEqual({name: said[name] for name in self.meanings("word")}, self.meanings("word"))

    def test_properties(self):
        said = []
        for row in self.words("class property"):
            said += [("class", *spans(name), bit) for name, bit in zip(row[::2], row[1::2]) if name]
        for of, names in self.words("property of a"):
            said += [(of.split()[0], *found) for found in re.findall(r"`(\w+)` (0x\w+)", names)]
        self.assertEqual(sorted(said), sorted(self.names["property"]))

    def test_permissions(self):
        said = [(*spans(letter), mask) for letter, mask in self.words("permission letter")]
        self.assertEqual(said, self.names["permission"])

    def test_data_types(self):
        said = [name for row in tables(dict(chapters(LANGUAGE, 2))["Data types"])[0][1:] for name in spans(row[0])]
        self.assertEqual(sorted(said), sorted(name for (name,) in self.names["type"]))

    def test_variable_types(self):
        said = re.search(r"\| `VariableType` \| yes \| no \| (.*?) \|", LANGUAGE.read_text()).group(1)
        self.assertEqual(spans(said), [name for (name,) in self.names["variable"]])


class Format(Names):
    """docs/format.md"""

    def said(self):
        """record -> fields, from the chapters whose headings name a record."""
        found = {}
        for title, text in chapters(FORMAT, 3):
            for record in re.findall(r"`(\w+_t)`", title):
                found[record] = [name for table in tables(text) if table[0][0] == "offset"
                                 for row in table[1:] for name in re.findall(r"`(\w+)`", row[2])]
        return found

    def test_each_record_has_its_fields(self):
        known = known_fields(self.names)
        for record, fields in self.said().items():
            with self.subTest(record):
                self.assertEqual(sorted(set(fields)), sorted(set(known[record])))

    def test_each_record_has_a_chapter(self):
        out_of_line = {"vx_array_t", "vx_structured_data_t", "vx_structured_data_element_t"}  # one table, "Values"
        self.assertEqual(set(self.said()), set(known_fields(self.names)) - out_of_line)


class Pages(Names):
    """The manual pages, which may be all that their readers have."""

    def missing(self, page, names):
        text = text_of(PROJECT / "man" / page)
        return sorted({name for name in names if not re.search(rf"\b{re.escape(name)}\b", text)})

    def test_source_page_has_every_name(self):
        wanted = {row[-1] for kind in ("stanza", "type", "variable", "property") for row in self.names[kind]}
        wanted |= {row[1] for row in self.names["attribute"]}
        self.assertEqual(self.missing("cdefsrc.5", wanted), [])

    def test_database_page_has_every_field(self):
        for record, fields in known_fields(self.names).items():
            self.assertEqual(self.missing("cdef.5", fields), [], record)

    def test_each_names_the_others(self):
        for page in PAGES:
            said = re.split(r"(?im)^\.SH \"?see also\"?$", text_of(page))[1]
            others = {other.name for other in PAGES} - {page.name}
            named = re.findall(r"\b(cdgen|cdef|cdefsrc)\b[( ](\d)", said)
            self.assertEqual({f"{name}.{section}" for name, section in named}, others, page)

    def test_whole_class_has_every_form_of_stanza(self):
        """A reader who has only the page finds a complete class in it."""
        most = max(sources(PROJECT / "man/cdefsrc.5"), key=len)
        used = set(re.findall(r"^[A-Z]\w+", most, re.M))
        for wanted in ("ControlDefinition", "ResourceClass", "ResourceVariableClass", "PersistentResourceAttribute",
                       "DynamicClassAttribute", "DynamicResourceAttribute", "PAttrSDDefinition", "OnlineSDDefinition",
                       "ResourceAction", "ActionInSDDefinition", "ActionOutSDDefinition", "ClassToManagerMapping"):
            self.assertIn(wanted, used)


class Everywhere(Names):
    def test_what_looks_like_a_field_is_one(self):
        known = {name for record, field in self.names["field"] for name in (record, *field.split("."))}
        known |= {name for names in UNION.values() for name in names}
        for path in (*DOCUMENTS, *PAGES):
            said = set(re.findall(FIELD, text_of(path)))
            self.assertEqual(said - known - SUPPOSED.get(path.name, set()), set(), path)

    def test_what_looks_like_a_name_of_the_language_is_one(self):
        known = {row[row[0] in ("class", "persistent", "dynamic", "action") or kind == "attribute"]
                 for kind in ("stanza", "attribute", "property", "type", "variable") for row in self.names[kind]}
        for path in DOCUMENTS:
            said = {span for span in spans(path.read_text()) if re.fullmatch(r"(?:[A-Z]+[a-z0-9]+){2,}[A-Z]*", span)}
            self.assertEqual(said - known - SUPPOSED.get(path.name, set()), set(), path)

    def test_name_equals_value_is_an_attribute(self):
        attributes = {row[1] for row in self.names["attribute"]}
        for path in (*DOCUMENTS, *PAGES):
            for span in spans(path.read_text()):
                match = re.match(r"([A-Z][a-z]\w*)=", span)
                if match:
                    self.assertIn(match.group(1), attributes, path)

    def test_examples_use_every_stanza(self):
        used = {word for path in (PROJECT / "examples").glob("*.cdefsrc")
                for word in re.findall(r"^[A-Z]\w+", path.read_text(), re.M)}
        self.assertEqual(used, {stanza for (stanza,) in self.names["stanza"]})

    def test_definition_is_a_stanza(self):
        stanzas = {stanza for (stanza,) in self.names["stanza"]}
        for path in (*DOCUMENTS, *PAGES):
            # A message joins an attribute and a stanza without anything between.
            text = re.sub(r"\(name/table\): \w+", "", text_of(path))
            for word in re.findall(r"\b[A-Z]\w+(?:Definition|ResourceAttribute|ClassAttribute)\b", text):
                self.assertIn(word, stanzas, path)
