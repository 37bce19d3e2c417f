/* read_everything.h: reads everything in a database through every view. */
#ifndef CDGEN_READ_EVERYTHING_H
#define CDGEN_READ_EVERYTHING_H

#include "cdb_view.h"

#include <bit>
#include <cstdint>
#include <cstring>
#include <span>
#include <string_view>

namespace reading {

/* Adds up what it reads, so that the compiler cannot leave out reading. */
class everything {
public:
    /* deep: values inside values too, to the end. Only for a sound database: in an unsound one a value may be inside
     * of itself more than once, and take for ever. */
    explicit everything(bool into_values) : deep(into_values) {}

    void read(const cdb::database &db) {
        add(db.header());
        for (std::size_t i = 0; i < db.section_count(); ++i)
            add(db.anchor(i), db.section(i).size());
        for (const auto &c : db.classes())
            read(c);
        for (const auto &m : db.managers())
            add(m.record(), m.name());
        for (const auto &m : db.maps())
            add(m.record(), m.message_catalog());
        for (const auto &v : db.variable_classes()) {
            add(v.record(), v.name(), v.alias());
            for (const auto &id : v.variable_ids())
                add(id.number, id.of_class());
        }
    }

    std::uint64_t sum = 0;

private:
    void read(const cdb::resource_class &c) {
        add(c.record(), c.name(), c.alias());
        for (cdb::level of : {cdb::level::of_resource, cdb::level::of_class}) {
            for (const auto &a : c.persistent_attributes(of))
                read(a);
            for (const auto &a : c.dynamic_attributes(of))
                read(a);
            for (const auto &a : c.actions(of))
                read(a);
        }
        for (auto input :
             {&rsrc_class_t::u_rc_def_input, &rsrc_class_t::u_rc_undef_input, &rsrc_class_t::u_rc_online_input,
              &rsrc_class_t::u_rc_offline_input, &rsrc_class_t::u_rc_reset_input})
            read(c.sd_input(input));
    }

    template <class Record> void read(const cdb::attribute<Record> &a) {
        add(a.record(), a.name(), a.id(), a.type(), cdb::name_of(a.type()));
        read(a.varieties());
        read(a.valid_values());
        read(a.structure());
        if constexpr (std::is_same_v<Record, rsrc_pattr_t>) {
            read(a.default_value());
        } else {
            add(a.expression(), a.rearm_expression());
            for (const cdb::value &v : {a.initial_value(), a.min_value(), a.max_value()})
                read(v);
        }
    }

    void read(const cdb::action &a) {
        add(a.record(), a.name(), a.id());
        read(a.varieties());
        read(a.input());
        read(a.response());
    }

    void read(const cdb::sd_definition &definition) {
        for (const auto &element : definition) {
            add(element.record(), element.name(), element.type());
            read(element.valid_values());
        }
    }

    void read(const cdb::variety_list &varieties) {
        for (const auto &v : varieties)
            add(v.low, v.high);
    }

    void read(const cdb::valid_value_list &values) {
        for (const auto &v : values) {
            read(v.low);
            read(v.high);
            add(v.message);
        }
    }

    void read(const cdb::value &v) {
        read_itself(v);
        for (const cdb::value &element : v.elements())
            deep ? read(element) : read_itself(element);
    }

    void read_itself(const cdb::value &v) {
        add(v.type(), v.present(), v.place().value_or(0), v.integer(), v.natural(), v.text());
        add(std::bit_cast<std::uint64_t>(v.real()), v.handle(), v.elements().size());
        add_bytes(v.binary());
    }

    template <class... Things> void add(const Things &...things) {
        (add_one(things), ...);
    }
    void add_one(std::string_view text) {
        add_bytes(std::as_bytes(std::span(text)));
    }
    template <class Thing> void add_one(const Thing &thing) {
        add_bytes(std::as_bytes(std::span(&thing, 1)));
    }
    /* By words as long as there are some: adding up must not take longer than reading. */
    void add_bytes(std::span<const std::byte> raw) {
        std::uint64_t word = 0;
        for (; raw.size() >= sizeof word; raw = raw.subspan(sizeof word)) {
            std::memcpy(&word, raw.data(), sizeof word);
            sum += word;
        }
        for (std::byte b : raw)
            sum += std::to_integer<unsigned>(b);
    }

    bool deep;
};

/* Verifies the database, reads it through all views, and lists its regions. The sum of what was there. */
inline std::uint64_t read_everything(const cdb::database &db) {
    everything all(cdb::is_sound(cdb::verify(db)));
    all.read(db);
    for (const cdb::region &r : cdb::regions(db))
        all.sum += r.size;
    return all.sum;
}

} // namespace reading

#endif
