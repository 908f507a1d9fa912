// SPDX-License-Identifier: MIT
#include "gsforacle.h"

#include <gsf/gsf.h>

#include <algorithm>
#include <cstring>
#include <mutex>

namespace projinfo::test {
namespace {

void initialize() {
  static std::once_flag once;
  std::call_once(once, [] { gsf_init(); });
}

void walk(GsfInfile* storage, const std::string& prefix, std::vector<std::string>& out) {
  const int count = gsf_infile_num_children(storage);
  for (int i = 0; i < count; ++i) {
    GsfInput* child = gsf_infile_child_by_index(storage, i);
    if (!child) {
      out.push_back("error: child " + std::to_string(i));
      continue;
    }
    const std::string name = prefix + gsf_input_name(child);
    if (GSF_IS_INFILE(child) && gsf_infile_num_children(GSF_INFILE(child)) >= 0) {
      out.push_back(name + "/");
      walk(GSF_INFILE(child), name + "/", out);
    } else {
      out.push_back(name + " " + std::to_string(gsf_input_size(child)));
    }
    g_object_unref(child);
  }
}

}  // namespace

std::vector<std::string> gsfTree(const std::string& path) {
  initialize();
  std::vector<std::string> out;
  GError* error = nullptr;
  GsfInput* input = gsf_input_stdio_new(path.c_str(), &error);
  GsfInfile* file = input ? gsf_infile_msole_new(input, &error) : nullptr;
  if (!file) {
    out.push_back(std::string("error: ") + (error ? error->message : "unknown"));
  } else {
    walk(file, "", out);
    std::sort(out.begin(), out.end());
    g_object_unref(file);
  }
  if (input) g_object_unref(input);
  if (error) g_error_free(error);
  return out;
}

bool gsfWriteTasks(const std::string& path, int count) {
  initialize();
  GError* error = nullptr;
  GsfOutput* sink = gsf_output_stdio_new(path.c_str(), &error);
  if (!sink) {
    g_error_free(error);
    return false;
  }
  GsfOutfile* file = gsf_outfile_msole_new(sink);
  GsfOutput* tasks = gsf_outfile_new_child(file, "TaskList", TRUE);
  bool ok = true;
  for (int id = 1; id <= count; ++id) {
    const std::string name = "Task" + std::to_string(id);
    const std::string text = "[Name](Tarefa " + std::to_string(id) + ")";
    std::vector<guint8> bytes(4 + 2 * text.size(), 0);
    const guint32 length = static_cast<guint32>(text.size());
    std::memcpy(bytes.data(), &length, 4);
    for (size_t i = 0; i < text.size(); ++i)
      bytes[4 + 2 * i] = static_cast<guint8>(text[i]);
    if (id == 7) bytes.resize(5000, 0);
    GsfOutput* stream = gsf_outfile_new_child(GSF_OUTFILE(tasks), name.c_str(), FALSE);
    ok = gsf_output_write(stream, bytes.size(), bytes.data()) && gsf_output_close(stream) && ok;
    g_object_unref(stream);
  }
  ok = gsf_output_close(tasks) && ok;
  g_object_unref(tasks);
  ok = gsf_output_close(GSF_OUTPUT(file)) && ok;  // closes the sink too
  g_object_unref(file);
  g_object_unref(sink);
  return ok;
}

}  // namespace projinfo::test
