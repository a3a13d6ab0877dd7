// SPDX-License-Identifier: MIT
// Reports as JSON: what a bench prints and the run of all benches reads.
#include "bench/Report.h"

#include <nlohmann/json.hpp>

namespace bench {

using Json = nlohmann::ordered_json;

NLOHMANN_JSON_SERIALIZE_ENUM(Role,
                             {{Role::ours, "ours"}, {Role::floor, "floor"}, {Role::peer, "peer"}})
NLOHMANN_JSON_SERIALIZE_ENUM(Better, {{Better::kLower, "lower"}, {Better::kHigher, "higher"}})

namespace {

Json figuresToJson(const Statistics& figures) {
    return {{"samples", figures.samples},
            {"median", rounded(figures.median)},
            {"p99", rounded(figures.p99)},
            {"min", rounded(figures.minimum)},
            {"max", rounded(figures.maximum)}};
}

Statistics figuresFromJson(const Json& json) {
    Statistics figures;
    json.at("samples").get_to(figures.samples);
    json.at("median").get_to(figures.median);
    json.at("p99").get_to(figures.p99);
    json.at("min").get_to(figures.minimum);
    json.at("max").get_to(figures.maximum);
    return figures;
}

Json rowToJson(const Row& row) {
    Json entries = Json::array();
    for (const Entry& entry : row.entries) {
        const bool isFirst = &entry == &row.entries.front();
        Json object{{"who", entry.who}, {"role", isFirst ? Role::ours : entry.role}};
        object.update(figuresToJson(entry.figures));
        if (!isFirst)
            object["ratio"] = rounded(ratio(row, entry));
        entries.push_back(std::move(object));
    }
    return {{"name", row.name}, {"unit", row.unit}, {"better", row.better}, {"entries", entries}};
}

Row rowFromJson(const Json& json) {
    Row row{json.at("name"), json.at("unit"), {}, json.at("better").get<Better>()};
    for (const Json& entry : json.at("entries"))
        row.entries.push_back(
            {entry.at("who"), figuresFromJson(entry), entry.at("role").get<Role>()});
    return row;
}

Json curveToJson(const Curve& curve) {
    Json lines = Json::array();
    for (const Line& line : curve.lines) {
        Json points = Json::array();
        for (const Statistics& figures : line.points)
            points.push_back(figuresToJson(figures));
        lines.push_back({{"who", line.who}, {"role", line.role}, {"points", points}});
    }
    return {{"name", curve.name},   {"unit", curve.unit},     {"better", curve.better},
            {"along", curve.along}, {"places", curve.places}, {"lines", lines}};
}

Curve curveFromJson(const Json& json) {
    Curve curve{json.at("name"),
                json.at("unit"),
                json.at("along"),
                json.at("places"),
                {},
                json.at("better").get<Better>()};
    for (const Json& entry : json.at("lines")) {
        Line line{entry.at("who"), entry.at("role").get<Role>(), {}};
        for (const Json& point : entry.at("points"))
            line.points.push_back(figuresFromJson(point));
        curve.lines.push_back(std::move(line));
    }
    return curve;
}

} // namespace

Json toJson(const Report& report) {
    Json rows = Json::array();
    for (const Row& row : report.rows())
        rows.push_back(rowToJson(row));
    Json curves = Json::array();
    for (const Curve& curve : report.curves())
        curves.push_back(curveToJson(curve));
    return {{"rows", rows}, {"curves", curves}, {"leftOut", report.leftOut()}};
}

Report reportFromJson(const Json& json) {
    Report report;
    for (const Json& row : json.at("rows"))
        report.add(rowFromJson(row));
    for (const Json& curve : json.at("curves"))
        report.add(curveFromJson(curve));
    for (const Json& contender : json.at("leftOut"))
        report.leaveOut(contender);
    return report;
}

} // namespace bench
