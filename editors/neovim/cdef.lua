-- Class definition sources in Neovim 0.7 or later, with the help of "cdef lsp". Put it into ~/.config/nvim/plugin.
vim.api.nvim_create_autocmd({ "BufRead", "BufNewFile" }, { pattern = "*.cdefsrc", command = "setfiletype cdefsrc" })

-- The folder of the project: the nearest one above the file with a cdef.toml or a repository, or else the file's own.
local function root_of(file)
  local folder = vim.fn.fnamemodify(file, ":p:h")
  local settings = vim.fn.findfile("cdef.toml", folder .. ";")
  local repository = vim.fn.finddir(".git", folder .. ";")
  if settings ~= "" then
    return vim.fn.fnamemodify(settings, ":p:h")
  end
  return repository ~= "" and vim.fn.fnamemodify(repository, ":p:h:h") or folder
end

-- Completion in Neovim inserts text into one line. Of an item with several lines, only the first is used.
local function complete_one_line(client)
  local request = client.request
  client.request = function(method, params, handler, buffer)
    if method ~= "textDocument/completion" then
      return request(method, params, handler, buffer)
    end
    return request(method, params, function(failure, items, ...)
      for _, item in ipairs(items or {}) do
        item.textEdit.newText = item.textEdit.newText:gsub("\n.*", "")
      end
      return handler(failure, items, ...)
    end, buffer)
  end
end

local clients = {} -- by their folder

vim.api.nvim_create_autocmd("FileType", {
  pattern = "cdefsrc",
  callback = function(args)
    local root = root_of(args.file)
    if not clients[root] or not vim.lsp.get_client_by_id(clients[root]) then
      clients[root] = vim.lsp.start_client({ name = "cdef", cmd = { "cdef", "lsp" }, root_dir = root,
        on_init = complete_one_line })
    end
    vim.lsp.buf_attach_client(args.buf, clients[root])
    vim.bo[args.buf].omnifunc = "v:lua.vim.lsp.omnifunc"
  end,
})
