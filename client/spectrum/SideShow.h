#pragma once

#include <json/value.h>

#include <string>
#include <vector>

#include "client/terminal/Deadline.h"
#include "client/terminal/Poll.h"

namespace vexa::client {

/// What is told beside a spectrum that is shown.
class SideShow {
public:
    /// One thing that was told: as JSON, and as a sentence, which is empty where there is nothing new in it.
    struct Item {
        std::string json;
        std::string sentence;
    };

    struct Room {
        int columns;
        int rows;
        /// Of the whole terminal.
        int screenRows;
        bool colour;
    };

    SideShow() = default;
    virtual ~SideShow() = default;
    SideShow(const SideShow&) = delete;
    SideShow& operator=(const SideShow&) = delete;

    /// What has to be waited for until process() has something to do.
    virtual Polled polled() const = 0;

    /// When it has something to do although nothing has arrived.
    virtual Deadline wake() const = 0;

    /// Takes in what has arrived, without waiting. Throws ClientError when the connection is lost.
    virtual std::vector<Item> process() = 0;

    /// What stands before the first item.
    virtual std::vector<std::string> opening(bool json) const = 0;

    /// How things stand, in at most so many lines.
    virtual std::vector<std::string> lines(const Room& room) const = 0;

    /// The end of the last line: what was seen. Also as members of its object.
    virtual std::string summary() const = 0;
    virtual void addSummary(Json::Value& object) const = 0;
};

}  // namespace vexa::client
