// Query strings and url-encoded bodies, and how cgiFormString hands values out.
#include <gtest/gtest.h>

#include "support.h"

TEST(CgiQueryString, DecodesFields)
{
    const auto ok = cgiFormSuccess, empty = cgiFormEmpty, none = cgiFormNotFound;
    const struct {
        std::string query, name;
        Read expected;
    } cases[] = {
        {"a=1&b=2", "b", {ok, "2"}}, {"a=x+y", "a", {ok, "x y"}}, {"a=%41%62%2b%2F", "a", {ok, "Ab+/"}},
        {"x%20y=1", "x y", {ok, "1"}}, {"a=b=c", "a", {ok, "b=c"}}, {"&&a=1&", "a", {ok, "1"}},
        // A bad escape stays as it was sent.
        {"a=%G1", "a", {ok, "%G1"}}, {"a=50%", "a", {ok, "50%"}}, {"a=%4", "a", {ok, "%4"}}, {"a=%%41", "a", {ok, "%A"}},
        // Present but empty, with or without "="; the first of two; absent.
        {"a=&b=1", "a", {empty, ""}}, {"b=1&a", "a", {empty, ""}}, {"a=1&a=2", "a", {ok, "1"}},
        {"a=1", "b", {none, ""}}, {"=1", "", {none, ""}}, {"", "a", {none, ""}},
        // A NUL byte ends the value as a C string.
        {"a=x%00y", "a", {ok, "x"}}, {"a=%00y", "a", {empty, ""}}, {"a=%FF%FE", "a", {ok, "\xff\xfe"}},
    };
    for (const auto& c : cases) {
        parse({.method = "GET", .query = c.query});
        EXPECT_EQ(form_string(c.name.c_str()), c.expected) << c.query;
    }
}

TEST(CgiFormString, CutsToSizeLessOneAndTerminates)
{
    parse({.method = "GET", .query = "a=abcdef&e="});
    const auto cut = cgiFormTruncated;
    const struct {
        const char* name;
        int size;
        Read expected;
    } cases[] = {
        {"a", 7, {cgiFormSuccess, "abcdef"}}, {"a", 6, {cut, "abcde"}}, {"a", 2, {cut, "a"}}, {"a", 1, {cut, ""}},
        {"a", 0, {cut, ""}}, {"a", -4, {cut, ""}}, {"e", 0, {cgiFormEmpty, ""}}, {"missing", 8, {cgiFormNotFound, ""}},
        {"missing", 0, {cgiFormNotFound, ""}},
    };
    for (const auto& c : cases)
        EXPECT_EQ(form_string(c.name, c.size), c.expected) << c.name << " in " << c.size;
    EXPECT_EQ(cgiFormString(nullptr, nullptr, 0), cgiFormNotFound);
}

TEST(CgiUrlencodedBody, TakesBodyFieldsFirstAndNoMoreThanContentLength)
{
    const std::string form = "application/x-www-form-urlencoded";
    parse({.query = "a=query&q=1", .content_type = form + "; charset=UTF-8", .body = "a=body&b=x+%2B"});
    EXPECT_EQ(form_string("a"), (Read{cgiFormSuccess, "body"}));
    EXPECT_EQ(form_string("b"), (Read{cgiFormSuccess, "x +"}));
    EXPECT_EQ(form_string("q"), (Read{cgiFormSuccess, "1"}));
    // Other methods and unknown body types read no body.
    parse({.method = "GET", .content_type = form, .body = "a=1"});
    EXPECT_EQ(form_string("a").result, cgiFormNotFound);
    parse({.content_type = "text/plain", .body = "a=1"});
    EXPECT_EQ(form_string("a").result, cgiFormNotFound);

    // A body cut short is dropped whole; a length that is no plain positive number
    // within the limit reads nothing.
    EXPECT_EQ(parse({.content_type = form, .body = "a=12345", .content_length = "3"}), 3);
    EXPECT_EQ(form_string("a"), (Read{cgiFormSuccess, "1"}));
    EXPECT_EQ(parse({.content_type = form, .body = "a=1", .content_length = "9"}), 3);
    EXPECT_EQ(form_string("a").result, cgiFormNotFound);
    const std::string too_long = std::to_string(cgilib::kMaxUrlencodedBody + 1);
    for (const std::string length : {"", "abc", "3x", " 3", "-1", "0", "99999999999999999999999", too_long.c_str()}) {
        EXPECT_EQ(parse({.content_type = form, .body = "a=1", .content_length = length}), 0) << length;
        EXPECT_EQ(form_string("a").result, cgiFormNotFound) << length;
    }
}
