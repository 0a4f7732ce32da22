#include "host/pieces/PlanText.h"

#include "host/convert/Failure.h"
#include "host/pieces/CheckedLine.h"
#include "host/pieces/Digest.h"
#include "host/pieces/MarkText.h"
#include "host/pieces/SettingsText.h"
#include "host/pieces/WholeFile.h"
#include "media/MediaRecords.h"

#include <cerrno>
#include <cstring>
#include <filesystem>
#include <fmt/format.h>
#include <stdexcept>

namespace movieconv {
namespace {

constexpr int kVersion = 1;
constexpr int64_t kLargestPlan = 16 << 20;
constexpr int kIndent = 2;
constexpr std::string_view kPlanHead = "{\n  \"version\": "; // with which AsJson begins

Json AsJson(const Piece& piece) {
    Json json{{"kind", "pictures"},
              {"begin", piece.begin},
              {"end", piece.end},
              {"readUntil", piece.until},
              {"pictures", piece.pictures}};
    if (piece.tick)
        json["tickBefore"] = *piece.tick;
    if (piece.drawnSince != piece.begin)
        json["drawnSince"] = piece.drawnSince;
    return json;
}

Json AsJson(const Division& division) {
    Json json = Json::object();
    if (division.pieces)
        json["pieces"] = *division.pieces;
    if (division.length)
        json["pieceLength"] = *division.length;
    return json;
}

/// Without the hash.
Json AsJson(const Plan& plan) {
    Json json;
    json["version"] = kVersion;
    json["madeWith"] = plan.versions;
    json["source"] = MarkAsJson(plan.source);
    json["texts"] = MarksAsJson(plan.texts);
    json["output"] = NameAsJson(plan.output);
    json["settings"] = SettingsAsJson(plan.settings);
    json["division"] = AsJson(plan.division);
    json["readFromStart"] = plan.fromStart;
    json["hasRates"] = plan.hasRates;
    json["memoryPerPiece"] = plan.memory;
    json["ticksPerSecond"] = kTicksPerSecond;
    Json pieces = Json::array();
    int64_t pictures = 0;
    for (const Piece& piece : plan.pictures) {
        pieces.push_back(AsJson(piece));
        pictures += piece.pictures;
    }
    pieces.push_back({{"kind", "rest"}, {"pictures", pictures}});
    json["pieces"] = std::move(pieces);
    return json;
}

std::string HashOf(const Json& json) {
    return DigestOf(json.dump());
}

[[noreturn]] void RefusePlan(const std::string& why) {
    throw std::invalid_argument(why);
}

Piece PieceFrom(const Json& json) {
    Piece piece;
    piece.begin = json.at("begin").get<int64_t>();
    piece.end = json.at("end").get<int64_t>();
    piece.until = json.at("readUntil").get<int64_t>();
    piece.pictures = Natural(json, "pictures");
    if (json.contains("tickBefore"))
        piece.tick = json.at("tickBefore").get<int64_t>();
    piece.drawnSince = json.contains("drawnSince") ? json.at("drawnSince").get<int64_t>() : piece.begin;
    if (json.at("kind") != "pictures" || piece.end <= piece.begin || piece.until < piece.end ||
        piece.pictures < 1)
        RefusePlan("a piece holds no pictures");
    return piece;
}

std::vector<Piece> PiecesFrom(const Json& json) {
    if (!json.is_array() || json.size() < 2 || json.size() > std::size_t{kMostPieces} + 1)
        RefusePlan(fmt::format("\"pieces\" is not a list of 2 to {}", kMostPieces + 1));
    std::vector<Piece> pieces;
    for (std::size_t i = 0; i + 1 < json.size(); ++i) {
        pieces.push_back(PieceFrom(json.at(i)));
        if (i > 0 && pieces[i].begin != pieces[i - 1].end)
            RefusePlan(fmt::format("piece {} does not begin where the one before it ends", i));
    }
    if (json.back().at("kind") != "rest")
        RefusePlan("the last piece is not the rest");
    return pieces;
}

Plan PlanFrom(const Json& json) {
    if (!json.is_object() || !json.contains("version"))
        RefusePlan("it is not a plan");
    if (json.at("version") != kVersion)
        RefusePlan(fmt::format("it has version {}, this program knows version {}", json.at("version").dump(),
                               kVersion));
    Plan plan;
    plan.pictures = PiecesFrom(json.at("pieces"));
    plan.versions = json.at("madeWith").get<std::map<std::string, std::string>>();
    plan.source = MarkFromJson(json.at("source"));
    for (const Json& text : json.at("texts"))
        plan.texts.push_back(MarkFromJson(text));
    plan.output = PathFromJson(json.at("output"));
    plan.settings = SettingsFromJson(json.at("settings"));
    plan.fromStart = json.at("readFromStart").get<bool>();
    plan.hasRates = json.at("hasRates").get<bool>();
    plan.memory = Natural(json, "memoryPerPiece");
    const Json& division = json.at("division");
    if (division.contains("pieces"))
        plan.division.pieces = division.at("pieces").get<int>();
    if (division.contains("pieceLength"))
        plan.division.length = division.at("pieceLength").get<double>();
    plan.hash = HashOf(AsJson(plan));
    if (json.at("hash") != plan.hash)
        RefusePlan("it was changed or cut since it was written");
    return plan;
}

} // namespace

Plan ReadPlan(const std::string& path) {
    const std::string text = ReadWhole(path, kLargestPlan);
    try {
        return PlanFrom(ParseFlat(text));
    } catch (const Json::parse_error&) {
        throw Failure(Category::kRequest, fmt::format("\"{}\" is not a plan, or only a part of one", path));
    } catch (const Json::exception& error) {
        throw Failure(Category::kRequest, fmt::format("\"{}\" is not a plan: {}", path, error.what()));
    } catch (const std::invalid_argument& error) {
        throw Failure(Category::kRequest, fmt::format("\"{}\" is not a plan: {}", path, error.what()));
    }
}

bool WritePlan(const std::string& path, Plan& plan, bool replace) {
    Json json = AsJson(plan);
    plan.hash = HashOf(json);
    json["hash"] = plan.hash;
    const std::string text = json.dump(kIndent) + "\n";
    if (!replace)
        return WriteNew(path, text);
    WriteWhole(path, text);
    return true;
}

bool IsPlanInTheMaking(const std::filesystem::path& file, const std::string& path) {
    return IsInTheMaking(file, path) && BeginsLike(file, kPlanHead);
}

std::string Difference(const Plan& before, const Plan& now) {
    std::string what =
        DifferenceIn(AsJson(before), AsJson(now), {"madeWith", "source", "settings", "division"});
    if (before.texts != now.texts)
        what += fmt::format("{}a file of subtitles was changed", what.empty() ? "" : "; ");
    if (before.output != now.output)
        what += fmt::format("{}the output was \"{}\"", what.empty() ? "" : "; ", before.output);
    return what;
}

} // namespace movieconv
