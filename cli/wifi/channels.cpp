// SPDX-License-Identifier: MIT
#include "cli/wifi/channels.h"

#include <algorithm>
#include <cstdint>
#include <cstdlib>
#include <map>
#include <set>

#include "cli/level.h"
#include "cli/text_width.h"
#include "cli/wifi/network_name.h"

namespace taviwireless::cli {

namespace {

constexpr int kLastOf24 = 14;

struct Band {
    const char* title;
    bool isUpper;  // 5 GHz, where channels that do not overlap stand four numbers apart
};
constexpr Band kBands[] = {{"2.4 GHz", false}, {"5 GHz", true}};

bool IsIn(const Band& band, const WirelessNetwork& network) {
    return network.channel > 0 && (network.channel > kLastOf24) == band.isUpper;
}

std::string NameOf(const WirelessNetwork& network) {
    return network.essid[0] == '\0' ? "(hidden)" : Printable(network.essid);
}

// How much of a network, in percent, there is on a channel. At 2.4 GHz one of 20 MHz reaches two
// channels to either side.
int Share(const WirelessNetwork& network, int channel, const Band& band) {
    constexpr int kPercentAt[] = {100, 70, 30};
    const auto distance = static_cast<size_t>(std::abs(network.channel - channel));
    if (band.isUpper || distance >= std::size(kPercentAt)) {
        return distance == 0 ? network.signal : 0;
    }
    return network.signal * kPercentAt[distance] / 100;
}

// The picture of one band.
class Picture {
  public:
    Picture(const Band& band, const std::vector<NetworkInRange>& networks)
        : band_(band), channelColumns_(band.isUpper ? 4 : 3) {
        std::set<int> channels;
        for (const NetworkInRange& one : networks) {
            if (IsIn(band, one.network)) {
                networks_.push_back(one);
                channels.insert(one.network.channel);
            }
        }
        constexpr int kLastEverywhere = 13;
        for (int channel = 1; !band.isUpper && channel <= kLastEverywhere; ++channel) {
            channels.insert(channel);
        }
        channels_.assign(channels.begin(), channels.end());
        Fit();
    }

    bool IsEmpty() const { return networks_.empty(); }
    // Columns that are left for the names.
    size_t NameColumns() const { return nameColumns_; }

    void AddTo(Report& report, size_t nameColumns) const {
        if (!report.rows.empty()) {
            report.rows.emplace_back();
        }
        report.rows.push_back({band_.title, Ruler()});
        for (const NetworkInRange& one : networks_) {
            const std::string name = (one.isInUse ? "* " : "") + NameOf(one.network);
            report.rows.push_back({Cut(name, nameColumns), Strip([&](int channel) {
                                       return Share(one.network, channel, band_);
                                   }),
                                   std::to_string(one.network.signal) + "%"});
        }
        report.rows.push_back({"all", Strip([&](int channel) { return Load(channel); })});
        for (const int channel : channels_) {
            AddDocument(report, channel);
        }
    }

  private:
    // Chooses the widths of a channel and of the names.
    void Fit() {
        constexpr size_t kBetweenAndPercent = 2 + 2 + 4;
        constexpr size_t kFewest = 10;
        const size_t width = TerminalWidth() > 0 ? static_cast<size_t>(TerminalWidth()) : 80;
        const auto isTooWide = [&] {
            return channels_.size() * channelColumns_ + kBetweenAndPercent + kFewest > width;
        };
        while (channelColumns_ > 1 && isTooWide()) {
            --channelColumns_;
        }
        const size_t taken = channels_.size() * channelColumns_ + kBetweenAndPercent;
        nameColumns_ = std::min<size_t>(std::max(width, taken + kFewest) - taken, 32);
    }

    // The numbers of the channels, as many as have room, each above its column.
    std::string Ruler() const {
        std::string ruler;
        for (size_t i = 0; i < channels_.size(); ++i) {
            const size_t place = i * channelColumns_;
            if (place >= ruler.size() + (ruler.empty() ? 0 : 1)) {
                ruler.resize(place, ' ');
                ruler += std::to_string(channels_[i]);
            }
        }
        return ruler;
    }

    template <typename PercentOf>
    std::string Strip(const PercentOf& percentOf) const {
        // Channels that do not overlap stand apart.
        const size_t gap = band_.isUpper && channelColumns_ > 1 ? 1 : 0;
        std::string strip;
        for (const int channel : channels_) {
            for (size_t i = gap; i < channelColumns_; ++i) {
                strip += Level(percentOf(channel));
            }
            strip.append(gap, ' ');
        }
        return strip;
    }

    int Load(int channel) const {
        int load = 0;
        for (const NetworkInRange& one : networks_) {
            load += Share(one.network, channel, band_);
        }
        return std::min(load, 100);
    }

    void AddDocument(Report& report, int channel) const {
        Json::Value document;
        document["band"] = band_.isUpper ? "5" : "2.4";
        document["channel"] = channel;
        document["load"] = Load(channel);
        document["networks"] = Json::arrayValue;
        for (const NetworkInRange& one : networks_) {
            if (one.network.channel == channel) {
                Json::Value network;
                network["ssid"] = TextOrNull(one.network.essid);
                network["bssid"] = BssidText(one.network.bssid);
                network["signal"] = one.network.signal;
                document["networks"].append(network);
            }
        }
        report.document.append(document);
    }

    const Band& band_;
    std::vector<NetworkInRange> networks_;
    std::vector<int> channels_;
    size_t channelColumns_;
    size_t nameColumns_ = 0;
};

}  // namespace

Report DescribeChannels(const std::vector<NetworkInRange>& networks) {
    std::vector<Picture> pictures;
    size_t nameColumns = SIZE_MAX;  // the same for all, as they stand in one table
    for (const Band& band : kBands) {
        Picture picture(band, networks);
        if (!picture.IsEmpty()) {
            nameColumns = std::min(nameColumns, picture.NameColumns());
            pictures.push_back(picture);
        }
    }
    if (pictures.empty()) {
        return {{{"No network is in range."}}, Json::arrayValue};
    }
    Report report{{}, Json::arrayValue};
    for (const Picture& picture : pictures) {
        picture.AddTo(report, nameColumns);
    }
    return report;
}

}  // namespace taviwireless::cli
