// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The files of make_tag_samples.py as they are read.
#ifndef MEDIIDX_TESTS_INTEGRATION_TOOL_TAGS_TAG_SAMPLES_H_
#define MEDIIDX_TESTS_INTEGRATION_TOOL_TAGS_TAG_SAMPLES_H_

#include <map>
#include <string>

#include "tags/media_file.h"

namespace mediidx::test {

std::string tag_sample(const std::string& name);

/// Throws tool::ReadError.
tool::MediaFile read_sample(const std::string& name);

/// What is known of a file, by the names of the record. Without what the file system tells; rates
/// of bits, which depend on the encoder, as "some"; the duration in whole seconds.
using Fields = std::map<std::string, std::string>;
Fields fields_of(const std::string& name);

/// The first fields, with these in place of theirs; an empty text takes one away.
Fields with(Fields fields, const Fields& others);

}  // namespace mediidx::test

#endif
