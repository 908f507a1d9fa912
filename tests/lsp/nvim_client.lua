-- A real editor as the client: Neovim opens $QUIMBEL_MODULE, starts `quimbel lsp`, formats the module
-- (the editor asking for tabs of 8), applies the code action titled $QUIMBEL_ACTION at line
-- $QUIMBEL_LINE, and writes the file. Any failure ends Neovim with exit code 1 and a message.
local function run()
  vim.o.fileencodings = 'ucs-bom,utf-8,cp1252'
  vim.o.fixendofline = false
  vim.cmd('edit ' .. vim.fn.fnameescape(os.getenv('QUIMBEL_MODULE')))
  local buffer = vim.api.nvim_get_current_buf()
  local id = vim.lsp.start_client({ name = 'quimbel', cmd = { os.getenv('QUIMBEL'), 'lsp' } })
  assert(id, 'quimbel lsp did not start')
  vim.lsp.buf_attach_client(buffer, id)
  local client = vim.lsp.get_client_by_id(id)
  assert(vim.wait(20000, function() return client.initialized end), 'no answer to initialize')

  local function ask(method, params)
    local answer, failure = client.request_sync(method, params, 20000, buffer)
    assert(answer, method .. ': ' .. tostring(failure))
    assert(not answer.err, method .. ': ' .. vim.inspect(answer.err))
    return answer.result
  end

  local edits = ask('textDocument/formatting', {
    textDocument = vim.lsp.util.make_text_document_params(buffer),
    options = { tabSize = 8, insertSpaces = false },
  })
  assert(#edits > 0, 'formatting changed nothing')
  vim.lsp.util.apply_text_edits(edits, buffer, client.offset_encoding)

  local line = tonumber(os.getenv('QUIMBEL_LINE'))
  local actions = ask('textDocument/codeAction', {
    textDocument = vim.lsp.util.make_text_document_params(buffer),
    range = { start = { line = line, character = 0 }, ['end'] = { line = line, character = 0 } },
    context = { diagnostics = {} },
  })
  local chosen
  for _, action in ipairs(actions) do
    if action.title == os.getenv('QUIMBEL_ACTION') then chosen = action end
  end
  assert(chosen, 'no action ' .. os.getenv('QUIMBEL_ACTION') .. ' in ' .. vim.inspect(actions))
  if not chosen.edit then chosen = ask('codeAction/resolve', chosen) end
  vim.lsp.util.apply_workspace_edit(chosen.edit, client.offset_encoding)
  vim.cmd('wall')
end

local ok, failure = pcall(run)
if not ok then
  io.stderr:write(tostring(failure) .. '\n')
  vim.cmd('cquit 1')
end
vim.cmd('qall!')
