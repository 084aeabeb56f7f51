#pragma once

#include <boost/beast/http/empty_body.hpp>
#include <boost/beast/http/message.hpp>
#include <boost/beast/http/message_generator.hpp>

namespace vexa::client {

/// What a browser asks for. Nothing that it may ask for has a body.
using PanelRequest = boost::beast::http::request<boost::beast::http::empty_body>;

using PanelAnswer = boost::beast::http::message_generator;

}  // namespace vexa::client
