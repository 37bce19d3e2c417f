// Prints the name of each class in a database and the names of its resources' attributes.

#include "cdb_view.h"

#include <iostream>

int main(int argc, char **argv) {
    std::error_code error;
    std::vector<std::byte> file = cdb::read_file(argc > 1 ? argv[1] : "", error);
    cdb::database db(file);
    if (error || !cdb::is_sound(cdb::verify(db))) {
        std::cerr << "show: not a sound database\n";
        return 1;
    }
    for (const auto &c : db.classes()) {
        std::cout << c.name() << '\n';
        for (const auto &a : c.persistent_attributes(cdb::level::of_resource))
            std::cout << "  " << a.name() << '\n';
    }
}
