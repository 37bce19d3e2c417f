-- Class definition sources in Neovim 0.7 or later, with the help of "cdef lsp". Put it into ~/.config/nvim/plugin.
vim.api.nvim_create_autocmd({ "BufRead", "BufNewFile" }, { pattern = "*.cdefsrc", command = "setfiletype cdefsrc" })

local client

vim.api.nvim_create_autocmd("FileType", {
  pattern = "cdefsrc",
  callback = function(args)
    if not client or not vim.lsp.get_client_by_id(client) then
      client = vim.lsp.start_client({ name = "cdef", cmd = { "cdef", "lsp" }, root_dir = vim.fn.getcwd() })
    end
    vim.lsp.buf_attach_client(args.buf, client)
    vim.bo[args.buf].omnifunc = "v:lua.vim.lsp.omnifunc"
  end,
})
