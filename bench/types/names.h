// Type names as models have them: a stem and a number, 5 to 40 characters.
#pragma once

#include <algorithm>
#include <random>
#include <string>
#include <vector>

inline std::vector<std::string> typeNames(int count) {
    const char* const stems[] = {"Bus", "EngineState", "sensor_msgs_PointCloud", "T",
                                 "dtoDblFlt_TransmissionCommand_v"};
    std::vector<std::string> names;
    for (int i = 0; i < count; ++i)
        names.push_back(std::string(stems[i % 5]) + std::to_string(i));
    return names;
}

/// Indices in random order, so that a lookup does not find its neighbour's cache line.
inline std::vector<int> shuffledIndices(int count) {
    std::vector<int> order(static_cast<std::size_t>(count));
    for (int i = 0; i < count; ++i)
        order[static_cast<std::size_t>(i)] = i;
    std::shuffle(order.begin(), order.end(), std::mt19937(1));
    return order;
}
