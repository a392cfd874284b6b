#include "report_graph.h"

#include <algorithm>
#include <cmath>

#include "html_text.h"

namespace zr::tool {

namespace {

constexpr int kWidth = 190;  // of a node
constexpr int kHeight = 26;
constexpr int kStepX = 260;
constexpr int kStepY = 38;
constexpr std::size_t kLongestLabel = 26;

struct Node {
    const CZRSourceInfo* object = nullptr;
    bool isQuery = false;
    std::vector<std::size_t> reads;
    std::size_t layer = 0;
    double rank = 0;  // where in its layer those that it reads from stand, on average
    int x = 0;
    int y = 0;
};

class Graph {
 public:
    explicit Graph(TracedProject& project) {
        host::Database& database = project.database();
        for (const CZRTableInfo* table : database.Tables) add(table, false);
        for (const CZRQueryInfo* query : database.Queries) add(query, true);
        // Queries stand behind those that they read from; a ring is cut where it isn't so.
        for (const CZRQueryInfo* query : database.Queries) {
            Node& node = nodes_[places_.at(query)];
            for (const CZRSourceInfo* object : project.lineage().tracer().objectsReadBy(*query)) {
                const std::size_t source = places_.at(object);
                node.reads.push_back(source);
                if (source < places_.at(query)) node.layer = std::max(node.layer, nodes_[source].layer + 1);
            }
            if (node.layer == 0) node.layer = 1;
        }
        layOut();
    }

    void appendTo(std::string& out, const Anchors& anchors) const {
        out +=
            "<svg id=\"graph\" tabindex=\"0\" role=\"group\" aria-label=\"What reads from what\" viewBox=\"0 "
            "0 " +
            std::to_string(width_) + " " + std::to_string(height_) + "\" data-width=\"" +
            std::to_string(width_) + "\" data-height=\"" + std::to_string(height_) + "\">\n";
        for (const Node& node : nodes_)
            for (const std::size_t source : node.reads) appendLine(out, nodes_[source], node, anchors);
        for (const Node& node : nodes_) appendNode(out, node, anchors);
        out += "</svg>\n";
    }

 private:
    void add(const CZRSourceInfo* object, bool isQuery) {
        places_[object] = nodes_.size();
        nodes_.push_back({});
        nodes_.back().object = object;
        nodes_.back().isQuery = isQuery;
    }

    void layOut() {
        std::vector<std::vector<std::size_t>> layers;
        for (std::size_t at = 0; at < nodes_.size(); ++at) {
            layers.resize(std::max(layers.size(), nodes_[at].layer + 1));
            layers[nodes_[at].layer].push_back(at);
        }
        // A layer that is long goes into several columns, so that the whole is about as wide as high.
        const auto rows = std::max<std::size_t>(
            12, static_cast<std::size_t>(std::sqrt(static_cast<double>(nodes_.size()) * kStepX / kStepY)));
        int column = 0;
        for (std::vector<std::size_t>& layer : layers) {
            for (const std::size_t at : layer) {
                Node& node = nodes_[at];
                for (const std::size_t source : node.reads)
                    node.rank += nodes_[source].y / static_cast<double>(node.reads.size());
            }
            std::stable_sort(layer.begin(), layer.end(), [this](std::size_t a, std::size_t b) {
                return nodes_[a].rank < nodes_[b].rank;
            });
            for (std::size_t place = 0; place < layer.size(); ++place) {
                if (place && place % rows == 0) ++column;
                Node& node = nodes_[layer[place]];
                node.x = 20 + column * kStepX;
                node.y = 20 + static_cast<int>(place % rows) * kStepY;
                width_ = std::max(width_, node.x + kWidth + 20);
                height_ = std::max(height_, node.y + kHeight + 20);
            }
            ++column;
        }
    }

    static void appendLine(std::string& out, const Node& from, const Node& to, const Anchors& anchors) {
        const int x1 = from.x + kWidth;
        const int y1 = from.y + kHeight / 2;
        const int y2 = to.y + kHeight / 2;
        const int bend = (x1 + to.x) / 2;
        out += "<path data-from=\"" + anchors.at(from.object) + "\" data-to=\"" + anchors.at(to.object) +
               "\" d=\"M" + std::to_string(x1) + " " + std::to_string(y1) + "C" + std::to_string(bend) + " " +
               std::to_string(y1) + " " + std::to_string(bend) + " " + std::to_string(y2) + " " +
               std::to_string(to.x) + " " + std::to_string(y2) + "\"/>\n";
    }

    static void appendNode(std::string& out, const Node& node, const Anchors& anchors) {
        const CString name = node.object->GetSrcName();
        std::u16string label(name.View());
        if (label.size() > kLongestLabel) label = label.substr(0, kLongestLabel - 1) + u"\u2026";
        const std::string& anchor = anchors.at(node.object);
        out += "<a href=\"#" + anchor + "\" tabindex=\"-1\" class=\"" + (node.isQuery ? "query" : "table") +
               "\" data-node=\"" + anchor + "\"><title>";
        appendHtml(out, name.View());
        out += "</title><rect x=\"" + std::to_string(node.x) + "\" y=\"" + std::to_string(node.y) +
               "\" width=\"" + std::to_string(kWidth) + "\" height=\"" + std::to_string(kHeight) +
               "\" rx=\"5\"/><text x=\"" + std::to_string(node.x + 8) + "\" y=\"" +
               std::to_string(node.y + 18) + "\">";
        appendHtml(out, label);
        out += "</text></a>\n";
    }

    std::vector<Node> nodes_;
    std::unordered_map<const CZRSourceInfo*, std::size_t> places_;
    int width_ = 100;
    int height_ = 60;
};

}  // namespace

void appendGraph(std::string& out, TracedProject& project, const Anchors& anchors) {
    Graph(project).appendTo(out, anchors);
}

}  // namespace zr::tool
