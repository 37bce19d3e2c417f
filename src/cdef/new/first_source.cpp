/* first_source.cpp: makes the first source of a new class. */

#include "cdef/new/first_source.h"

#include "cdb_view.h"
#include "check/check.h"
#include "check/view.h"

#include <cctype>
#include <string_view>

namespace cdef::new_command {

namespace {

constexpr std::string_view TEMPLATE =
    R"(# A line that begins in column 1 starts a stanza; the indented lines below it are its
# attributes. The manual page cdefsrc(5) explains all of them. Each Description, DisplayName
# and ValueDisplayName is the number of a message in the catalog that the last stanza names.

ControlDefinition
	FileVersion=1.0.0.0

ResourceClass
	Description=1
	DisplayName=2
	Properties=HasResources,CanDefine
	ClassPermTemplate=0
	ResourcePermTemplate=0
	Name=@NAME@
	# The attribute that says where a resource is.
	Locator=HostName

# Stored for each resource. Programs know an attribute by its Id, so never use an Id again.
PersistentResourceAttribute
	Name=HostName
	Description=3
	DisplayName=4
	Id=0
	DataType=String
	VarietyRange=1,1
	Properties=Public,ReqdForDefine

PersistentResourceAttribute
	Name=Enabled
	Description=5
	DisplayName=6
	Id=1
	DataType=UInt32
	VarietyRange=1,1
	Properties=Public,OptForDefine
	ValidValue=0
	ValueDisplayName=7
	ValidValue=1
	ValueDisplayName=8
	DefaultValue=1

# The program that serves the class, and the catalog with its texts.
ClassToManagerMapping
	ResourceManager=@PLAIN@Manager
	FirstKey=1
	LastKey=100
	MessageCatalog=@PLAIN@.cat
	DescriptiveMessageSet=1
)";

void replace_all(std::string &text, std::string_view what, const std::string &by) {
    for (std::size_t at = text.find(what); at != std::string::npos; at = text.find(what, at + by.size()))
        text.replace(at, what.size(), by);
}

/* True for a name without characters that are special to the language, to shells or to file systems. */
std::string plain(std::string name) {
    for (char &c : name)
        if (std::isalnum(static_cast<unsigned char>(c)) == 0 && c != '-')
            c = '_';
    constexpr std::size_t LONGEST = 60;
    return name.substr(0, LONGEST);
}

/* True if the source has no errors and no warnings, and its class has the name. */
bool says(const std::string &source, const std::string &name) {
    check::warning_set all;
    all.fill(true);
    bool is_named = false;
    check::compile_job job = {"x.cdef", [&](stepwise_compiler &compiler, const check::view & /* see */) {
                                  std::vector<std::byte> image = compiler.image();
                                  for (const auto &each : cdb::database(image).classes())
                                      is_named = each.name() == name;
                              }};
    check::totals count = check::check_bytes(
        source, "new", all, [](check::finding &&) {}, &job);
    return is_named && count.errors == 0 && count.warnings == 0;
}

} // namespace

std::optional<std::string> first_source(const std::string &name) {
    if (name.empty() || name.find_first_of(std::string_view("\n\0", 2)) != std::string::npos)
        return std::nullopt;
    std::string rest(TEMPLATE);
    replace_all(rest, "@PLAIN@", plain(name));
    for (const std::string &value : {name, '"' + name + '"'}) {
        std::string source = rest;
        source.replace(source.find("@NAME@"), std::string_view("@NAME@").size(), value);
        if (says(source, name))
            return source;
    }
    return std::nullopt;
}

} // namespace cdef::new_command
