// SPDX-License-Identifier: Apache-2.0
//
// The style and the script of a page: style.css and script.js of this folder, put into the program
// when it is built.
#pragma once

namespace orvane::desk {

struct OwnFile {
    const char* content;
    const char* hash; ///< SHA-256 of the content, in base64
};

extern const OwnFile PAGE_STYLE;
extern const OwnFile PAGE_SCRIPT;

} // namespace orvane::desk
