/* navigation.cpp: where a name is defined and used. */

#include "server/navigation.h"

#include "server/places.h"

namespace lsp {

namespace {

/* All places of the name at a place; none if there is no name. */
std::vector<source_index::mention> mentions_at(const place_in_source &place) {
    const source_index::mention *here = place.in.names().at(place.offset);
    if (here == nullptr)
        return {};
    return place.in.names().of(here->name);
}

json locations(const session &now, const place_in_source &place, bool definitions, bool uses) {
    json found = json::array();
    position_maker positions = place.in.positions(now.client.units);
    for (const source_index::mention &each : mentions_at(place))
        if (each.defines ? definitions : uses)
            found.push_back({{"uri", place.in.uri()}, {"range", to_json(positions.of(each.at))}});
    return found;
}

} // namespace

json definition(session &now, const json &params) {
    return locations(now, place_in(now, params), true, false);
}

json references(session &now, const json &params) {
    return locations(now, place_in(now, params), is_true(params, "/context/includeDeclaration"), true);
}

json highlights(session &now, const json &params) {
    constexpr int READ = 2;
    constexpr int WRITE = 3;
    place_in_source place = place_in(now, params);
    json found = json::array();
    position_maker positions = place.in.positions(now.client.units);
    for (const source_index::mention &each : mentions_at(place))
        found.push_back({{"range", to_json(positions.of(each.at))}, {"kind", each.defines ? WRITE : READ}});
    return found;
}

} // namespace lsp
