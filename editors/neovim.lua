-- Tries `vtsym lsp` in Neovim as a user does: opens files, reads diagnostics and hovers, types, applies an action.
-- nvim --headless --clean -c 'luafile neovim.lua', in a folder with radio.h and model.json.  VTSYM is the program.

local patience = 60000 -- milliseconds

local function check(holds, what)
  if not holds then
    error(what, 2)
  end
end

local function until_(condition, what)
  check(vim.wait(patience, condition, 20), what .. ' in vain')
end

local function open(file)
  vim.cmd('edit ' .. file)
  local client = vim.lsp.start_client({
    cmd = { vim.env.VTSYM, 'lsp' },
    root_dir = vim.fn.getcwd(),
    on_error = function(code, message) error('the server: ' .. code .. ' ' .. vim.inspect(message)) end,
  })
  check(client, 'the server does not start')
  vim.lsp.buf_attach_client(0, client)
  return vim.lsp.get_client_by_id(client)
end

local function messages()
  local found = {}
  for _, each in ipairs(vim.diagnostic.get(0)) do
    table.insert(found, (each.lnum + 1) .. ': ' .. each.message)
  end
  table.sort(found)
  return table.concat(found, '\n')
end

local function ask(client, method, parameters)
  local answer = client.request_sync(method, parameters, patience, 0)
  check(answer and not answer.err, method .. ': ' .. vim.inspect(answer))
  return answer.result
end

local function line(number)
  return vim.api.nvim_buf_get_lines(0, number - 1, number, true)[1]
end

local function action_at(client, number)
  local actions = ask(client, 'textDocument/codeAction', {
    textDocument = vim.lsp.util.make_text_document_params(),
    range = {
      start = { line = number - 1, character = 0 },
      ['end'] = { line = number - 1, character = #line(number) },
    },
    context = { diagnostics = {}, only = { 'quickfix' } },
  })
  check(#actions == 1, 'one action is offered: ' .. vim.inspect(actions))
  vim.lsp.util.apply_workspace_edit(actions[1].edit, client.offset_encoding)
end

local function try()
  local client = open('radio.h')
  until_(function() return messages():find("can be '#if defined%(CRC%)'") end, 'waited for findings')
  check(messages():find("9: '#elif defined%(LEGACY%) && PROTOCOL > 2' is dead"), messages())
  local dimmed = vim.tbl_filter(function(each)
    local tags = each.user_data and each.user_data.lsp and each.user_data.lsp.tags
    return tags and vim.tbl_contains(tags, 1)
  end, vim.diagnostic.get(0))
  check(#dimmed == 1 and dimmed[1].lnum == 9, 'the dead branch is dimmed: ' .. vim.inspect(dimmed))

  vim.api.nvim_win_set_cursor(0, { 5, 0 })
  local hover = ask(client, 'textDocument/hover', vim.lsp.util.make_position_params(0, client.offset_encoding))
  check(hover.contents.value:find('Built where `PROTOCOL >= 3 && defined(CRC)`', 1, true), vim.inspect(hover))
  local symbols = ask(client, 'textDocument/documentSymbol', { textDocument = vim.lsp.util.make_text_document_params() })
  check(#symbols == 4 and #symbols[1].children == 1, vim.inspect(symbols))

  action_at(client, 4)
  check(line(4) == '#if defined(CRC)   /* checksums came with protocol 2 */', line(4))
  until_(function() return not messages():find('can be') end, 'waited for the finding to go')

  -- What is typed, with characters that are several bytes and several code units.
  vim.api.nvim_buf_set_lines(0, 1, 1, true, { '/* \u{1F600} \u{e4}', '\u{1F600} */ #if LEGACY && !LEGACY', '#endif' })
  until_(function() return messages():find("3: '#if LEGACY && !LEGACY' is dead") end, 'waited for what was typed')
  vim.api.nvim_buf_set_text(0, 2, 12, 2, 22, { '' })
  check(line(3) == '\u{1F600} */ #if !LEGACY', line(3))
  until_(function() return not messages():find('!LEGACY') end, 'waited for what was changed')
  vim.api.nvim_buf_set_lines(0, 1, 4, true, {})
  vim.cmd('silent write')

  client = open('model.json')
  until_(function() return messages():find('Engine/Hydrogen is never active') end, 'waited for findings of a model')
  action_at(client, 9)
  check(line(9):find('"condition": "FUEL==1"', 1, true), line(9))
  vim.cmd('silent write')

  for _, each in ipairs(vim.lsp.get_active_clients()) do
    each.stop()
  end
  until_(function() return #vim.lsp.get_active_clients() == 0 end, 'waited for the end of the servers')
end

local worked, problem = pcall(try)
if not worked then
  io.stderr:write('editors/neovim.lua: ' .. tostring(problem) .. '\n')
  vim.cmd('cquit')
end
vim.cmd('quitall!')
