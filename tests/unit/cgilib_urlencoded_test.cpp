// Query strings and url-encoded bodies, and how cgiFormString hands values out.
#include <gtest/gtest.h>

#include "cgilib_test_support.h"

using cgilib_test::form_string;
using cgilib_test::parse;
using cgilib_test::Read;
using cgilib_test::TestRequest;

TEST(CgiQueryString, DecodesFields)
{
    const struct {
        std::string query, name;
        Read expected;
    } cases[] = {
        {"a=1&b=2", "b", {cgiFormSuccess, "2"}},
        {"a=x+y", "a", {cgiFormSuccess, "x y"}},
        {"a=%41%62%2b%2F", "a", {cgiFormSuccess, "Ab+/"}},
        {"x%20y=1", "x y", {cgiFormSuccess, "1"}},
        {"a=b=c", "a", {cgiFormSuccess, "b=c"}},
        {"&&a=1&", "a", {cgiFormSuccess, "1"}},
        // A bad escape stays as it was sent.
        {"a=%G1", "a", {cgiFormSuccess, "%G1"}},
        {"a=50%", "a", {cgiFormSuccess, "50%"}},
        {"a=%4", "a", {cgiFormSuccess, "%4"}},
        {"a=%%41", "a", {cgiFormSuccess, "%A"}},
        // Present but empty, with or without "=".
        {"a=&b=1", "a", {cgiFormEmpty, ""}},
        {"b=1&a", "a", {cgiFormEmpty, ""}},
        {"a=1&a=2", "a", {cgiFormSuccess, "1"}},
        {"a=1", "b", {cgiFormNotFound, ""}},
        {"=1", "", {cgiFormNotFound, ""}},
        {"", "a", {cgiFormNotFound, ""}},
        // A NUL byte ends the value as a C string.
        {"a=x%00y", "a", {cgiFormSuccess, "x"}},
        {"a=%00y", "a", {cgiFormEmpty, ""}},
        {"a=%FF%FE", "a", {cgiFormSuccess, "\xff\xfe"}},
    };
    for (const auto& c : cases) {
        parse({.method = "GET", .query = c.query});
        EXPECT_EQ(form_string(c.name.c_str()), c.expected) << c.query;
    }
}

TEST(CgiFormString, CutsToSizeLessOneAndTerminates)
{
    parse({.method = "GET", .query = "a=abcdef&e="});
    const struct {
        const char* name;
        int size;
        Read expected;
    } cases[] = {
        {"a", 7, {cgiFormSuccess, "abcdef"}}, {"a", 6, {cgiFormTruncated, "abcde"}}, {"a", 2, {cgiFormTruncated, "a"}},
        {"a", 1, {cgiFormTruncated, ""}}, {"a", 0, {cgiFormTruncated, ""}}, {"a", -4, {cgiFormTruncated, ""}},
        {"e", 0, {cgiFormEmpty, ""}}, {"missing", 8, {cgiFormNotFound, ""}}, {"missing", 0, {cgiFormNotFound, ""}},
    };
    for (const auto& c : cases)
        EXPECT_EQ(form_string(c.name, c.size), c.expected) << c.name << " in " << c.size;
    EXPECT_EQ(cgiFormString(nullptr, nullptr, 0), cgiFormNotFound);
}

TEST(CgiUrlencodedBody, TakesBodyFieldsBeforeQueryFields)
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
}

TEST(CgiUrlencodedBody, ReadsNoMoreThanContentLengthAndDropsShortBodies)
{
    const struct {
        std::string body;
        std::optional<std::string> length;
        Read expected;
        std::streamoff consumed;
    } cases[] = {
        {"a=12345", "3", {cgiFormSuccess, "1"}, 3},
        {"a=1", "9", {cgiFormNotFound, ""}, 3},        // cut short: dropped whole
        // Lengths that are no plain positive number read nothing.
        {"a=1", "", {cgiFormNotFound, ""}, 0}, {"a=1", "abc", {cgiFormNotFound, ""}, 0},
        {"a=1", "3x", {cgiFormNotFound, ""}, 0}, {"a=1", " 3", {cgiFormNotFound, ""}, 0},
        {"a=1", "-1", {cgiFormNotFound, ""}, 0}, {"a=1", "0", {cgiFormNotFound, ""}, 0},
        {"a=1", "99999999999999999999999", {cgiFormNotFound, ""}, 0},
        {"a=1", std::to_string(cgilib::kMaxUrlencodedBody + 1), {cgiFormNotFound, ""}, 0},
    };
    for (const auto& c : cases) {
        const auto consumed = parse(
            {.content_type = "application/x-www-form-urlencoded", .body = c.body, .content_length = c.length});
        EXPECT_EQ(form_string("a"), c.expected) << *c.length;
        EXPECT_EQ(consumed, c.consumed) << *c.length;
    }
}
