#pragma once

#include "host/OBExport.h"
#include "platform/FileSystem.h"
#include "platform/Platform.h"

#include <functional>
#include <memory>
#include <string>
#include <string_view>

struct QueryExpression;

/// Who hears how a gathering goes on; a call that is not set is not made.
struct OBGatherObserver {
    /// A folder is listed next.
    std::function<void(std::string_view folder)> enters {};
    /// A folder, or the scope itself, could not be read, or to its end only in part.
    std::function<void(std::string_view path, platform::FileProblem problem)> skips {};
};

/// A question about files, as in "(kMDItemFSName = '*.mov'c && kMDItemPixelWidth >= 1920)".
///
/// A comparison is an attribute of the platform's metadata index, one of = == != < > <= >=, and a value. A text stands
/// in '…' or "…" and is compared by = == != alone: "*" stands for any characters and "?" for one, unless a backslash
/// stands before them, as it does before quotes and itself. Letters behind the text: c leaves out of account case, d
/// accents, and with w the text is to be found as whole words. Numbers are compared with numbers, dates with
/// $time.iso("2011-03-03T10:00:00Z"). A file without the attribute is only ever not equal. ! binds closer than &&, and
/// && closer than ||; parentheses stand inside each other a hundred deep at most.
///
/// Only plain files match, hidden ones too. Immutable; any thread.
class OB_EXPORT OBMetadataQuery {
public:
    /// A query, or why the text is none.
    struct ParseResult {
        std::shared_ptr<const OBMetadataQuery> query;
        /// One line that begins with the column, counted in characters from 1; empty when there is a query.
        std::string problem;
    };

    static ParseResult parse(std::string_view text);

    explicit OBMetadataQuery(std::unique_ptr<const QueryExpression> expression);
    ~OBMetadataQuery();
    OBMetadataQuery(const OBMetadataQuery&) = delete;
    OBMetadataQuery& operator=(const OBMetadataQuery&) = delete;

    /// Whether the path of a plain file tells all that is asked.
    bool asksOnlyForNamePathOrType() const { return _asksOnlyPath; }
    /// For such a query: whether a plain file at `path` matches, whatever lies there. Makes no system call. False for
    /// every other query.
    bool matchesByPath(std::string_view path) const;
    /// Whether a plain file lies at `path`, a link in its last component not followed, and matches now. May block.
    bool matches(const platform::Platform& platform, std::string_view path) const;

    /// Tells `take` every file that matches: `scope` where it is a file, else what lies below it, folders in the order
    /// of their listings, each with what is in it when its turn comes.
    ///
    /// Links on the way to `scope` are followed, those below it are not; paths begin with `scope` as it is spelled.
    /// False when `isCancelled`, asked before each folder and each file that is read, stopped it. May block.
    bool gather(const platform::Platform& platform, std::string_view scope,
        const std::function<void(std::string_view path)>& take, const std::function<bool()>& isCancelled,
        const OBGatherObserver& observer = {}) const;

private:
    const std::unique_ptr<const QueryExpression> _expression;
    const bool _asksOnlyPath;
};
